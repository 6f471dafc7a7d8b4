#include "commands/update_services.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::TestRow;
using Node = COverrideExpression;
using Lines = std::vector<std::string>;

class UpdateServicesTest : public ::testing::Test {
protected:
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(UpdateServicesTest, SymbolsNameColumnsAndForcedNamesForceDownload) {
    TestRow row("Name,FORCE DOWNLOAD,homedir", "a.dll,1,C:\\App");
    for (const char* symbol : {"FORCED", "forced", "Forced"}) {
        EXPECT_TRUE(row.services.GetSymbol(symbol).boolValue) << symbol;
    }
    Node yes = Node::FromBool(false), dir = Node::FromString("D:\\New");
    EXPECT_EQ(row.services.SetSymbol("forced", yes), 0);
    row.services.SetSymbol("HomeDir", dir);
    EXPECT_EQ(row.Cell("Force Download"), "0");
    EXPECT_EQ(row.services.GetSymbol("homedir").stringValue, "D:\\New");
    Lines lines = trace.Lines();
    EXPECT_EQ(Lines(lines.begin() + 2, lines.end()),
              (Lines{"Getting Symbol: Forced --> FieldName:[Force Download]=[1]",
                     "Setting Symbol: forced(Force Download) to 0",
                     "Setting Symbol: HomeDir(HomeDir) to D:\\New",
                     "Getting Symbol: homedir --> FieldName:[homedir]=[D:\\New]"}));
}

TEST_F(UpdateServicesTest, ASymbolWithoutAColumnChangesNothing) {
    TestRow row("Name,HomeDir", "a.dll,C:\\App");
    Node value = row.services.GetSymbol("FORCED");
    EXPECT_EQ(value.type, Node::kError);
    EXPECT_EQ(value.code, Node::kUnexpected);
    EXPECT_EQ(value.name, "Illegal attempt to get value for unknown symbol.");

    const std::string before = row.table.ToFileText();
    Node yes = Node::FromBool(true);
    EXPECT_EQ(row.services.SetSymbol("FORCED", yes), Node::kUnexpected);
    EXPECT_EQ(row.table.ToFileText(), before);
    EXPECT_EQ(trace.Lines(), Lines{"Setting Symbol: FORCED(Force Download) not done: the content "
                                   "file has no such column"});
}

}  // namespace
