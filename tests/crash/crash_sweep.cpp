#include "tests/crash/crash_sweep.h"

#include <cstdio>

#include "platform/machine.h"
#include "tests/crash/machine_copies.h"

namespace pextest {

void CrashSweep::TearDown() { plat::machine::SetRoot(machine.Root()); }

ChildRun CrashSweep::Run(int crashAt, const Interruption& how) {
    ++runs_;
    return RunUpdateInChild(crashAt, how);
}

int CrashSweep::CountOperations(const std::string& from) {
    const MachineCopy copy(from);
    const ChildRun run = Run(0);
    EXPECT_TRUE(run.finished) << run.ending;
    ExpectComplete();
    return run.mutations;
}

bool CrashSweep::InterruptAndRecover(const std::string& from, int k, const Interruption& how,
                                     const std::string& scenario) {
    SCOPED_TRACE(scenario);
    const int failuresBefore = Failures();
    const MachineCopy copy(from);
    const ChildRun crashed = Run(k, how);
    EXPECT_TRUE(crashed.crashed) << "the run was not ended at operation " << k << ": " << crashed.ending;
    ExpectConsistent();
    const ChildRun recovered = Run(0);
    EXPECT_TRUE(recovered.finished) << recovered.ending;
    ExpectComplete();
    const MachineSnapshot before = SnapshotMachine();
    EXPECT_TRUE(Run(0).finished);
    EXPECT_EQ(SnapshotDifference(before, SnapshotMachine()), "")
        << "a run after the update was complete changed the machine";
    return Failures() == failuresBefore;
}

void CrashSweep::SweepEveryOperation(const Interruption& how, const std::string& word) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    ASSERT_GT(n, 20) << "the product should make a run of some length";
    int failing = 0;
    for (int k = 1; k <= n && failing < kFailingScenariosShown; ++k) {
        const std::string scenario = word + " at operation " + std::to_string(k) + " of " + std::to_string(n);
        if (!InterruptAndRecover(published, k, how, scenario)) ++failing;
    }
    Report((word + ", every operation").c_str(), n);
}

void CrashSweep::SweepInterruptedRecoveries(const Interruption& how, const std::string& word) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    int failing = 0;
    for (int first : Spread(n, 16)) {
        const MachineCopy interrupted(published);
        ASSERT_TRUE(Run(first, how).crashed);
        const int recovery = CountOperations(interrupted.Root());
        for (int second : Spread(recovery, 8)) {
            if (failing >= kFailingScenariosShown) break;
            const std::string scenario = word + " at operation " + std::to_string(first) + ", then at operation " +
                                         std::to_string(second) + " of the " + std::to_string(recovery) +
                                         " that recover";
            if (!InterruptAndRecover(interrupted.Root(), second, how, scenario)) ++failing;
        }
    }
    Report((word + " in the run and in its recovery, sampled").c_str(), n);
}

int CrashSweep::Failures() {
    return ::testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
}

std::vector<int> CrashSweep::Spread(int n, int count) {
    std::vector<int> points;
    for (int i = 0; i < count && n > 0; ++i) {
        const int point = 1 + (count > 1 ? i * (n - 1) / (count - 1) : 0);
        if (points.empty() || points.back() != point) points.push_back(point);
    }
    return points;
}

void CrashSweep::Report(const char* what, int operations) {
    RecordProperty("operations", operations);
    RecordProperty("runs", runs_);
    std::printf("[  crash   ] %s: %d mutating operations in a complete run, %d runs\n", what, operations, runs_);
}

}  // namespace pextest
