// CManifestParser up to the apply pipeline: a product's settings, the site rules, the resolution
// of install directories, the choice of a download type, and locating, loading, preparing and
// discarding the product's content file.
#include "manifest/manifest_parser.h"

#include <gtest/gtest.h>

#include <array>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
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
    // Registers Zendor32's content file, in the mode, with these bytes.
    void Publish(const std::string& mode, const std::string& text) {
        Set(kSection, "ContentFileName", kContent);
        Set(kSection, "ContentFileMode", mode);
        Set(kSection, "ContentFileTarget", "zendor32.exe");
        Set("Software\\Vantric\\Pex", "DefaultPath", "C:\\Base");
        machine.WriteFile(kContent, text);
    }
    // LoadManifest found and loaded the content file.
    static bool Load(CManifestParser& parser) {
        bool present = false;
        return parser.LoadManifest("Zendor32", &present) && present;
    }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    CManifestParser parser;
};

TEST_F(ManifestParser, AKeyWithoutEntriesGivesTheDefaultSettings) {
    pextest::CreateRegKey(reg::kLocalMachine, "Software\\Vantric\\Pex\\Orlandel");
    trace.Clear();
    EXPECT_TRUE(parser.Init("Orlandel"));
    EXPECT_TRUE(trace.Contains(
        "CManifestParser: Init, setting are ( DefaultDirectory is '.' ), ( PromptThreshold is 30 ), "
        "( ContentFile is 'Orlandel_content.txt' ), ( DownloadSite is '' ), "
        "( GetCommand is 'cgi-bin/GetFile.pl?Command=GetFile&' )"));
    EXPECT_EQ(trace.Lines().front(), "CManifestParser: Init, project name is 'Orlandel'");
    EXPECT_EQ(trace.Lines().back(), "CManifestParser: Init, leaving");
}

TEST_F(ManifestParser, SiteIsSplitIntoHostAndPath) {
    const std::vector<std::array<std::string, 3>> cases = {
        {"server1/pub/files", "server1/", "pub/files/"},
        {"server2", "server2/", ""},
        {"/pub", "", "pub/"},
        {"host\\dir\\", "host/", "dir/"},
        {"", "", ""},
    };
    for (const auto& c : cases) {
        Set(kSection, "Site", c[0]);
        CManifestParser settings;
        settings.Init("Zendor32");
        EXPECT_EQ(settings.Site(), c[1]) << c[0];
        EXPECT_EQ(settings.FtpPath(), c[2]) << c[0];
    }
}

TEST_F(ManifestParser, BranchesComeFromTheSitesApplicationProfile) {
    Set(kSection, "Site", "server1/pub");
    Set(kSection, "PromptThreshold", "ignored: read from the application profile");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\URLs\\server1", "PBranch", "beta");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\URLs\\server1", "UBranch", "stable");
    pextest::SetRegText(reg::kCurrentUser, "Software\\Vantric\\Mendler\\Zendor32", "PromptThreshold", "x7");
    parser.Init("Zendor32");
    EXPECT_EQ(parser.PBranch(), "beta");
    EXPECT_EQ(parser.UBranchSetting(), "stable");
    EXPECT_EQ(parser.PromptThreshold(), 0);  // not a number
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

// A relative folder below the base (the content file's rows show the simple cases).
TEST_F(ManifestParser, HomeDirectoriesAreResolved) {
    auto resolve = &CManifestParser::sResolveDirectoryInformation;
    EXPECT_EQ(resolve("E:\\App", "C:\\Base"), "E:\\App");
    EXPECT_EQ(resolve(".\\App", "C:\\Base"), ".\\App");
    EXPECT_EQ(resolve("App", "C:\\Base"), "App");
    EXPECT_EQ(resolve("Sub\\App", "C:\\Base\\"), "C:\\Base\\Sub\\App");
    EXPECT_EQ(resolve("\\Program Files\\App", "C:\\Base"), "C:\\Program Files\\App");
    ASSERT_TRUE(plat::paths::ChangeDirectory("Z:\\tmp"));
    EXPECT_EQ(resolve("\\Program Files\\App", "C:\\Base"), "Z:\\Program Files\\App");
}

