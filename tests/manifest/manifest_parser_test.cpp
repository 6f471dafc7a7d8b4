// CManifestParser up to the apply pipeline: a product's settings, the site rules, the resolution
// of install directories, the choice of a download type, and locating, loading, preparing and
// discarding the product's content file.
#include "manifest/manifest_parser.h"

#include <gtest/gtest.h>

#include <set>

#include "platform/paths.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

const char* const kSection = "Software\\Vantric\\Pex\\Zendor32";
const char* const kContent = "C:\\Vantric\\Zendor32_content.txt";

class ManifestParser : public ::testing::Test {
protected:
    static void Set(const std::string& key, const std::string& name, const std::string& value) {
        pextest::SetRegText(reg::kLocalMachine, key, name, value);
    }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    CManifestParser parser;
};

// The host's special files, given as it spells them, are kept trimmed and upper-cased.
TEST_F(ManifestParser, SpecialFileNamesAreTrimmedAndUpperCased) {
    parser.AddToSpecialList(" pellow.exe\n");
    parser.AddToSpecialList("PELLOW.EXE");
    EXPECT_EQ(parser.SpecialFiles(), (std::set<std::string>{"PELLOW.EXE"}));
    parser.ClearSpecialFileList();  // between products
    EXPECT_TRUE(parser.SpecialFiles().empty());
}

TEST_F(ManifestParser, DefaultPathIsReadFromTheSectionHeldBeforeInit) {
    Set("Software\\Vantric\\Pex", "DefaultPath", "C:\\Root");
    Set("Software\\Vantric\\Pex\\First", "DefaultPath", "C:\\First");
    Set("Software\\Vantric\\Pex\\Second", "DefaultPath", "C:\\Second");
    parser.Init("First");
    EXPECT_EQ(parser.DefaultDirectory(), "C:\\Root");
    parser.Init("Second");
    EXPECT_EQ(parser.DefaultDirectory(), "C:\\First");
}

// A relative folder below a base with a trailing separator, and a rooted one on the current
// drive when that is not C: (the golden run settings_site shows the other forms).
TEST_F(ManifestParser, HomeDirectoriesAreResolved) {
    auto resolve = &CManifestParser::sResolveDirectoryInformation;
    EXPECT_EQ(resolve("Sub\\App", "C:\\Base\\"), "C:\\Base\\Sub\\App");
    ASSERT_TRUE(plat::paths::ChangeDirectory("Z:\\tmp"));
    EXPECT_EQ(resolve("\\Program Files\\App", "C:\\Base"), "Z:\\Program Files\\App");
}

// Every interested party narrows the pick; missing or odd capabilities give LZW.
TEST_F(ManifestParser, DownloadTypeSuitsEveryInterestedParty) {
    Set("Software\\Vantric\\Fetch", "Capabilities", "ZLIB;LZW");
    Set("Software\\Vantric\\Disk", "Capabilities", "RTPatch;ZLIB;None");
    Set("Software\\Vantric\\Lower", "Capabilities", "zlib");  // names compare exactly: an unknown name counts as LZW
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Vantric\\Binary", "Capabilities", reg::kRegBinary, "ZLIB");
    EXPECT_EQ(parser.DetermineDownloadtype("Fetch;Disk"), 2u);
    for (const char* parties : {" \t\n", "Nobody", "Lower"}) {
        EXPECT_EQ(parser.DetermineDownloadtype(parties), 1u) << parties;
    }
    EXPECT_EQ(CManifestParser::sGetInterestedPartiesInformation("Binary"), "");

    // The pick walks down from the last one and always ends: at None when nothing at or below
    // the last pick is supported.
    EXPECT_EQ(CManifestParser::PickBest(3, {1, 2}), 2u);
    EXPECT_EQ(CManifestParser::PickBest(2, {}), 1u);
    EXPECT_EQ(CManifestParser::PickBest(2, {3}), 0u);
    EXPECT_EQ(CManifestParser::NextWorst(0), 0u);
}

// A parser driven for a second product keeps nothing of the first one's content file, also
// when the second product has none. A second product that has one, in a mode spelled in
// another case, is groups_left_out.
TEST_F(ManifestParser, ARunKeepsNothingOfTheContentFileOfTheRunBefore) {
    Set(kSection, "ContentFileName", kContent);
    Set(kSection, "ContentFileMode", "MandatoryOnly");
    Set(kSection, "ContentFileTarget", "zendor32.exe");
    machine.WriteFile(kContent, "FileName,UpgradeStatus\r\na.dll,Skipped\r\n");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 0);
    ASSERT_TRUE(parser.MandatoryOnly());
    pextest::CreateRegKey(reg::kLocalMachine, "Software\\Vantric\\Pex\\Orlandel");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Orlandel"), nullptr), 0);
    EXPECT_EQ(parser.Table().ColumnCount(), 0u);
    EXPECT_EQ(parser.ContentFilePath(), "");
    EXPECT_EQ(parser.ContentFileTarget(), "");
    EXPECT_FALSE(parser.MandatoryOnly());
    EXPECT_FALSE(parser.MoveToRow(0));
}

}  // namespace
