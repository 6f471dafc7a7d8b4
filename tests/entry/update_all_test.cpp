// What the golden runs (tests/runs) do not show of the product loop: no products at all, the
// special-file list's names, and the progress record's cut of a long status text.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
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

TEST_F(UpdateAllTest, SpecialFileNamesAreTrimmedAndUpperCased) {
    CManifestParser parser;
    parser.AddToSpecialList(" pellow.exe\n");
    parser.AddToSpecialList("PELLOW.EXE");
    EXPECT_EQ(parser.SpecialFiles(), (std::set<std::string>{"PELLOW.EXE"}));
    parser.ClearSpecialFileList();  // between products
    EXPECT_TRUE(parser.SpecialFiles().empty());
}

TEST(ProgressDataTest, StatusTextIsCutTo255Characters) {
    CProgressData progress;
    EXPECT_FALSE(progress.StatusTextSet);
    progress.SetStatusText(std::string(300, 'x'));
    EXPECT_EQ(std::string(progress.StatusText), std::string(255, 'x'));
    EXPECT_TRUE(progress.StatusTextSet);
}

}  // namespace
