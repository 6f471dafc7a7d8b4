// The executors of the built-in functions, evaluated directly on parsed (unvalidated) trees, and
// the update services through which they reach the row.
#include "expr/executors.h"

#include <gtest/gtest.h>

#include "expr/evaluation.h"
#include "expr/expression_text.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::ParseExpression;
using exprtest::TestRow;
using Node = COverrideExpression;
using Lines = std::vector<std::string>;

// The value as a text would write it, or "failure: " and the failure's message.
std::string Outcome(const std::string& text, TestRow& row) {
    try {
        return ExpressionText(Evaluate(ParseExpression(text), row.services));
    } catch (const Node& failure) {
        EXPECT_EQ(failure.code, Node::kUnexpected);
        return "failure: " + failure.name;
    }
}

TEST(Builtins, ValuesFailuresAndTheNamesTheyRead) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\App\\a.dll", "no version information");
    const std::string versioned = pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll");
    machine.WriteFile("C:\\App\\versioned.dll", versioned);
    std::string noFixedPart = versioned;
    noFixedPart[noFixedPart.find("\xBD\x04\xEF\xFE")] = 0;  // the fixed part's signature
    machine.WriteFile("C:\\App\\nofixed.dll", noFixedPart);
    pextest::TraceCapture trace;
    for (const pextest::Case& c : pextest::ReadCases("expr/cases/builtins.txt")) {
        SCOPED_TRACE(c.where);
        TestRow row;
        trace.Clear();
        EXPECT_EQ(Outcome(c[0], row), c[1]);
        EXPECT_EQ(row.services.reads, c[2]);
        if (!c[3].empty()) {
            EXPECT_TRUE(trace.Contains(c[3])) << trace.Text();
        }
    }
}

// How lookups are indented by their nesting depth is pinned by the golden run scripts.
TEST(Builtins, SettingNestingAfterAFailureAndUnknownNames) {
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    TestRow row;
    EXPECT_EQ(Evaluate(ParseExpression("SET(HomeDir, \"D:\\\\x\")"), row.services).code, 0);
    EXPECT_EQ(row.Cell("HomeDir"), "D:\\x");
    EXPECT_EQ(Evaluate(ParseExpression("SET(forced, TRUE)"), row.services).code, 0);
    EXPECT_EQ(row.Cell("Force Download"), "1");
    Outcome("NOT BVAR", row);
    EXPECT_EQ(row.services.nestingLevel, 0);  // back after a failure

    trace.Clear();
    EXPECT_THROW(GetVar(Node::FromText(Node::kFunc, "Nope"), row.services), Node);
    EXPECT_EQ(trace.Lines(), Lines{"Error finding Variable [Nope]: Unknown Name!"});
    EXPECT_NO_THROW(Evaluate(Node::FromText(Node::kFunc, "Nope"), row.services));

    // Without a "Force Download" column, FORCED reads as an error value and cannot be set.
    TestRow lean("Name,HomeDir", "a.dll,C:\\App");
    const Node value = lean.services.GetSymbol("FORCED");
    EXPECT_EQ(value.type, Node::kError);
    EXPECT_EQ(value.code, Node::kUnexpected);
    EXPECT_EQ(value.name, "Illegal attempt to get value for unknown symbol.");
    Node yes = Node::FromBool(true);
    EXPECT_EQ(lean.services.SetSymbol("FORCED", yes), Node::kUnexpected);
}

}  // namespace
