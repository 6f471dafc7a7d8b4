// Reading one named section out of an ELF file (little-endian, 32 or 64 bit): the file header,
// the section headers and the one section are read, piece by piece, from a file or from bytes
// in memory.
#pragma once
#include <cstdint>
#include <string>

#include "platform/byte_source.h"

namespace plat::elf {

// True when the bytes start with the ELF magic.
bool LooksLikeElf(const std::string& file);

// The contents of the section of that name, when it holds at most maxSize bytes; false when
// the file has none, its headers do not hold together or the section is larger.
bool SectionContents(const ByteSource& file, const std::string& name, std::uint64_t maxSize,
                     std::string* contents);
bool SectionContents(const std::string& file, const std::string& name, std::uint64_t maxSize,
                     std::string* contents);

}  // namespace plat::elf
