// Registry data as people read and write it with `reg`: type names, the data text of
// `reg query`, and the data of `reg add /t TYPE /d TEXT`.
#pragma once
#include <cstdint>
#include <string>

namespace plat::reg {

// REG_SZ, REG_DWORD, ... for the known types; REG_0xN (hexadecimal) for the others.
std::string TypeName(std::uint32_t type);

// The type of one of the names `reg add` takes (REG_SZ, REG_EXPAND_SZ, REG_DWORD, REG_BINARY,
// REG_MULTI_SZ, REG_NONE; any case); false for others.
bool TypeFromName(const std::string& name, std::uint32_t* type);

// The data as `reg query` shows it: texts up to their NUL, a multi-string's texts joined by
// \0, a REG_DWORD as 0x and lower-case hex, anything else as upper-case hex digits.
std::string DataText(std::uint32_t type, const std::string& data);

// The bytes `reg add` stores for text under type: texts with their NUL (a multi-string split
// at separator, by default the two characters \0, and ended by an empty string), a REG_DWORD
// from decimal or 0x-hexadecimal, REG_BINARY from hex digits. False, with a message, when the
// text does not fit the type.
bool DataFromText(std::uint32_t type, const std::string& text, const std::string& separator,
                  std::string* data, std::string* message);

}  // namespace plat::reg
