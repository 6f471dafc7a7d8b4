// Locating, loading, preparing, storing and discarding a product's content file.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

const char* const kSection = "Software\\Vantric\\Pex\\Zendor32";
const char* const kContent = "C:\\Vantric\\Zendor32_content.txt";

class ContentFileTest : public ::testing::Test {
protected:
    void Register(const std::string& mode) {
        pextest::SetRegText(reg::kLocalMachine, kSection, "ContentFileName", kContent);
        pextest::SetRegText(reg::kLocalMachine, kSection, "ContentFileMode", mode);
        pextest::SetRegText(reg::kLocalMachine, kSection, "ContentFileTarget", "zendor32.exe");
        pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Pex", "DefaultPath", "C:\\Base");
    }
    bool HasEntry(const std::string& name) {
        std::string bytes;
        return pextest::GetRegValue(reg::kLocalMachine, kSection, name, &bytes);
    }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    CManifestParser parser;
};

TEST_F(ContentFileTest, WithoutContentFileNameThereIsNothingToLoad) {
    pextest::CreateRegKey(reg::kLocalMachine, kSection);
    bool present = true;
    EXPECT_TRUE(parser.LoadManifest("Zendor32", &present));
    EXPECT_FALSE(present);
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest, update portion, no available manifest file "
                               "found for processing"));
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest, return value is 1"));
}

TEST_F(ContentFileTest, LoadPreparesRowsAndReadsTheMode) {
    Register("MandatoryOnly");
    machine.WriteFile(kContent,
                      "FileName,UpgradeStatus,HomeDir,Force Download,DynamicFieldInfo\n"
                      "a.dll,Skipped,Sub\\App,0,FORCED = TRUE\n"
                      "b.dll,MissingDependancySkipped,,0,\n");
    bool present = false;
    ASSERT_TRUE(parser.LoadManifest("Zendor32", &present));
    EXPECT_TRUE(present);
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
}

TEST_F(ContentFileTest, RowScriptsRunUnescapedAndFailuresDoNotStopTheLoad) {
    Register("");
    machine.WriteFile(kContent,
                      "FileName,Force Download,DynamicFieldInfo\n"
                      "a.dll,0,FORCED = AND(TRUE&#x2C; TRUE)\n"
                      "b.dll,0,FORCED = AND(TRUE&#x2c; FALSE)\n"
                      "c.dll,0,\n"
                      "d.dll,1,FORCED = NoSuchColumn\n"
                      "e.dll,0,FORCED = (\n");
    bool present = false;
    ASSERT_TRUE(parser.LoadManifest("Zendor32", &present));
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
    EXPECT_TRUE(trace.Contains("CManifestParser: LoadManifest load from file success"));
}

TEST_F(ContentFileTest, ModeIsComparedExactly) {
    Register("mandatoryonly");
    machine.WriteFile(kContent, "FileName\r\n");
    bool present = false;
    ASSERT_TRUE(parser.LoadManifest("Zendor32", &present));
    EXPECT_FALSE(parser.MandatoryOnly());
}

TEST_F(ContentFileTest, WriteManifestStoresTheTableWithCrLf) {
    Register("");
    machine.WriteFile(kContent, "FileName,UpgradeStatus\n\"a.dll\",Downloaded\n");
    bool present = false;
    ASSERT_TRUE(parser.LoadManifest("Zendor32", &present));
    EXPECT_TRUE(parser.SetField(0, "UpgradeStatus", "AppliedSuccessfully"));
    EXPECT_FALSE(parser.SetField(1, "UpgradeStatus", "x"));
    EXPECT_FALSE(parser.SetField(0, "NoSuchColumn", "x"));
    EXPECT_TRUE(parser.WriteManifest());
    EXPECT_EQ(machine.ReadFile(kContent), "FileName,UpgradeStatus\r\na.dll,AppliedSuccessfully\r\n");
}

TEST_F(ContentFileTest, AnUnloadableFileIsDiscardedWithItsEntries) {
    Register("");
    machine.WriteFile(kContent, "FileName,UpgradeStatus\na,b,c\n");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr), 0);
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, Unable to load Content file"));
    EXPECT_FALSE(HasEntry("ContentFileName"));
    EXPECT_FALSE(HasEntry("ContentFileMode"));
    EXPECT_FALSE(HasEntry("ContentFileTarget"));
    EXPECT_EQ(plat::files::GetAttributes(kContent), plat::files::kInvalidAttributes);
}

}  // namespace
