// Crash safety of a product run: the run is ended just before each of its mutating operations
// in turn (copy, delete, write, rename, attribute or time change, registry write), as a killed
// process would end it, and the machine must then be consistent, and a new run must complete the
// update. Each run is a forked child on a copy of the published machine.
#include <gtest/gtest.h>

#include "tests/crash/crash_sweep.h"

namespace {

class CrashPoints : public pextest::CrashSweep {};

TEST_F(CrashPoints, ACrashAtAnyOperationLeavesAStateTheNextRunCompletes) {
    SweepEveryOperation(pextest::Interruption{}, "crash");
}

TEST_F(CrashPoints, ACrashWhileRecoveringFromACrashIsRecoveredToo) {
    SweepInterruptedRecoveries(pextest::Interruption{}, "crash");
}

}  // namespace
