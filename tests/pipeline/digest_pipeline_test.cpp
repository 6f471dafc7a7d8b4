// The "Sha256" column end to end: downloads that match their digest install, whatever the case
// of its letters and after expansion; one that does not fails its row and rolls its group back
// without touching its target.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "platform/files.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/rivzip/memory_streams.h"

using pextest::ContentRow;

namespace {

// Digests of the bytes that the rows below install.
constexpr char kNewOne[] = "20a96de1d7f9c25045cc7e54a249e23a8129c6ad5bb98888895e28be303334e6";
constexpr char kNewBad[] = "2cc3e078eafde9f02c465af59b47bc8f42a4c6465118ccf3197bc94dd6569b10";
constexpr char kTruncated[] = "227b1c2e53cfd4a3dc1cc26c83b9c4fccef2130f905aef3123fdc3dc2c9e4df6";
constexpr char kUpperInUpperCase[] = "AEE610558292023758A4229DDCF75F167C9904313A83CF795232ED7F7E2131C9";
constexpr char kSzddPayload[] = "5361e6a88b42ab58ec0066a63c955151e7bb12ad9aee3c4dbecdc0039676ed6c";

class DigestPipeline : public pextest::PipelineTest {
protected:
    std::int32_t Run() {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
    }
    ContentRow Checked(const std::string& fileName, const std::string& bytes, const std::string& digest,
                       const std::string& group = "") {
        ContentRow row = Row(fileName, bytes, group);
        row["Sha256"] = digest;
        return row;
    }
};

TEST_F(DigestPipeline, DownloadsMatchingTheirDigestInEitherCaseInstall) {
    machine.WriteFile("C:\\App\\one.dll", "old one");
    Publish({Checked("one.dll", "new one", kNewOne), Checked("upper.dll", "upper", kUpperInUpperCase),
             Row("plain.dll", "plain")});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Installed("one.dll"), "new one");
    EXPECT_EQ(Installed("upper.dll"), "upper");
    EXPECT_EQ(Installed("plain.dll"), "plain");
    EXPECT_EQ(Count("CFile_: Sha256 of download (C:\\Pex\\cache\\one.dll.new) matches"), 1);
    EXPECT_EQ(Count("CFile_: Sha256 of download (C:\\Pex\\cache\\upper.dll.new) matches"), 1);
    EXPECT_FALSE(plat::files::Exists(kContent));
}

// A truncated download: the group's member already in place is undone, the target of the
// failing row never changes, and its download stays for support staff to look at.
TEST_F(DigestPipeline, AMismatchFailsTheRowAndRollsItsGroupBack) {
    machine.WriteFile("C:\\App\\one.dll", "old one");
    machine.WriteFile("C:\\App\\bad.dll", "old bad");
    Publish({Checked("one.dll", "new one", kNewOne, "G"), Checked("bad.dll", "truncated", kNewBad, "G")});
    EXPECT_EQ(Run(), 1);
    EXPECT_TRUE(trace.Contains(std::string("CFile_: Sha256 mismatch for file 'bad.dll', expected ") + kNewBad +
                               ", download (C:\\Pex\\cache\\bad.dll.new) has " + kTruncated));
    EXPECT_EQ(Installed("one.dll"), "old one");
    EXPECT_EQ(Installed("bad.dll"), "old bad");
    EXPECT_EQ(Cell(0, "UpgradeStatus"), "Downloaded");
    EXPECT_EQ(Cell(1, "UpgradeStatus"), "ApplicationFailed");
    EXPECT_EQ(machine.ReadFile("C:\\Pex\\cache\\bad.dll.new"), "truncated");
    EXPECT_FALSE(plat::files::Exists("C:\\App\\one.dll.$bak$"));
    EXPECT_FALSE(plat::files::Exists("C:\\App\\bad.dll.$bak$"));
    EXPECT_TRUE(ContentEntriesPresent());
}

// The digest is of the file as installed: the download after its expansion.
TEST_F(DigestPipeline, ACompressedDownloadIsCheckedAsExpanded) {
    const std::string payload = "szdd payload, szdd payload";
    const auto packed = rivziptest::Compress(rivziptest::Bytes(payload.begin(), payload.end()));
    ContentRow row = Checked("packed.exe", std::string(packed.begin(), packed.end()), kSzddPayload);
    row["NeedsDecompression"] = "1";  // SZDD, the download type of a row without capabilities
    Publish({row});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Installed("packed.exe"), payload);
    EXPECT_EQ(Count("CFile_: Sha256 of download (C:\\Pex\\cache\\packed.exe.new) matches"), 1);
}

}  // namespace
