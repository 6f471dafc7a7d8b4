// Version information of files on the host: a PE file's RT_VERSION resource (Windows binaries
// being updated) or the ".pexver" section stamped into our own ELF modules and programs.
#include "platform/version_info.h"

#include "platform/errors.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/pe_resources.h"
#include "platform/posix/elf_section.h"

namespace plat::ver {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

bool FromImage(const std::string& file, std::string* block) {
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
    std::string file;
    if (!files::ReadAll(Located(winPath), &file)) return false;
    bool found;
    if (pe::LooksLikeImage(file)) {
        found = FromImage(file, block);
    } else if (elf::LooksLikeElf(file)) {
        found = elf::SectionContents(file, kElfSection, block) || Fail(kErrorResourceTypeNotFound);
    } else {
        found = Fail(kErrorResourceDataNotFound);
    }
    if (found) SetLastErrorCode(kErrorSuccess);
    return found;
}

}  // namespace plat::ver
