// ELF sections by name: the section header table (e_shoff, e_shnum) and the table of section
// names (e_shstrndx). Every offset is checked against the file, since any file may be asked.
#include "platform/posix/elf_section.h"

#include <cstdint>
#include <cstring>

namespace plat::elf {

namespace {

std::uint64_t Read(const std::string& b, std::size_t at, int size) {
    std::uint64_t v = 0;
    for (int i = size - 1; i >= 0; --i) v = (v << 8) | static_cast<unsigned char>(b[at + i]);
    return v;
}

bool Fits(const std::string& b, std::uint64_t at, std::uint64_t n) {
    return at <= b.size() && n <= b.size() - at;
}

struct Header {
    std::uint64_t nameOffset, offset, size;
};

// The layout of the two classes: field offsets in the file header and in a section header.
struct Layout {
    int word;  // 4 or 8
    std::size_t shoff, shentsize, shnum, shstrndx;
    std::size_t shName, shOffset, shSize;
};
constexpr Layout kElf32{4, 0x20, 0x2E, 0x30, 0x32, 0, 16, 20};
constexpr Layout kElf64{8, 0x28, 0x3A, 0x3C, 0x3E, 0, 24, 32};

bool SectionHeader(const std::string& b, const Layout& l, std::uint64_t table, std::uint64_t entSize,
                   std::uint64_t index, Header* h) {
    std::uint64_t at = table + index * entSize;
    if (!Fits(b, at, entSize) || entSize < l.shSize + l.word) return false;
    h->nameOffset = Read(b, at + l.shName, 4);
    h->offset = Read(b, at + l.shOffset, l.word);
    h->size = Read(b, at + l.shSize, l.word);
    return true;
}

}  // namespace

bool LooksLikeElf(const std::string& file) {
    return file.size() >= 4 && std::memcmp(file.data(), "\x7F" "ELF", 4) == 0;
}

bool SectionContents(const std::string& b, const std::string& name, std::string* contents) {
    if (!LooksLikeElf(b) || !Fits(b, 0, 0x40) || b[5] != 1) return false;  // little-endian only
    const Layout& l = b[4] == 2 ? kElf64 : kElf32;
    std::uint64_t table = Read(b, l.shoff, l.word), entSize = Read(b, l.shentsize, 2);
    std::uint64_t count = Read(b, l.shnum, 2), namesIndex = Read(b, l.shstrndx, 2);
    Header names;
    if (!SectionHeader(b, l, table, entSize, namesIndex, &names) || !Fits(b, names.offset, names.size))
        return false;
    for (std::uint64_t i = 0; i < count; ++i) {
        Header h;
        if (!SectionHeader(b, l, table, entSize, i, &h)) return false;
        if (h.nameOffset >= names.size) continue;
        const char* n = b.data() + names.offset + h.nameOffset;
        std::size_t max = static_cast<std::size_t>(names.size - h.nameOffset);
        if (strnlen(n, max) != name.size() || name.compare(0, name.size(), n, name.size()) != 0) continue;
        if (!Fits(b, h.offset, h.size)) return false;
        *contents = b.substr(static_cast<std::size_t>(h.offset), static_cast<std::size_t>(h.size));
        return true;
    }
    return false;
}

}  // namespace plat::elf
