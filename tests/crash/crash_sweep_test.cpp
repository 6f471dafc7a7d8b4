// Crash and power-cut safety of a product run: the run is ended just before each of its
// mutating operations in turn (copy, delete, write, rename, attribute or time change, registry
// write), as a killed process ends it, or the power is cut there and the machine keeps only what
// the run had made durable (file flushes, folder flushes, committed registry transactions), or a
// random subset of the rest as a disk that reorders its writes may. The machine must then be
// consistent, a new run must complete the update and one more must change nothing. Each run is
// a forked child on a copy of the published machine.
#include <gtest/gtest.h>

#include <cstdio>

#include "diag/trace_log.h"
#include "entry/update_all.h"
#include "platform/fault.h"
#include "platform/machine.h"
#include "tests/crash/child_run.h"
#include "tests/crash/crash_product.h"
#include "tests/crash/machine_copies.h"

namespace {

using pextest::ChildRun;
using pextest::MachineCopy;

// How a run is interrupted at its chosen operation: the process is killed (the page cache keeps
// every write), or the power is cut (only what was made durable stays; with a keepSeed, also a
// random subset of the rest).
struct Interruption {
    bool powerCut = false;
    unsigned keepSeed = 0;
};
const Interruption kKill{}, kPowerCut{true, 0};

class CrashSweep : public pextest::CrashProduct {
protected:
    void TearDown() override { plat::machine::SetRoot(machine.Root()); }

    // UpdateAll on the current machine in a child, which leaves without any clean-up; with
    // crashAt > 0 it ends just before its crashAt-th mutating operation, as how says. The child
    // writes no trace: trace lines would count as operations of their own, and a crash between
    // two trace lines leaves the machine as a crash before the next real operation does.
    ChildRun Run(int crashAt, const Interruption& how = kKill) {
        ++runs_;
        return pextest::RunInChild([&] {
            plat::fault::Clear();
            if (crashAt > 0 && how.powerCut) plat::fault::PowerCutAtMutation(crashAt, how.keepSeed);
            else if (crashAt > 0) plat::fault::CrashAtMutation(crashAt);
            g_TraceLog.enabled = false;
            UpdateAll(nullptr);
        });
    }

    // The mutating operations of a complete run from the machine at `from`.
    int CountOperations(const std::string& from) {
        const MachineCopy copy(from);
        const ChildRun run = Run(0);
        EXPECT_TRUE(run.finished) << run.ending;
        ExpectComplete();
        return run.mutations;
    }

    // From a copy of the machine at `from`: a run interrupted at operation k, then a run to the
    // end, then one more, which must find nothing to do. False when a check failed.
    bool InterruptAndRecover(const std::string& from, int k, const Interruption& how, const std::string& scenario) {
        SCOPED_TRACE(scenario);
        const int failuresBefore = Failures();
        const MachineCopy copy(from);
        const ChildRun crashed = Run(k, how);
        EXPECT_TRUE(crashed.crashed) << "the run was not ended at operation " << k << ": " << crashed.ending;
        ExpectConsistent();
        const ChildRun recovered = Run(0);
        EXPECT_TRUE(recovered.finished) << recovered.ending;
        ExpectComplete();
        const std::string before = pextest::SnapshotMachine();
        EXPECT_TRUE(Run(0).finished);
        EXPECT_EQ(before, pextest::SnapshotMachine())
            << "a run after the update was complete changed the machine";
        return Failures() == failuresBefore;
    }

    // Interrupts a run from the published machine at every operation in turn (a word for the
    // interruption names the scenarios); each is recovered and checked.
    void SweepEveryOperation(const Interruption& how, const std::string& word) {
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

    // Interrupts a run at 16 points, and its recovery at 8 points of its own.
    void SweepInterruptedRecoveries(const Interruption& how, const std::string& word) {
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

TEST_F(CrashSweep, ACrashAtAnyOperationLeavesAStateTheNextRunCompletes) { SweepEveryOperation(kKill, "crash"); }

TEST_F(CrashSweep, ACrashWhileRecoveringFromACrashIsRecoveredToo) { SweepInterruptedRecoveries(kKill, "crash"); }

TEST_F(CrashSweep, APowerCutAtAnyOperationLosesNothingTheNextRunNeeds) {
    SweepEveryOperation(kPowerCut, "power cut");
}

TEST_F(CrashSweep, APowerCutWhileRecoveringFromAPowerCutIsRecoveredToo) {
    SweepInterruptedRecoveries(kPowerCut, "power cut");
}

// 200 seeds, each picking its operation too, so that the seeds cover the whole run.
TEST_F(CrashSweep, APowerCutThatKeepsSomeUnflushedChangesIsRecoveredToo) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    int failing = 0;
    for (unsigned seed = 1; seed <= 200 && failing < kFailingScenariosShown; ++seed) {
        const int k = 1 + static_cast<int>((seed * 2654435761u) % static_cast<unsigned>(n));
        const std::string scenario =
            "power cut at operation " + std::to_string(k) + " of " + std::to_string(n) + ", seed " + std::to_string(seed);
        if (!InterruptAndRecover(published, k, Interruption{true, seed}, scenario)) ++failing;
    }
    Report("power cut keeping a random subset", n);
}

}  // namespace
