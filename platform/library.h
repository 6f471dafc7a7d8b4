// Libraries (modules) of the machine: load by path or bare name, look up an export, free.
// Failures set the last error to the code Windows gives.
#pragma once
#include <string>
#include <utility>

namespace plat::lib {

struct ModuleTag;
using HModule = ModuleTag*;
// An exported function, to be cast to its real type (FARPROC).
using Proc = void (*)();

constexpr unsigned kErrorBadExeFormat = 193;

// LoadLibrary: a name with a drive or separator is loaded from that path; a bare name is
// searched in the folder of the host program, C:\windows\system32, the current folder, then
// PATH. A name without extension gets ".dll" (a trailing dot means "no extension"). Loading a
// module already loaded gives the same handle and counts one more reference.
// nullptr and the last error on failure: 126 for an empty name or a file not found, 193 for a
// file that is not a module of this machine.
HModule Load(const std::string& nameOrPath);

// GetProcAddress: the export of that name. An MSVC-decorated name ("?Name@@YA...") that the
// module lacks is looked up by its undecorated name ("Name"), since ELF modules export C++
// entry points under plain names. nullptr and 127 when there is no such export.
Proc FindExport(HModule module, const std::string& name);

// The Windows path of the file that Load would load for nameOrPath (the same search); empty and
// 126 when there is none.
std::string SearchFile(const std::string& nameOrPath);

// FreeLibrary: drops one reference; the module is unloaded with the last. False (6) for a null
// handle.
bool Free(HModule module);

// RAII owner of a loaded module: frees it on every path.
class Library {
public:
    Library() = default;
    explicit Library(HModule module) : module_(module) {}
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;
    Library(Library&& other) noexcept : module_(std::exchange(other.module_, nullptr)) {}
    Library& operator=(Library&& other) noexcept {
        if (this != &other) { Reset(); module_ = std::exchange(other.module_, nullptr); }
        return *this;
    }
    ~Library() { Reset(); }
    HModule get() const { return module_; }
    explicit operator bool() const { return module_ != nullptr; }
    void Reset() { if (module_) { Free(module_); module_ = nullptr; } }

private:
    HModule module_ = nullptr;
};

}  // namespace plat::lib
