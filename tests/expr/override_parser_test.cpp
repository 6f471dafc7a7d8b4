// The scanner and the grammar, seen through the trees they build.
#include "expr/override_parser.h"

#include <gtest/gtest.h>

#include "tests/expr/expr_test_support.h"
#include "tests/support/case_file.h"

namespace {

using exprtest::ParseText;
using Items = std::vector<std::string>;

// The items a text parses to, or "refused: " and what the parser printed, then what it kept.
std::string Outcome(const std::string& text) {
    exprtest::Parsed parsed = ParseText(text);
    std::string outcome;
    if (!parsed.ok) outcome = "refused: " + parsed.output.substr(0, parsed.output.find('\n'));
    for (const std::string& item : parsed.items) outcome += (outcome.empty() ? "" : "; ") + item;
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
        exprtest::Parsed parsed = ParseText(text);
        EXPECT_EQ(parsed.output, "ab\n");
        EXPECT_EQ(parsed.items, Items{"SET(FORCED, \"cd\")"});
    }
}

TEST(OverrideScanner, ATokenReachingTheBufferLimitEndsOnlyThatParse) {
    // The limit counts the token and its NUL (a string: what it gathered and its closing quote).
    // Each token is followed by a blank: at the very end of a text the scanner also counts the
    // end-of-buffer marker, one byte more.
    const std::string name(8191, 'x'), text(8190, 's');
    EXPECT_EQ(Outcome("FORCED = " + name + " "), "SET(FORCED, <unknown name>)");
    EXPECT_EQ(Outcome("FORCED = \"" + text + "\" "), "SET(FORCED, \"" + text + "\")");
    for (const std::string& tooLong : {"FORCED = " + name + "x ", "FORCED = \"" + text + "s\" "}) {
        testing::internal::CaptureStderr();
        EXPECT_EQ(Outcome(tooLong), "refused: ");
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "token too large, exceeds YYLMAX\n");
        EXPECT_EQ(Outcome("FORCED = TRUE"), "SET(FORCED, TRUE)");  // the scanner was reset
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
    EXPECT_EQ(Outcome(nested(194)), "SET(FORCED, TRUE)");
    EXPECT_EQ(Outcome(nested(195)), "refused: parser stack overflow");
    std::string nots = "FORCED = ";
    for (int i = 0; i < 300; ++i) nots += "NOT ";
    EXPECT_EQ(Outcome(nots + "TRUE"), "refused: parser stack overflow");

    testing::internal::CaptureStdout();
    EXPECT_EQ(ParseOverrideText(nested(300)), kParseStackOverflow);
    EXPECT_EQ(ParseOverrideText("FORCED = "), kParseSyntaxError);
    EXPECT_EQ(ParseOverrideText(std::string("FORCED = TRUE\0; x", 17)), kParseAccepted);  // C text
    testing::internal::GetCapturedStdout();
}

}  // namespace
