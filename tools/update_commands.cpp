// `pexupdate all` and `pexupdate product NAME`: the host program's own work.
#include <cstdio>
#include <string>
#include <vector>

#include "entry/library_startup.h"
#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/paths.h"
#include "tools/command.h"
#include "tools/host_progress.h"
#include "tools/status_report.h"

namespace pextool {

namespace {

// Parses [--quiet] [--help] and the expected number of operands.
bool ParseOptions(const std::vector<std::string>& args, size_t operands, const char* help,
                  std::vector<std::string>* rest, int* exitCode) {
    bool quiet = false;
    for (const std::string& a : args) {
        if (a == "--help" || a == "-h") {
            std::printf("%s", help);
            *exitCode = 0;
            return false;
        }
        if (a == "--quiet" || a == "-q") quiet = true;
        else rest->push_back(a);
    }
    if (rest->size() != operands) {
        std::fprintf(stderr, "%s", help);
        *exitCode = 2;
        return false;
    }
    SetProgressStyle(ChooseProgressStyle(quiet));
    return true;
}

// Where the library writes its trace log: the folder "log" beside Mendler.dll.
void PrintLogLocation(const std::string& libraryPath, bool quiet) {
    if (quiet || libraryPath.empty()) return;
    const std::string log = status::TraceLogBeside(libraryPath);
    std::printf("Trace log: %s (%s)\n", log.c_str(), plat::paths::ToHost(log).c_str());
}

const char* const kAllHelp =
    "usage: pexupdate [--machine DIR] all [--quiet]\n"
    "Loads Mendler.dll as a host does and applies the downloaded updates of every product\n"
    "registered below HKLM\\software\\Vantric\\Pex.\n";

int RunAll(const std::vector<std::string>& args) {
    std::vector<std::string> rest;
    int exitCode = 0;
    if (!ParseOptions(args, 0, kAllHelp, &rest, &exitCode)) return exitCode;
    plat::lib::Library library(plat::lib::Load("Mendler.dll"));
    if (!library) {
        std::fprintf(stderr, "pexupdate: cannot load Mendler.dll (error %u)\n", plat::LastError());
        return 1;
    }
    using UpdateAllFn = bool (*)(ProgressCallback);
    auto updateAll = reinterpret_cast<UpdateAllFn>(plat::lib::FindExport(library.get(), "UpdateAll"));
    if (!updateAll) {
        std::fprintf(stderr, "pexupdate: Mendler.dll does not export UpdateAll\n");
        return 1;
    }
    updateAll(&ShowProgress);
    FinishProgress();
    PrintLogLocation(plat::lib::SearchFile("Mendler.dll"), args.size() && rest.size() != args.size());
    return 0;
}

const char* const kProductHelp =
    "usage: pexupdate [--machine DIR] product NAME [--quiet]\n"
    "Applies the downloaded updates of one product, as a host driving CManifestParser does.\n"
    "Exits 0 when every update was applied (or there was nothing to do), 1 otherwise.\n";

int RunProduct(const std::vector<std::string>& args) {
    std::vector<std::string> rest;
    int exitCode = 0;
    if (!ParseOptions(args, 1, kProductHelp, &rest, &exitCode)) return exitCode;
    const bool quiet = rest.size() != args.size();
    // The parser runs in this program; it starts the library's log as loading Mendler.dll does.
    std::string module = plat::lib::SearchFile("Mendler.dll");
    if (module.empty()) module = plat::files::ModuleFileName(nullptr);
    StartLibrary(module);
    std::int32_t failures = 0;
    {
        CManifestParser parser;
        failures = parser.ProcessUpdateInformation(_bstr_t(rest[0].c_str()), &ShowProgress);
    }
    StopLibrary();
    FinishProgress();
    if (failures != 0 || !quiet) std::printf("%s: %d failure%s\n", rest[0].c_str(), failures, failures == 1 ? "" : "s");
    PrintLogLocation(module, quiet);
    return failures == 0 ? 0 : 1;
}

const CommandRegistrar kAll({"all", "apply the updates of every registered product", &RunAll});
const CommandRegistrar kProduct({"product", "apply the updates of one product", &RunProduct});

}  // namespace

}  // namespace pextool
