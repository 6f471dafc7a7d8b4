// The trace of parsing, validating and running a plan item by item is the golden run scripts'.
#include "expr/execution_plan.h"

#include <gtest/gtest.h>

#include <new>

#include "expr/expression_tree.h"
#include "tests/expr/expr_test_support.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using exprtest::QuietParse;
using exprtest::TestRow;
using Lines = std::vector<std::string>;

class ExecutionPlanTest : public ::testing::Test {
protected:
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

// Services whose every read fails as the machine can: memory runs out.
class ExhaustedServices : public UpdateServices {
public:
    using UpdateServices::UpdateServices;
    COverrideExpression GetSymbol(std::string) override { throw std::bad_alloc(); }
};

// Runs "FORCED = AVAR; FORCED = TRUE" with services whose read of AVAR fails, and returns the
// comments; the second item must still have run.
Lines CommentsAfterAFailedRead(UpdateServices& services, TestRow& row) {
    ExecutionPlan plan;
    EXPECT_TRUE(QuietParse(plan, "FORCED = AVAR; FORCED = TRUE"));
    EXPECT_TRUE(plan.Validate());
    EXPECT_EQ(plan.Execute(services), COverrideExpression::kUnexpected);
    EXPECT_EQ(row.Cell("Force Download"), "1");
    return plan.Comments();
}

// Found by review: a failure other than the language's own escaped Execute and abandoned the
// product run. Any failure fails its item; the plan's other items still run.
TEST_F(ExecutionPlanTest, EveryItemRunsAndFailuresAreRecorded) {
    TestRow noAvar("Force Download,HomeDir", "0,C:\\App");
    EXPECT_EQ(CommentsAfterAFailedRead(noAvar.services, noAvar),
              Lines{"HResult: 0x8000ffff(Failed!):GetVar: Type Mismatch"});
    TestRow row;
    ExhaustedServices exhausted(row.ref);
    EXPECT_EQ(CommentsAfterAFailedRead(exhausted, row), Lines{"HResult: 0x8000ffff(Failed!):std::bad_alloc"});
    EXPECT_TRUE(trace.Contains("ExecutionPlan: Execute, item # 0 failed: std::bad_alloc"));
}

TEST_F(ExecutionPlanTest, ValidationStopsCommentingAfterTheFirstInvalidItem) {
    ExecutionPlan plan;
    ASSERT_TRUE(QuietParse(plan, "FORCED = \"x\"; FORCED = 1"));
    trace.Clear();
    EXPECT_FALSE(plan.Validate());
    EXPECT_EQ(plan.Comments(), Lines{"Type mismatch between FORCED and "});
    EXPECT_TRUE(trace.Contains("Validating Execution Item # 1."));
    EXPECT_FALSE(plan.Validate());
    EXPECT_EQ(plan.Comments().size(), 1u);  // comments start afresh
}

TEST_F(ExecutionPlanTest, TheCurrentPlanReceivesThePushes) {
    ExecutionPlan plan;
    EXPECT_TRUE(QuietParse(plan, "FORCED = TRUE"));
    EXPECT_TRUE(QuietParse(plan, "FORCED = FALSE"));  // a second parse appends
    EXPECT_EQ(plan.Items().size(), 2u);
    EXPECT_EQ(&CurrentPlan(), &plan);
}

}  // namespace
