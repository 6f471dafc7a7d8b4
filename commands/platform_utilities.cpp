// The small shared utilities: process start, paths, temporary names, directory trees, numbers.
#include "commands/platform_utilities.h"

#include <cerrno>
#include <cstdlib>

#include "diag/trace_log.h"
#include "commands/item_list.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/process.h"

bool RunProcess(const std::string& commandLine, const std::string& directory, bool wait,
                std::uint32_t timeoutMs, bool dispatchMessages) {
    plat::proc::Process process;
    if (!plat::proc::Start(commandLine, directory, &process)) return false;
    if (!wait) return true;
    if (plat::proc::WaitDispatching(process, timeoutMs, dispatchMessages) !=
        plat::proc::WaitResult::Ended)
        return false;  // still running at the time-out: it is left running
    std::uint32_t exitCode = 0;
    plat::proc::ExitCode(process, &exitCode);  // read, as the caller has no use for it
    return true;
}

std::string AddTrailingBackslash(const std::string& text) {
    if (!text.empty() && text.back() == '\\') return text;
    return text + "\\";
}

void ComposePath(std::string& path, const std::string& second, unsigned char flags) {
    path = plat::paths::ComposePath(path, second, flags);
}

std::string sGetTempFileName() {
    TRACE(g_TraceLog, "CManifestParser: sGetTempFileName");
    std::string name;
    const std::string folder = plat::files::TempFolder();
    if (!folder.empty() && folder.size() <= 261) name = plat::files::TempFileName(folder, "pex", 0);
    TRACE(g_TraceLog, "CManifestParser: sGetTempFileName, return is '%s'", name.c_str());
    return name;
}

namespace {

bool PathExists(const std::string& path) {
    if (path.size() == 2 && path[1] == ':') return true;
    return plat::files::GetAttributes(path) != plat::files::kInvalidAttributes;
}

}  // namespace

bool CreateDirectoryTree(const std::string& path) {
    if (path.empty()) return false;
    if (path.back() == '\\') {
        CreateDirectoryTree(path.substr(0, path.size() - 1));
        return true;
    }
    if (PathExists(path)) return true;
    // A relative name without a backslash has no parent to create first: it is created directly
    // (taking the whole name as its own parent would never end).
    const size_t slash = path.rfind('\\');
    if (slash != std::string::npos) CreateDirectoryTree(path.substr(0, slash));
    plat::files::MakeDirectory(path);  // a failure shows later, when the folder is used
    return true;
}

std::uint32_t NumberFromText(const std::string& text) {
    const std::string trimmed = TrimItem(text);
    const char* p = trimmed.c_str();
    while (*p == ' ' || *p == '\t' || *p == '\n' || *p == '\r' || *p == '\v' || *p == '\f') ++p;
    const bool negative = *p == '-';
    if (*p == '-' || *p == '+') ++p;
    if (*p == '-' || *p == '+') return 0;  // a second sign is no number
    errno = 0;
    char* end = nullptr;
    const unsigned long long magnitude = std::strtoull(p, &end, 0);
    if (end == p) return 0;
    // The C library of a 32-bit unsigned long saturates out-of-range values.
    if (errno == ERANGE || magnitude > 0xFFFFFFFFull) return 0xFFFFFFFFu;
    const std::uint32_t value = static_cast<std::uint32_t>(magnitude);
    return negative ? static_cast<std::uint32_t>(0u - value) : value;
}
