// Reading one named section out of an ELF file held in memory (little-endian, 32 or 64 bit).
#pragma once
#include <string>

namespace plat::elf {

// True when the bytes start with the ELF magic.
bool LooksLikeElf(const std::string& file);

// The contents of the section of that name; false when the file has none or its headers do
// not hold together.
bool SectionContents(const std::string& file, const std::string& name, std::string* contents);

}  // namespace plat::elf
