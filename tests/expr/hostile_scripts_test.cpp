// Scripts written to hurt: long texts, deep trees and long tokens cost bounded time and stack,
// and whatever goes wrong inside one row's plan stays that row's failure.
#include <gtest/gtest.h>

#include <new>

#ifndef _WIN32
#include <sys/stat.h>
#include <unistd.h>
#endif

#include "commands/row_preparation.h"
#include "expr/override_parser.h"
#include "platform/paths.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/small_stack.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::QuietParse;
using exprtest::TestRow;

// "FORCED = x op x op ... x" with n operators: a left-leaning tree n + 1 levels deep.
std::string Chain(std::size_t n, const std::string& operand = "TRUE", const std::string& op = " AND ") {
    std::string text = "FORCED = " + operand;
    for (std::size_t i = 0; i < n; ++i) text += op + operand;
    return text;
}

// The parse result of text, printed messages dropped; the plan is thrown away.
int ParseResult(const std::string& text) {
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    const int result = ParseOverrideText(text);
    testing::internal::GetCapturedStderr();
    testing::internal::GetCapturedStdout();
    return result;
}

// Runs each script as a row's script and returns the rows' "Force Download" cells.
std::vector<std::string> ForcedAfter(const std::vector<std::string>& scripts) {
    std::string content = "FileName,Force Download,DynamicFieldInfo\r\n";
    for (std::size_t i = 0; i < scripts.size(); ++i) content += std::to_string(i) + ",0," + scripts[i] + "\r\n";
    CContentTable table;
    EXPECT_GE(table.LoadFromText(content), 0);
    testing::internal::CaptureStdout();
    EvaluateDynamicFields(table);
    testing::internal::GetCapturedStdout();
    std::vector<std::string> forced;
    for (std::uint32_t row = 0; row < table.RowCount(); ++row) forced.push_back(table.Cell(row, 1));
    return forced;
}

// Found by review: every reduction copied its whole left subtree (quadratic: 14k operators took
// 24 s) and copy, validation, evaluation and destruction recursed once per level, so 8,000
// ANDs overflowed a 1 MiB stack inside the load. Each row's plan now fails or runs on such a
// stack, and the next row goes on.
TEST(HostileScripts, LongAndDeepScriptsRunOnAWindowsSizedStack) {
    pextest::TestMachine machine;
    const std::vector<std::string> scripts = {
        Chain(111110),                                 // 1 MB
        Chain(100000, "a", "&"),                       // 100,000 levels
        Chain(kMaxExpressionDepth - 1),                // the deepest tree allowed
        Chain(kMaxExpressionDepth - 1, "FORCED", " OR "),
        Chain(kMaxExpressionDepth, "TRUE", " XOR "),   // one level more
        "FORCED = TRUE",
    };
    pextest::TraceCapture trace;
    std::vector<std::string> forced;
    ASSERT_TRUE(pextest::RunOnStack(pextest::kWindowsMainStack, [&] { forced = ForcedAfter(scripts); }));
    EXPECT_EQ(forced, (std::vector<std::string>{"0", "0", "1", "0", "0", "1"}));
    const std::string log = trace.Text();
    EXPECT_NE(log.find("ExecutionPlan: Parse, script too long, exceeds 65536 bytes\nError Creating Plan\n"
                       "Evaluating Dynamic Fields for file 1:"), std::string::npos);
    EXPECT_NE(log.find("ExecutionPlan: Parse, expression too deep, exceeds 256 levels\nError Creating Plan\n"),
              std::string::npos);
}

TEST(HostileScripts, TheBoundsAreExactAndSaySo) {
    pextest::TestMachine machine;
    std::string longest = "FORCED = TRUE";
    while (longest.size() + 15 <= kMaxScriptLength) longest += "; FORCED = TRUE";
    longest.append(kMaxScriptLength - longest.size(), ' ');
    EXPECT_EQ(ParseResult(longest), kParseAccepted);
    EXPECT_EQ(ParseResult(longest + " "), kParseTooLong);
    // Only the text up to its first NUL counts, as everywhere else.
    EXPECT_EQ(ParseResult(longest + std::string(1, '\0') + "xx"), kParseAccepted);

    // Depth counts every call, whichever parameter the deep operand is.
    const std::string deepest = Chain(kMaxExpressionDepth - 1).substr(9);
    EXPECT_EQ(ParseResult("FORCED = " + deepest), kParseAccepted);
    EXPECT_EQ(ParseResult("FORCED = NOT (" + deepest + ")"), kParseTooDeep);
    EXPECT_EQ(ParseResult("FORCED = IIFB(TRUE, " + deepest + ", TRUE)"), kParseTooDeep);
    EXPECT_EQ(ParseResult("FORCED = IIFB(TRUE, TRUE, " + deepest + ")"), kParseTooDeep);
    EXPECT_EQ(ParseResult("FORCED = (" + deepest + ") AND TRUE"), kParseTooDeep);
    EXPECT_EQ(ParseResult("FORCED = TRUE AND (" + deepest + ")"), kParseTooDeep);
    EXPECT_EQ(ParseResult("FORCED = " + deepest + "; FORCED = " + deepest), kParseAccepted);

    pextest::TraceCapture trace;
    ExecutionPlan plan;
    std::string output;
    EXPECT_FALSE(QuietParse(plan, Chain(kMaxExpressionDepth, "AVAR", " OR "), &output));
    EXPECT_EQ(output, "expression too deep, exceeds 256 levels\n");
    EXPECT_TRUE(trace.Contains("ExecutionPlan: Parse, expression too deep, exceeds 256 levels"));
}

