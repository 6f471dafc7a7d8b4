#include "expr/override_expression.h"

#include <gtest/gtest.h>

#include "expr/command_table.h"
#include "expr/override_grammar.hpp"

namespace {

using Node = COverrideExpression;

TEST(OverrideExpression, TokenCodesFollowTheirDeclaredOrder) {
    const int codes[] = {TOK_OVERRIDE_SEP, TOK_EQUAL, TOK_VAR, TOK_SETTING, TOK_PAREN_L,
                         TOK_PAREN_R, TOK_COMMA, TOK_STRING, TOK_FUNCTION_NAME, TOK_NUMBER,
                         TOK_CONCAT, TOK_TRUE, TOK_FALSE, TOK_BOOL_OR, TOK_BOOL_XOR,
                         TOK_BOOL_AND, TOK_BOOL_NOT};
    for (int i = 0; i < 17; ++i) EXPECT_EQ(codes[i], 258 + i);
}

TEST(OverrideExpression, SetFromConvertsByType) {
    EXPECT_TRUE(Node::FromText(Node::kBool, "t").boolValue);
    EXPECT_TRUE(Node::FromText(Node::kBool, "True").boolValue);
    EXPECT_TRUE(Node::FromText(Node::kBool, "1").boolValue);
    EXPECT_FALSE(Node::FromText(Node::kBool, "yes").boolValue);
    EXPECT_FALSE(Node::FromText(Node::kBool, "").boolValue);
    EXPECT_EQ(Node::FromText(Node::kNumber, "abc").number, 0.0);
    EXPECT_EQ(Node::FromText(Node::kNumber, "2.5xyz").number, 2.5);
    EXPECT_EQ(Node::FromText(Node::kFunc, "And").name, "And");
    EXPECT_EQ(Node::FromText(Node::kNone, "Kept").stringValue, "Kept");

    Node odd = Node::FromText(5, "x");
    EXPECT_EQ(odd.type, 5);
    EXPECT_EQ(odd.stringValue, "");
    EXPECT_STREQ(Node::TypeName(5), "unknown type");
}

TEST(OverrideExpression, TokenAndSymbolConstructionsChooseTheType) {
    EXPECT_EQ(Node::FromToken(TOK_FUNCTION_NAME, "AND").type, Node::kFunc);
    EXPECT_EQ(Node::FromToken(TOK_NUMBER, "-3").number, -3.0);
    EXPECT_FALSE(Node::FromToken(TOK_FALSE, "FALSE").boolValue);
    EXPECT_TRUE(Node::FromToken(TOK_TRUE, "true").boolValue);
    EXPECT_EQ(Node::FromToken(TOK_SETTING, "Forced").stringValue, "Forced");
    EXPECT_EQ(Node::FromToken(TOK_CONCAT, "&").type, Node::kString);

    Node forced = Node::FromSymbol("forced", "1");
    EXPECT_EQ(forced.type, Node::kBool);
    EXPECT_TRUE(forced.boolValue);
    EXPECT_EQ(Node::FromSymbol("HomeDir", "c:\\x").stringValue, "c:\\x");
    EXPECT_EQ(Node::FromSymbol("CVAR", "T").type, Node::kBool);
    Node unknown = Node::FromSymbol("Size", "12");
    EXPECT_EQ(unknown.type, Node::kNone);
    EXPECT_EQ(unknown.stringValue, "12");
}

TEST(OverrideExpression, ValueTextIsWhatARowStores) {
    EXPECT_EQ(Node::FromBool(true).ValueText(), "1");
    EXPECT_EQ(Node::FromBool(false).ValueText(), "0");
    EXPECT_EQ(Node::FromText(Node::kNumber, "2.5").ValueText(), "2.500000");
    EXPECT_EQ(Node::Failure(-2147418113).ValueText(), "0x8000ffff");
    EXPECT_EQ(Node::FromString("c:\\a").ValueText(), "c:\\a");
}

TEST(OverrideExpression, DisplayTextIsWhatTracesShow) {
    EXPECT_EQ(Node::FromText(Node::kNumber, "1").DisplayText(), "1.000000");
    EXPECT_EQ(Node::FromBool(false).DisplayText(), "false");
    Node call = Node::FromText(Node::kFunc, "AND");
    call.params.push_back(Node::FromBool(true));
    EXPECT_EQ(call.DisplayText(), "AND()");
    EXPECT_EQ(call.stringValue, "AND()");  // text forms leave their result behind

    Node list = Node::ParamList();
    list.params = {Node::FromBool(true), Node::FromString("x"), call};
    EXPECT_EQ(list.DisplayText(), "true,x,AND()");

    EXPECT_EQ(Node::Failure(Node::kUnexpected, "GetVar: Type Mismatch").DisplayText(),
              "HResult: 0x8000ffff(Failed!):GetVar: Type Mismatch");
    EXPECT_EQ(Node::Failure(0).DisplayText(), "HResult: 0x0(Succeeded!):");
}

TEST(OverrideExpression, ResultTypeAndSettableComeFromTheTable) {
    EXPECT_EQ(Node::FromText(Node::kFunc, "concat").ResultType(), Node::kString);
    EXPECT_EQ(Node::FromText(Node::kFunc, "SET").ResultType(), Node::kNone);
    EXPECT_EQ(Node::FromText(Node::kFunc, "Foo").ResultType(), Node::kFunc);
    EXPECT_EQ(Node::Failure(Node::kUnexpected).ResultType(), Node::kError);
    EXPECT_TRUE(Node::FromText(Node::kFunc, "HOMEDIR").IsSettable());
    EXPECT_TRUE(Node::FromText(Node::kFunc, "FileName").IsSettable());
    EXPECT_FALSE(Node::FromText(Node::kFunc, "AVAR").IsSettable());
    EXPECT_FALSE(Node::FromString("FORCED").IsSettable());  // a literal has no name
}

TEST(CommandTable, OrderAndSignatures) {
    const char* names[] = {"AND", "OR", "XOR", "NOT", "CONCAT", "IIFS", "IIFB",
                           "IIFN", "IsUnderstood", "FileVersionAtLeast", "FileExists",
                           "AddPathSep", "SET", "AVAR", "BVAR", "CVAR", "FORCED",
                           "HomeDir", "FileName"};
    ASSERT_EQ(CommandTableSize(), 19u);
    for (std::size_t i = 0; i < 19; ++i) EXPECT_STREQ(CommandTable()[i].name, names[i]);

    const CommandEntry* iifn = LookupCommand("iifn");
    ASSERT_NE(iifn, nullptr);
    EXPECT_EQ(iifn->paramCount, 3);
    EXPECT_EQ(iifn->paramTypes[0], Node::kBool);
    EXPECT_EQ(iifn->paramTypes[2], Node::kNumber);
    EXPECT_EQ(iifn->paramTypes[3], Node::kNone);

    const CommandEntry* cvar = LookupCommand("CVAR");
    EXPECT_EQ(cvar->resultType, Node::kBool);
    EXPECT_EQ(cvar->paramTypes[0], Node::kString);
    EXPECT_EQ(LookupCommand("DOESREGIPHAVE"), nullptr);
    EXPECT_EQ(LookupCommand(std::string("AND\0X", 5)), nullptr);
}

}  // namespace