// Every interested party narrows the pick; missing or odd capabilities give LZW.
TEST_F(ManifestParser, DownloadTypeSuitsEveryInterestedParty) {
    Set("Software\\Vantric\\Fetch", "Capabilities", "ZLIB;LZW");
    Set("Software\\Vantric\\Disk", "Capabilities", "RTPatch;ZLIB;None");
    Set("Software\\Vantric\\Lower", "Capabilities", "zlib");  // names compare exactly: an unknown name counts as LZW
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Vantric\\Binary", "Capabilities", reg::kRegBinary, "ZLIB");
    trace.Clear();
    EXPECT_EQ(parser.DetermineDownloadtype("Fetch;Disk"), 2u);
    EXPECT_TRUE(trace.Contains("CManifestParser: Interested party 'Fetch' report capabilities as 'ZLIB;LZW'"));
    EXPECT_TRUE(trace.Contains("CManifestParser: DetermineDownloadtype returning 2"));
    for (const char* parties : {" \t\n", "Nobody", "Lower"}) {
        EXPECT_EQ(parser.DetermineDownloadtype(parties), 1u) << parties;
    }
    EXPECT_TRUE(trace.Contains("CManifestParser: RegOpenKeyEx failed with 2"));
    EXPECT_EQ(CManifestParser::sGetInterestedPartiesInformation("Binary"), "");

    // The pick walks down from the last one and always ends: at None when nothing at or below
    // the last pick is supported.
    EXPECT_EQ(CManifestParser::PickBest(3, {1, 2}), 2u);
    EXPECT_EQ(CManifestParser::PickBest(2, {}), 1u);
    EXPECT_EQ(CManifestParser::PickBest(2, {3}), 0u);
    EXPECT_EQ(CManifestParser::NextWorst(0), 0u);
    EXPECT_EQ(CManifestParser::ConvertCompressionType("RTPatch"), 3u);
}

TEST_F(ManifestParser, WithoutContentFileNameThereIsNothingToLoad) {
    pextest::CreateRegKey(reg::kLocalMachine, kSection);
    bool present = true;
    EXPECT_TRUE(parser.LoadManifest("Zendor32", &present));
    EXPECT_FALSE(present);
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest, update portion, no available manifest file "
                               "found for processing"));
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest, return value is 1"));
}

// Transient statuses become final, home folders are resolved, rows' scripts run; the mode's
// text is compared exactly.
TEST_F(ManifestParser, LoadPreparesRowsAndReadsTheMode) {
    Publish("MandatoryOnly",
            "FileName,UpgradeStatus,HomeDir,Force Download,DynamicFieldInfo\n"
            "a.dll,Skipped,Sub\\App,0,FORCED = TRUE\n"
            "b.dll,MissingDependancySkipped,,0,\n");
    ASSERT_TRUE(Load(parser));
    EXPECT_TRUE(parser.MandatoryOnly());
    EXPECT_EQ(parser.ContentFileTarget(), "zendor32.exe");
    ASSERT_TRUE(parser.MoveToRow(0));
    EXPECT_EQ(parser.GetField("upgradestatus"), "AppliedSuccessfully");
    EXPECT_EQ(parser.GetField("HomeDir"), "C:\\Base\\Sub\\App");
    EXPECT_EQ(parser.GetField("Force Download"), "1");  // set by the row's script
    ASSERT_TRUE(parser.NextRow());
    EXPECT_EQ(parser.GetField("UpgradeStatus"), "ApplicationFailed");
    EXPECT_EQ(parser.GetField("HomeDir"), "C:\\Base");
    EXPECT_FALSE(parser.NextRow());
    EXPECT_EQ(parser.GetField("FileName"), "");
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest load from file success"));

    Set(kSection, "ContentFileMode", "mandatoryonly");
    CManifestParser lowerCase;
    ASSERT_TRUE(Load(lowerCase));
    EXPECT_FALSE(lowerCase.MandatoryOnly());
}

