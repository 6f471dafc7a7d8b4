// A product run in a child process that may be ended at any mutating operation, as a power cut
// or a killed process would end it.
#pragma once
#include <functional>
#include <string>

namespace pextest {

struct ChildRun {
    bool crashed = false;   // ended by the fault plan just before the chosen operation
    bool finished = false;  // UpdateAll returned
    int mutations = 0;      // mutating operations of a finished run
    std::string ending;     // how it ended otherwise (an exit code or a signal), for messages
};

// How a run is interrupted at its chosen operation: the process is killed (the page cache keeps
// every write), or the power is cut (only what was made durable stays; with a keepSeed, also a
// random subset of the rest).
struct Interruption {
    bool powerCut = false;
    unsigned keepSeed = 0;
};

// Forks; the child does the work and leaves without any clean-up, reporting the mutating
// operations counted since the fault plan was last cleared. crashed: the fault plan ended it.
ChildRun RunInChild(const std::function<void()>& work);

// Forks; the child runs UpdateAll on the current machine and leaves without any clean-up.
// With crashAt > 0 the child ends just before its crashAt-th mutating operation, as how says. The child
// writes no trace: trace lines would count as operations of their own, and a crash between
// two trace lines leaves the machine as a crash before the next real operation does.
ChildRun RunUpdateInChild(int crashAt, const Interruption& how = Interruption{});

}  // namespace pextest
