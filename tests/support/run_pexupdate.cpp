#include "tests/support/run_pexupdate.h"

#include <sys/wait.h>

#include <cstdio>

namespace pextest {

CommandOutcome RunPexupdate(const std::string& pexupdatePath, const TestMachine& machine,
                            const std::string& args) {
    const std::string command =
        "'" + pexupdatePath + "' --machine '" + machine.Root() + "' " + args + " 2>&1";
    CommandOutcome o;
    FILE* pipe = popen(command.c_str(), "r");
    if (!pipe) return o;
    char buffer[4096];
    for (size_t n; (n = fread(buffer, 1, sizeof buffer, pipe)) > 0;) o.out.append(buffer, n);
    const int status = pclose(pipe);
    o.exit = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    return o;
}

}  // namespace pextest
