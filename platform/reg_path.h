// Registry key paths as people write them: a root by its short or long name (HKLM,
// HKEY_LOCAL_MACHINE, HKCU, HKEY_CURRENT_USER, HKCR, HKEY_CLASSES_ROOT; any case), then the
// path below it, parts separated by backslashes.
#pragma once
#include <string>

#include "platform/registry.h"

namespace plat::reg {

struct KeyPath {
    HKey root = nullptr;
    std::string rootName;  // the long name, HKEY_LOCAL_MACHINE
    std::string subKey;    // as written, without outer backslashes; empty for the root itself

    // rootName, then the path below it: HKEY_LOCAL_MACHINE\Software\Vantric.
    std::string FullName() const;
    // The path of the subkey name below this key.
    KeyPath Child(const std::string& name) const;
};

// Whether two names are the same for the registry: equal but for the case of ASCII letters.
bool NamesEqual(const std::string& a, const std::string& b);

// False when text does not start with one of the roots.
bool ParseKeyPath(const std::string& text, KeyPath* path);

}  // namespace plat::reg
