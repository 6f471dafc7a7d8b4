// PE resources, portable: the DOS header leads to the PE header, whose data directory 2 gives
// the resource tree's RVA; the section table maps RVAs to file offsets. The tree has three
// levels (type, name, language) of IMAGE_RESOURCE_DIRECTORY tables, the last pointing at an
// IMAGE_RESOURCE_DATA_ENTRY whose OffsetToData is again an RVA. Every offset is checked, since
// the files read are whatever lies on the disk.
#include "platform/pe_resources.h"

#include <algorithm>
#include <vector>

namespace plat::pe {

namespace {

struct Section {
    std::uint32_t rva, size, fileOffset, fileSize;
};

class Image {
public:
    explicit Image(const std::string& b) : b_(b) {}
    bool Ok(std::size_t at, std::size_t n) const { return at <= b_.size() && n <= b_.size() - at; }
    std::uint32_t U16(std::size_t at) const {
        return static_cast<unsigned char>(b_[at]) | (static_cast<unsigned char>(b_[at + 1]) << 8);
    }
    std::uint32_t U32(std::size_t at) const { return U16(at) | (U16(at + 2) << 16); }
    const std::string& bytes() const { return b_; }

private:
    const std::string& b_;
};

constexpr std::uint32_t kPeSignature = 0x00004550;  // "PE\0\0"
constexpr std::uint32_t kMagicPe32 = 0x10B, kMagicPe32Plus = 0x20B;
constexpr std::uint32_t kResourceDirectory = 2;
constexpr std::uint32_t kSubdirectoryBit = 0x80000000u;

// The resource directory's RVA and the section table; false when the headers are not sound.
bool ReadHeaders(const Image& im, std::uint32_t* resourceRva, std::vector<Section>* sections) {
    if (!im.Ok(0, 64) || im.U16(0) != 0x5A4D) return false;
    std::size_t pe = im.U32(60);
    if (!im.Ok(pe, 24) || im.U32(pe) != kPeSignature) return false;
    std::uint32_t count = im.U16(pe + 6), optSize = im.U16(pe + 20);
    std::size_t opt = pe + 24;
    if (!im.Ok(opt, optSize) || optSize < 2) return false;
    std::uint32_t magic = im.U16(opt);
    std::size_t dirs = magic == kMagicPe32 ? opt + 96 : magic == kMagicPe32Plus ? opt + 112 : 0;
    if (dirs == 0 || dirs + 4 > opt + optSize) return false;
    std::uint32_t dirCount = im.U32(dirs - 4);
    std::size_t entry = dirs + kResourceDirectory * 8;
    bool hasEntry = dirCount > kResourceDirectory && entry + 8 <= opt + optSize;
    *resourceRva = hasEntry ? im.U32(entry) : 0;
    std::size_t table = opt + optSize;
    if (!im.Ok(table, static_cast<std::size_t>(count) * 40)) return false;
    for (std::uint32_t i = 0; i < count; ++i) {
        std::size_t s = table + i * 40;
        sections->push_back({im.U32(s + 12), std::max(im.U32(s + 8), im.U32(s + 16)), im.U32(s + 20),
                             im.U32(s + 16)});
    }
    return true;
}

// The file offset of an RVA and how many bytes of the file follow it in its section.
bool MapRva(const std::vector<Section>& sections, std::uint32_t rva, std::size_t* offset,
            std::size_t* available) {
    for (const Section& s : sections) {
        if (rva >= s.rva && rva - s.rva < s.size) {
            std::uint32_t delta = rva - s.rva;
            if (delta >= s.fileSize) return false;  // in the section's zero-filled tail
            *offset = static_cast<std::size_t>(s.fileOffset) + delta;
            *available = s.fileSize - delta;
            return true;
        }
    }
    return false;
}

// The OffsetToData of the first entry of a directory table (at dir); for the type level, the
// entry whose id is wanted. false when there is none.
bool DirectoryEntry(const Image& im, std::size_t dir, bool matchId, std::uint32_t id,
                    std::uint32_t* target) {
    if (!im.Ok(dir, 16)) return false;
    std::uint32_t n = im.U16(dir + 12) + im.U16(dir + 14);
    for (std::uint32_t i = 0; i < n; ++i) {
        std::size_t e = dir + 16 + i * 8;
        if (!im.Ok(e, 8)) return false;
        std::uint32_t name = im.U32(e);
        if (matchId && ((name & kSubdirectoryBit) || name != id)) continue;
        *target = im.U32(e + 4);
        return true;
    }
    return false;
}

}  // namespace

bool LooksLikeImage(const std::string& image) {
    return image.size() >= 2 && image[0] == 'M' && image[1] == 'Z';
}

Lookup FirstResourceOfType(const std::string& bytes, std::uint32_t type, std::string* data) {
    Image im(bytes);
    std::uint32_t rsrcRva = 0;
    std::vector<Section> sections;
    if (!ReadHeaders(im, &rsrcRva, &sections)) return Lookup::NotImage;
    std::size_t root, avail;
    if (rsrcRva == 0 || !MapRva(sections, rsrcRva, &root, &avail)) return Lookup::NoResources;
    // Offsets inside the tree are relative to its root. The type and name levels point at
    // further tables (high bit set); the language level points at the data entry.
    std::uint32_t off = 0;
    if (!DirectoryEntry(im, root, true, type, &off) || !(off & kSubdirectoryBit)) return Lookup::NotFound;
    if (!DirectoryEntry(im, root + (off & ~kSubdirectoryBit), false, 0, &off) || !(off & kSubdirectoryBit))
        return Lookup::NotFound;
    if (!DirectoryEntry(im, root + (off & ~kSubdirectoryBit), false, 0, &off) || (off & kSubdirectoryBit))
        return Lookup::NotFound;
    std::size_t entry = root + off;
    if (!im.Ok(entry, 16)) return Lookup::NotFound;
    std::uint32_t size = im.U32(entry + 4);
    std::size_t offset;
    // The section table's sizes are only claims: a file cut short ends before its sections do.
    if (!MapRva(sections, im.U32(entry), &offset, &avail) || size > avail || !im.Ok(offset, size))
        return Lookup::NotFound;
    *data = bytes.substr(offset, size);
    return Lookup::Found;
}

}  // namespace plat::pe
