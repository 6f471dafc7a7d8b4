// The trace log as support staff read it: stamped lines with CR LF ends, the substitution pair,
// appends that live with other openers, and where the log goes at start-up.
#include "diag/trace_log.h"

#include <gtest/gtest.h>

#include "diag/trace_startup.h"
#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

class TraceLogTest : public ::testing::Test {
protected:
    void TearDown() override { plat::fault::Clear(); }

    pextest::TestMachine m;
    pextest::TraceCapture trace;
};

// The time stamp's form is pinned by every golden run, whose driver takes it off each line.
TEST_F(TraceLogTest, ALineIsWrittenWholeHoweverLong) {
    const std::string text = std::string(20000, 'x') + "end";
    TRACE(g_TraceLog, "CFile_: Apply %d [%s] %d%% %5.1f", 7, text.c_str(), 42, 2.25);
    EXPECT_EQ(trace.Bytes().substr(28), "CFile_: Apply 7 [" + text + "] 42%   2.2\r\n");
}

// Each case: the text traced, the bytes it leaves, the substitution pair in force and whether
// SetSubstitution refuses it.
TEST_F(TraceLogTest, LinesOfTheCaseFile) {
    g_TraceLog.timestamps = false;
    for (const pextest::Case& c : pextest::ReadCases("diag/cases/trace_lines.txt")) {
        SCOPED_TRACE(c.where);
        trace.Clear();
        EXPECT_EQ(g_TraceLog.SetSubstitution(c[2], c[3]), c[4] != "refused");
        TRACE(g_TraceLog, "%s", pextest::Unescape(c[0]).c_str());
        EXPECT_EQ(trace.Bytes(), pextest::Unescape(c[1]));
    }
    trace.Clear();
    TRACE(g_TraceLog, "%s", "");
    g_TraceLog.ensureNewline = false;  // then a line ends as the caller ends it
    TRACE(g_TraceLog, "no end");
    EXPECT_EQ(trace.Bytes(), "\r\nno end");
}

TEST_F(TraceLogTest, AppendsWhileAnotherProgramHoldsTheFileShared) {
    plat::CFile other;
    ASSERT_TRUE(other.Open(trace.Path(), plat::CFile::modeCreate | plat::CFile::modeReadWrite |
                                             plat::CFile::shareDenyNone));
    other.Write("other\r\n", 7);
    TRACE(g_TraceLog, "one");
    TRACE(g_TraceLog, "two");
    EXPECT_EQ(trace.Lines(), (Lines{"other", "one", "two"}));
}

TEST_F(TraceLogTest, FileThatCannotBeOpenedSwitchesFileOutputOff) {
    auto holder = std::make_unique<plat::CFile>();
    ASSERT_TRUE(holder->Open(trace.Path(), plat::CFile::modeCreate | plat::CFile::modeWrite |
                                               plat::CFile::shareExclusive));
    TRACE(g_TraceLog, "lost");
    EXPECT_FALSE(g_TraceLog.fileOutput);
    holder.reset();
    TRACE(g_TraceLog, "also lost: the rest of the run writes nowhere");
    EXPECT_EQ(trace.Bytes(), "");

    // The next run tries the file again (run_guard_test); a log switched off on purpose stays off.
    g_TraceLog.ResumeFileOutput();
    EXPECT_TRUE(g_TraceLog.fileOutput);
    g_TraceLog.fileOutput = false;
    g_TraceLog.ResumeFileOutput();
    EXPECT_FALSE(g_TraceLog.fileOutput);
}

// A line goes out in one write, so a failed write loses that line whole, never a part of it.
TEST_F(TraceLogTest, FailedWriteDropsThatLineOnly) {
    g_TraceLog.timestamps = false;
    TRACE(g_TraceLog, "first");
    plat::fault::FailNth(plat::fault::Op::Write, 1, plat::kErrorDiskFull);
    TRACE(g_TraceLog, "dropped\nwhole");
    TRACE(g_TraceLog, "next");
    EXPECT_EQ(trace.Bytes(), "first\r\nnext\r\n");
}

// The log's host path is mapped once; a folder spelled otherwise since then fails the open,
// which maps the path again instead of losing the log.
TEST_F(TraceLogTest, FolderMadeAgainInAnotherCaseIsFoundAfterAFailedOpen) {
    TraceLog log("C:\\Logs\\run.log");
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\LOGS"));
    TRACE(log, "before");
    ASSERT_TRUE(plat::files::Remove("C:\\Logs\\run.log"));
    ASSERT_TRUE(plat::files::RemoveDirectory("C:\\LOGS"));
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\logs"));
    TRACE(log, "after");
    EXPECT_TRUE(log.fileOutput);
    EXPECT_EQ(pextest::TraceLines(m.ReadFile("C:\\logs\\run.log")), Lines{"after"});
}

// A burst holds the file open between its lines. On the emulated machine the share lock is
// let go between them, as it was before a line held it: a reader that denies writers gets in,
// and the line that meets it is dropped. Windows refuses that reader while the burst's handle
// is open for writing.
TEST_F(TraceLogTest, BurstHoldsTheFileButLetsOtherOpenersInBetweenItsLines) {
    g_TraceLog.keepOpen = true;
    TRACE(g_TraceLog, "burst 1");
    EXPECT_TRUE(g_TraceLog.IsOpen());
#ifndef _WIN32
    plat::CFile reader;
    ASSERT_TRUE(reader.Open(trace.Path(), plat::CFile::modeRead | plat::CFile::shareDenyWrite));
    TRACE(g_TraceLog, "dropped");
    reader.Close();
#endif
    TRACE(g_TraceLog, "burst 2");
    g_TraceLog.keepOpen = false;
    EXPECT_TRUE(g_TraceLog.IsOpen());
    TRACE(g_TraceLog, "after");
    EXPECT_FALSE(g_TraceLog.IsOpen());
    EXPECT_EQ(trace.Lines(), (Lines{"burst 1", "burst 2", "after"}));
}

// Start-up configuration, on a log of its own as the library's start-up uses it. The rotation
// of the previous log, also when its backup cannot be written, is the golden runs'
// (log_backup_refused, host_calls_twice).
TEST(TraceStartupTest, CreatesTheLogFolderWithItsParentsAndInstallsTheSubstitution) {
    pextest::TestMachine m;
    TraceLog log;
    ConfigureTraceLog(log, "C:\\Deep\\Er\\Mendler.dll");
    EXPECT_EQ(log.FileName(), "C:\\Deep\\Er\\log\\pex_support_mendler.log");
    EXPECT_TRUE(log.fileOutput);
    EXPECT_FALSE(log.keepOpen);
    TRACE(log, "ProgID: [%s.Agent]", kTraceHiddenWord);
    EXPECT_EQ(pextest::TraceLines(m.ReadFile(log.FileName())),
              Lines{"ProgID: [" + std::string(kTraceHiddenWordToken) + ".Agent]"});

    // Without a usable module path the log is at the drive's root.
    for (const std::string& module : {std::string(), "C:\\" + std::string(1100, 'a') + "\\Mendler.dll"}) {
        ConfigureTraceLog(log, module);
        EXPECT_EQ(log.FileName(), "c:\\log.log");
    }
}

}  // namespace
