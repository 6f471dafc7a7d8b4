#include "tests/support/run_pexupdate.h"

#ifndef _WIN32
#include <sys/wait.h>
#endif

#include <cstdio>

namespace pextest {

namespace {

std::string ShellLine(const std::string& pexupdatePath, const TestMachine& machine,
                      const std::string& args) {
    std::string line = "'" + pexupdatePath + "' --machine '" + machine.Root() + "' " + args + " 2>&1";
#ifdef _WIN32
    // cmd.exe runs the line: it quotes with double quotes, and it drops the first and the last
    // quote of a line that starts with one, hence the outer pair.
    for (char& c : line) c = c == '\'' ? '"' : c;
    line = "\"" + line + "\"";
#endif
    return line;
}

#ifdef _WIN32
FILE* OpenPipe(const std::string& line) { return _popen(line.c_str(), "r"); }
int ExitOf(FILE* pipe) { return _pclose(pipe); }
#else
FILE* OpenPipe(const std::string& line) { return popen(line.c_str(), "r"); }
int ExitOf(FILE* pipe) {
    const int status = pclose(pipe);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}
#endif

}  // namespace

CommandOutcome RunPexupdate(const std::string& pexupdatePath, const TestMachine& machine,
                            const std::string& args) {
    CommandOutcome o;
    FILE* pipe = OpenPipe(ShellLine(pexupdatePath, machine, args));
    if (!pipe) return o;
    char buffer[4096];
    for (size_t n; (n = fread(buffer, 1, sizeof buffer, pipe)) > 0;) o.out.append(buffer, n);
    o.exit = ExitOf(pipe);
    return o;
}

}  // namespace pextest
