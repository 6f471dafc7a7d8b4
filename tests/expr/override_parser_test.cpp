// The scanner and the grammar, seen through the trees they build.
#include "expr/override_parser.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"

namespace {

using exprtest::ParseText;
using Items = std::vector<std::string>;

// The one item a text parses to, or what went wrong.
std::string ItemOf(const std::string& text) {
    exprtest::Parsed parsed = ParseText(text);
    if (!parsed.ok) return "refused: " + parsed.output;
    return parsed.items.size() == 1 ? parsed.items[0] : std::to_string(parsed.items.size()) + " items";
}

void ExpectTrees(const std::vector<std::pair<std::string, std::string>>& cases) {
    for (const auto& [text, tree] : cases) EXPECT_EQ(ItemOf(text), tree) << text;
}

void ExpectSyntaxErrors(const std::vector<std::string>& texts) {
    for (const std::string& text : texts) EXPECT_EQ(ItemOf(text), "refused: syntax error\n") << text;
}

TEST(OverrideGrammar, PrecedenceAndAssociativity) {
    ExpectTrees({
        {"FORCED = HomeDir & AVAR AND BVAR", "SET(FORCED, CONCAT(HomeDir, AND(AVAR, BVAR)))"},
        {"FORCED = AVAR OR BVAR XOR CVAR", "SET(FORCED, OR(AVAR, XOR(BVAR, CVAR)))"},
        {"FORCED = AVAR XOR BVAR OR CVAR", "SET(FORCED, OR(XOR(AVAR, BVAR), CVAR))"},
        {"FORCED = NOT AVAR AND BVAR", "SET(FORCED, AND(NOT(AVAR), BVAR))"},
        {"FORCED = AVAR AND BVAR AND CVAR", "SET(FORCED, AND(AND(AVAR, BVAR), CVAR))"},
        {"FORCED = AVAR AND (BVAR OR CVAR)", "SET(FORCED, AND(AVAR, OR(BVAR, CVAR)))"},
        {"FORCED = TRUE AND FALSE", "SET(FORCED, AND(TRUE, FALSE))"},
        {"FORCED = AND(TRUE, FALSE)", "SET(FORCED, AND(TRUE, FALSE))"},
    });
}

TEST(OverrideGrammar, TextShapes) {
    ExpectTrees({
        {"FORCED=TRUE", "SET(FORCED, TRUE)"},
        {"Forced\t=\n\ttrue", "SET(Forced, TRUE)"},
        {"FORCED = FORCED OR FileVersionAtLeast(HomeDir & FileName, \"4.1.0.0\")",
         "SET(FORCED, OR(FORCED, FileVersionAtLeast(CONCAT(HomeDir, FileName), \"4.1.0.0\")))"},
    });
    ExpectSyntaxErrors({"", "FORCED = TRUE;", "TRUE", "FORCED = FileExists()", "HomeDir = \"x\"",
                        "FORCED = TRUE FALSE"});
    // Assignments reduced before the error stay in the plan.
    EXPECT_EQ(ParseText("FORCED = TRUE; FORCED = ; FORCED = FALSE").items, Items{"SET(FORCED, TRUE)"});
}

TEST(OverrideScanner, NamesKeywordsAndFunctionNames) {
    ExpectTrees({
        // Directly before "(", any name calls, keywords included.
        {"FORCED = NOT(TRUE)", "SET(FORCED, NOT(TRUE))"},
        {"FORCED = CONCAT(\"a\", \"b\")", "SET(FORCED, CONCAT(\"a\", \"b\"))"},
        {"FORCED = TRUE(FALSE)", "SET(FORCED, TRUE(FALSE))"},
        // With a blank before "(", only the nine function keywords still call.
        {"FORCED = IIFS (TRUE, \"a\", \"b\")", "SET(FORCED, IIFS(TRUE, \"a\", \"b\"))"},
        {"FORCED = func3 (1)", "SET(FORCED, func3(1))"},
        // A keyword followed by letters or digits is an identifier (unknown ones become errors).
        {"FORCED = ANDY", "SET(FORCED, <unknown name>)"},
        {"FORCED = TRUE1", "SET(FORCED, <unknown name>)"},
        {"FORCED = X1", "SET(FORCED, <unknown name>)"},
        {"DOWNLOAD_FILE = download_file", "SET(<unknown name>, <unknown name>)"},
    });
    ExpectSyntaxErrors({"FORCED = CONCAT (\"a\", \"b\")", "FORCEDX = TRUE",
                        "FORCED = DOWNLOAD_FILEX", "FORCED = DOWNLOAD_FILE(TRUE)",
                        "FORCED = DOWNLOAD_X", "FORCED = X_1"});
}

TEST(OverrideScanner, NumbersAndRawCharacters) {
    ExpectTrees({{"FORCED = -3", "SET(FORCED, -3)"},
                 {"FORCED = 2.5", "SET(FORCED, 2.5)"},
                 {"FORCED = 12.", "SET(FORCED, 12)"}});
    ExpectSyntaxErrors({"FORCED = .5", "FORCED = - 3", "FORCED =\rTRUE", "FORCED = TRUE \\",
                        "FORCED = \xE9"});
}

TEST(OverrideScanner, Strings) {
    ExpectTrees({
        {R"(FORCED = "c:\\temp\\a.dll")", R"(SET(FORCED, "c:\\temp\\a.dll"))"},
        {R"(FORCED = "a\tb\Nc")", R"(SET(FORCED, "a\nb\nc"))"},  // line feeds, no tab
        {R"(FORCED = "\A\q")", R"(SET(FORCED, "Aq"))"},
        {R"(FORCED = "say \"hi\"")", R"(SET(FORCED, "say \"hi\""))"},
        {"FORCED = \"semi;colon = AND(\"", "SET(FORCED, \"semi;colon = AND(\")"},
    });
    // A line feed in a string (or an escape) echoes what was gathered, which is dropped.
    for (const char* text : {"FORCED = \"ab\ncd\"", "FORCED = \"ab\\\ncd\""}) {
        exprtest::Parsed parsed = ParseText(text);
        EXPECT_EQ(parsed.output, "ab\n");
        EXPECT_EQ(parsed.items, Items{"SET(FORCED, \"cd\")"});
    }
    // Each parse starts outside a string, whatever the previous text left open.
    ExpectSyntaxErrors({"FORCED = \"unterminated", "FORCED = \"open escape\\"});
    EXPECT_EQ(ItemOf("FORCED = TRUE"), "SET(FORCED, TRUE)");
}

TEST(OverrideScanner, ATokenReachingTheBufferLimitEndsOnlyThatParse) {
    // The limit counts the token and its NUL (a string: what it gathered and its closing quote).
    // Each token is followed by a blank: at the very end of a text the scanner also counts the
    // end-of-buffer marker, one byte more.
    const std::string name(8191, 'x'), text(8190, 's');
    EXPECT_EQ(ItemOf("FORCED = " + name + " "), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(ItemOf("FORCED = \"" + text + "\" "), "SET(FORCED, \"" + text + "\")");
    for (const std::string& tooLong : {"FORCED = " + name + "x ", "FORCED = \"" + text + "s\" "}) {
        testing::internal::CaptureStderr();
        EXPECT_EQ(ItemOf(tooLong), "refused: ");
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "token too large, exceeds YYLMAX\n");
        EXPECT_EQ(ItemOf("FORCED = TRUE"), "SET(FORCED, TRUE)");  // the scanner was reset
    }
    testing::internal::CaptureStderr();
    EXPECT_EQ(ParseOverrideText("FORCED = " + name + "x "), kParseScannerFailure);
    testing::internal::GetCapturedStderr();
}

TEST(OverrideGrammar, StacksHoldTwoHundredStates) {
    // 0, FORCED, = and one state per "(" are stacked, then the inner expression and ")".
    auto nested = [](int depth) {
        return "FORCED = " + std::string(depth, '(') + "TRUE" + std::string(depth, ')');
    };
    EXPECT_EQ(ItemOf(nested(194)), "SET(FORCED, TRUE)");
    EXPECT_EQ(ItemOf(nested(195)), "refused: parser stack overflow\n");
    std::string nots = "FORCED = ";
    for (int i = 0; i < 300; ++i) nots += "NOT ";
    EXPECT_EQ(ItemOf(nots + "TRUE"), "refused: parser stack overflow\n");

    testing::internal::CaptureStdout();
    EXPECT_EQ(ParseOverrideText(nested(300)), kParseStackOverflow);
    EXPECT_EQ(ParseOverrideText("FORCED = "), kParseSyntaxError);
    EXPECT_EQ(ParseOverrideText(std::string("FORCED = TRUE\0; x", 17)), kParseAccepted);  // C text
    testing::internal::GetCapturedStdout();
}

}  // namespace
