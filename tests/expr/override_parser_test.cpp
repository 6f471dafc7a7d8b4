// The scanner and the grammar, seen through the trees they build. Their bounds (script length,
// depth, stack, token length) are hostile_scripts_test's.
#include "expr/override_parser.h"

#include <gtest/gtest.h>

#include "expr/expression_text.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/case_file.h"

namespace {

// The items a text parses to ("; " between them), after "refused: " and the parser's first
// printed line when it refuses; *printed receives all it printed.
std::string Outcome(const std::string& text, std::string* printed = nullptr) {
    ExecutionPlan plan;
    std::string output;
    std::string outcome = exprtest::QuietParse(plan, text, &output) ? "" : "refused: " + output.substr(0, output.find('\n'));
    for (const COverrideExpression& item : plan.Items()) outcome += (outcome.empty() ? "" : "; ") + ExpressionText(item);
    if (printed) *printed = output;
    return outcome;
}

TEST(OverrideParser, TreesOfTexts) {
    for (const pextest::Case& c : pextest::ReadCases("expr/cases/parse_trees.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(Outcome(c[2] == "escaped" ? pextest::Unescape(c[0]) : c[0]), c[1]);
    }
    EXPECT_EQ(Outcome(""), "refused: syntax error");
    // A line feed in a string (or an escape) echoes what was gathered, which is dropped.
    for (const char* text : {"FORCED = \"ab\ncd\"", "FORCED = \"ab\\\ncd\""}) {
        std::string printed;
        EXPECT_EQ(Outcome(text, &printed), "SET(FORCED, \"cd\")");
        EXPECT_EQ(printed, "ab\n");
    }
    // The longest string a token holds is gathered whole.
    const std::string longest(8190, 's');
    EXPECT_EQ(Outcome("FORCED = \"" + longest + "\" "), "SET(FORCED, \"" + longest + "\")");
}

}  // namespace
