#include "expr/validation.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"

namespace {

using Comments = std::vector<std::string>;
using Node = COverrideExpression;

TEST(Validation, CommentsOfParsedTexts) {
    const std::pair<const char*, Comments> cases[] = {
        {"FORCED = TRUE", {"valid"}},
        {"FORCED = AVAR", {"valid"}},
        {"FORCED = CVAR", {"valid"}},  // CVAR's result type is Bool
        {"FORCED = forced", {"valid"}},
        {"FORCED = \"yes\"", {"Type mismatch between FORCED and "}},
        {"SNOOZEABLE = TRUE",
         {"Type mismatch between  and ", "Attempting to set unsettable object:"}},
        {"FORCED = SET(HomeDir, \"x\")", {"Type mismatch between FORCED and SET"}},
        {"FORCED = Foo(TRUE)", {"Type mismatch between FORCED and Foo"}},
        {"FORCED = FileExists(concat(\"a\", \"b\"))", {"valid"}},  // result types by any case
        {"FORCED = AND(TRUE)", {"Wrong # of parameters for AND - expects 2"}},
        {"FORCED = AND(TRUE, \"x\")", {"AND: Type mismatch for Parameter # 2  - expected Bool"}},
        {"FORCED = AND(TRUE, Nope)", {"AND: Type mismatch for Parameter # 2  - expected Bool"}},
        {"FORCED = AND(Foo(TRUE), TRUE)",
         {"AND: Type mismatch for Parameter # 1 Foo - expected Bool"}},
        {"FORCED = NOT(TRUE, FALSE)",
         {"Wrong # of parameters for NOT - expects 1",
          "NOT: Type mismatch for Parameter # 2  - expected None"}},
        // Only the five typed positions are checked; names appear as written.
        {"FORCED = iifb(1, TRUE, FALSE, 4, 5, 6)",
         {"Wrong # of parameters for iifb - expects 3",
          "iifb: Type mismatch for Parameter # 1  - expected Bool",
          "iifb: Type mismatch for Parameter # 4  - expected None",
          "iifb: Type mismatch for Parameter # 5  - expected None"}},
        // The descent stops at the first invalid node.
        {"FORCED = AND(NOT(\"a\"), OR(TRUE))",
         {"NOT: Type mismatch for Parameter # 1  - expected Bool"}},
        {"FORCED = IsUnderstood(CONCAT)", {"Wrong # of parameters for CONCAT - expects 2"}},
    };
    for (const auto& [text, comments] : cases) {
        EXPECT_EQ(exprtest::ValidationOf(text), comments) << text;
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
