// The power-cut model and the platform's flushes, one operation at a time: a forked child makes
// some changes and the power is cut after them; the machine must then hold exactly what was
// made durable (the files before and after each cut are in cases/power_cut_rules.txt). The
// whole-run sweep is crash_sweep_test.cpp.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <unistd.h>

#include <climits>
#include <functional>
#include <set>

#include "platform/cfile.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "platform/paths.h"
#include "platform/power_cut.h"
#include "platform/setup_install.h"
#include "tests/crash/child_run.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"

namespace {

namespace files = plat::files;

// The files of each scenario before and after its cut: lines of "scenario | before or after |
// Windows path | bytes" (through Unescape; "(empty)" is a file without bytes, "(missing)" none).
constexpr char kCases[] = "crash/cases/power_cut_rules.txt";

std::string Bytes(const std::string& field) { return field == "(empty)" ? "" : pextest::Unescape(field); }

class PowerCutRules : public ::testing::Test {
protected:
    // In a child: the state is kept from now on, the steps run, and the power is cut at the next
    // mutating operation after them. True when the cut happened.
    bool CutAfter(const std::function<void()>& steps, unsigned keepSeed = 0) {
        plat::machine::SetRoot(machine.Root());  // the child must not share the registry connection
        const pextest::ChildRun run = pextest::RunInChild([&] {
            plat::fault::Clear();
            plat::fault::PowerCutAtMutation(INT_MAX, keepSeed);
            steps();
            plat::fault::PowerCutAtMutation(plat::fault::MutationCount() + 1, keepSeed);
            files::Remove("C:\\nothing to remove");
        });
        return run.crashed;
    }

    static void Write(const std::string& path, const std::string& bytes, unsigned mode, bool flush) {
        plat::CFile file;
        if (!file.Open(path, mode | plat::CFile::modeWrite | plat::CFile::shareExclusive)) return;
        file.Write(bytes.data(), static_cast<std::uint32_t>(bytes.size()));
        if (flush) file.Flush();
    }

    std::string Host(const std::string& winPath) const { return plat::paths::ToHost(winPath); }

    void PlaceFiles(const std::string& scenario) const {
        for (const pextest::Case& c : pextest::ReadCases(kCases))
            if (c[0] == scenario && c[1] == "before") machine.WriteFile(c[2], Bytes(c[3]));
    }
    void ExpectFiles(const std::string& scenario) const {
        for (const pextest::Case& c : pextest::ReadCases(kCases)) {
            if (c[0] != scenario || c[1] != "after") continue;
            SCOPED_TRACE(c.where);
            EXPECT_EQ(files::Exists(c[2]) ? machine.ReadFile(c[2]) : "(missing)", c[3] == "(missing)" ? c[3] : Bytes(c[3]));
        }
    }

