// The commands of pexupdate. Each command file registers itself with a static ToolCommand,
// so the program's main only dispatches.
#pragma once
#include <string>
#include <vector>

namespace pextool {

struct ToolCommand {
    const char* name;
    const char* summary;  // one line for `pexupdate --help`
    // Runs with the arguments after the command name; returns the process exit code.
    int (*run)(const std::vector<std::string>& args);
};

class CommandRegistrar {
public:
    explicit CommandRegistrar(const ToolCommand& command);
};

const std::vector<ToolCommand>& Commands();

}  // namespace pextool
