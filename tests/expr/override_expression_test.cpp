// The values of the expression language and their texts. Result types and settable names are
// checked through validation (validation_test.cpp).
#include "expr/override_expression.h"

#include <gtest/gtest.h>

#include "expr/override_grammar.hpp"

namespace {

using Node = COverrideExpression;

TEST(OverrideExpression, ConversionsAndTexts) {
    EXPECT_TRUE(Node::FromText(Node::kBool, "t").boolValue);
    EXPECT_FALSE(Node::FromText(Node::kBool, "yes").boolValue);
    EXPECT_EQ(Node::FromText(Node::kNumber, "abc").number, 0.0);
    EXPECT_EQ(Node::FromToken(TOK_FUNCTION_NAME, "And").type, Node::kFunc);
    EXPECT_EQ(Node::FromToken(TOK_SETTING, "Forced").stringValue, "Forced");
    Node forced = Node::FromSymbol("forced", "1");  // typed by the command table
    EXPECT_EQ(forced.type, Node::kBool);
    EXPECT_TRUE(forced.boolValue);
    EXPECT_EQ(Node::FromSymbol("CVAR", "x").type, Node::kBool);
    EXPECT_EQ(Node::FromSymbol("Size", "12").type, Node::kNone);
    EXPECT_STREQ(Node::TypeName(5), "unknown type");

    EXPECT_EQ(Node::FromText(Node::kNumber, "2.5").ValueText(), "2.500000");
    EXPECT_EQ(Node::Failure(-2147418113).ValueText(), "0x8000ffff");
    Node list = Node::ParamList();
    list.params = {Node::FromText(Node::kNumber, "1"), Node::FromString("x"), Node::FromText(Node::kFunc, "AND")};
    EXPECT_EQ(list.DisplayText(), "1.000000,x,AND()");
    EXPECT_EQ(list.params[2].stringValue, "AND()");  // text forms leave their result behind
    EXPECT_EQ(Node::Failure(0).DisplayText(), "HResult: 0x0(Succeeded!):");
}

}  // namespace
