// The parameter of a [REGISTRY] install command: (TYPE)ROOT\Key\Path\ValueName=Data, for
// example (DWORD)HKLM\Software\Maker\Product\Flags=1. Parsing is pure (no registry access) so
// that it can be tested and fuzzed on its own; the executor only creates the key and writes.
#pragma once
#include <cstdint>
#include <string>

enum class RegistryRoot { LocalMachine, CurrentUser };

// The type is classified while parsing but judged only after the key exists, because an
// unknown type is reported after the key has been created.
enum class RegistryDataType { Dword, String, Unknown };

struct RegistryAssignment {
    RegistryRoot root = RegistryRoot::LocalMachine;
    std::string subKey;     // below the root; empty for the root itself
    std::string valueName;  // empty for the key's default value
    RegistryDataType type = RegistryDataType::Unknown;
    std::string data;       // the text after "=", every "/" turned into "\"
};

// Parses the parameter. Returns nullptr and fills *assignment, or returns the fixed message of
// the first defect found, checked in this order: type, remainder, value, root key.
//   "Invalid Registration Parameter - no type"        no "(...)" or nothing after its ")"
//   "Invalid Registration Parameter - no value"       no name before "=", no data after it, or
//                                                     no "\" between the key path and the name
//   "Invalid Registration Parameter - no root key"    the key path starts with "\"
//   "Invalid Registration Parameter - Bad Root Key."  a root other than HKLM or HKCU
// A ")" ends the remainder and a second "=" ends the data; what follows them is dropped.
const char* ParseRegistryAssignment(std::string parameter, RegistryAssignment* assignment);

// The number a DWORD value gets from its data, as the C atol reads it: leading white space,
// an optional sign, then decimal digits up to the first other character; 0 when there are
// none. Values beyond the 32-bit range saturate.
std::int32_t RegistryDwordFromText(const std::string& data);
