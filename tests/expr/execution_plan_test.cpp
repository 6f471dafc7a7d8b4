#include "expr/execution_plan.h"

#include <gtest/gtest.h>

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

// The trace of parsing, validating and running a plan item by item is the golden run scripts'.
TEST_F(ExecutionPlanTest, EveryItemRunsAndFailuresAreRecorded) {
    TestRow noAvar("Force Download,HomeDir", "0,C:\\App");
    ExecutionPlan plan;
    ASSERT_TRUE(QuietParse(plan, "FORCED = AND(AVAR, TRUE); FORCED = NOT FORCED"));
    ASSERT_TRUE(plan.Validate());
    EXPECT_EQ(plan.Execute(noAvar.services), COverrideExpression::kUnexpected);
    EXPECT_EQ(plan.Comments(), Lines{"HResult: 0x8000ffff(Failed!):GetVar: Type Mismatch"});
    EXPECT_EQ(noAvar.Cell("Force Download"), "1");
}

TEST_F(ExecutionPlanTest, ValidationStopsCheckingAfterTheFirstInvalidItem) {
    ExecutionPlan plan;
    ASSERT_TRUE(QuietParse(plan, "FORCED = \"x\"; FORCED = 1"));
    trace.Clear();
    EXPECT_FALSE(plan.Validate());
    EXPECT_EQ(plan.Comments(), Lines{"Type mismatch between FORCED and "});
    EXPECT_EQ(trace.Lines(),
              (Lines{"Validating ExecutionPlan: Here we go....!", "Validating Execution Item # 0.",
                     "-- Done.", "Validating Execution Item # 1.", "-- Done.",
                     "The plan is: INVALID.  Validation Comments:", "That's all folks!"}));
    EXPECT_FALSE(plan.Validate());
    EXPECT_EQ(plan.Comments().size(), 1u);  // comments start afresh
}

TEST_F(ExecutionPlanTest, TheCurrentPlanReceivesThePushes) {
    {
        ExecutionPlan plan;
        EXPECT_FALSE(QuietParse(plan, ""));
        EXPECT_TRUE(QuietParse(plan, "FORCED = TRUE"));
        EXPECT_TRUE(QuietParse(plan, "FORCED = FALSE"));  // a second parse appends
        EXPECT_EQ(plan.Items().size(), 2u);
        EXPECT_EQ(&CurrentPlan(), &plan);
    }
}

}  // namespace
