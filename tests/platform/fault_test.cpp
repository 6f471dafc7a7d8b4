// The fault plan: counted failures by kind, persistent failures and the counts by which the
// sweeps of tests/crash make each operation fail in turn. The crash point is exercised there,
// at every mutating operation of a whole run (crash_points_test.cpp).
#include "platform/fault.h"

#include <gtest/gtest.h>

#include "platform/errors.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"

namespace {

namespace fault = plat::fault;
using fault::Op;

class FaultPlan : public ::testing::Test {
protected:
    void SetUp() override {
        fault::Clear();
        m.WriteFile("C:\\a.txt", "a");
    }
    void TearDown() override { fault::Clear(); }
    pextest::TestMachine m;
};

// Rules by kind, once and for good, are what the golden runs' fault plans make (target_in_use,
// content_file_not_saved); a rule for any kind counts the operations of every kind.
TEST_F(FaultPlan, ARuleForAnyKindCountsEveryKindBesideTheRulesOfOneKind) {
    EXPECT_TRUE(fault::Allow(Op::Copy));  // counted before the rules exist: not part of them
    fault::FailNth(Op::Remove, 2, plat::kErrorAccessDenied, true);
    fault::FailNth(Op::Any, 3, plat::kErrorGenFailure);
    EXPECT_TRUE(fault::Allow(Op::Remove));
    EXPECT_FALSE(fault::Allow(Op::Remove));
    EXPECT_FALSE(fault::Allow(Op::ProcessStart));  // the third of any kind
    EXPECT_EQ(plat::LastError(), plat::kErrorGenFailure);
    EXPECT_FALSE(fault::Allow(Op::Remove));
    EXPECT_TRUE(fault::Allow(Op::Copy));
    fault::Clear();
    EXPECT_TRUE(fault::Allow(Op::Remove));
}

// Operations that a rule fails count too; only mutating ones count as mutations (crash points).
TEST_F(FaultPlan, OperationsAreCountedByKindWhetherOrNotTheyFail) {
    fault::FailNth(Op::Copy, 1, plat::kErrorDiskFull);
    EXPECT_FALSE(plat::files::Copy("C:\\a.txt", "C:\\b.txt", false));
    plat::files::Copy("C:\\a.txt", "C:\\b.txt", false);
    plat::files::SetAttributes("C:\\b.txt", plat::files::kAttrNormal);
    plat::files::GetAttributes("C:\\b.txt");
    plat::files::Exists("C:\\b.txt");
    plat::files::Remove("C:\\b.txt");
    fault::Allow(Op::RegWrite);
    fault::Allow(Op::ProcessStart);
    EXPECT_EQ(fault::OperationCount(Op::Copy), 2);
    EXPECT_EQ(fault::OperationCount(Op::ProcessStart), 1);
    EXPECT_EQ(fault::OperationCount(Op::Rename), 0);
    EXPECT_EQ(fault::MutationCount(), 5);
    fault::Clear();
    EXPECT_EQ(fault::OperationCount(Op::Any), 0);
}

}  // namespace
