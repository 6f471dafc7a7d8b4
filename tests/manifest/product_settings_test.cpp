// A product's settings, the site rules and the resolution of install directories.
#include <gtest/gtest.h>

#include <array>

#include "manifest/manifest_parser.h"
#include "platform/paths.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

class ProductSettingsTest : public ::testing::Test {
protected:
    void SetSetting(const std::string& project, const std::string& name, const std::string& value) {
        pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Pex\\" + project, name, value);
    }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(ProductSettingsTest, AKeyWithoutEntriesGivesTheDefaults) {
    pextest::CreateRegKey(reg::kLocalMachine, "Software\\Vantric\\Pex\\Orlandel");
    CManifestParser parser;
    trace.Clear();
    EXPECT_TRUE(parser.Init("Orlandel"));
    EXPECT_EQ(parser.DefaultDirectory(), ".");
    EXPECT_EQ(parser.PromptThreshold(), 30);
    EXPECT_EQ(parser.Site(), "");
    EXPECT_EQ(parser.FtpPath(), "");
    EXPECT_EQ(parser.GetScript(), "cgi-bin/GetFile.pl?Command=GetFile&");
    EXPECT_TRUE(trace.Contains(
        "CManifestParser: Init, setting are ( DefaultDirectory is '.' ), ( PromptThreshold is 30 ), "
        "( ContentFile is 'Orlandel_content.txt' ), ( DownloadSite is '' ), "
        "( GetCommand is 'cgi-bin/GetFile.pl?Command=GetFile&' )"));
    EXPECT_EQ(trace.Lines().front(), "CManifestParser: Init, project name is 'Orlandel'");
    EXPECT_EQ(trace.Lines().back(), "CManifestParser: Init, leaving");
}

TEST_F(ProductSettingsTest, SiteIsSplitIntoHostAndPath) {
    const std::vector<std::array<std::string, 3>> cases = {
        {"server1/pub/files", "server1/", "pub/files/"},
        {"server2", "server2/", ""},
        {"/pub", "", "pub/"},
        {"host\\dir\\", "host/", "dir/"},
    };
    for (const auto& c : cases) {
        SetSetting("Zendor32", "Site", c[0]);
        CManifestParser parser;
        parser.Init("Zendor32");
        EXPECT_EQ(parser.Site(), c[1]) << c[0];
        EXPECT_EQ(parser.FtpPath(), c[2]) << c[0];
    }
}

TEST_F(ProductSettingsTest, BranchesComeFromTheSitesApplicationProfile) {
    SetSetting("Zendor32", "Site", "server1/pub");
    SetSetting("Zendor32", "PromptThreshold", "ignored: read from the application profile");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\URLs\\server1", "PBranch", "beta");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\URLs\\server1", "UBranch", "stable");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\Zendor32", "PromptThreshold", "x7");
    CManifestParser parser;
    parser.Init("Zendor32");
    EXPECT_EQ(parser.PBranch(), "beta");
    EXPECT_EQ(parser.UBranchSetting(), "stable");
    EXPECT_EQ(parser.PromptThreshold(), 0);  // not a number
}

TEST_F(ProductSettingsTest, DefaultPathIsReadFromTheSectionHeldBeforeInit) {
    SetSetting("", "DefaultPath", "C:\\Root");
    SetSetting("First", "DefaultPath", "C:\\First");
    SetSetting("Second", "DefaultPath", "C:\\Second");
    CManifestParser parser;
    parser.Init("First");
    EXPECT_EQ(parser.DefaultDirectory(), "C:\\Root");
    parser.Init("Second");
    EXPECT_EQ(parser.DefaultDirectory(), "C:\\First");
}

TEST_F(ProductSettingsTest, HomeDirectoriesAreResolved) {
    auto resolve = &CManifestParser::sResolveDirectoryInformation;
    EXPECT_EQ(resolve("", "C:\\Base"), "C:\\Base");
    EXPECT_EQ(resolve("E:\\App", "C:\\Base"), "E:\\App");
    EXPECT_EQ(resolve(".\\App", "C:\\Base"), ".\\App");
    EXPECT_EQ(resolve("App", "C:\\Base"), "App");
    EXPECT_EQ(resolve("Sub\\App", "C:\\Base"), "C:\\Base\\Sub\\App");
    EXPECT_EQ(resolve("Sub\\App", "C:\\Base\\"), "C:\\Base\\Sub\\App");
    EXPECT_EQ(resolve("\\Program Files\\App", "C:\\Base"), "C:\\Program Files\\App");
    ASSERT_TRUE(plat::paths::ChangeDirectory("Z:\\tmp"));
    EXPECT_EQ(resolve("\\Program Files\\App", "C:\\Base"), "Z:\\Program Files\\App");
}

}  // namespace
