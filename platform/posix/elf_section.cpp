// ELF sections by name: the section header table (e_shoff, e_shnum) and the table of section
// names (e_shstrndx). Every offset is checked against the file, since any file may be asked;
// of the names, only the bytes that could match are read.
#include "platform/posix/elf_section.h"

#include <cstring>

namespace plat::elf {

namespace {

std::uint64_t Read(const std::string& b, std::size_t at, int size) {
    std::uint64_t v = 0;
    for (int i = size - 1; i >= 0; --i) v = (v << 8) | static_cast<unsigned char>(b[at + i]);
    return v;
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

bool SectionHeader(const ByteSource& f, const Layout& l, std::uint64_t table, std::uint64_t entSize,
                   std::uint64_t index, Header* h) {
    const std::size_t used = l.shSize + static_cast<std::size_t>(l.word);
    std::string b;
    if (entSize < used || !f.ReadAt(table + index * entSize, used, &b)) return false;
    h->nameOffset = Read(b, l.shName, 4);
    h->offset = Read(b, l.shOffset, l.word);
    h->size = Read(b, l.shSize, l.word);
    return true;
}

// Whether the name at offset in the names section is exactly name (its terminating NUL, or the
// section's end, included).
bool NameIs(const ByteSource& f, const Header& names, std::uint64_t offset, const std::string& name) {
    if (offset >= names.size) return false;
    const std::uint64_t left = names.size - offset;
    const std::size_t n = left > name.size() ? name.size() + 1 : static_cast<std::size_t>(left);
    std::string bytes;
    if (!f.ReadAt(names.offset + offset, n, &bytes)) return false;
    return strnlen(bytes.data(), n) == name.size() && bytes.compare(0, name.size(), name) == 0;
}

}  // namespace

bool LooksLikeElf(const std::string& file) {
    return file.size() >= 4 && std::memcmp(file.data(), "\x7F" "ELF", 4) == 0;
}

bool SectionContents(const ByteSource& f, const std::string& name, std::uint64_t maxSize,
                     std::string* contents) {
    std::string b;
    if (!f.ReadAt(0, 0x40, &b) || !LooksLikeElf(b) || b[5] != 1) return false;  // little-endian only
    const Layout& l = b[4] == 2 ? kElf64 : kElf32;
    std::uint64_t table = Read(b, l.shoff, l.word), entSize = Read(b, l.shentsize, 2);
    std::uint64_t count = Read(b, l.shnum, 2), namesIndex = Read(b, l.shstrndx, 2);
    Header names;
    if (!SectionHeader(f, l, table, entSize, namesIndex, &names) || names.offset > f.Size() ||
        names.size > f.Size() - names.offset)
        return false;
    for (std::uint64_t i = 0; i < count; ++i) {
        Header h;
        if (!SectionHeader(f, l, table, entSize, i, &h)) return false;
        if (!NameIs(f, names, h.nameOffset, name)) continue;
        return h.size <= maxSize && f.ReadAt(h.offset, static_cast<std::size_t>(h.size), contents);
    }
    return false;
}

bool SectionContents(const std::string& file, const std::string& name, std::uint64_t maxSize,
                     std::string* contents) {
    return SectionContents(MemorySource(file), name, maxSize, contents);
}

}  // namespace plat::elf
