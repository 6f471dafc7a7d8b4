#include "tests/expr/expr_test_support.h"

#include <gtest/gtest.h>

namespace exprtest {

TestRow::TestRow(const std::string& header, const std::string& line) {
    table.LoadFromText(header + "\r\n" + line + "\r\n");
}

std::string TestRow::Cell(const std::string& column) const {
    int index = table.ColumnIndex(column);
    return index < 0 ? "<no column>" : table.Cell(0, static_cast<std::uint32_t>(index));
}

bool QuietParse(ExecutionPlan& plan, const std::string& text, std::string* output) {
    testing::internal::CaptureStdout();
    const bool ok = plan.Parse(text);
    const std::string printed = testing::internal::GetCapturedStdout();
    if (output) *output = printed;
    return ok;
}

COverrideExpression ParseExpression(const std::string& text) {
    ExecutionPlan plan;
    std::string output;
    const bool ok = QuietParse(plan, "FORCED = " + text, &output);
    EXPECT_TRUE(ok) << text << ": " << output;
    if (!ok || plan.Items().empty()) return COverrideExpression();
    return plan.Items()[0].params.at(1);
}

}  // namespace exprtest
