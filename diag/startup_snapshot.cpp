// The banner and support snapshot at the top of every fresh trace log.
#include "diag/startup_snapshot.h"

#include "commands/platform_utilities.h"
#include "diag/module_version.h"
#include "diag/suite_components.h"
#include "diag/trace_log.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/registry.h"

namespace reg = plat::reg;

namespace {

const char* const kNoVersion = "Version # Not Available";

std::string VersionText(const std::string& path) {
    std::string text;
    if (path.empty() || !GetFileVersionText(path, &text)) return kNoVersion;
    return text;
}

// The hive of a root name (case-sensitive); null for an unknown root.
reg::HKey RootKey(const std::string& rootName) {
    if (rootName == "HKCU" || rootName == "HKEY_CURRENT_USER") return reg::kCurrentUser;
    if (rootName == "HKLM" || rootName == "HKEY_LOCAL_MACHINE") return reg::kLocalMachine;
    if (rootName == "HKCR" || rootName == "HKEY_CLASSES_ROOT") return reg::kClassesRoot;
    return nullptr;
}

void LogRegistryKey(const std::string& entry) {
    const size_t slash = entry.find('\\');
    if (slash == std::string::npos) {
        TRACE(g_TraceLog, "Unable to log malformed key: %s", entry.c_str());
        return;
    }
    const std::string rootName = entry.substr(0, slash);
    const reg::HKey root = RootKey(rootName);
    if (!root) {
        TRACE(g_TraceLog, "Unknown Registry Root: %s\n", rootName.c_str());
        return;
    }
    const std::string subKey = entry.substr(slash + 1);
    long status = 0;
    const std::string dump = "Logging Registry Settings: " + rootName + "\\" + subKey + "\n" +
                             RegistryKeyDump(rootName, root, subKey, &status);
    TRACE(g_TraceLog, "%s", dump.c_str());
    if (status != 0) TRACE(g_TraceLog, "Failed (%d)!", static_cast<int>(status));
}

}  // namespace

void LogComponentVersions() {
    const plat::paths::PathParts host = plat::paths::SplitPath(plat::files::ModuleFileName(nullptr));
    const std::string base = AddTrailingBackslash(host.drive + host.dir);
    g_TraceLog.keepOpen = true;
    for (const SuiteComponent& c : SuiteComponentList()) {
        if (c.kind == SuiteComponent::File) {
            const std::string path = base + c.text;
            TRACE(g_TraceLog, "File Version [%40s]: %s", path.c_str(), VersionText(path).c_str());
        } else {
            const std::string path = InprocServerPath(c.text);
            TRACE(g_TraceLog, "ProgID: [%30s] File [%40s]: %s", c.text.c_str(), path.c_str(),
                  VersionText(path).c_str());
        }
    }
    g_TraceLog.keepOpen = false;
}

void LogRegistryKeys(const std::string& keyList) {
    std::string rest = keyList;
    do {
        const size_t end = rest.find("\r\n");
        const std::string entry = rest.substr(0, end);
        rest = end == std::string::npos ? std::string() : rest.substr(end + 2);
        LogRegistryKey(entry);
    } while (!rest.empty());
}

void WriteStartupSnapshot(const std::string& libraryPath) {
    const ModuleVersion version(libraryPath);
    TRACE(g_TraceLog, "Vantric Software Update - Mendler (%s)", version.Text(true));
    TRACE(g_TraceLog, "=================================================");
    TRACE(g_TraceLog, "Current Working Directory: [%s]", plat::paths::CurrentDirectory().c_str());
    LogComponentVersions();
    g_TraceLog.keepOpen = true;
    LogRegistryKeys(SuiteRegistryKeyList());
    g_TraceLog.keepOpen = false;
}
