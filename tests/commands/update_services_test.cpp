// The trace lines of getting and setting symbols, and an assignment to FORCED where the content
// file has no "Force Download" column, are the golden run scripts'.
#include "commands/update_services.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::TestRow;
using Node = COverrideExpression;

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
    Node no = Node::FromBool(false), dir = Node::FromString("D:\\New");
    EXPECT_EQ(row.services.SetSymbol("forced", no), 0);
    row.services.SetSymbol("HomeDir", dir);
    EXPECT_EQ(row.Cell("Force Download"), "0");
    EXPECT_EQ(row.services.GetSymbol("homedir").stringValue, "D:\\New");
    EXPECT_TRUE(trace.Contains("Getting Symbol: Forced --> FieldName:[Force Download]=[1]"));
}

TEST_F(UpdateServicesTest, ASymbolWithoutAColumnIsAnError) {
    TestRow row("Name,HomeDir", "a.dll,C:\\App");
    Node value = row.services.GetSymbol("FORCED");
    EXPECT_EQ(value.type, Node::kError);
    EXPECT_EQ(value.code, Node::kUnexpected);
    EXPECT_EQ(value.name, "Illegal attempt to get value for unknown symbol.");
    Node yes = Node::FromBool(true);
    EXPECT_EQ(row.services.SetSymbol("FORCED", yes), Node::kUnexpected);
}

}  // namespace
