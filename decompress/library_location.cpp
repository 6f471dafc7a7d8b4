// Where Rivzip.dll may be: the folder that the suite's installer records in the registry, the
// suite's two shared folders, the current folder, and wherever the system's search finds it.
#include <new>
#include <stdexcept>
#include <vector>

#include "decompress/decompression_objects.h"
#include "diag/trace_log.h"
#include "platform/registry.h"

namespace {

constexpr char kLocationKey[] = "SOFTWARE\\Vantric\\ZENDOR32";
constexpr char kLocationValue[] = "path";

// A folder text with its separator; an empty text stays empty, so the bare name follows.
std::string WithSeparator(const std::string& folder) {
    if (folder.empty() || folder.back() == '\\') return folder;
    return folder + "\\";
}

}  // namespace

std::string CDecompressionObjects::GetRegistryPath() {
    TRACE(g_TraceLog, "CDecompressionObjects::GetRegistryPath");
    plat::reg::Key key;
    long status = plat::reg::OpenKey(plat::reg::kLocalMachine, kLocationKey, plat::reg::kKeyRead, key.out());
    if (status != 0) {
        TRACE(g_TraceLog, "CDecompressionObjects::GetRegistryPath, Unable to access registry, RegOpenKeyEx returns %d",
              static_cast<int>(status));
        return std::string();
    }
    std::uint32_t type = 0, size = 0;
    status = plat::reg::QueryValue(key.get(), kLocationValue, &type, nullptr, &size);
    if (status != 0 || type != plat::reg::kRegSz) {
        // A value of another type is refused like a missing one, reported as the call's success.
        TRACE(g_TraceLog, "CDecompressionObjects::GetRegistryPath, Unable to access registry, RegQueryValueEx returns %d",
              static_cast<int>(status));
        return std::string();
    }
    const std::string dll = GetDLL();
    if (dll.empty()) {
        TRACE(g_TraceLog, "CDecompressionObjects::GetRegistryPath, GetDLL returned empty string");
        return std::string();
    }
    std::vector<char> text;
    try {
        text.assign(static_cast<std::size_t>(size) + 1, '\0');  // the extra zero ends a value stored without one
    } catch (const std::exception&) {
        TRACE(g_TraceLog, "CDecompressionObjects::GetRegistryPath, Unable to allocate memory");
        return std::string();
    }
    status = plat::reg::QueryValue(key.get(), kLocationValue, &type, reinterpret_cast<std::uint8_t*>(text.data()),
                                   &size);
    if (status != 0) {
        TRACE(g_TraceLog,
              "CDecompressionObjects::GetRegistryPath, Unable to find path to decompression DLL, RegQueryValueEx returns %d",
              static_cast<int>(status));
        return std::string();
    }
    return WithSeparator(std::string(text.data())) + dll;
}

std::string CDecompressionObjects::GetDefaultPath1() {
    TRACE(g_TraceLog, "CDecompressionObjects::GetDefaultPath1");
    return "c:\\program files\\vantric\\orlandel\\" + GetDLL();
}

std::string CDecompressionObjects::GetDefaultPath2() {
    TRACE(g_TraceLog, "CDecompressionObjects::GetDefaultPath2");
    return "c:\\program files\\vantric\\orlandel\\shared\\" + GetDLL();
}

std::string CDecompressionObjects::GetDefaultPath3() {
    TRACE(g_TraceLog, "CDecompressionObjects::GetDefaultPath3");
    return ".\\" + GetDLL();
}

std::string CDecompressionObjects::GetDLL() { return "Rivzip.dll"; }
