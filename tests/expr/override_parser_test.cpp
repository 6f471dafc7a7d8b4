// The scanner and the grammar, seen through the trees they build.
#include "expr/override_parser.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"

namespace {

using exprtest::ParseText;
using Items = std::vector<std::string>;

Items ItemsOf(const std::string& text) {
    exprtest::Parsed parsed = ParseText(text);
    EXPECT_TRUE(parsed.ok) << text << ": " << parsed.output;
    return parsed.items;
}

std::string OnlyItem(const std::string& text) {
    Items items = ItemsOf(text);
    return items.size() == 1 ? items[0] : "<" + std::to_string(items.size()) + " items>";
}

void ExpectSyntaxError(const std::string& text) {
    exprtest::Parsed parsed = ParseText(text);
    EXPECT_FALSE(parsed.ok) << text;
    EXPECT_EQ(parsed.output, "syntax error\n") << text;
}

TEST(OverrideGrammar, PrecedenceAndAssociativity) {
    EXPECT_EQ(OnlyItem("FORCED = HomeDir & AVAR AND BVAR"),
              "SET(FORCED, CONCAT(HomeDir, AND(AVAR, BVAR)))");
    EXPECT_EQ(OnlyItem("FORCED = AVAR OR BVAR XOR CVAR"), "SET(FORCED, OR(AVAR, XOR(BVAR, CVAR)))");
    EXPECT_EQ(OnlyItem("FORCED = AVAR XOR BVAR OR CVAR"), "SET(FORCED, OR(XOR(AVAR, BVAR), CVAR))");
    EXPECT_EQ(OnlyItem("FORCED = NOT AVAR AND BVAR"), "SET(FORCED, AND(NOT(AVAR), BVAR))");
    EXPECT_EQ(OnlyItem("FORCED = AVAR AND BVAR AND CVAR"), "SET(FORCED, AND(AND(AVAR, BVAR), CVAR))");
    EXPECT_EQ(OnlyItem("FORCED = AVAR AND (BVAR OR CVAR)"), "SET(FORCED, AND(AVAR, OR(BVAR, CVAR)))");
    EXPECT_EQ(OnlyItem("FORCED = AND(TRUE, FALSE)"), OnlyItem("FORCED = TRUE AND FALSE"));
}

TEST(OverrideGrammar, LegalTexts) {
    EXPECT_EQ(OnlyItem("FORCED=TRUE"), "SET(FORCED, TRUE)");
    EXPECT_EQ(OnlyItem("forced = true"), "SET(forced, TRUE)");
    EXPECT_EQ(OnlyItem("Forced=True"), "SET(Forced, TRUE)");
    EXPECT_EQ(OnlyItem("forced = NOT FileExists(\"c:\\\\temp\\\\a.dll\")"),
              "SET(forced, NOT(FileExists(\"c:\\\\temp\\\\a.dll\")))");
    EXPECT_EQ(OnlyItem("FORCED = FORCED OR FileVersionAtLeast(HomeDir & FileName, \"4.1.0.0\")"),
              "SET(FORCED, OR(FORCED, FileVersionAtLeast(CONCAT(HomeDir, FileName), \"4.1.0.0\")))");
    EXPECT_EQ(ItemsOf("FORCED = IIFB(IsUnderstood(\"FileExists\"), FileExists(AddPathSep(HomeDir) "
                      "& \"x.exe\"), FALSE); FORCED = FORCED XOR TRUE"),
              (Items{"SET(FORCED, IIFB(IsUnderstood(\"FileExists\"), "
                     "FileExists(CONCAT(AddPathSep(HomeDir), \"x.exe\")), FALSE))",
                     "SET(FORCED, XOR(FORCED, TRUE))"}));
}

TEST(OverrideGrammar, ShapesThatAreNotTexts) {
    ExpectSyntaxError("");
    ExpectSyntaxError("FORCED = TRUE;");
    ExpectSyntaxError("TRUE");
    ExpectSyntaxError("FORCED = FileExists()");
    ExpectSyntaxError("HomeDir = \"x\"");
    ExpectSyntaxError("FORCED = TRUE FALSE");
}

TEST(OverrideGrammar, AssignmentsBeforeASyntaxErrorStayInThePlan) {
    exprtest::Parsed parsed = ParseText("FORCED = TRUE; FORCED = ; FORCED = FALSE");
    EXPECT_FALSE(parsed.ok);
    EXPECT_EQ(parsed.items, Items{"SET(FORCED, TRUE)"});
}

TEST(OverrideScanner, ANameDirectlyBeforeAParenthesisIsAFunctionName) {
    EXPECT_EQ(OnlyItem("FORCED = NOT(TRUE)"), "SET(FORCED, NOT(TRUE))");
    EXPECT_EQ(OnlyItem("FORCED = CONCAT(\"a\", \"b\")"), "SET(FORCED, CONCAT(\"a\", \"b\"))");
    EXPECT_EQ(OnlyItem("FORCED = TRUE(FALSE)"), "SET(FORCED, TRUE(FALSE))");
    EXPECT_EQ(OnlyItem("FORCED = Foo(1, 2)"), "SET(FORCED, Foo(1, 2))");
    // With a blank before "(", only the nine function keywords still call.
    EXPECT_EQ(OnlyItem("FORCED = IIFS (TRUE, \"a\", \"b\")"), "SET(FORCED, IIFS(TRUE, \"a\", \"b\"))");
    EXPECT_EQ(OnlyItem("FORCED = func3 (1)"), "SET(FORCED, func3(1))");
    ExpectSyntaxError("FORCED = CONCAT (\"a\", \"b\")");
    ExpectSyntaxError("FORCED = AND (TRUE, FALSE)");
}

TEST(OverrideScanner, KeywordsFollowedByLettersOrDigitsAreIdentifiers) {
    // Identifiers outside the table become error nodes, shown as <unknown name>.
    EXPECT_EQ(OnlyItem("FORCED = ANDY"), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(OnlyItem("FORCED = FORCED2"), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(OnlyItem("FORCED = TRUE1"), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(OnlyItem("FORCED = NOTX"), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(OnlyItem("FORCED = X1"), "SET(FORCED, <unknown name>)");
    ExpectSyntaxError("FORCEDX = TRUE");
}

TEST(OverrideScanner, DownloadFileIsTheOnlyNameWithAnUnderscore) {
    EXPECT_EQ(OnlyItem("DOWNLOAD_FILE = TRUE"), "SET(<unknown name>, TRUE)");
    EXPECT_EQ(OnlyItem("snoozeable = download_file"), "SET(<unknown name>, <unknown name>)");
    ExpectSyntaxError("FORCED = DOWNLOAD_FILEX");   // the setting, then the identifier X
    ExpectSyntaxError("FORCED = DOWNLOAD_FILE(TRUE)");
    ExpectSyntaxError("FORCED = DOWNLOAD_X");       // DOWNLOAD, then a raw underscore
    ExpectSyntaxError("FORCED = X_1");
}

TEST(OverrideScanner, NumbersAndRawCharacters) {
    EXPECT_EQ(OnlyItem("FORCED = -3"), "SET(FORCED, -3)");
    EXPECT_EQ(OnlyItem("FORCED = 2.5"), "SET(FORCED, 2.5)");
    EXPECT_EQ(OnlyItem("FORCED = 12."), "SET(FORCED, 12)");
    ExpectSyntaxError("FORCED = .5");
    ExpectSyntaxError("FORCED = - 3");
    ExpectSyntaxError("FORCED =\rTRUE");  // a carriage return is not white space
    ExpectSyntaxError("FORCED = TRUE \\");
    ExpectSyntaxError("FORCED = \xE9");
    EXPECT_EQ(OnlyItem("FORCED\t=\n\tTRUE"), "SET(FORCED, TRUE)");
}

TEST(OverrideScanner, StringEscapes) {
    EXPECT_EQ(OnlyItem(R"(FORCED = "c:\\temp\\a.dll")"), R"(SET(FORCED, "c:\\temp\\a.dll"))");
    EXPECT_EQ(OnlyItem(R"(FORCED = "a\tb\Nc")"), "SET(FORCED, \"a\\nb\\nc\")");  // both line feeds
    EXPECT_EQ(OnlyItem(R"(FORCED = "\A\q")"), "SET(FORCED, \"Aq\")");
    EXPECT_EQ(OnlyItem(R"(FORCED = "say \"hi\"")"), R"(SET(FORCED, "say \"hi\""))");
    EXPECT_EQ(OnlyItem(R"(FORCED = "")"), R"(SET(FORCED, ""))");
    EXPECT_EQ(OnlyItem("FORCED = \"semi;colon = AND(\""), "SET(FORCED, \"semi;colon = AND(\")");
}

TEST(OverrideScanner, ALineFeedInAStringEchoesWhatWasGathered) {
    exprtest::Parsed parsed = ParseText("FORCED = \"ab\ncd\"");
    EXPECT_TRUE(parsed.ok);
    EXPECT_EQ(parsed.output, "ab\n");
    EXPECT_EQ(parsed.items, Items{"SET(FORCED, \"cd\")"});

    parsed = ParseText("FORCED = \"ab\\\ncd\"");  // inside an escape
    EXPECT_EQ(parsed.output, "ab\n");
    EXPECT_EQ(parsed.items, Items{"SET(FORCED, \"cd\")"});
}

TEST(OverrideScanner, EveryParseStartsOutsideAString) {
    ExpectSyntaxError("FORCED = \"unterminated");
    EXPECT_EQ(OnlyItem("FORCED = TRUE"), "SET(FORCED, TRUE)");
    ExpectSyntaxError("FORCED = \"ends in an escape\\");
    EXPECT_EQ(OnlyItem("FORCED = FALSE"), "SET(FORCED, FALSE)");
}

TEST(OverrideScanner, ATokenReachingTheBufferLimitEndsOnlyThatParse) {
    // The limit counts the token and its NUL (a string: what it gathered and its closing quote).
    // Each token is followed by a blank: at the very end of a text the scanner also counts the
    // end-of-buffer marker, one byte more.
    const std::string name(8191, 'x'), text(8190, 's');
    EXPECT_EQ(OnlyItem("FORCED = " + name + " "), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(OnlyItem("FORCED = \"" + text + "\" "), "SET(FORCED, \"" + text + "\")");
    EXPECT_EQ(OnlyItem("FORCED = " + std::string(8191, '7') + " "), "SET(FORCED, inf)");

    for (const std::string& tooLong : {"FORCED = " + name + "x ", "FORCED = \"" + text + "s\" "}) {
        testing::internal::CaptureStderr();
        exprtest::Parsed parsed = ParseText(tooLong);
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "token too large, exceeds YYLMAX\n");
        EXPECT_FALSE(parsed.ok);
        EXPECT_EQ(parsed.output, "");
        EXPECT_EQ(OnlyItem("FORCED = TRUE"), "SET(FORCED, TRUE)");  // the scanner was reset
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
    EXPECT_EQ(OnlyItem(nested(194)), "SET(FORCED, TRUE)");
    exprtest::Parsed parsed = ParseText(nested(195));
    EXPECT_FALSE(parsed.ok);
    EXPECT_EQ(parsed.output, "parser stack overflow\n");

    std::string nots = "FORCED = ";
    for (int i = 0; i < 300; ++i) nots += "NOT ";
    parsed = ParseText(nots + "TRUE");
    EXPECT_EQ(parsed.output, "parser stack overflow\n");

    testing::internal::CaptureStdout();
    EXPECT_EQ(ParseOverrideText(nested(300)), kParseStackOverflow);
    EXPECT_EQ(ParseOverrideText("FORCED = "), kParseSyntaxError);
    EXPECT_EQ(ParseOverrideText("FORCED = TRUE"), kParseAccepted);
    testing::internal::GetCapturedStdout();
}

TEST(OverrideParser, TheTextEndsAtItsFirstNul) {
    EXPECT_EQ(OnlyItem(std::string("FORCED = TRUE\0; garbage", 23)), "SET(FORCED, TRUE)");
}

}  // namespace