    pextest::TestMachine machine;
};

TEST_F(PowerCutRules, BytesSurviveTheirFlushAndNamesTheirFolderFlush) {
    PlaceFiles("flushes");
    ASSERT_TRUE(CutAfter([&] {
        Write("C:\\d\\unflushed.txt", "new", plat::CFile::modeNoTruncate, false);
        Write("C:\\d\\flushed.txt", "new", plat::CFile::modeNoTruncate, true);
        // Host calls, which report nothing: the names change but no folder is flushed.
        rename(Host("C:\\d\\renamed.txt").c_str(), Host("C:\\d\\moved.txt").c_str());
        const int fd = open(Host("C:\\d\\lost.txt").c_str(), O_WRONLY | O_CREAT, 0644);
        plat::power::FileFlushed(fd);
        close(fd);
        const int empty = open(Host("C:\\f\\empty.txt").c_str(), O_WRONLY | O_CREAT, 0644);
        if (write(empty, "unflushed", 9) != 9) return;
        plat::power::FolderFlushed(Host("C:\\f"));  // not the other folder
        close(empty);
    }));
    ExpectFiles("flushes");
}

TEST_F(PowerCutRules, WhatThePlatformReportsDoneSurvivesACut) {
    PlaceFiles("reported");
    ASSERT_TRUE(CutAfter([] {
        // First, so that its folder flush (which it always made) covers none of the others.
        files::CopyToKeep("C:\\d\\source.txt", "C:\\d\\kept.txt");
        files::Copy("C:\\d\\source.txt", "C:\\d\\copy.txt", false);
        files::WriteAllDurably("C:\\d\\rewritten.txt", "new");
        files::WriteAllDurably("C:\\d\\rewritten.txt", "newer");  // through the kept previous version
        files::WriteAllDurably("C:\\d\\rewritten.txt", "newest");
        files::WriteAllDurably("C:\\d\\written.txt", "new");
        files::Rename("C:\\e\\moving.txt", "C:\\d\\moved.txt", false);
        files::Remove("C:\\d\\gone.txt");
        files::MakeDirectory("C:\\d\\sub");
        files::Copy("C:\\d\\source.txt", "C:\\d\\sub\\copy.txt", false);
        Write("C:\\d\\created.txt", "created", plat::CFile::modeCreate, true);
    }));
    ExpectFiles("reported");
}

TEST_F(PowerCutRules, ABatchMakesItsCopiesAndDeletionsDurableWhenItEnds) {
    PlaceFiles("batch");
    ASSERT_TRUE(CutAfter([] {
        {
            files::FolderFlushBatch ended;
            files::Copy("C:\\d\\source.txt", "C:\\d\\copy.txt", false);
            files::Remove("C:\\d\\gone.txt");
        }
        new files::FolderFlushBatch();  // still open at the cut (the child ends there)
        files::CopyToKeep("C:\\e\\target.txt", "C:\\e\\kept.txt");
        files::Copy("C:\\d\\source.txt", "C:\\f\\pending.txt", false);
        files::Remove("C:\\f\\gone.txt");
    }));
    ExpectFiles("batch");
}

TEST_F(PowerCutRules, AFileStagedForTheRestartSurvivesWithTheQueue) {
    PlaceFiles("restart");
    ASSERT_TRUE(CutAfter([] {
        plat::CFile holder;  // the target in use
        holder.Open("C:\\d\\busy.dll", plat::CFile::modeRead | plat::CFile::shareExclusive);
        bool inUse = false;
        plat::setup::InstallFile("C:\\d\\new.dll", "C:\\d\\busy.dll",
                                 plat::setup::kCopySourceAbsolute | plat::setup::kCopyInUseNeedsReboot, &inUse);
    }));
    std::vector<plat::setup::PendingRename> queue;
    ASSERT_TRUE(plat::setup::ReadPendingRenames(&queue));
    ASSERT_EQ(queue.size(), 1u);
    EXPECT_EQ(machine.ReadFile(queue[0].from), "version 2");
}

// A seed keeps each unflushed change whole or not at all, the same ones each time.
TEST_F(PowerCutRules, ASeedKeepsTheSameSubsetOfTheUnflushedChanges) {
    static constexpr int kFiles = 12;
    for (int i = 0; i < kFiles; ++i) machine.WriteFile("C:\\d\\" + std::to_string(i), "old");
    auto outcome = [&](unsigned seed) {
        std::string kept;
        for (int i = 0; i < kFiles; ++i) machine.WriteFile("C:\\d\\" + std::to_string(i), "old");
        EXPECT_TRUE(CutAfter([] {
            for (int i = 0; i < kFiles; ++i)
                Write("C:\\d\\" + std::to_string(i), "new bytes", plat::CFile::modeNoTruncate, false);
        }, seed));
        for (int i = 0; i < kFiles; ++i) {
            const std::string bytes = machine.ReadFile("C:\\d\\" + std::to_string(i));
            EXPECT_TRUE(bytes == "old" || bytes == "new bytes") << bytes;
            kept += bytes == "old" ? '-' : '+';
        }
        return kept;
    };
    const std::string first = outcome(7);
    EXPECT_EQ(outcome(7), first);
    EXPECT_NE(first.find('+'), std::string::npos) << first;
    EXPECT_NE(first.find('-'), std::string::npos) << first;
    EXPECT_EQ(outcome(0), std::string(kFiles, '-'));
}

}  // namespace
