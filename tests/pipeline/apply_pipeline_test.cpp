// End-to-end runs of one product: the content file on the emulated machine, the files installed,
// the statuses recorded and the trace written.
#include <gtest/gtest.h>

#include <zlib.h>

#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/cfile.h"
#include "platform/files.h"
#include "platform/setup_install.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/rivzip/memory_streams.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_registry.h"

namespace reg = plat::reg;
using pextest::ContentRow;

namespace {

std::int32_t g_steps = 0, g_total = 0;
bool CountSteps(CProgressData* p) {
    g_total = p->TotalSteps;
    g_steps = p->CurrentStep;
    return true;
}

std::string Deflate(const std::string& bytes) {
    uLongf size = compressBound(static_cast<uLong>(bytes.size()));
    std::string out(size, '\0');
    compress2(reinterpret_cast<Bytef*>(out.data()), &size, reinterpret_cast<const Bytef*>(bytes.data()),
              static_cast<uLong>(bytes.size()), 9);
    out.resize(size);
    return out;
}

std::string Szdd(const std::string& bytes) {
    const auto packed = rivziptest::Compress(rivziptest::Bytes(bytes.begin(), bytes.end()));
    return std::string(packed.begin(), packed.end());
}

class ApplyPipeline : public pextest::PipelineTest {
protected:
    std::int32_t Run(ProgressCallback callback = nullptr) {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(kProduct), callback);
    }
};

TEST_F(ApplyPipeline, CompleteSuccessInstallsEverythingAndLeavesNothingBehind) {
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Fetch", "Capabilities", "ZLIB;LZW");
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Disk", "Capabilities", "LZW;None");
    machine.WriteFile("C:\\App\\plain.txt", "old plain");
    ContentRow plain = Row("plain.txt", "new plain");
    plain["UpdateDate"] = "2003-12-31 22:30:00.25";
    ContentRow zipped = Row("zipped.dll", Deflate("zlib payload"));
    zipped["InterestedParties"] = "Fetch";
    zipped["NeedsDecompression"] = "1";
    ContentRow packed = Row("packed.exe", Szdd("szdd payload, szdd payload"));
    packed["InterestedParties"] = "Fetch;Disk";
    packed["NeedsDecompression"] = "1";
    Publish({plain, zipped, packed});

    const std::int32_t before = g_ProgressData.CurrentStep;
    EXPECT_EQ(Run(&CountSteps), 0);
    EXPECT_EQ(g_total, 6);                // 1 + 2 + 2 work steps, plus the cleanup
    EXPECT_EQ(g_steps - before, g_total);  // a full run reaches the total exactly
    EXPECT_EQ(Installed("plain.txt"), "new plain");
    EXPECT_EQ(Installed("zipped.dll"), "zlib payload");
    EXPECT_EQ(Installed("packed.exe"), "szdd payload, szdd payload");
    plat::files::FileStatus status;
    ASSERT_TRUE(plat::files::GetStatus("C:\\App\\plain.txt", &status));
    EXPECT_EQ(status.lastWrite, 127173834000000000ull);  // 2003-12-31 22:30:00, the text as UTC
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_FALSE(ContentEntriesPresent());
    EXPECT_FALSE(plat::files::Exists("C:\\App\\plain.txt.$bak$"));
    EXPECT_TRUE(plat::files::Find("C:\\Pex\\cache\\*").empty());
}

TEST_F(ApplyPipeline, AnEmptyMasterListIsACompleteSuccess) {
    Publish({});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Count("CManifestParser:  Application loop....."), 1);
    EXPECT_FALSE(plat::files::Exists(kContent));
}

TEST_F(ApplyPipeline, ADependentGroupThatSortsFirstWaitsOnePass) {
    Publish({Row("app.exe", "app", "App", "Runtime"), Row("rt.dll", "rt", "Runtime")});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Count("allowing retry..."), 1);
    EXPECT_EQ(Count("CManifestParser:  Application loop....."), 2);
    EXPECT_EQ(Installed("app.exe"), "app");
    EXPECT_EQ(Installed("rt.dll"), "rt");
}

