// Registry values through RegQueryValueExA and its siblings: the data is handed over as the
// bytes given, with the system's own size rules.
#include <vector>

#include "platform/registry.h"
#include "platform/win32/registry_handle.h"
#include "platform/win32/registry_journal.h"

namespace plat::reg {

using win32::Done;
using win32::Native;

namespace {

BYTE* Bytes(std::uint8_t* data) { return reinterpret_cast<BYTE*>(data); }

}  // namespace

long QueryValue(HKey key, const std::string& name, std::uint32_t* type, std::uint8_t* data,
                std::uint32_t* size) {
    if (data && !size) return Done(kErrorInvalidParameter);
    DWORD t = 0, s = size ? *size : 0;
    const long rc = ::RegQueryValueExA(Native(key), name.c_str(), nullptr, &t, Bytes(data),
                                       size ? &s : nullptr);
    if (rc == ERROR_SUCCESS || rc == ERROR_MORE_DATA) {
        if (type) *type = t;
        if (size) *size = s;
    }
    return Done(rc);
}

long SetValue(HKey key, const std::string& name, std::uint32_t type, const std::uint8_t* data,
              std::uint32_t size) {
    if (!data && size) return Done(kErrorInvalidParameter);
    if (long rc = win32::AllowWrite()) return Done(rc);
    // RegSetValueExA looks one byte past a text's given size and counts a NUL it finds there as
    // part of the value. The bytes are handed over with a non-zero byte after them, so the
    // value is stored exactly as given.
    std::vector<BYTE> bytes(data, data + size);
    bytes.push_back(0xFF);
    win32::journal::BeforeSetValue(Native(key), name);
    return Done(::RegSetValueExA(Native(key), name.c_str(), 0, type, bytes.data(), size));
}

long DeleteValue(HKey key, const std::string& name) {
    // The plan is asked only when there is something to delete; the call itself still checks
    // the handle's rights first.
    const long found = ::RegQueryValueExA(Native(key), name.c_str(), nullptr, nullptr, nullptr, nullptr);
    if (found == ERROR_SUCCESS) {
        if (long rc = win32::AllowWrite()) return Done(rc);
        win32::journal::BeforeDeleteValue(Native(key), name);
    }
    return Done(::RegDeleteValueA(Native(key), name.c_str()));
}

long EnumValue(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize,
               std::uint32_t* type, std::uint8_t* data, std::uint32_t* dataSize) {
    if (!nameSize || (data && !dataSize)) return Done(kErrorInvalidParameter);
    if (!name) return Done(kErrorMoreData);
    DWORD n = *nameSize, t = 0, s = dataSize ? *dataSize : 0;
    const long rc = ::RegEnumValueA(Native(key), index, name, &n, nullptr, &t, Bytes(data),
                                    dataSize ? &s : nullptr);
    if (rc == ERROR_SUCCESS || rc == ERROR_MORE_DATA) {
        *nameSize = n;
        if (type) *type = t;
        if (dataSize) *dataSize = s;
    }
    return Done(rc);
}

}  // namespace plat::reg
