// CFile_ with a recorded SHA-256 digest: what counts as no digest, and the cells that fail Apply
// before the target is touched. The golden run download_digests shows a match, a missing download
// and a mismatch in whole runs.
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
const std::string kNewDigest = "11507a0e2f5e69d5dfa40a62a1bd7b6ee57e6bcd85c67c9b8431b36fff21c437";  // of "new"

class UpdateFileDigest : public ::testing::Test {
protected:
    void SetUp() override { machine.WriteFile(kDownload, "new"); }
    // Applies a.dll with the digest cell over a target holding "old"; the result.
    std::int32_t Apply(const std::string& digest) {
        machine.WriteFile(kTarget, "old");
        trace.Clear();
        CFile_ file(3, true, false, "C:\\App", "a.dll", kDownload, "", "", false, 0);
        file.SetExpectedSha256(digest);
        const std::int32_t result = file.Apply();
        EXPECT_EQ(plat::files::Exists(std::string(kTarget) + ".$bak$"), result == CFile_::kApplied);
        EXPECT_EQ(machine.ReadFile(kTarget), result == CFile_::kApplied ? "new" : "old");
        return result;
    }

    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(UpdateFileDigest, BlanksAreNoDigest) {
    for (const char* none : {"", " ", " \t "}) {
        EXPECT_EQ(Apply(none), CFile_::kApplied);
        EXPECT_EQ(trace.Text().find("Sha256"), std::string::npos) << "the download was read for '" << none << "'";
        ASSERT_TRUE(plat::files::Remove(std::string(kTarget) + ".$bak$"));
    }
}

TEST_F(UpdateFileDigest, ACellThatIsNoDigestIsAMismatch) {
    for (const std::string& cell :
         std::vector<std::string>{kNewDigest.substr(1), kNewDigest + "0", kNewDigest.substr(1) + "g", "yes"}) {
        EXPECT_EQ(Apply(cell), CFile_::kNotApplied) << cell;
        EXPECT_TRUE(trace.Contains("CFile_: Sha256 '" + cell +
                                   "' of file 'a.dll' is not 64 hexadecimal digits, not applying"))
            << cell;
    }
}

}  // namespace
