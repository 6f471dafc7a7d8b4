#include "model/upgrade_status.h"

#include <gtest/gtest.h>

#include <string>

#include "manifest/content_table.h"
#include "tests/support/test_machine.h"

namespace {

TEST(UpgradeStatusCodes, TextsAndCodesConvertBothWays) {
    const char* const texts[] = {"NeedsDownloaded",       "Downloaded",
                                 "InstallCommandNotUnderstood", "FailedNotMangled",
                                 "FailedMangled",         "AppliedSuccessfully",
                                 "ApplicationFailed",     "ExceededDownloadLimit",
                                 "DownloadAccessDenied"};
    for (int code = 0; code < kUpgradeStatusCount; ++code) {
        EXPECT_STREQ(texts[code], UpgradeStatusText(code));
        EXPECT_EQ(code, UpgradeStatusCodeOf(texts[code]));
    }
    EXPECT_EQ(nullptr, UpgradeStatusText(-1));
    EXPECT_EQ(nullptr, UpgradeStatusText(9));
}

TEST(UpgradeStatusCodes, TextsCompareExactly) {
    EXPECT_EQ(-1, UpgradeStatusCodeOf("downloaded"));
    EXPECT_EQ(-1, UpgradeStatusCodeOf("Downloaded "));
    EXPECT_EQ(-1, UpgradeStatusCodeOf("Skipped"));
    EXPECT_EQ(-1, UpgradeStatusCodeOf("MissingDependancySkipped"));
    EXPECT_EQ(-1, UpgradeStatusCodeOf(""));
}

// The pass over a real content file: only the two transient texts, written exactly, change.
TEST(NormalizeUpgradeStatus, ReplacesTheTransientTextsOnly) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\Pex\\content.csv",
                      "FileName,upgradestatus\r\n"
                      "a,Skipped\r\n"
                      "b,MissingDependancySkipped\r\n"
                      "c,skipped\r\n"
                      "d,Skipped \r\n"
                      "e,Downloaded\r\n"
                      "f\r\n");
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromFile("C:\\Pex\\content.csv"));
    NormalizeUpgradeStatus(table);
    table.SaveToFile("C:\\Pex\\content.csv");
    EXPECT_EQ("FileName,upgradestatus\r\n"
              "a,AppliedSuccessfully\r\n"
              "b,ApplicationFailed\r\n"
              "c,skipped\r\n"
              "d,Skipped \r\n"
              "e,Downloaded\r\n"
              "f,\r\n",
              machine.ReadFile("C:\\Pex\\content.csv"));
    EXPECT_EQ(kAppliedSuccessfully, UpgradeStatusCodeOf(table.Field(0, "UpgradeStatus")));
    EXPECT_EQ(kApplicationFailed, UpgradeStatusCodeOf(table.Field(1, "UpgradeStatus")));
    EXPECT_EQ(-1, UpgradeStatusCodeOf(table.Field(2, "UpgradeStatus")));
}

TEST(NormalizeUpgradeStatus, LeavesATableWithoutTheColumnAlone) {
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromText("FileName,Status\r\nSkipped,Skipped\r\n"));
    NormalizeUpgradeStatus(table);
    EXPECT_EQ("FileName,Status\r\nSkipped,Skipped\r\n", table.ToFileText());

    CContentTable empty;
    NormalizeUpgradeStatus(empty);
    EXPECT_EQ(0u, empty.RowCount());
}

}  // namespace
