#include "tests/expr/expr_test_support.h"

#include <gtest/gtest.h>

#include "diag/trace_log.h"
#include "expr/evaluation.h"
#include "expr/expression_text.h"
#include "expr/validation.h"

namespace exprtest {

namespace {
const char kTracePath[] = "C:\\trace.log";
}

TestRow::TestRow(const std::string& header, const std::string& line) {
    table.LoadFromText(header + "\r\n" + line + "\r\n");
}

std::string TestRow::Cell(const std::string& column) const {
    int index = table.ColumnIndex(column);
    return index < 0 ? "<no column>" : table.Cell(0, static_cast<std::uint32_t>(index));
}

Parsed ParseText(const std::string& text) {
    ExecutionPlan plan;
    Parsed parsed;
    testing::internal::CaptureStdout();
    parsed.ok = plan.Parse(text);
    parsed.output = testing::internal::GetCapturedStdout();
    for (const COverrideExpression& item : plan.Items()) parsed.items.push_back(ExpressionText(item));
    return parsed;
}

COverrideExpression ParseExpression(const std::string& text) {
    ExecutionPlan plan;
    testing::internal::CaptureStdout();
    bool ok = plan.Parse("FORCED = " + text);
    std::string output = testing::internal::GetCapturedStdout();
    EXPECT_TRUE(ok) << text << ": " << output;
    if (!ok || plan.Items().empty()) return COverrideExpression();
    return plan.Items()[0].params.at(1);
}

std::vector<std::string> ValidationOf(const std::string& text) {
    ExecutionPlan plan;
    testing::internal::CaptureStdout();
    bool ok = plan.Parse(text);
    std::string output = testing::internal::GetCapturedStdout();
    EXPECT_TRUE(ok) << text << ": " << output;
    if (plan.Validate()) return {"valid"};
    return plan.Comments();
}

TraceRecorder::TraceRecorder() {
    g_TraceLog.timestamps = false;
    g_TraceLog.SetFileName(kTracePath);
}

TraceRecorder::~TraceRecorder() {
    g_TraceLog.Close();
    g_TraceLog.SetFileName("");
    g_TraceLog.fileOutput = false;
    g_TraceLog.timestamps = true;
}

std::vector<std::string> TraceRecorder::Lines() const {
    std::string text = machine_.ReadFile(kTracePath);
    std::vector<std::string> lines;
    std::size_t start = 0;
    for (std::size_t end; (end = text.find("\r\n", start)) != std::string::npos; start = end + 2) {
        lines.push_back(text.substr(start, end - start));
    }
    return lines;
}

void TraceRecorder::Clear() {
    g_TraceLog.Close();
    machine_.WriteFile(kTracePath, "");
}

std::string FailureOf(const COverrideExpression& node, UpdateServices& services) {
    try {
        Evaluate(node, services);
    } catch (const COverrideExpression& failure) {
        EXPECT_EQ(failure.code, COverrideExpression::kUnexpected);
        return failure.name;
    }
    return "no failure";
}

}  // namespace exprtest