// Found by review: flex counted the end of the text into a token that reached it, so a quoted
// string of 8,190 characters (or a name of 8,191) was refused only when it ended the text.
TEST(HostileScripts, ATokenEndingTheTextMeetsTheSameLengthLimit) {
    const std::string longestString = "FORCED = \"" + std::string(8190, 's') + "\"";
    const std::string longestName = "FORCED = N" + std::string(8190, 'n');
    for (const std::string& text : {longestString, longestName}) {
        EXPECT_EQ(ParseResult(text), kParseAccepted) << text.size();
        EXPECT_EQ(ParseResult(text + " "), kParseAccepted) << text.size();
    }
    EXPECT_EQ(ParseResult("FORCED = \"" + std::string(8191, 's') + "\""), kParseScannerFailure);
    EXPECT_EQ(ParseResult("FORCED = \"" + std::string(8191, 's') + "\" "), kParseScannerFailure);
    EXPECT_EQ(ParseResult(longestName + "n"), kParseScannerFailure);
    EXPECT_EQ(ParseResult(longestName + "n "), kParseScannerFailure);
}

// Found by review: FileVersionAtLeast read the whole file, so Z:\dev\zero grew memory until
// std::bad_alloc escaped the plan and ended the product run, a pipe blocked for ever and a file
// of gigabytes was read whole. Only the headers and the resource section of a regular file are
// read; anything else has no version.
TEST(HostileScripts, FileTestsReadOnlyThePartsOfRegularFilesThatHoldTheVersion) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\App\\big.dll", pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    machine.WriteFile("C:\\App\\huge.bin", "MZ");
    auto atLeast = [](const std::string& file) {
        std::string literal;
        for (char c : file) literal += c == '\\' ? std::string("\\\\") : std::string(1, c);
        return "FORCED = FileVersionAtLeast(\"" + literal + "\"&#x2C; \"3.10.0.0\")";
    };
    std::vector<std::string> scripts = {atLeast("C:\\App"), atLeast("C:\\App\\big.dll")};
    std::vector<std::string> expected = {"0", "1"};
#ifndef _WIN32
    // Gigabytes that take no disk: the version lies in the first few kilobytes.
    ASSERT_EQ(truncate((machine.DriveC() + "/App/big.dll").c_str(), 6LL << 30), 0);
    ASSERT_EQ(truncate((machine.DriveC() + "/App/huge.bin").c_str(), 6LL << 30), 0);
    ASSERT_EQ(mkfifo((machine.DriveC() + "/App/pipe.dll").c_str(), 0600), 0);
    for (const char* file : {"C:\\App\\huge.bin", "C:\\App\\pipe.dll", "Z:\\dev\\zero", "Z:\\dev\\stdin"}) {
        scripts.push_back(atLeast(file));
        expected.push_back("0");
    }
    scripts.back() = "FORCED = NOT FileVersionAtLeast(\"Z:\\\\dev\\\\stdin\"&#x2C; \"0.0.0.0\")";
    expected.back() = "1";
#endif
    scripts.push_back("FORCED = TRUE");
    expected.push_back("1");
    EXPECT_EQ(ForcedAfter(scripts), expected);
}

// Services whose every read fails as the machine can: memory runs out.
class ExhaustedServices : public UpdateServices {
public:
    using UpdateServices::UpdateServices;
    COverrideExpression GetSymbol(std::string) override { throw std::bad_alloc(); }
};

// Found by review: a failure other than the language's own escaped Execute and abandoned the
// product run. It fails its item; the plan's other items still run.
TEST(HostileScripts, AnyFailureInsideAPlanFailsOnlyItsItem) {
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    TestRow row;
    ExhaustedServices services(row.ref);
    ExecutionPlan plan;
    ASSERT_TRUE(QuietParse(plan, "FORCED = AVAR; FORCED = TRUE"));
    ASSERT_TRUE(plan.Validate());
    EXPECT_EQ(plan.Execute(services), COverrideExpression::kUnexpected);
    EXPECT_EQ(plan.Comments(), std::vector<std::string>{"HResult: 0x8000ffff(Failed!):std::bad_alloc"});
    EXPECT_EQ(row.Cell("Force Download"), "1");
    EXPECT_TRUE(trace.Contains("ExecutionPlan: Execute, item # 0 failed: std::bad_alloc"));
}

}  // namespace
