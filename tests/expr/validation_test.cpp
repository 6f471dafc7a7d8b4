#include "expr/validation.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"
#include "tests/support/case_file.h"

namespace {

using Comments = std::vector<std::string>;
using Node = COverrideExpression;

TEST(Validation, CommentsOfParsedTexts) {
    for (const pextest::Case& c : pextest::ReadCases("expr/cases/validation.txt")) {
        SCOPED_TRACE(c.where);
        Comments expected;
        for (std::size_t i = 1; i < c.fields.size(); ++i) expected.push_back(pextest::Unescape(c[i]));
        ExecutionPlan plan;
        ASSERT_TRUE(exprtest::QuietParse(plan, c[0]));
        EXPECT_EQ(plan.Validate() ? Comments{"valid"} : plan.Comments(), expected);
    }
}

TEST(Validation, NodesNoTextProduces) {
    Comments comments;
    EXPECT_FALSE(Validate(Node::FromText(Node::kFunc, "Foo"), comments));
    EXPECT_EQ(comments, Comments{"Unknown command:Foo"});

    comments.clear();
    Node set = Node::FromText(Node::kFunc, "set");  // only the upper-case SET is an assignment
    set.params = {Node::FromText(Node::kFunc, "FORCED"), Node::FromBool(true)};
    EXPECT_FALSE(Validate(set, comments));
    EXPECT_EQ(comments, (Comments{"set: Type mismatch for Parameter # 1 FORCED - expected None",
                                  "set: Type mismatch for Parameter # 2  - expected None"}));
}

}  // namespace
