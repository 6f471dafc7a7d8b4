// The executors of the built-in functions, evaluated directly on parsed (unvalidated) trees.
#include "expr/executors.h"

#include <gtest/gtest.h>

#include "expr/evaluation.h"
#include "platform/paths.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::FailureOf;
using exprtest::ParseExpression;
using exprtest::TestRow;
using Node = COverrideExpression;
using Lines = std::vector<std::string>;

Node Value(const std::string& text, TestRow& row) {
    return Evaluate(ParseExpression(text), row.services);
}

std::string Literal(const std::string& text) {
    std::string literal = "\"";
    for (char c : text) literal += c == '\\' ? std::string("\\\\") : std::string(1, c);
    return literal + "\"";
}

Lines Matching(const pextest::TraceCapture& trace, const std::string& part) {
    Lines lines;
    for (const std::string& line : trace.Lines()) {
        if (line.find(part) != std::string::npos) lines.push_back(line);
    }
    return lines;
}

// AND and OR skip the second operand once the first decides; selectors evaluate one branch.
TEST(Builtins, OnlyTheDecidingOperandsAreEvaluated) {
    TestRow row;  // AVAR reads as true
    EXPECT_FALSE(Value("FALSE AND AVAR", row).boolValue);
    EXPECT_TRUE(Value("TRUE OR AVAR", row).boolValue);
    EXPECT_FALSE(Value("AND(FALSE, \"not even checked\")", row).boolValue);
    EXPECT_EQ(Value("IIFS(TRUE, \"a\", 5)", row).stringValue, "a");
    EXPECT_TRUE(row.services.reads.empty());
    EXPECT_TRUE(Value("FALSE OR AVAR", row).boolValue);
    EXPECT_EQ(Value("IIFS(AVAR, HomeDir, FileName)", row).stringValue, "C:\\App");
    EXPECT_EQ(row.services.reads, (Lines{"AVAR", "AVAR", "HomeDir"}));
    EXPECT_EQ(Value("IIFN(FALSE, \"x\", 2.5)", row).number, 2.5);
}

TEST(Builtins, Values) {
    TestRow row;
    EXPECT_FALSE(Value("AVAR XOR TRUE", row).boolValue);
    EXPECT_TRUE(Value("NOT(FALSE)", row).boolValue);
    EXPECT_EQ(Value("CONCAT(\"a\", \"b\")", row).stringValue, "ab");
    EXPECT_EQ(Value("AddPathSep(HomeDir) & FileName", row).stringValue, "C:\\App\\a.dll");
    EXPECT_EQ(Value("AddPathSep(\"c:\\\\\")", row).stringValue, "c:\\");
    EXPECT_EQ(Value("AddPathSep(\"\")", row).stringValue, "");
    EXPECT_TRUE(Value("IsUnderstood(\"fileexists\") AND IsUnderstood(\"FORCED\")", row).boolValue);
    EXPECT_FALSE(Value("IsUnderstood(\"DOESREGIPHAVE\")", row).boolValue);
    EXPECT_EQ(Evaluate(ParseExpression("SET(HomeDir, \"D:\\\\x\")"), row.services).code, 0);
    EXPECT_EQ(row.Cell("HomeDir"), "D:\\x");
}

TEST(Builtins, FailureMessages) {
    const std::pair<const char*, const char*> cases[] = {
        {"AND(TRUE)", "AND: Expects 2 parameters"},
        {"AND(HomeDir, TRUE)", "AND: First Parameter [HomeDir]must be BOOL"},
        {"OR(FALSE, FileName)", "OR: Second Parameter [FileName] must be BOOL"},
        {"XOR(TRUE)", "XOR: Expects 2 parameters"},
        {"XOR(1, TRUE)", "XOR: First Parameter must be BOOL"},
        {"XOR(TRUE, HomeDir)", "XOR: Second Parameter must be BOOL"},
        {"NOT(TRUE, TRUE)", "NOT: Expects 1 parameter"},
        {"NOT \"x\"", "NOT: First Parameter must be BOOL"},
        {"IIFS(FALSE, \"a\", 5)", "IIFS: Third Parameter result [] was not correct typeString"},
        {"IIFN(TRUE, \"x\", 2)", "IIFN: Second Parameter result [] was not correct typeNumber"},
        {"IIFB(TRUE, TRUE)", "IIFB: Expects 3 parameters"},
        {"IIFN(HomeDir, 1, 2)", "IIFN: First Parameter [HomeDir] must be BOOL"},
        {"CONCAT(\"a\")", "CONCAT: Expects 2 parameters"},
        {"CONCAT(TRUE, \"a\")", "CONCAT: First Parameter must be string"},
        {"\"a\" & 1", "CONCAT: Second Parameter must be string"},
        {"IsUnderstood(\"a\", \"b\")", "ISUNDERSTOOD: Expects 1 parameters"},
        {"IsUnderstood(TRUE)", "ISUNDERSTOOD: First Parameter must be string"},
        {"FileExists(\"a\", \"b\")", "FileExists: Expects 1 parameters"},
        {"FileExists(AVAR)", "FileExists: First Parameter must be string"},
        {"AddPathSep(\"a\", \"b\")", "AddPathSep: Expects 1 parameters"},
        {"AddPathSep(AVAR)", "AddPathSep: First Parameter must be string"},
        {"FileVersionAtLeast(\"a\")", "ExecFileVersionAtLeast: Expects 2 parameters"},
        {"FileVersionAtLeast(1, \"a\")", "ExecFileVersionAtLeast: First Parameter must be string"},
        {"FileVersionAtLeast(\"a\", AVAR)", "ExecFileVersionAtLeast: Second Parameter must be string"},
        {"SET(HomeDir)", "SET: Expects 2 parameters"},
        {"SET(AVAR, TRUE)", "SET: First Parameter not a settable object"},
        {"SET(FORCED, \"1\")", "SET: Type mismatch."},
        {"BVAR", "GetVar: Type Mismatch"},  // the row has no BVAR column
    };
    for (const auto& [text, message] : cases) {
        TestRow row;
        EXPECT_EQ(FailureOf(ParseExpression(text), row.services), message) << text;
    }
}

