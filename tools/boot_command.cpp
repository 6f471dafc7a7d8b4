// `pexupdate boot`: what Windows does with the restart queue when the machine starts, done on
// the emulated machine, which never restarts.
#include <cstdio>
#include <string>
#include <vector>

#include "platform/errors.h"
#include "platform/setup_install.h"
#include "tools/command.h"

namespace {

int RunBoot(const std::vector<std::string>& args) {
    if (!args.empty()) {
        bool help = args[0] == "--help";
        std::fprintf(help ? stdout : stderr, "usage: pexupdate boot\n\n"
                    "Carries out the renames queued for the next restart (files installed while\n"
                    "they were in use), in order, and reports each. A rename that fails stays\n"
                    "queued.\n");
        return help ? 0 : 2;
    }
    std::vector<plat::setup::RenameOutcome> outcomes;
    bool stored = plat::setup::CarryOutPendingRenames(&outcomes);
    int failures = 0;
    for (const plat::setup::RenameOutcome& o : outcomes) {
        std::string what = o.op.to.empty() ? "delete " + o.op.from : "rename " + o.op.from + " -> " + o.op.to;
        if (o.error == 0) {
            std::printf("%s: done\n", what.c_str());
        } else {
            std::printf("%s: failed, error %u, left queued\n", what.c_str(), o.error);
            ++failures;
        }
    }
    if (!stored) {
        std::printf("the restart queue could not be read or stored, error %u\n", plat::LastError());
        return 1;
    }
    if (outcomes.empty()) std::printf("no renames queued for the restart\n");
    return failures == 0 ? 0 : 1;
}

const pextool::CommandRegistrar kBoot({"boot", "carry out the renames queued for the next restart",
                                       RunBoot});

}  // namespace
