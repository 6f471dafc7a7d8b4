// .reg files, as the Windows registry editor reads and writes them: the header line
// "Windows Registry Editor Version 5.00" (or "REGEDIT4"), then key sections ("[KEY]", or
// "[-KEY]" to delete the key and all below it) with value lines ("name"="text", @= for the
// default value, dword:, hex:, hex(N): forms, "name"=- to delete). A line ending in a
// backslash continues on the next; lines starting with ';' are comments. Quoted texts escape
// \\ and \". In a version 5 file the data of hex(1), hex(2) and hex(7) is UTF-16LE, which
// converts to the registry's single-byte texts one code unit per byte (see reg_text.h).
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "platform/reg_path.h"

namespace plat::reg {

// One change a file asks for. Value entries follow the CreateKey entry of their section.
struct RegFileEntry {
    enum class Kind { CreateKey, DeleteKey, SetValue, DeleteValue };
    Kind kind = Kind::CreateKey;
    int line = 0;  // where it stands in the file, for messages
    KeyPath key;
    std::string name;  // value name; empty for the default value
    std::uint32_t type = 0;
    std::string data;
};

struct RegFileError {
    int line = 0;  // 0 when the failure belongs to no line
    std::string message;
};

// Reads a whole file (UTF-16LE, UTF-8 or single-byte). False, with the number of the first
// malformed line and what is wrong with it, when the file is not a well-formed .reg file.
bool ParseRegFile(const std::string& fileBytes, std::vector<RegFileEntry>* entries,
                  RegFileError* error);

// Carries out the entries in one Transaction, so that either all of them take effect or
// none. Deleting a key or value that is not there is no failure. 0, or the Windows code of
// the failing call with its line in error.
long ApplyRegFile(const std::vector<RegFileEntry>& entries, RegFileError* error);

// ParseRegFile, then ApplyRegFile: 0, or 87 for a malformed file, or the code of the failing
// call; nothing of the file is applied on failure.
long ImportRegFile(const std::string& fileBytes, RegFileError* error);

// The key and every key below it as a version 5 file in single-byte characters with CR LF
// line ends: each key a section, its values in enumeration order, its subkeys after it.
long ExportRegText(const KeyPath& key, std::string* text);

// ExportRegText encoded as the registry editor writes it: UTF-16LE with a byte-order mark.
long ExportRegFile(const KeyPath& key, std::string* fileBytes);

}  // namespace plat::reg
