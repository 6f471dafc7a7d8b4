// A product run in a child process that may be ended at any mutating operation, as a power cut
// or a killed process would end it.
#pragma once
#include <functional>
#include <string>

namespace pextest {

struct ChildRun {
    bool crashed = false;   // ended by the fault plan just before the chosen operation
    bool finished = false;  // the work returned
    int mutations = 0;      // mutating operations of a finished run
    std::string ending;     // how it ended otherwise (an exit code or a signal), for messages
};

// Forks; the child does the work and leaves without any clean-up, reporting the mutating
// operations counted since the fault plan was last cleared. crashed: the fault plan ended it.
ChildRun RunInChild(const std::function<void()>& work);

}  // namespace pextest
