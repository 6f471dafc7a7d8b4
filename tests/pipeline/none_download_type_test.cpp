// A download that needs decompression, whose interested parties share no compressed type, so
// that its download type comes out as None: it is never installed compressed.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/support/test_registry.h"

namespace reg = plat::reg;
using pextest::ContentRow;

namespace {

using NoneDownloadType = pextest::PipelineTest;

TEST_F(NoneDownloadType, FailsItsDecompressionAndKeepsItsGroupAndRow) {
    // Fetch takes ZLIB, Disk only RTPatch: nothing at or below ZLIB is left for Disk.
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Fetch", "Capabilities", "ZLIB");
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Disk", "Capabilities", "RTPatch");
    machine.WriteFile("C:\\App\\lib.dll", "old lib");
    ContentRow packed = Row("lib.dll", "compressed bytes", "G");
    packed["InterestedParties"] = "Fetch;Disk";
    packed["NeedsDecompression"] = "1";
    Publish({packed, Row("partner.dll", "partner", "G"), Row("other.dll", "other", "H")});

    CManifestParser parser;
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 1) << "one failure, counted once";
    EXPECT_EQ(Count("CManifestParser: DetermineDownloadtype returning 0"), 1);
    EXPECT_EQ(Count("CDecompressionObjects::DecompressNone, the file needs decompression but its download type is "
                    "None, so it cannot be expanded"),
              1);
    EXPECT_EQ(Count("CManifestParser: group is not decompressed, application of this group will not occur"), 1);
    EXPECT_EQ(Installed("lib.dll"), "old lib");
    EXPECT_EQ(Installed("partner.dll"), "") << "its group waits with it";
    EXPECT_EQ(Installed("other.dll"), "other");
    EXPECT_EQ(machine.ReadFile("C:\\Pex\\cache\\lib.dll.new"), "compressed bytes");
    EXPECT_EQ(Cell(0, "UpgradeStatus"), "Downloaded");
    EXPECT_EQ(Cell(0, "NeedsDecompression"), "1");
    EXPECT_EQ(Cell(1, "UpgradeStatus"), "Downloaded");
    EXPECT_TRUE(ContentEntriesPresent());
}

}  // namespace
