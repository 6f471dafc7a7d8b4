// What a run may touch of what it finds on the machine: only what the product's journal names.
// Files that merely look like an earlier run's leftovers (a download that is the installed
// file, a backup beside a target that already holds the new bytes) are never deleted or taken
// over, and a journal left by an interrupted run is carried out to the letter.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "model/run_journal.h"
#include "platform/files.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/support/case_file.h"
#include "tests/support/machine_files.h"

using pextest::ContentRow;

namespace {

constexpr char kCases[] = "pipeline/cases/journal_recovery.txt";

class JournalRecovery : public pextest::PipelineTest {
protected:
    std::int32_t Run() {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
    }
};

TEST_F(JournalRecovery, FilesThatLookLikeLeftoversAreNeverTouched) {
    pextest::PlaceFiles(machine, kCases, "look-alikes");
    ContentRow skipped = Row("a.dll", "unused");
    skipped["UpgradeStatus"] = "Skipped";
    skipped["DownLoadCacheFile"] = "C:\\App\\a.dll";
    ContentRow applied = Row("b.dll", "new b");
    applied["UpgradeStatus"] = "AppliedSuccessfully";
    Publish({skipped, applied, Row("c.dll", "new c")});
    EXPECT_EQ(Run(), 0);
    pextest::ExpectFiles(machine, kCases, "look-alikes");
}

// An interrupted run's journal is carried out to the letter: a row it had replaced and not
// committed gets its previous version back (with its read-only attribute) before it is applied
// again; a row it had committed loses its backup and download, but never a download that is its
// installed file; a settled row, a torn last record and files it does not name are left alone.
TEST_F(JournalRecovery, AnInterruptedRunIsFinishedOrUndoneAsItsJournalSays) {
    pextest::PlaceFiles(machine, kCases, "journal");
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\a.dll", plat::files::kAttrReadOnly));
    ContentRow a = Row("a.dll", "new a", "G");
    a["Command"] = "[RUN]nosuchprogram.exe";  // so that the run ends with a's previous version in place
    ContentRow b = Row("b.dll", "new b");
    b["UpgradeStatus"] = "AppliedSuccessfully";
    Publish({a, b});
    std::string journal;
    for (const pextest::Case& c : pextest::ReadCases(kCases))
        if (c[1] == "record") journal += (journal.empty() ? "" : "\n") + c[2];
    machine.WriteFile(CRunJournal::NameFor(kContent), journal);
    EXPECT_EQ(Run(), 1);
    pextest::ExpectFiles(machine, kCases, "journal");
    EXPECT_NE(plat::files::GetAttributes("C:\\App\\a.dll") & plat::files::kAttrReadOnly, 0u);
    EXPECT_FALSE(plat::files::Exists(CRunJournal::NameFor(kContent)));
}

}  // namespace
