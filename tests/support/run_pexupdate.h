// Runs the built pexupdate on a test machine, as a person would from a shell.
#pragma once
#include <string>

#include "tests/support/test_machine.h"

namespace pextest {

struct CommandOutcome {
    int exit = -1;
    std::string out;  // standard output and standard error together
};

// pexupdate --machine <machine root> <args>; args are given to the shell as they stand.
CommandOutcome RunPexupdate(const std::string& pexupdatePath, const TestMachine& machine,
                            const std::string& args);

}  // namespace pextest
