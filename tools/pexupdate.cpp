// pexupdate: the host program of the Vantric suite's updater, and the tool with which people
// who look after a machine inspect and change it.
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "platform/machine.h"
#include "tools/command.h"

namespace pextool {

static std::vector<ToolCommand>& Registry() {
    static std::vector<ToolCommand> commands;
    return commands;
}

CommandRegistrar::CommandRegistrar(const ToolCommand& command) { Registry().push_back(command); }

const std::vector<ToolCommand>& Commands() { return Registry(); }

}  // namespace pextool

static void PrintUsage(FILE* out) {
    std::fprintf(out, "usage: pexupdate [--machine DIR] COMMAND [ARGS...]\n\ncommands:\n");
    for (const auto& c : pextool::Commands()) std::fprintf(out, "  %-10s %s\n", c.name, c.summary);
    std::fprintf(out,
                 "\nThe machine root is DIR, else $PEX_MACHINE, else ~/.local/share/pex/machine.\n"
                 "`pexupdate COMMAND --help` describes one command.\n");
}

int main(int argc, char** argv) {
    std::vector<std::string> args(argv + 1, argv + argc);
    size_t i = 0;
    if (i < args.size() && args[i] == "--machine") {
        if (i + 1 >= args.size()) {
            std::fprintf(stderr, "pexupdate: --machine needs a folder\n");
            return 2;
        }
        plat::machine::SetRoot(args[i + 1]);
        i += 2;
    }
    if (i >= args.size() || args[i] == "--help" || args[i] == "-h") {
        PrintUsage(i >= args.size() ? stderr : stdout);
        return i >= args.size() ? 2 : 0;
    }
    for (const auto& c : pextool::Commands()) {
        if (args[i] == c.name) {
            if (!plat::machine::Ensure()) {
                std::fprintf(stderr, "pexupdate: cannot prepare the machine root %s\n",
                             plat::machine::Root().c_str());
                return 1;
            }
            return c.run(std::vector<std::string>(args.begin() + i + 1, args.end()));
        }
    }
    std::fprintf(stderr, "pexupdate: unknown command '%s'\n", args[i].c_str());
    PrintUsage(stderr);
    return 2;
}
