// Registry keys through RegOpenKeyExA and its siblings. The fault plan is asked only when a
// call is about to change the registry, as on the emulated machine.
#include "platform/fault.h"
#include "platform/registry.h"
#include "platform/win32/registry_handle.h"
#include "platform/win32/registry_journal.h"

namespace plat::reg {

using win32::Done;
using win32::Native;
using win32::Wrapped;

// The predefined keys are fixed values, so these are constant-initialised and usable from any
// other module's start-up code.
const HKey kLocalMachine = reinterpret_cast<HKey>(HKEY_LOCAL_MACHINE);
const HKey kCurrentUser = reinterpret_cast<HKey>(HKEY_CURRENT_USER);
const HKey kClassesRoot = reinterpret_cast<HKey>(HKEY_CLASSES_ROOT);

namespace win32 {
long AllowWrite() {
    if (fault::Allow(fault::Op::RegWrite)) return 0;
    const std::uint32_t code = LastError();
    return code ? static_cast<long>(code) : long{kErrorAccessDenied};
}
}  // namespace win32

namespace {

// Whether subKey exists below parent: 0 when it does, else the code of the failed open.
long Probe(HKey parent, const std::string& subKey) {
    HKEY probe = nullptr;
    const long rc = ::RegOpenKeyExA(Native(parent), subKey.c_str(), 0, KEY_QUERY_VALUE, &probe);
    if (rc == ERROR_SUCCESS) ::RegCloseKey(probe);
    return rc;
}

}  // namespace

long OpenKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result) {
    if (!result) return Done(kErrorInvalidParameter);
    HKEY key = nullptr;
    const long rc = ::RegOpenKeyExA(Native(parent), subKey.c_str(), 0, access, &key);
    *result = rc == ERROR_SUCCESS ? Wrapped(key) : nullptr;
    return Done(rc);
}

long CreateKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result,
               std::uint32_t* disposition) {
    if (!result) return Done(kErrorInvalidParameter);
    *result = nullptr;
    if (Probe(parent, subKey) == ERROR_FILE_NOT_FOUND) {
        if (long rc = win32::AllowWrite()) return Done(rc);
        win32::journal::BeforeCreateKey(Native(parent), subKey);
    }
    HKEY key = nullptr;
    DWORD outcome = 0;
    const long rc = ::RegCreateKeyExA(Native(parent), subKey.c_str(), 0, nullptr,
                                      REG_OPTION_NON_VOLATILE, access, nullptr, &key, &outcome);
    if (rc == ERROR_SUCCESS) {
        *result = Wrapped(key);
        if (disposition) *disposition = outcome;
    }
    return Done(rc);
}

long CloseKey(HKey key) {
    if (!key) return Done(kErrorInvalidHandle);
    return Done(::RegCloseKey(Native(key)));
}

long DeleteKey(HKey parent, const std::string& subKey) {
    if (long rc = Probe(parent, subKey)) return Done(rc);
    if (long rc = win32::AllowWrite()) return Done(rc);
    win32::journal::BeforeDeleteKey(Native(parent), subKey);
    return Done(::RegDeleteKeyA(Native(parent), subKey.c_str()));
}

long EnumKey(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize) {
    if (!nameSize) return Done(kErrorInvalidParameter);
    if (!name) return Done(kErrorMoreData);
    DWORD size = *nameSize;
    const long rc =
        ::RegEnumKeyExA(Native(key), index, name, &size, nullptr, nullptr, nullptr, nullptr);
    if (rc == ERROR_SUCCESS) *nameSize = size;
    return Done(rc);
}

long QueryInfoKey(HKey key, std::uint32_t* subKeys, std::uint32_t* values) {
    DWORD keys = 0, vals = 0;
    const long rc = ::RegQueryInfoKeyA(Native(key), nullptr, nullptr, nullptr, &keys, nullptr,
                                       nullptr, &vals, nullptr, nullptr, nullptr, nullptr);
    if (rc == ERROR_SUCCESS) {
        if (subKeys) *subKeys = keys;
        if (values) *values = vals;
    }
    return Done(rc);
}

}  // namespace plat::reg
