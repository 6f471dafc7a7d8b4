// The choice of a download type from the interested parties' capabilities.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

class DownloadTypeTest : public ::testing::Test {
protected:
    void Capabilities(const std::string& component, const std::string& text) {
        pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\" + component, "Capabilities", text);
    }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    CManifestParser parser;
};

TEST_F(DownloadTypeTest, EveryPartyNarrowsThePick) {
    Capabilities("Fetch", "ZLIB;LZW");
    Capabilities("Disk", "RTPatch;ZLIB;None");
    trace.Clear();
    EXPECT_EQ(parser.DetermineDownloadtype("Fetch;Disk"), 2u);
    EXPECT_TRUE(trace.Contains("CManifestParser: Interested party 'Fetch' report capabilities as 'ZLIB;LZW'"));
    EXPECT_TRUE(trace.Contains("CManifestParser: DetermineDownloadtype returning 2"));
}

TEST_F(DownloadTypeTest, MissingOrOddCapabilitiesGiveLzw) {
    EXPECT_EQ(parser.DetermineDownloadtype(" \t\n"), 1u);
    EXPECT_EQ(parser.DetermineDownloadtype("Nobody"), 1u);
    EXPECT_TRUE(trace.Contains("CManifestParser: RegOpenKeyEx failed with 2"));
    Capabilities("Lower", "zlib");  // names compare exactly: an unknown name counts as LZW
    EXPECT_EQ(parser.DetermineDownloadtype("Lower"), 1u);
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Vantric\\Binary", "Capabilities", reg::kRegBinary, "ZLIB");
    EXPECT_EQ(CManifestParser::sGetInterestedPartiesInformation("Binary"), "");
}

TEST_F(DownloadTypeTest, PickWalksDownAndAlwaysEnds) {
    EXPECT_EQ(CManifestParser::PickBest(3, {1, 2}), 2u);
    EXPECT_EQ(CManifestParser::PickBest(2, {}), 1u);
    // Nothing at or below the last pick is supported: the walk stops at None.
    EXPECT_EQ(CManifestParser::PickBest(2, {3}), 0u);
    EXPECT_EQ(CManifestParser::NextWorst(0), 0u);
    EXPECT_EQ(CManifestParser::ConvertCompressionType("RTPatch"), 3u);
    EXPECT_EQ(CManifestParser::ConvertCompressionType("None"), 0u);
}

}  // namespace