TEST_F(ApplyPipeline, AGroupThatCanNeverApplyIsGivenUpAndKept) {
    Publish({Row("self.dll", "self", "Loop", "loop"), Row("other.dll", "other")});
    EXPECT_EQ(Run(), 1);
    EXPECT_EQ(Count("retry threshold exceeded, giving up on 'LOOP'"), 1);
    EXPECT_EQ(Count("allowing retry..."), 2);  // deferred as often as files were added
    EXPECT_EQ(Installed("other.dll"), "other");
    EXPECT_EQ(Installed("self.dll"), "");
    // The content file stays, so the next run offers the group again.
    EXPECT_EQ(Cell(0, "UpgradeStatus"), "Downloaded");
    EXPECT_EQ(Cell(1, "UpgradeStatus"), "AppliedSuccessfully");
    EXPECT_TRUE(ContentEntriesPresent());
}

TEST_F(ApplyPipeline, AFailingMemberRollsTheWholeGroupBack) {
    machine.WriteFile("C:\\App\\one.dll", "old one");
    machine.WriteFile("C:\\App\\two.dll", "old two");
    ContentRow two = Row("two.dll", "new two", "G");
    two["Command"] = "[RUN]nosuchprogram.exe";
    Publish({Row("one.dll", "new one", "G"), two, Row("three.dll", "new three", "G")});
    EXPECT_EQ(Run(), 1);
    EXPECT_EQ(Installed("one.dll"), "old one");
    EXPECT_EQ(Installed("two.dll"), "old two");  // its commands failed after the copy: undone too
    EXPECT_EQ(Installed("three.dll"), "");
    EXPECT_EQ(Count("CManifestParser: considering applying file 'three.dll'"), 0);
    EXPECT_EQ(Cell(0, "UpgradeStatus"), "Downloaded");  // undone, so offered again
    EXPECT_EQ(Cell(1, "UpgradeStatus"), "ApplicationFailed");
    EXPECT_EQ(Cell(2, "UpgradeStatus"), "Downloaded");
    EXPECT_FALSE(plat::files::Exists("C:\\App\\one.dll.$bak$"));
    EXPECT_TRUE(plat::files::Exists("C:\\Pex\\cache\\one.dll.new"));  // downloads kept for the next run
}

// A host may drive several products with one parser and fill its special-file list once: each
// run starts with nothing of the one before, so a group that failed for the first product is
// neither applied again nor recorded in the second product's content file.
TEST_F(ApplyPipeline, OneParserRunsSeveralProductsEachOnItsOwn) {
    const std::string otherContent = "C:\\Pex\\Orlandel_content.txt";
    ContentRow failing = Row("failing.dll", "f", "G");
    failing["Command"] = "[RUN]nosuchprogram.exe";
    Publish({Row("Zendor32.exe", "host"), failing});
    CManifestParser parser;
    parser.AddToSpecialList("zendor32.exe");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 1);
    EXPECT_TRUE(parser.WasSpecialFileUpdateAttempted());
    const std::string firstContent = machine.ReadFile(kContent);

    Publish({Row("other.dll", "other")}, "", "Orlandel", otherContent);
    machine.WriteFile("C:\\App\\Zendor32.exe", "changed since");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Orlandel"), nullptr), 0);
    EXPECT_FALSE(parser.WasSpecialFileUpdateAttempted());
    EXPECT_EQ(parser.SpecialFiles().count("ZENDOR32.EXE"), 1u);
    EXPECT_EQ(Installed("other.dll"), "other");
    EXPECT_EQ(Installed("Zendor32.exe"), "changed since");
    EXPECT_EQ(Count("CManifestParser: considering applying file 'failing.dll'"), 1);
    EXPECT_FALSE(plat::files::Exists(otherContent));
    EXPECT_EQ(machine.ReadFile(kContent), firstContent);
}

TEST_F(ApplyPipeline, MandatoryOnlyTakesForcedRowsThatCannotBeSnoozed) {
    ContentRow forced = Row("forced.dll", "f");
    forced["Force Download"] = "1";
    ContentRow snoozable = Row("snooze.dll", "s");
    snoozable["Force Download"] = "1";
    snoozable["Snoozable"] = "1";
    ContentRow scripted = Row("script.dll", "x");
    scripted["DynamicFieldInfo"] = "FORCED = TRUE";
    Publish({forced, snoozable, scripted, Row("optional.dll", "o")}, "MandatoryOnly");
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Installed("forced.dll"), "f");
    EXPECT_EQ(Installed("script.dll"), "x");
    EXPECT_EQ(Installed("snooze.dll"), "");
    EXPECT_EQ(Installed("optional.dll"), "");
}

