// The ELF section reader over any file, and the version block it finds through the parser, as
// the library reads the version stamped into one of our modules. Any file may be asked, so the
// section table, the names and every offset may be out of bounds.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "platform/posix/elf_section.h"
#include "platform/version_info.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string file(reinterpret_cast<const char*>(data), size);
    plat::elf::LooksLikeElf(file);
    std::string block;
    if (!plat::elf::SectionContents(file, plat::ver::kElfSection, plat::ver::kMaxBlockSize, &block)) return 0;
    if (block.size() > file.size()) std::abort();
    plat::ver::VersionInfo info;
    info.Parse(block);
    return 0;
}
