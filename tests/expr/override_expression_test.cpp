#include "expr/override_expression.h"

#include <gtest/gtest.h>

#include "expr/override_grammar.hpp"

namespace {

using Node = COverrideExpression;

TEST(OverrideExpression, TokenCodesFollowTheirDeclaredOrder) {
    EXPECT_EQ(TOK_OVERRIDE_SEP, 258);
    EXPECT_EQ(TOK_STRING, 265);
    EXPECT_EQ(TOK_FUNCTION_NAME, 266);
    EXPECT_EQ(TOK_BOOL_NOT, 274);
}

TEST(OverrideExpression, ConversionsFromText) {
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
}

TEST(OverrideExpression, TextForms) {
    EXPECT_EQ(Node::FromBool(true).ValueText(), "1");
    EXPECT_EQ(Node::FromText(Node::kNumber, "2.5").ValueText(), "2.500000");
    EXPECT_EQ(Node::Failure(-2147418113).ValueText(), "0x8000ffff");
    EXPECT_EQ(Node::FromText(Node::kNumber, "1").DisplayText(), "1.000000");
    Node list = Node::ParamList();
    list.params = {Node::FromBool(false), Node::FromString("x"), Node::FromText(Node::kFunc, "AND")};
    EXPECT_EQ(list.DisplayText(), "false,x,AND()");
    EXPECT_EQ(list.params[2].stringValue, "AND()");  // text forms leave their result behind
    EXPECT_EQ(Node::Failure(Node::kUnexpected, "m").DisplayText(), "HResult: 0x8000ffff(Failed!):m");
    EXPECT_EQ(Node::Failure(0).DisplayText(), "HResult: 0x0(Succeeded!):");
}

TEST(OverrideExpression, ResultTypeAndSettableComeFromTheTable) {
    EXPECT_EQ(Node::FromText(Node::kFunc, "concat").ResultType(), Node::kString);
    EXPECT_EQ(Node::FromText(Node::kFunc, "SET").ResultType(), Node::kNone);
    EXPECT_EQ(Node::FromText(Node::kFunc, "Foo").ResultType(), Node::kFunc);
    EXPECT_EQ(Node::Failure(Node::kUnexpected).ResultType(), Node::kError);
    EXPECT_TRUE(Node::FromText(Node::kFunc, "HOMEDIR").IsSettable());
    EXPECT_FALSE(Node::FromText(Node::kFunc, "AVAR").IsSettable());
}

}  // namespace