// The running program may read its file, not have it replaced: the copy goes to the restart
// queue, and the file does not count as applied, so its commands do not run.
TEST_F(ApplyPipeline, ATargetInUseIsQueuedForTheRestart) {
    PEX_NOT_UNDER_WINE(pextest::kWineSetupApi);
    machine.WriteFile("C:\\App\\busy.exe", "running version");
    machine.WriteFile("C:\\App\\marker.txt", "x");
    ContentRow busy = Row("busy.exe", "next version");
    busy["Command"] = "[DEL] marker.txt";
    Publish({busy});
    {
        plat::CFile running;
        ASSERT_TRUE(running.Open("C:\\App\\busy.exe", plat::CFile::modeRead | plat::CFile::shareDenyWrite));
        EXPECT_EQ(Run(), 1);
    }
    EXPECT_EQ(Installed("busy.exe"), "running version");
    EXPECT_EQ(Installed("marker.txt"), "x");
    EXPECT_EQ(Cell(0, "UpgradeStatus"), "ApplicationFailed");
    EXPECT_TRUE(trace.Contains("CFile_: Copy not successfull, reason code is 32, source was "
                               "(C:\\Pex\\cache\\busy.exe.new), target was (C:\\App\\busy.exe), retrying with SetupAPI"));
    EXPECT_TRUE(trace.Contains("CFile_: SetupInstallFileEx succeeded, but the file was in use.  It has been queued "
                               "to be installed on the next system reboot."));
    std::vector<plat::setup::RenameOutcome> outcomes;
    EXPECT_TRUE(plat::setup::CarryOutPendingRenames(&outcomes));  // what `pexupdate boot` does
    EXPECT_EQ(Installed("busy.exe"), "next version");
}

TEST_F(ApplyPipeline, AReadOnlyTargetIsReplaced) {
    machine.WriteFile("C:\\App\\locked.ini", "old");
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\locked.ini", plat::files::kAttrReadOnly));
    Publish({Row("locked.ini", "new")});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Installed("locked.ini"), "new");
    EXPECT_FALSE(plat::files::Exists("C:\\App\\locked.ini.$bak$"));
}

// A read-only download is removed like any other; one that another program holds is left with a
// trace line, and neither keeps the content file of a complete success or the progress short.
TEST_F(ApplyPipeline, DownloadsThatResistRemovalDoNotKeepTheContentFile) {
    Publish({Row("ro.dll", "read-only download"), Row("held.dll", "held download")});
    ASSERT_TRUE(plat::files::SetAttributes("C:\\Pex\\cache\\ro.dll.new", plat::files::kAttrReadOnly));
    plat::CFile holder;
    ASSERT_TRUE(holder.Open("C:\\Pex\\cache\\held.dll.new", plat::CFile::modeRead | plat::CFile::shareDenyWrite));
    const std::int32_t before = g_ProgressData.CurrentStep;
    EXPECT_EQ(Run(&CountSteps), 0);
    EXPECT_EQ(g_steps - before, g_total);
    EXPECT_FALSE(plat::files::Exists("C:\\Pex\\cache\\ro.dll.new"));
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, unable to remove download "
                               "'C:\\Pex\\cache\\held.dll.new', left in place"));
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_FALSE(ContentEntriesPresent());
}

TEST_F(ApplyPipeline, ASpecialFileResetsTheHostsSchedule) {
    const std::string key = "Software\\Vantric\\Zendor32\\MatrixUpdates";
    pextest::SetRegText(reg::kLocalMachine, key, "NextDate", "12/31/2026");
    Publish({Row("Zendor32.EXE", "host"), Row("later.dll", "later")});
    UpdateAll(nullptr);
    std::string bytes;
    ASSERT_TRUE(pextest::GetRegValue(reg::kLocalMachine, key, "NextDate", &bytes));
    EXPECT_EQ(bytes, "");
}

}  // namespace
