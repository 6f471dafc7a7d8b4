// PE resources, portable: the DOS header leads to the PE header, whose data directory 2 gives
// the resource tree's RVA; the section table maps RVAs to file offsets. The tree has three
// levels (type, name, language) of IMAGE_RESOURCE_DIRECTORY tables, the last pointing at an
// IMAGE_RESOURCE_DATA_ENTRY whose OffsetToData is again an RVA. Every offset and size is
// checked, since the files read are whatever lies on the disk, and only the pieces named by
// the headers are read.
#include "platform/pe_resources.h"

#include <algorithm>
#include <vector>

namespace plat::pe {

namespace {

struct Section {
    std::uint32_t rva, size, fileOffset, fileSize;
};

// Little-endian fields of bytes already read; the caller has read enough of them.
std::uint32_t U16(const std::string& b, std::size_t at) {
    return static_cast<unsigned char>(b[at]) | (static_cast<unsigned char>(b[at + 1]) << 8);
}
std::uint32_t U32(const std::string& b, std::size_t at) { return U16(b, at) | (U16(b, at + 2) << 16); }

constexpr std::uint32_t kPeSignature = 0x00004550;  // "PE\0\0"
constexpr std::uint32_t kMagicPe32 = 0x10B, kMagicPe32Plus = 0x20B;
constexpr std::uint32_t kResourceDirectory = 2;
constexpr std::uint32_t kSubdirectoryBit = 0x80000000u;
constexpr std::size_t kSectionHeaderSize = 40;

// The resource directory's RVA from the optional header; 0 when it has none.
bool ResourceRva(const std::string& opt, std::uint32_t* resourceRva) {
    std::uint32_t magic = U16(opt, 0);
    std::size_t dirs = magic == kMagicPe32 ? 96 : magic == kMagicPe32Plus ? 112 : 0;
    if (dirs == 0 || dirs + 4 > opt.size()) return false;
    std::uint32_t dirCount = U32(opt, dirs - 4);
    std::size_t entry = dirs + kResourceDirectory * 8;
    bool hasEntry = dirCount > kResourceDirectory && entry + 8 <= opt.size();
    *resourceRva = hasEntry ? U32(opt, entry) : 0;
    return true;
}

// The resource directory's RVA and the section table; false when the headers are not sound.
bool ReadHeaders(const ByteSource& src, std::uint32_t* resourceRva, std::vector<Section>* sections) {
    std::string dos, head, opt, table;
    if (!src.ReadAt(0, 64, &dos) || U16(dos, 0) != 0x5A4D) return false;
    const std::uint64_t pe = U32(dos, 60);
    if (!src.ReadAt(pe, 24, &head) || U32(head, 0) != kPeSignature) return false;
    const std::uint32_t count = U16(head, 6), optSize = U16(head, 20);
    if (optSize < 2 || !src.ReadAt(pe + 24, optSize, &opt) || !ResourceRva(opt, resourceRva)) return false;
    if (!src.ReadAt(pe + 24 + optSize, count * kSectionHeaderSize, &table)) return false;
    for (std::uint32_t i = 0; i < count; ++i) {
        std::size_t s = i * kSectionHeaderSize;
        sections->push_back({U32(table, s + 12), std::max(U32(table, s + 8), U32(table, s + 16)),
                             U32(table, s + 20), U32(table, s + 16)});
    }
    return true;
}

// The file offset of an RVA and how many bytes of the file follow it in its section.
bool MapRva(const std::vector<Section>& sections, std::uint32_t rva, std::uint64_t* offset,
            std::uint64_t* available) {
    for (const Section& s : sections) {
        if (rva >= s.rva && rva - s.rva < s.size) {
            std::uint32_t delta = rva - s.rva;
            if (delta >= s.fileSize) return false;  // in the section's zero-filled tail
            *offset = static_cast<std::uint64_t>(s.fileOffset) + delta;
            *available = s.fileSize - delta;
            return true;
        }
    }
    return false;
}

// The resource tree: its offsets are relative to its root and stay inside its section.
struct Tree {
    const ByteSource& src;
    std::uint64_t root, available;
    bool Read(std::uint64_t off, std::size_t n, std::string* bytes) const {
        return off <= available && n <= available - off && src.ReadAt(root + off, n, bytes);
    }
};

// The OffsetToData of the first entry of a directory table (at dir); for the type level, the
// entry whose id is wanted. false when there is none.
bool DirectoryEntry(const Tree& tree, std::uint64_t dir, bool matchId, std::uint32_t id,
                    std::uint32_t* target) {
    std::string header, entries;
    if (!tree.Read(dir, 16, &header)) return false;
    std::uint64_t n = U16(header, 12) + U16(header, 14);
    // The entries that lie in the section; a table running past it is read up to its end.
    n = std::min<std::uint64_t>(n, (tree.available - std::min(tree.available, dir + 16)) / 8);
    if (!tree.Read(dir + 16, static_cast<std::size_t>(n * 8), &entries)) return false;
    for (std::size_t e = 0; e < entries.size(); e += 8) {
        std::uint32_t name = U32(entries, e);
        if (matchId && ((name & kSubdirectoryBit) || name != id)) continue;
        *target = U32(entries, e + 4);
        return true;
    }
    return false;
}

// The data entry that the type's first name and first language lead to.
bool DataEntry(const Tree& tree, std::uint32_t type, std::string* entry) {
    // The type and name levels point at further tables (high bit set); the language level
    // points at the data entry.
    std::uint32_t off = 0;
    if (!DirectoryEntry(tree, 0, true, type, &off) || !(off & kSubdirectoryBit)) return false;
    if (!DirectoryEntry(tree, off & ~kSubdirectoryBit, false, 0, &off) || !(off & kSubdirectoryBit))
        return false;
    if (!DirectoryEntry(tree, off & ~kSubdirectoryBit, false, 0, &off) || (off & kSubdirectoryBit))
        return false;
    return tree.Read(off, 16, entry);
}

}  // namespace

bool LooksLikeImage(const std::string& image) {
    return image.size() >= 2 && image[0] == 'M' && image[1] == 'Z';
}

Lookup FirstResourceOfType(const ByteSource& src, std::uint32_t type, std::string* data) {
    std::uint32_t rsrcRva = 0;
    std::vector<Section> sections;
    if (!ReadHeaders(src, &rsrcRva, &sections)) return Lookup::NotImage;
    std::uint64_t root = 0, avail = 0;
    if (rsrcRva == 0 || !MapRva(sections, rsrcRva, &root, &avail)) return Lookup::NoResources;
    std::string entry;
    if (!DataEntry(Tree{src, root, avail}, type, &entry)) return Lookup::NotFound;
    std::uint32_t size = U32(entry, 4);
    std::uint64_t offset = 0;
    // The section table's sizes are only claims: a file cut short ends before its sections do.
    if (size > kMaxResourceSize || !MapRva(sections, U32(entry, 0), &offset, &avail) || size > avail ||
        !src.ReadAt(offset, size, data))
        return Lookup::NotFound;
    return Lookup::Found;
}

Lookup FirstResourceOfType(const std::string& image, std::uint32_t type, std::string* data) {
    return FirstResourceOfType(MemorySource(image), type, data);
}

}  // namespace plat::pe