TEST(Builtins, FileTests) {
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    machine.WriteFile("C:\\App\\a.dll", "no version information");
    TestRow row;
    EXPECT_TRUE(Value("FileExists(AddPathSep(HomeDir) & FileName)", row).boolValue);
    EXPECT_TRUE(Value("FileExists(\"c:\\\\app\\\\*.DLL\")", row).boolValue);
    EXPECT_FALSE(Value("FileExists(\"C:\\\\Nowhere\\\\a.dll\")", row).boolValue);
    EXPECT_EQ(Matching(trace, "Checking"), (Lines{"Checking for file: [C:\\App\\a.dll]",
                                                  "Checking for file: [c:\\app\\*.DLL]",
                                                  "Checking for file: [C:\\Nowhere\\a.dll]"}));

    // The fixture's file version is 3.10.40000.5.
    const std::string dll = Literal(plat::paths::ToWindows(PEX_FIXTURE_DIR "/versioned.dll"));
    auto atLeast = [&](const std::string& file, const std::string& wanted) {
        return Value("FileVersionAtLeast(" + file + ", \"" + wanted + "\")", row).boolValue;
    };
    for (const char* wanted : {"3.10.40000.5", "3.9.65535.65535", "0.0.0.0", "3.10.40000.5.9",
                               "3.0010.+40000.5", "3.10..5"}) {
        EXPECT_TRUE(atLeast(dll, wanted)) << wanted;
    }
    for (const char* wanted : {"3.10.40000.6", "4.0.0.0", "1.2.3", "1.0.0.x", "-0.0.0.0"}) {
        EXPECT_FALSE(atLeast(dll, wanted)) << wanted;
    }
    EXPECT_FALSE(atLeast(Literal("C:\\App\\a.dll"), "0.0.0.0"));
    EXPECT_FALSE(atLeast(Literal("C:\\App\\missing.dll"), "0.0.0.0"));
    // Version information without its fixed part (its signature broken) has no file version.
    std::string bytes = pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll");
    bytes[bytes.find("\xBD\x04\xEF\xFE")] = 0;
    machine.WriteFile("C:\\App\\nofixed.dll", bytes);
    EXPECT_FALSE(atLeast(Literal("C:\\App\\nofixed.dll"), "0.0.0.0"));
}

TEST(Builtins, LookupsAreIndentedByTheNestingDepth) {
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
    TestRow row;
    Value("NOT (AVAR AND IIFB(TRUE, AVAR, FALSE))", row);
    EXPECT_EQ(Matching(trace, "Looking up"), (Lines{"         Looking up Variable [AVAR] of type Bool",
                                                     "            Looking up Variable [AVAR] of type Bool"}));
    FailureOf(ParseExpression("NOT BVAR"), row.services);
    EXPECT_EQ(row.services.nestingLevel, 0);  // also back after a failure

    trace.Clear();
    EXPECT_THROW(GetVar(Node::FromText(Node::kFunc, "Nope"), row.services), Node);
    EXPECT_EQ(trace.Lines(), Lines{"Error finding Variable [Nope]: Unknown Name!"});
    EXPECT_EQ(FailureOf(Node::FromText(Node::kFunc, "Nope"), row.services), "no failure");
}

}  // namespace
