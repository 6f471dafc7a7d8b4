// Modules through LoadLibraryA, GetProcAddress and FreeLibrary; the search for a module's
// file through SearchPathA.
#include "platform/library.h"

#include "platform/errors.h"
#include "platform/paths.h"
#include "platform/win32/windows_api.h"

namespace plat::lib {

namespace {

HMODULE Native(HModule module) { return reinterpret_cast<HMODULE>(module); }

// "?Name@@YAHXZ" -> "Name": the name up to the first '@' after the leading '?'.
std::string Undecorated(const std::string& name) {
    if (name.size() < 2 || name[0] != '?') return {};
    const std::size_t at = name.find('@');
    return at == std::string::npos ? std::string() : name.substr(1, at - 1);
}

bool NamesPath(const std::string& name) {
    return name.find_first_of("\\/") != std::string::npos || (name.size() >= 2 && name[1] == ':');
}

}  // namespace

HModule Load(const std::string& nameOrPath) {
    if (nameOrPath.empty()) {
        SetLastErrorCode(kErrorModNotFound);
        return nullptr;
    }
    // No "cannot load" dialogue may stop an update run: failures are reported as codes.
    DWORD previous = 0;
    ::SetThreadErrorMode(SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX, &previous);
    HMODULE module = ::LoadLibraryA(nameOrPath.c_str());
    const DWORD error = ::GetLastError();
    ::SetThreadErrorMode(previous, nullptr);
    SetLastErrorCode(module ? DWORD{kErrorSuccess} : error);
    return reinterpret_cast<HModule>(module);
}

Proc FindExport(HModule module, const std::string& name) {
    if (!module) {
        SetLastErrorCode(kErrorInvalidHandle);
        return nullptr;
    }
    FARPROC found = ::GetProcAddress(Native(module), name.c_str());
    // The same fallback as on Linux, so that callers see one rule on every target.
    const std::string plain = found ? std::string() : Undecorated(name);
    if (!plain.empty()) found = ::GetProcAddress(Native(module), plain.c_str());
    if (!found) {
        SetLastErrorCode(kErrorProcNotFound);
        return nullptr;
    }
    return reinterpret_cast<Proc>(reinterpret_cast<void*>(found));
}

std::string SearchFile(const std::string& nameOrPath) {
    char buffer[MAX_PATH];
    DWORD n = 0;
    if (!nameOrPath.empty()) {
        // A path is not searched: it names the file itself.
        const std::string name = NamesPath(nameOrPath) ? paths::FullPath(nameOrPath) : nameOrPath;
        n = ::SearchPathA(nullptr, name.c_str(), ".dll", MAX_PATH, buffer, nullptr);
    }
    if (n == 0 || n >= MAX_PATH) {
        SetLastErrorCode(kErrorModNotFound);
        return std::string();
    }
    return std::string(buffer, n);
}

bool Free(HModule module) {
    if (!module) {
        SetLastErrorCode(kErrorInvalidHandle);
        return false;
    }
    return ::FreeLibrary(Native(module)) != FALSE;
}

}  // namespace plat::lib
