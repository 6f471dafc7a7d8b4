// `pexupdate status [PRODUCT] [--json]`: what a support person needs to know about why a product
// did not update, read from the machine without changing it.
#include <cstdio>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "platform/library.h"
#include "tools/command.h"
#include "tools/status_report.h"

namespace {

const char kUsage[] =
    "usage: pexupdate [--machine DIR] status [PRODUCT] [--json]\n\n"
    "For each product registered below HKLM\\software\\Vantric\\Pex (or the one named): its\n"
    "content file (kept aside as <content file>.rejected when it did not load), its rows counted\n"
    "by status and every row not applied, the journal of an interrupted run that the next run\n"
    "recovers, the restart-queue entries (PendingFileRenameOperations) for its files, and its\n"
    "last run as the trace log beside Mendler.dll (or its .bak) tells it, with the lines that\n"
    "explain a failure. Nothing on the machine is changed.\n"
    "Exit status: 0 when nothing is pending or failed, 1 when something is, 2 when the machine\n"
    "cannot be read (or PRODUCT is not registered).\n\n"
    "--json prints one JSON document of this shape:\n";

int RunStatus(const std::vector<std::string>& args) {
    bool json = false;
    std::vector<std::string> rest;
    for (const std::string& arg : args) {
        if (arg == "--help") {
            std::printf("%s%s", kUsage, pextool::status::kJsonShape);
            return 0;
        }
        if (arg == "--json") json = true;
        else rest.push_back(arg);
    }
    if (rest.size() > 1 || (!rest.empty() && rest[0].rfind("--", 0) == 0)) {
        std::fprintf(stderr, "%s", kUsage);
        return 2;
    }
    pextool::status::Report report;
    std::string error;
    const std::string log = pextool::status::TraceLogBeside(plat::lib::SearchFile("Mendler.dll"));
    if (!pextool::status::Gather(rest.empty() ? "" : rest[0], log, &report, &error)) {
        std::fprintf(stderr, "pexupdate: %s\n", error.c_str());
        if (json) std::printf("%s\n", nlohmann::ordered_json{{"version", 1}, {"error", error}}.dump(2).c_str());
        return 2;
    }
    const std::string out = json ? pextool::status::RenderJson(report) : pextool::status::RenderText(report);
    std::fwrite(out.data(), 1, out.size(), stdout);
    return pextool::status::ExitCode(report);
}

const pextool::CommandRegistrar kStatus({"status", "why a product did not update: rows, journal, restart queue, last run",
                                         RunStatus});

}  // namespace
