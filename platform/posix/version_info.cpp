// Version information of files on the host: a PE file's RT_VERSION resource (Windows binaries
// being updated) or the ".pexver" section stamped into our own ELF modules and programs. Only
// regular files are read, and of them only the headers and the part that holds the block, so a
// device, a pipe or a file of many gigabytes costs no more than a module.
#include "platform/version_info.h"

#include <algorithm>

#include "platform/errors.h"
#include "platform/library.h"
#include "platform/pe_resources.h"
#include "platform/posix/elf_section.h"
#include "platform/regular_file.h"

namespace plat::ver {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

bool FromImage(const ByteSource& file, std::string* block) {
    switch (pe::FirstResourceOfType(file, pe::kRtVersion, block)) {
        case pe::Lookup::Found:
            return true;
        case pe::Lookup::NotFound:
            return Fail(kErrorResourceTypeNotFound);
        default:
            return Fail(kErrorResourceDataNotFound);
    }
}

}  // namespace

// A bare file name is found by the library search, as GetFileVersionInfo does.
std::string Located(const std::string& winPath) {
    if (winPath.find_first_of("\\/:") != std::string::npos) return winPath;
    const std::string found = lib::SearchFile(winPath);
    return found.empty() ? winPath : found;
}

bool ReadBlock(const std::string& winPath, std::string* block) {
    files::RegularFile file;
    if (!file.Open(Located(winPath))) {
        // Anything but a regular file holds no version information.
        return LastError() == kErrorAccessDenied ? Fail(kErrorResourceDataNotFound) : false;
    }
    std::string start;
    file.ReadAt(0, static_cast<std::size_t>(std::min<std::uint64_t>(file.Size(), 4)), &start);
    bool found;
    if (pe::LooksLikeImage(start)) {
        found = FromImage(file, block);
    } else if (elf::LooksLikeElf(start)) {
        found = elf::SectionContents(file, kElfSection, kMaxBlockSize, block) ||
                Fail(kErrorResourceTypeNotFound);
    } else {
        found = Fail(kErrorResourceDataNotFound);
    }
    if (found) SetLastErrorCode(kErrorSuccess);
    return found;
}

}  // namespace plat::ver
