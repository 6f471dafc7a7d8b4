// The sweep of the crash and power-cut tests: a product run interrupted at one operation, then
// run to the end and once more, with the crash-point checks between. Each run is a forked child
// on a copy of the published machine.
#pragma once
#include <string>
#include <vector>

#include "tests/crash/child_run.h"
#include "tests/crash/crash_product.h"

namespace pextest {

class CrashSweep : public CrashProduct {
protected:
    // Enough failing scenarios to see the pattern without drowning the output.
    static constexpr int kFailingScenariosShown = 5;

    void TearDown() override;

    // A run in a child, counted for the report.
    ChildRun Run(int crashAt, const Interruption& how = Interruption{});

    // The mutating operations of a complete run from the machine at `from`.
    int CountOperations(const std::string& from);

    // From a copy of the machine at `from`: a run interrupted at operation k, then a run to the
    // end, then one more, which must find nothing to do. False when a check failed.
    bool InterruptAndRecover(const std::string& from, int k, const Interruption& how, const std::string& scenario);

    // Interrupts a run from the published machine at every operation in turn (a word for the
    // interruption names the scenarios); each is recovered and checked.
    void SweepEveryOperation(const Interruption& how, const std::string& word);

    // Interrupts a run at 16 points, and its recovery at 8 points of its own.
    void SweepInterruptedRecoveries(const Interruption& how, const std::string& word);

    static int Failures();

    // count points spread evenly over 1..n, the ends included.
    static std::vector<int> Spread(int n, int count);

    void Report(const char* what, int operations);

    int runs_ = 0;
};

}  // namespace pextest