TEST_F(ManifestParser, RowScriptsRunUnescapedAndFailuresDoNotStopTheLoad) {
    Publish("",
            "FileName,UpgradeStatus,Force Download,DynamicFieldInfo\n"
            "a.dll,,0,FORCED = AND(TRUE&#x2C; TRUE)\n"
            "b.dll,,0,FORCED = AND(TRUE&#x2c; FALSE)\n"
            "c.dll,,0,\n"
            "d.dll,,1,FORCED = NoSuchColumn\n"
            "e.dll,,0,FORCED = (\n");
    ASSERT_TRUE(Load(parser));
    const std::vector<std::string> forced = {"1", "0", "0", "1", "0"};
    for (std::int32_t row = 0; row < 5; ++row) {
        ASSERT_TRUE(parser.MoveToRow(row));
        EXPECT_EQ(parser.GetField("Force Download"), forced[row]) << row;
    }
    EXPECT_TRUE(trace.Contains("Evaluating Dynamic Fields for file a.dll: [FORCED = AND(TRUE, TRUE)]"));
    EXPECT_TRUE(trace.Contains("Evaluating Dynamic Fields for file b.dll: [FORCED = AND(TRUE, FALSE)]"));
    EXPECT_FALSE(trace.Contains("Evaluating Dynamic Fields for file c.dll: []"));
    EXPECT_TRUE(trace.Contains("Evaluation Plan Not Valid.  Validation Results:"));
    EXPECT_TRUE(trace.Contains("Error Creating Plan"));
}

// A parser driven for a second product keeps nothing of the first one's content file, also
// when the second product has none.
TEST_F(ManifestParser, ARunKeepsNothingOfTheContentFileOfTheRunBefore) {
    Publish("MandatoryOnly", "FileName,UpgradeStatus\r\na.dll,Skipped\r\n");
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

bool EntriesPresent() {
    std::string bytes;
    for (const char* name : {"ContentFileName", "ContentFileMode", "ContentFileTarget"}) {
        if (pextest::GetRegValue(reg::kLocalMachine, kSection, name, &bytes)) return true;
    }
    return false;
}

// A quoted date holds a comma, so its row has too many cells: the file is moved aside for
// support staff, replacing an older one, and the product counts as failed.
TEST_F(ManifestParser, AnUnloadableContentFileIsKeptAsideAndCounted) {
    const std::string bytes = "FileName,UpgradeStatus,UpdateDate\r\na.dll,Downloaded,\"Dec 31, 2003\"\r\n";
    const std::string kept = std::string(kContent) + ".rejected";
    Publish("", bytes);
    machine.WriteFile(kept, "an older rejected file");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 1);
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, content file '" + std::string(kContent) +
                               "' rejected: line 2 has more cells than the 3 columns of the header"));
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, rejected content file kept as '" + kept +
                               "'"));
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, Unable to load Content file"));
    EXPECT_FALSE(EntriesPresent());
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_EQ(machine.ReadFile(kept), bytes);

    // A table without a column the analysis needs is rejected the same way.
    Publish("", "FileName,Status\r\na.dll,Downloaded\r\n");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 1);
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, content file '" + std::string(kContent) +
                               "' rejected: there is no column UpgradeStatus"));
    EXPECT_EQ(machine.ReadFile(kept), "FileName,Status\r\na.dll,Downloaded\r\n");

    // A missing file: nothing to keep, the entries go, and there is no failure to count.
    Publish("", "");
    ASSERT_TRUE(plat::files::Remove(kContent));
    ASSERT_TRUE(plat::files::Remove(kept));
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 0);
    EXPECT_FALSE(EntriesPresent());
    EXPECT_FALSE(plat::files::Exists(kept));
}

// A move that fails never costs the file: it stays, with the entries that name it, for the
// next run to meet again.
TEST_F(ManifestParser, ARejectedFileThatCannotBeMovedStaysInPlace) {
    const std::string bytes = "Name\r\n";
    Publish("", bytes);
    plat::fault::FailNth(plat::fault::Op::Rename, 1, plat::kErrorSharingViolation, true);
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 1);
    plat::fault::Clear();
    EXPECT_EQ(machine.ReadFile(kContent), bytes);
    EXPECT_FALSE(plat::files::Exists(std::string(kContent) + ".rejected"));
    EXPECT_TRUE(EntriesPresent());
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, rejected content file not moved to '" +
                               std::string(kContent) + ".rejected' (error 32), left in place"));
}

}  // namespace
