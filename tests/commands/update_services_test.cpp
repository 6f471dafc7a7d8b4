#include "commands/update_services.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"

namespace {

using exprtest::TestRow;
using exprtest::TraceRecorder;
using Node = COverrideExpression;
using Lines = std::vector<std::string>;

TEST(UpdateServices, ForcedInAnyCaseIsTheForceDownloadColumn) {
    TraceRecorder trace;
    TestRow row("Name,FORCE DOWNLOAD,homedir", "a.dll,1,C:\\App");
    for (const char* symbol : {"FORCED", "forced", "Forced"}) {
        Node value = row.services.GetSymbol(symbol);
        EXPECT_EQ(value.type, Node::kBool);
        EXPECT_TRUE(value.boolValue);
    }
    Node home = row.services.GetSymbol("HomeDir");
    EXPECT_EQ(home.type, Node::kString);
    EXPECT_EQ(home.stringValue, "C:\\App");
    EXPECT_EQ(trace.Lines()[0], "Getting Symbol: FORCED --> FieldName:[Force Download]=[1]");
    EXPECT_EQ(trace.Lines()[3], "Getting Symbol: HomeDir --> FieldName:[HomeDir]=[C:\\App]");
}

TEST(UpdateServices, ASymbolWithoutAColumnReadsAsAnError) {
    TraceRecorder trace;
    TestRow row("Name", "a.dll");
    Node value = row.services.GetSymbol("FORCED");
    EXPECT_EQ(value.type, Node::kError);
    EXPECT_EQ(value.code, Node::kUnexpected);
    EXPECT_EQ(value.name, "Illegal attempt to get value for unknown symbol.");
    EXPECT_TRUE(trace.Lines().empty());
}

TEST(UpdateServices, SettingStoresTheValueTextAndReadsBack) {
    TraceRecorder trace;
    TestRow row;
    Node yes = Node::FromBool(true);
    EXPECT_EQ(row.services.SetSymbol("forced", yes), 0);
    EXPECT_EQ(row.Cell("Force Download"), "1");
    Node dir = Node::FromString("D:\\New");
    row.services.SetSymbol("HomeDir", dir);
    EXPECT_EQ(row.services.GetSymbol("homedir").stringValue, "D:\\New");
    EXPECT_EQ(trace.Lines(), (Lines{"Setting Symbol: forced(Force Download) to 1",
                                    "Setting Symbol: HomeDir(HomeDir) to D:\\New",
                                    "Getting Symbol: homedir --> FieldName:[homedir]=[D:\\New]"}));
}

TEST(UpdateServices, SettingASymbolWithoutAColumnChangesNothing) {
    TraceRecorder trace;
    TestRow row("Name,HomeDir", "a.dll,C:\\App");
    Node yes = Node::FromBool(true);
    EXPECT_EQ(row.services.SetSymbol("FORCED", yes), Node::kUnexpected);
    EXPECT_EQ(row.table.ToFileText(), TestRow("Name,HomeDir", "a.dll,C:\\App").table.ToFileText());
    EXPECT_EQ(row.table.ColumnIndex("Force Download"), -1);
    EXPECT_EQ(row.services.GetSymbol("FORCED").type, Node::kError);
    EXPECT_EQ(trace.Lines(),
              Lines{"Setting Symbol: FORCED(Force Download) not done: the content file has no "
                    "such column"});
}

}  // namespace
