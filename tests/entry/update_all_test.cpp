// What the golden runs (tests/runs) do not show of the product loop: the special-file list's
// names, and the progress record's cut of a long status text. A machine without products is
// no_products_key and no_products.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "entry/update_all.h"
#include "manifest/manifest_parser.h"

namespace {

TEST(UpdateAllTest, SpecialFileNamesAreTrimmedAndUpperCased) {
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
