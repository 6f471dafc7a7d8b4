#include "model/upgrade_status.h"

#include <gtest/gtest.h>

#include <string>

#include "manifest/content_table.h"
#include "tests/support/test_machine.h"

namespace {

TEST(UpgradeStatusCodes, TextsAndCodesConvertExactly) {
    for (int code = 0; code < kUpgradeStatusCount; ++code) {
        EXPECT_EQ(code, UpgradeStatusCodeOf(UpgradeStatusText(code)));
    }
    EXPECT_STREQ("AppliedSuccessfully", UpgradeStatusText(kAppliedSuccessfully));
    EXPECT_EQ(nullptr, UpgradeStatusText(9));
    for (const char* text : {"downloaded", "Downloaded ", "Skipped", "MissingDependancySkipped"}) {
        EXPECT_EQ(-1, UpgradeStatusCodeOf(text)) << text;
    }
}

// The pass over a real content file: only the two transient texts, written exactly, change;
// the column is found without regard to case.
TEST(NormalizeUpgradeStatus, ReplacesTheTransientTextsOnly) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\Pex\\content.csv",
                      "FileName,upgradestatus\r\na,Skipped\r\nb,MissingDependancySkipped\r\n"
                      "c,skipped\r\nd,Skipped \r\ne,Downloaded\r\nf\r\n");
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromFile("C:\\Pex\\content.csv"));
    NormalizeUpgradeStatus(table);
    table.SaveToFile("C:\\Pex\\content.csv");
    EXPECT_EQ("FileName,upgradestatus\r\na,AppliedSuccessfully\r\nb,ApplicationFailed\r\n"
              "c,skipped\r\nd,Skipped \r\ne,Downloaded\r\nf,\r\n",
              machine.ReadFile("C:\\Pex\\content.csv"));
}

TEST(NormalizeUpgradeStatus, LeavesATableWithoutTheColumnAlone) {
    CContentTable table;
    table.LoadFromText("FileName,Status\r\nSkipped,Skipped\r\n");
    NormalizeUpgradeStatus(table);
    EXPECT_EQ("FileName,Status\r\nSkipped,Skipped\r\n", table.ToFileText());
}

}  // namespace
