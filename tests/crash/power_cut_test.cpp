// Power-cut safety of a product run: the power is cut just before each mutating operation in
// turn, and the machine keeps only what the run had made durable (file flushes, folder flushes,
// committed registry transactions), or a random subset of the rest as a disk that reorders its
// writes may. The machine must then be consistent, a new run must complete the update and one
// more must change nothing.
#include <gtest/gtest.h>

#include "tests/crash/crash_sweep.h"

namespace {

using pextest::Interruption;

// The seeds of the random-subset runs.
constexpr unsigned kSeeds = 200;

class PowerCuts : public pextest::CrashSweep {};

TEST_F(PowerCuts, APowerCutAtAnyOperationLosesNothingTheNextRunNeeds) {
    SweepEveryOperation(Interruption{true, 0}, "power cut");
}

TEST_F(PowerCuts, APowerCutThatKeepsSomeUnflushedChangesIsRecoveredToo) {
    const std::string published = machine.Root();
    const int n = CountOperations(published);
    int failing = 0;
    for (unsigned seed = 1; seed <= kSeeds && failing < kFailingScenariosShown; ++seed) {
        // Each seed picks its operation too, so that the seeds cover the whole run.
        const int k = 1 + static_cast<int>((seed * 2654435761u) % static_cast<unsigned>(n));
        const std::string scenario =
            "power cut at operation " + std::to_string(k) + " of " + std::to_string(n) + ", seed " + std::to_string(seed);
        if (!InterruptAndRecover(published, k, Interruption{true, seed}, scenario)) ++failing;
    }
    Report("power cut keeping a random subset", n);
}

TEST_F(PowerCuts, APowerCutWhileRecoveringFromAPowerCutIsRecoveredToo) {
    SweepInterruptedRecoveries(Interruption{true, 0}, "power cut");
}

}  // namespace
