// The fault plan: counted failures by kind, persistent failures, and the crash point.
#include "platform/fault.h"

#include <gtest/gtest.h>
#ifndef _WIN32
#include <sys/wait.h>
#include <unistd.h>
#endif

#include "platform/errors.h"
#include "platform/files.h"
#include "tests/support/platform_guard.h"
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

TEST_F(FaultPlan, TheNthOperationOfTheKindFailsOnce) {
    EXPECT_TRUE(fault::Allow(Op::Copy));  // counted before the rule exists: not part of it
    fault::FailNth(Op::Copy, 2, plat::kErrorDiskFull);
    EXPECT_TRUE(plat::files::Copy("C:\\a.txt", "C:\\b.txt", false));
    EXPECT_TRUE(fault::Allow(Op::Remove));
    EXPECT_FALSE(plat::files::Copy("C:\\a.txt", "C:\\c.txt", false));
    EXPECT_EQ(plat::LastError(), plat::kErrorDiskFull);
    EXPECT_FALSE(plat::files::Exists("C:\\c.txt"));
    EXPECT_TRUE(plat::files::Copy("C:\\a.txt", "C:\\c.txt", false));
}

TEST_F(FaultPlan, APersistentRuleFailsEveryLaterOperationToo) {
    fault::FailNth(Op::Remove, 2, plat::kErrorAccessDenied, true);
    EXPECT_TRUE(fault::Allow(Op::Remove));
    EXPECT_FALSE(fault::Allow(Op::Remove));
    EXPECT_FALSE(fault::Allow(Op::Remove));
    EXPECT_TRUE(fault::Allow(Op::Copy));
    fault::Clear();
    EXPECT_TRUE(fault::Allow(Op::Remove));
}

TEST_F(FaultPlan, AnyCountsOperationsOfEveryKind) {
    fault::FailNth(Op::Any, 3, plat::kErrorGenFailure);
    EXPECT_TRUE(fault::Allow(Op::ProcessStart));
    EXPECT_TRUE(fault::Allow(Op::RegWrite));
    EXPECT_FALSE(fault::Allow(Op::Rename));
    EXPECT_EQ(plat::LastError(), plat::kErrorGenFailure);
    EXPECT_TRUE(fault::Allow(Op::Rename));
}

TEST_F(FaultPlan, OnlyMutatingOperationsAreCounted) {
    plat::files::Copy("C:\\a.txt", "C:\\b.txt", false);
    plat::files::SetAttributes("C:\\b.txt", plat::files::kAttrNormal);
    plat::files::GetAttributes("C:\\b.txt");
    plat::files::Exists("C:\\b.txt");
    plat::files::Remove("C:\\b.txt");
    fault::Allow(Op::RegWrite);
    fault::Allow(Op::ProcessStart);
    EXPECT_EQ(fault::MutationCount(), 4);
}

// A test that fails each operation of a run in turn needs to know how many there are, by kind;
// operations that a rule fails are counted too.
TEST_F(FaultPlan, OperationsAreCountedByKindWhetherOrNotTheyFail) {
    fault::FailNth(Op::Copy, 1, plat::kErrorDiskFull);
    EXPECT_FALSE(fault::Allow(Op::Copy));
    EXPECT_TRUE(fault::Allow(Op::Copy));
    EXPECT_TRUE(fault::Allow(Op::ProcessStart));
    EXPECT_EQ(fault::OperationCount(Op::Copy), 2);
    EXPECT_EQ(fault::OperationCount(Op::ProcessStart), 1);
    EXPECT_EQ(fault::OperationCount(Op::Remove), 0);
    EXPECT_EQ(fault::OperationCount(Op::Any), 3);
    fault::Clear();
    EXPECT_EQ(fault::OperationCount(Op::Any), 0);
}

// The crash needs a child process that shares the test's state up to that point (fork).
TEST_F(FaultPlan, TheProcessEndsJustBeforeTheChosenMutation) {
    PEX_LINUX_ONLY();
#ifndef _WIN32
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        fault::Clear();
        fault::CrashAtMutation(2);
        plat::files::Copy("C:\\a.txt", "C:\\first.txt", false);
        plat::files::Copy("C:\\a.txt", "C:\\second.txt", false);
        _exit(0);
    }
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), fault::kCrashExitCode);
    EXPECT_TRUE(plat::files::Exists("C:\\first.txt"));
    EXPECT_FALSE(plat::files::Exists("C:\\second.txt"));
#endif
}

}  // namespace
