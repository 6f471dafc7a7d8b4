// Modules on the host are ELF shared objects under their Windows names (Mendler.dll): they are
// found as Windows finds a library and opened with dlopen.
#include "platform/library.h"

#include <dlfcn.h>
#include <link.h>

#include <cstring>

#include "platform/errors.h"
#include "platform/paths.h"
#include "platform/posix/search_path.h"

namespace plat::lib {

namespace {

// LoadLibrary's name rule: no extension means ".dll"; a trailing dot asks for the bare name.
std::string WithExtension(const std::string& name) {
    if (!name.empty() && name.back() == '.') return name.substr(0, name.size() - 1);
    std::size_t slash = name.find_last_of("\\/");
    std::size_t dot = name.find('.', slash == std::string::npos ? 0 : slash + 1);
    return dot == std::string::npos ? name + ".dll" : name;
}

std::string FindModule(const std::string& name) {
    std::string spelled = WithExtension(name);
    if (search::NamesPath(spelled)) return search::ExistingFile(paths::FullPath(spelled));
    return search::Find(search::Folders(true), {spelled});
}

// "?Name@@YAHXZ" -> "Name": the name up to the first '@' after the leading '?'.
std::string Undecorated(const std::string& name) {
    if (name.size() < 2 || name[0] != '?') return {};
    std::size_t at = name.find('@');
    return at == std::string::npos ? std::string() : name.substr(1, at - 1);
}

// dlsym also searches the module's dependencies; GetProcAddress sees only the module's own
// exports, so a symbol found elsewhere does not count.
bool OwnSymbol(void* handle, void* sym) {
    Dl_info info;
    link_map* map = nullptr;
    if (!dladdr(sym, &info) || dlinfo(handle, RTLD_DI_LINKMAP, &map) != 0 || !map) return true;
    return info.dli_fname && map->l_name && std::strcmp(info.dli_fname, map->l_name) == 0;
}

// What Windows reports when a file exists but does not load: a missing dependency is 126, a
// missing import 127, anything else is not a module (193).
std::uint32_t LoadError() {
    const char* why = dlerror();
    if (why && std::strstr(why, "cannot open shared object")) return kErrorModNotFound;
    if (why && std::strstr(why, "undefined symbol")) return kErrorProcNotFound;
    return kErrorBadExeFormat;
}

}  // namespace

std::string SearchFile(const std::string& nameOrPath) {
    const std::string host = nameOrPath.empty() ? std::string() : FindModule(nameOrPath);
    if (host.empty()) {
        SetLastErrorCode(kErrorModNotFound);
        return std::string();
    }
    return paths::ToWindows(host);
}

HModule Load(const std::string& nameOrPath) {
    std::string host = nameOrPath.empty() ? std::string() : FindModule(nameOrPath);
    if (host.empty()) {
        SetLastErrorCode(kErrorModNotFound);
        return nullptr;
    }
    void* handle = dlopen(host.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!handle) {
        SetLastErrorCode(LoadError());
        return nullptr;
    }
    SetLastErrorCode(kErrorSuccess);
    return static_cast<HModule>(handle);
}

Proc FindExport(HModule module, const std::string& name) {
    if (!module) {
        SetLastErrorCode(kErrorInvalidHandle);
        return nullptr;
    }
    void* sym = dlsym(module, name.c_str());
    if (sym && !OwnSymbol(module, sym)) sym = nullptr;
    std::string plain = Undecorated(name);
    if (!sym && !plain.empty()) sym = dlsym(module, plain.c_str());
    if (sym && !OwnSymbol(module, sym)) sym = nullptr;
    if (!sym) {
        SetLastErrorCode(kErrorProcNotFound);
        return nullptr;
    }
    return reinterpret_cast<Proc>(sym);
}

bool Free(HModule module) {
    if (!module) {
        SetLastErrorCode(kErrorInvalidHandle);
        return false;
    }
    return dlclose(module) == 0;
}

}  // namespace plat::lib
