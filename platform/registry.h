// The registry of the machine. The calls mirror the Win32 registry calls: each returns the
// Windows error code (0 on success) and also sets the thread's last error. Key and value names
// compare without regard to ASCII case and keep the case they were created with; subkeys
// enumerate in case-insensitive name order. Data is stored as bytes exactly as given.
#pragma once
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace plat::reg {

struct KeyTag;
using HKey = KeyTag*;

// The predefined roots.
extern const HKey kLocalMachine;
extern const HKey kCurrentUser;
extern const HKey kClassesRoot;  // a view of HKLM\Software\Classes

// Access masks (the Windows values). A key opened without write rights gives 5 on writes.
constexpr std::uint32_t kKeyQueryValue = 0x0001;
constexpr std::uint32_t kKeySetValue = 0x0002;
constexpr std::uint32_t kKeyCreateSubKey = 0x0004;
constexpr std::uint32_t kKeyEnumerateSubKeys = 0x0008;
constexpr std::uint32_t kKeyRead = 0x20019;
constexpr std::uint32_t kKeyWrite = 0x20006;
constexpr std::uint32_t kKeyAllAccess = 0xF003F;

// Value types.
constexpr std::uint32_t kRegNone = 0;
constexpr std::uint32_t kRegSz = 1;
constexpr std::uint32_t kRegExpandSz = 2;
constexpr std::uint32_t kRegBinary = 3;
constexpr std::uint32_t kRegDword = 4;
constexpr std::uint32_t kRegMultiSz = 7;

// Dispositions of CreateKey.
constexpr std::uint32_t kCreatedNewKey = 1;
constexpr std::uint32_t kOpenedExistingKey = 2;

// RegOpenKeyEx: 2 when the key (or a parent) is missing.
long OpenKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result);
// RegCreateKeyEx: creates missing keys on the way; disposition may be null.
long CreateKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result,
               std::uint32_t* disposition);
// RegCloseKey. Closing a root is a no-op.
long CloseKey(HKey key);

// RegQueryValueEx: with data null, the size; a buffer too small gives 234 and the needed size.
// type and size may be null when not wanted (size must be given with data).
long QueryValue(HKey key, const std::string& name, std::uint32_t* type, std::uint8_t* data,
                std::uint32_t* size);
// RegSetValueEx.
long SetValue(HKey key, const std::string& name, std::uint32_t type, const std::uint8_t* data,
              std::uint32_t size);
// RegDeleteValue: 2 when missing.
long DeleteValue(HKey key, const std::string& name);
// RegDeleteKey: 5 when the key has subkeys, 2 when missing.
long DeleteKey(HKey parent, const std::string& subKey);

// RegEnumKeyEx: nameSize in characters, in: buffer size, out: name length without NUL.
// 234 when the buffer cannot hold the name and its NUL; 259 past the last subkey.
long EnumKey(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize);
// RegEnumValue: name as EnumKey; data and type as QueryValue (data may be null).
long EnumValue(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize,
               std::uint32_t* type, std::uint8_t* data, std::uint32_t* dataSize);
// RegQueryInfoKey: number of direct subkeys and of values (either may be null).
long QueryInfoKey(HKey key, std::uint32_t* subKeys, std::uint32_t* values);

// RAII owner of an open key: closes it on every path.
class Key {
public:
    Key() = default;
    explicit Key(HKey key) : key_(key) {}
    Key(const Key&) = delete;
    Key& operator=(const Key&) = delete;
    Key(Key&& other) noexcept : key_(std::exchange(other.key_, nullptr)) {}
    Key& operator=(Key&& other) noexcept {
        if (this != &other) { Reset(); key_ = std::exchange(other.key_, nullptr); }
        return *this;
    }
    ~Key() { Reset(); }
    HKey get() const { return key_; }
    HKey* out() { Reset(); return &key_; }
    explicit operator bool() const { return key_ != nullptr; }
    void Reset() { if (key_) { CloseKey(key_); key_ = nullptr; } }
private:
    HKey key_ = nullptr;
};

}  // namespace plat::reg
