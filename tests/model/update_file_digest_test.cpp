// CFile_ with a recorded SHA-256 digest: what counts as no digest, and the digests that fail
// Apply before the target is touched (malformed, unreadable download, kept by copies).
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "model/update_file.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

constexpr char kDownload[] = "C:\\Cache\\a.dll";
constexpr char kTarget[] = "C:\\App\\a.dll";
// The digest of "new".
constexpr char kNewDigest[] = "11507a0e2f5e69d5dfa40a62a1bd7b6ee57e6bcd85c67c9b8431b36fff21c437";

class UpdateFileDigest : public ::testing::Test {
protected:
    void SetUp() override {
        machine.WriteFile(kDownload, "new");
        machine.WriteFile(kTarget, "old");
    }
    static CFile_ Make(const std::string& digest) {
        CFile_ file(3, true, false, "C:\\App", "a.dll", kDownload, "", "", false, 0);
        file.SetExpectedSha256(digest);
        return file;
    }
    // Apply fails, leaves the target and the download as they were and backs nothing up.
    void ExpectRefused(CFile_ file) {
        EXPECT_EQ(file.Apply(), CFile_::kNotApplied);
        EXPECT_EQ(machine.ReadFile(kTarget), "old");
        EXPECT_FALSE(plat::files::Exists(std::string(kTarget) + ".$bak$"));
        EXPECT_FALSE(trace.Contains("CFile_: Backup successful..."));
        EXPECT_TRUE(file.Rollback());
        EXPECT_EQ(machine.ReadFile(kTarget), "old");
    }

    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(UpdateFileDigest, NoDigestOrOnlyBlanksInstallsWithoutReadingTheDownload) {
    for (const char* none : {"", " ", " \t "}) {
        machine.WriteFile(kTarget, "old");
        trace.Clear();
        CFile_ file = Make(none);
        EXPECT_EQ(file.Apply(), CFile_::kApplied);
        EXPECT_EQ(machine.ReadFile(kTarget), "new");
        for (const std::string& line : trace.Lines()) EXPECT_EQ(line.find("Sha256"), std::string::npos) << line;
        EXPECT_TRUE(file.RemoveBackupFile());
    }
}

TEST_F(UpdateFileDigest, ADigestAmongBlanksIsTrimmed) {
    CFile_ file = Make(std::string("  ") + kNewDigest + "\t");
    EXPECT_EQ(file.Apply(), CFile_::kApplied);
    EXPECT_EQ(machine.ReadFile(kTarget), "new");
    EXPECT_TRUE(trace.Contains("CFile_: Sha256 of download (C:\\Cache\\a.dll) matches"));
}

TEST_F(UpdateFileDigest, ACellThatIsNoDigestIsAMismatch) {
    const std::string digest = kNewDigest;
    for (const std::string& cell : std::vector<std::string>{digest.substr(1), digest + "0", digest.substr(1) + "g", "yes"}) {
        trace.Clear();
        ExpectRefused(Make(cell));
        EXPECT_TRUE(trace.Contains("CFile_: Sha256 '" + cell +
                                   "' of file 'a.dll' is not 64 hexadecimal digits, not applying"))
            << cell;
    }
}

// A download that cannot be read is not copied either: the setup service never sees it.
TEST_F(UpdateFileDigest, AnUnreadableDownloadIsAMismatch) {
    ASSERT_TRUE(plat::files::Remove(kDownload));
    ExpectRefused(Make(kNewDigest));
    EXPECT_TRUE(trace.Contains("CFile_: Unable to read (C:\\Cache\\a.dll) for its Sha256, GetLastError returns 2"));
    EXPECT_EQ(trace.Text().find("SetupAPI"), std::string::npos);
}

// Groups hold copies: the digest goes with them.
TEST_F(UpdateFileDigest, ACopyChecksTheSameDigest) {
    const CFile_ original = Make(std::string(64, 'a'));
    ExpectRefused(CFile_(original));
    EXPECT_TRUE(trace.Contains("CFile_: Sha256 mismatch for file 'a.dll', expected " + std::string(64, 'a') +
                               ", download (C:\\Cache\\a.dll) has " + kNewDigest));
}

}  // namespace
