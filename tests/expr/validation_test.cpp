#include "expr/validation.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"

namespace {

using exprtest::ValidationOf;
using Comments = std::vector<std::string>;
using Node = COverrideExpression;

TEST(Validation, AssignmentsOfTheRightTypeToSettableNames) {
    EXPECT_EQ(ValidationOf("FORCED = TRUE"), Comments{"valid"});
    EXPECT_EQ(ValidationOf("FORCED = AVAR"), Comments{"valid"});
    EXPECT_EQ(ValidationOf("FORCED = CVAR"), Comments{"valid"});  // CVAR's result type is Bool
    EXPECT_EQ(ValidationOf("FORCED = forced"), Comments{"valid"});
    EXPECT_EQ(ValidationOf("FORCED = IIFB(IsUnderstood(\"FileExists\"), FileExists(AddPathSep("
                           "HomeDir) & \"x.exe\"), FALSE); FORCED = FORCED XOR TRUE"),
              Comments{"valid"});
}

TEST(Validation, AssignmentProblems) {
    EXPECT_EQ(ValidationOf("FORCED = \"yes\""), Comments{"Type mismatch between FORCED and "});
    EXPECT_EQ(ValidationOf("SNOOZEABLE = TRUE"),
              (Comments{"Type mismatch between  and ", "Attempting to set unsettable object:"}));
    EXPECT_EQ(ValidationOf("FORCED = SET(HomeDir, \"x\")"),
              Comments{"Type mismatch between FORCED and SET"});
    EXPECT_EQ(ValidationOf("FORCED = Foo(TRUE)"), Comments{"Type mismatch between FORCED and Foo"});
}

TEST(Validation, CallProblems) {
    EXPECT_EQ(ValidationOf("FORCED = AND(TRUE)"), Comments{"Wrong # of parameters for AND - expects 2"});
    EXPECT_EQ(ValidationOf("FORCED = AND(TRUE, \"x\")"),
              Comments{"AND: Type mismatch for Parameter # 2  - expected Bool"});
    EXPECT_EQ(ValidationOf("FORCED = AND(Foo(TRUE), TRUE)"),
              Comments{"AND: Type mismatch for Parameter # 1 Foo - expected Bool"});
    EXPECT_EQ(ValidationOf("FORCED = NOT(TRUE, FALSE)"),
              (Comments{"Wrong # of parameters for NOT - expects 1",
                        "NOT: Type mismatch for Parameter # 2  - expected None"}));
    EXPECT_EQ(ValidationOf("FORCED = AND(TRUE, Nope)"),
              Comments{"AND: Type mismatch for Parameter # 2  - expected Bool"});
    // Only the five typed positions are checked.
    EXPECT_EQ(ValidationOf("FORCED = iifb(1, TRUE, FALSE, 4, 5, 6)"),
              (Comments{"Wrong # of parameters for iifb - expects 3",
                        "iifb: Type mismatch for Parameter # 1  - expected Bool",
                        "iifb: Type mismatch for Parameter # 4  - expected None",
                        "iifb: Type mismatch for Parameter # 5  - expected None"}));
    EXPECT_EQ(ValidationOf("FORCED = FORCED(TRUE)"), Comments{"Wrong # of parameters for FORCED - expects 0"});
}

TEST(Validation, DescentStopsAtTheFirstInvalidNode) {
    EXPECT_EQ(ValidationOf("FORCED = AND(NOT(\"a\"), OR(TRUE))"),
              Comments{"NOT: Type mismatch for Parameter # 1  - expected Bool"});
    EXPECT_EQ(ValidationOf("FORCED = IIFB(TRUE, CONCAT, FALSE)"),
              Comments{"IIFB: Type mismatch for Parameter # 2 CONCAT - expected Bool"});
    EXPECT_EQ(ValidationOf("FORCED = IsUnderstood(CONCAT)"),
              Comments{"Wrong # of parameters for CONCAT - expects 2"});
}

TEST(Validation, NodesOutsideTheTable) {
    Comments comments;
    EXPECT_FALSE(Validate(Node::FromText(Node::kFunc, "Foo"), comments));
    EXPECT_EQ(comments, Comments{"Unknown command:Foo"});

    comments.clear();
    Node set = Node::FromText(Node::kFunc, "set");  // only the upper-case SET is an assignment
    set.params = {Node::FromText(Node::kFunc, "AVAR"), Node::FromString("x")};
    EXPECT_FALSE(Validate(set, comments));
    EXPECT_EQ(comments, (Comments{"set: Type mismatch for Parameter # 1 AVAR - expected None",
                                  "set: Type mismatch for Parameter # 2  - expected None"}));
    EXPECT_TRUE(Validate(Node::Failure(Node::kUnexpected), comments));  // only calls are checked
}

}  // namespace
