// The scanner and the grammar, seen through the trees they build. Their bounds (script length,
// depth, stack, token length) are hostile_scripts_test's.
#include "expr/override_parser.h"

#include <gtest/gtest.h>

#include "expr/expression_text.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/case_file.h"

namespace {

// What the parser printed (its first line) and the items it parsed ("; " between them), after
// "refused: " when it refused the text.
std::string Outcome(const std::string& text) {
    ExecutionPlan plan;
    std::string output;
    const bool ok = exprtest::QuietParse(plan, text, &output);
    std::string outcome = std::string(ok ? "" : "refused: ") + output.substr(0, output.find('\n'));
    for (const COverrideExpression& item : plan.Items()) outcome += (outcome.empty() ? "" : "; ") + ExpressionText(item);
    return outcome;
}

TEST(OverrideParser, TreesOfTexts) {
    for (const pextest::Case& c : pextest::ReadCases("expr/cases/parse_trees.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(Outcome(c[2] == "escaped" ? pextest::Unescape(c[0]) : c[0]), c[1]);
    }
    EXPECT_EQ(Outcome(""), "refused: syntax error");
    // The longest string a token holds is gathered whole.
    const std::string longest(8190, 's');
    EXPECT_EQ(Outcome("FORCED = \"" + longest + "\" "), "SET(FORCED, \"" + longest + "\")");
}

}  // namespace
