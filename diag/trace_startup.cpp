#include "diag/trace_startup.h"

#include "platform/files.h"
#include "platform/paths.h"

// Log lines quote registry paths, program identifiers and file names verbatim. Machines that
// once ran the suite's pre-release builds still carry the update engine's development code name
// in such places, and support staff, who never knew that name, took lines showing it for a
// foreign program or malware and escalated healthy machines. The code name therefore never
// reaches the log: every occurrence reads as "pex", the name support staff know the engine by.
const char* const kTraceHiddenWord = "Kestrel";
const char* const kTraceHiddenWordToken = "pex";

namespace {

constexpr std::size_t kModulePathBuffer = 1024;  // characters, with the terminating NUL

// Creates each missing folder of the path, outermost first; errors are left to the open.
void MakeFolders(const std::string& folder) {
    std::size_t skip = plat::paths::SplitPath(folder).drive.size();
    for (std::size_t at = folder.find_first_of("\\/", skip + 1); at != std::string::npos;
         at = folder.find_first_of("\\/", at + 1)) {
        plat::files::MakeDirectory(folder.substr(0, at));
    }
    plat::files::MakeDirectory(folder);
}

std::string LogFilePath(const std::string& modulePath) {
    if (modulePath.empty() || modulePath.size() >= kModulePathBuffer) return "c:\\log.log";
    plat::paths::PathParts parts = plat::paths::SplitPath(modulePath);
    parts.dir += "log\\";
    MakeFolders(parts.drive + parts.dir.substr(0, parts.dir.size() - 1));
    parts.fname = "pex_support_mendler";
    parts.ext = ".log";
    return plat::paths::MakePath(parts);
}

}  // namespace

void ConfigureTraceLog(TraceLog& log, const std::string& modulePath) {
    std::string path = LogFilePath(modulePath);
    log.SetSubstitution(kTraceHiddenWord, kTraceHiddenWordToken);
    log.keepOpen = false;
    log.Close();
    log.fileOutput = false;
    if (!path.empty()) log.SetFileName(path);
    log.Backup();
}
