// Crash safety of a product run: the run is ended just before each of its mutating operations
// in turn (copy, delete, write, rename, attribute or time change, registry write), as a power
// cut would end it, and the machine must then be consistent, and a new run must complete the
// update. Each run is a forked child on a copy of the published machine.
#include <gtest/gtest.h>

#include <cstdio>

#include "platform/machine.h"
#include "tests/crash/child_run.h"
#include "tests/crash/crash_product.h"
#include "tests/crash/machine_copies.h"

namespace {

using pextest::ChildRun;
using pextest::RunUpdateInChild;

// Enough failing scenarios to see the pattern without drowning the output.
constexpr int kFailingScenariosShown = 5;

class CrashPoints : public pextest::CrashProduct {
protected:
    void TearDown() override { plat::machine::SetRoot(machine.Root()); }

    ChildRun Run(int crashAt) {
        ++runs_;
        return RunUpdateInChild(crashAt);
    }

    // The mutating operations of a complete run from the machine at `from`.
    int CountOperations(const std::string& from) {
        const pextest::MachineCopy copy(from);
        const ChildRun run = Run(0);
        EXPECT_TRUE(run.finished) << run.ending;
        ExpectComplete();
        return run.mutations;
    }

    // From a copy of the machine at `from`: a run ended at operation k, then a run to the end,
    // then one more, which must find nothing to do. False when a check failed.
    bool CrashAndRecover(const std::string& from, int k, const std::string& scenario) {
        SCOPED_TRACE(scenario);
        const int failuresBefore = Failures();
        const pextest::MachineCopy copy(from);
        const ChildRun crashed = Run(k);
        EXPECT_TRUE(crashed.crashed) << "the run was not ended at operation " << k << ": " << crashed.ending;
        ExpectConsistent();
        const ChildRun recovered = Run(0);
        EXPECT_TRUE(recovered.finished) << recovered.ending;
        ExpectComplete();
        const pextest::MachineSnapshot before = pextest::SnapshotMachine();
        EXPECT_TRUE(Run(0).finished);
        EXPECT_EQ(pextest::SnapshotDifference(before, pextest::SnapshotMachine()), "")
            << "a run after the update was complete changed the machine";
        return Failures() == failuresBefore;
    }

    static int Failures() {
        return ::testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
    }

    // count points spread evenly over 1..n, the ends included.
    static std::vector<int> Spread(int n, int count) {
        std::vector<int> points;
        for (int i = 0; i < count && n > 0; ++i) {
            const int point = 1 + (count > 1 ? i * (n - 1) / (count - 1) : 0);
            if (points.empty() || points.back() != point) points.push_back(point);
        }
        return points;
    }

    void Report(const char* what, int operations) {
        RecordProperty("operations", operations);
        RecordProperty("runs", runs_);
        std::printf("[  crash   ] %s: %d mutating operations in a complete run, %d runs\n", what, operations, runs_);
    }

    int runs_ = 0;
};

TEST_F(CrashPoints, ACrashAtAnyOperationLeavesAStateTheNextRunCompletes) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    ASSERT_GT(n, 20) << "the product should make a run of some length";
    int failing = 0;
    for (int k = 1; k <= n && failing < kFailingScenariosShown; ++k) {
        if (!CrashAndRecover(published, k, "crash at operation " + std::to_string(k) + " of " + std::to_string(n)))
            ++failing;
    }
    Report("every operation", n);
}

TEST_F(CrashPoints, ACrashWhileRecoveringFromACrashIsRecoveredToo) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    int failing = 0;
    for (int first : Spread(n, 16)) {
        const pextest::MachineCopy crashed(published);
        ASSERT_TRUE(Run(first).crashed);
        const int recovery = CountOperations(crashed.Root());
        for (int second : Spread(recovery, 8)) {
            if (failing >= kFailingScenariosShown) break;
            const std::string scenario = "crash at operation " + std::to_string(first) + ", then at operation " +
                                         std::to_string(second) + " of the " + std::to_string(recovery) +
                                         " that recover";
            if (!CrashAndRecover(crashed.Root(), second, scenario)) ++failing;
        }
    }
    Report("sampled double crashes", n);
}

}  // namespace
