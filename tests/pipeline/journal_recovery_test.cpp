// What a run may touch of what it finds on the machine: only what the product's journal names.
// Files that merely look like an earlier run's leftovers (a download that is the installed
// file, a backup beside a target that already holds the new bytes) are never deleted or taken
// over, and a journal left by an interrupted run is carried out to the letter.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "model/run_journal.h"
#include "platform/files.h"
#include "tests/pipeline/pipeline_fixture.h"

using pextest::ContentRow;

namespace {

class JournalRecovery : public pextest::PipelineTest {
protected:
    std::int32_t Run() {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
    }
    std::string Read(const std::string& path) const { return machine.ReadFile(path); }
    static bool Exists(const std::string& path) { return plat::files::Exists(path); }
    void WriteJournal(const std::string& records) const { machine.WriteFile(CRunJournal::NameFor(kContent), records); }
};

TEST_F(JournalRecovery, FilesThatLookLikeLeftoversAreNeverTouched) {
    // A row read as applied whose download is the installed file itself.
    machine.WriteFile("C:\\App\\a.dll", "installed a");
    ContentRow skipped = Row("a.dll", "unused");
    skipped["UpgradeStatus"] = "Skipped";
    skipped["DownLoadCacheFile"] = "C:\\App\\a.dll";
    // An applied row whose download holds what its target holds, beside a backup that some other
    // row keeps.
    machine.WriteFile("C:\\App\\b.dll", "new b");
    machine.WriteFile("C:\\App\\b.dll.$bak$", "old b, kept");
    ContentRow applied = Row("b.dll", "new b");
    applied["UpgradeStatus"] = "AppliedSuccessfully";
    Publish({skipped, applied, Row("c.dll", "new c")});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Read("C:\\App\\a.dll"), "installed a");
    EXPECT_EQ(Read("C:\\App\\b.dll.$bak$"), "old b, kept");
    EXPECT_EQ(Read("C:\\App\\c.dll"), "new c");
}

// An interrupted run's journal: a row it had replaced and not committed gets its previous
// version back (with its read-only attribute) before it is applied again; a row it had
// committed loses its backup and download, but never a download that is its installed file; a
// settled row, a torn last record and files it does not name are left alone.
TEST_F(JournalRecovery, AnInterruptedRunIsFinishedOrUndoneAsItsJournalSays) {
    machine.WriteFile("C:\\App\\a.dll", "new a");
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\a.dll", plat::files::kAttrReadOnly));
    machine.WriteFile("C:\\App\\a.dll.$bak$", "old a");
    machine.WriteFile("C:\\App\\b.dll", "new b");
    machine.WriteFile("C:\\App\\b.dll.$bak$", "old b");
    machine.WriteFile("C:\\App\\c.dll.$bak$", "settled");
    machine.WriteFile("C:\\App\\d.dll", "d, its own download");
    machine.WriteFile("C:\\App\\e.dll.$bak$", "not named");
    ContentRow a = Row("a.dll", "new a", "G");
    a["Command"] = "[RUN]nosuchprogram.exe";  // so that the run ends with a's previous version in place
    ContentRow b = Row("b.dll", "new b");
    b["UpgradeStatus"] = "AppliedSuccessfully";
    Publish({a, b});
    WriteJournal("B|0|C:\\Pex\\cache\\a.dll.new|C:\\App\\a.dll|C:\\App\\a.dll.$bak$|1|0|0|0\n"
                 "R|0|C:\\Pex\\cache\\a.dll.new|C:\\App\\a.dll|C:\\App\\a.dll.$bak$\n"
                 "B|1|C:\\Pex\\cache\\b.dll.new|C:\\App\\b.dll|C:\\App\\b.dll.$bak$|0|0|0|0\n"
                 "R|1|C:\\Pex\\cache\\b.dll.new|C:\\App\\b.dll|C:\\App\\b.dll.$bak$\n"
                 "B|2|C:\\Pex\\cache\\c.dll.new|C:\\App\\c.dll|C:\\App\\c.dll.$bak$|0|0|0|0\n"
                 "U|2\n"
                 "R|3|C:\\App\\d.dll|C:\\App\\d.dll|\n"
                 "C|3\n"
                 "B|4|C:\\Pex\\cache\\e.dll.new|C:\\App\\e.dll|C:\\App\\e.dll.$bak$|0|0|0|0");
    EXPECT_EQ(Run(), 1);
    EXPECT_EQ(Read("C:\\App\\a.dll"), "old a");
    EXPECT_NE(plat::files::GetAttributes("C:\\App\\a.dll") & plat::files::kAttrReadOnly, 0u);
    EXPECT_FALSE(Exists("C:\\App\\a.dll.$bak$"));
    EXPECT_EQ(Read("C:\\App\\b.dll"), "new b");
    EXPECT_FALSE(Exists("C:\\App\\b.dll.$bak$") || Exists("C:\\Pex\\cache\\b.dll.new"));
    EXPECT_EQ(Read("C:\\App\\c.dll.$bak$"), "settled");
    EXPECT_EQ(Read("C:\\App\\d.dll"), "d, its own download");
    EXPECT_EQ(Read("C:\\App\\e.dll.$bak$"), "not named");
    EXPECT_FALSE(Exists(CRunJournal::NameFor(kContent)));
}

}  // namespace
