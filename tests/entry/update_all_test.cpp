// The product loop, the special-file list, the schedule reset and the progress record.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

const char* const kProducts = "Software\\Vantric\\Pex";

struct Seen {
    std::int32_t total;
    std::int32_t current;
    std::string status;
};
std::vector<Seen> g_seen;

bool Record(CProgressData* p) {
    g_seen.push_back({p->TotalSteps, p->CurrentStep, p->StatusText});
    return false;  // ignored by the library
}

std::vector<std::string> Matching(const std::vector<std::string>& lines, const std::string& prefix) {
    std::vector<std::string> out;
    for (const auto& l : lines)
        if (l.compare(0, prefix.size(), prefix) == 0) out.push_back(l);
    return out;
}

class UpdateAllTest : public ::testing::Test {
protected:
    void SetUp() override { g_seen.clear(); }
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(UpdateAllTest, WithoutProductsNothingIsRun) {
    EXPECT_FALSE(UpdateAll(&Record));
    EXPECT_TRUE(trace.Lines().empty());  // no products key: not even the log is opened
    EXPECT_TRUE(g_seen.empty());
    EXPECT_FALSE(g_TraceLog.IsOpen());

    pextest::CreateRegKey(reg::kLocalMachine, kProducts);
    EXPECT_FALSE(UpdateAll(&Record));
    ASSERT_EQ(g_seen.size(), 1u);
    EXPECT_EQ(g_seen[0].total, 0);
    EXPECT_EQ(trace.Lines(), (std::vector<std::string>{"UpdateAll, main key is open",
                                                       "UpdateAll, RegEnumKey returned 259"}));
}

TEST_F(UpdateAllTest, ProductsRunInOrderWithOneStepEach) {
    for (const char* name : {"Orlandel", "Zendor32", "Fetchwell"})
        pextest::CreateRegKey(reg::kLocalMachine, std::string(kProducts) + "\\" + name);
    const std::int32_t before = g_ProgressData.CurrentStep;
    UpdateAll(&Record);
    const auto lines = trace.Lines();
    EXPECT_EQ(Matching(lines, "UpdateAll, key"),
              (std::vector<std::string>{"UpdateAll, key 1 is 'Fetchwell'", "UpdateAll, key 2 is 'Orlandel'",
                                        "UpdateAll, key 3 is 'Zendor32'"}));
    EXPECT_EQ(Matching(lines, "CManifestParser: ProcessUpdateInformation, No content file exists, nothing to do")
                  .size(), 3u);
    // Each product step is reported before the product's own "Analyzing data..." report.
    std::vector<std::int32_t> productSteps;
    for (const Seen& s : g_seen)
        if (s.status == "Analyzing data...") productSteps.push_back(s.current - before);
    EXPECT_EQ(productSteps, (std::vector<std::int32_t>{1, 2, 3}));
    EXPECT_EQ(g_seen.front().total, 3);
}

// The content file cannot be saved: the run stops there, and the trace says where and why.
TEST_F(UpdateAllTest, AProductRunStoppedByAFileErrorIsTracedAndEndsTheLoop) {
    pextest::SetRegText(reg::kLocalMachine, std::string(kProducts) + "\\Alpha", "ContentFileName", "C:\\alpha.txt");
    pextest::CreateRegKey(reg::kLocalMachine, std::string(kProducts) + "\\Beta");
    machine.WriteFile("C:\\alpha.txt", "FileName,UpgradeStatus\r\n");
    plat::fault::FailNth(plat::fault::Op::Rename, 1, plat::kErrorDiskFull);  // the first save's last step
    UpdateAll(nullptr);
    plat::fault::Clear();
    EXPECT_TRUE(trace.Contains("UpdateAll, product run stopped, file error 112 on 'C:\\alpha.txt'"));
    EXPECT_FALSE(trace.Contains("UpdateAll, key 2 is 'Beta'"));
}

TEST_F(UpdateAllTest, SpecialFileNamesAreTrimmedAndUpperCased) {
    CManifestParser parser;
    parser.AddToSpecialList(" pellow.exe\n");
    parser.AddToSpecialList("PELLOW.EXE");
    EXPECT_EQ(parser.SpecialFiles(), (std::set<std::string>{"PELLOW.EXE"}));
    parser.ClearSpecialFileList();  // between products
    EXPECT_TRUE(parser.SpecialFiles().empty());
}

TEST_F(UpdateAllTest, ScheduleResetWritesOnlyExistingKeys) {
    ResetUpdateScheduleDates();
    EXPECT_EQ(Matching(trace.Lines(), "Mendler: RegOpenKeyEx failed with 2").size(), 6u);
    EXPECT_EQ(trace.Lines()[0], "Mendler: Setting Registry Key "
                                "Software\\Vantric\\OEM\\Tessary\\Zendor32\\MatrixUpdates.LastDate to ''");
    EXPECT_FALSE(pextest::RegKeyExists(reg::kLocalMachine, "Software\\Vantric\\Zendor32"));

    trace.Clear();
    const std::string key = "Software\\Vantric\\Zendor32\\MatrixUpdates";
    pextest::SetRegText(reg::kLocalMachine, key, "NextDate", "12/31/2026");
    ResetUpdateScheduleDates();
    std::string bytes;
    std::uint32_t type = 0;
    ASSERT_TRUE(pextest::GetRegValue(reg::kLocalMachine, key, "NextDate", &bytes, &type));
    EXPECT_EQ(type, reg::kRegSz);
    EXPECT_EQ(bytes, "");  // written without a terminating zero
    EXPECT_TRUE(pextest::GetRegValue(reg::kLocalMachine, key, "LastDate", &bytes));
    EXPECT_EQ(Matching(trace.Lines(), "Mendler: set value successfully...").size(), 2u);
}

TEST(ProgressDataTest, StatusTextIsCutTo255Characters) {
    CProgressData progress;
    EXPECT_FALSE(progress.StatusTextSet);
    progress.SetStatusText(std::string(300, 'x'));
    EXPECT_EQ(std::string(progress.StatusText), std::string(255, 'x'));
    EXPECT_TRUE(progress.StatusTextSet);
}

}  // namespace
