// The PE resource reader over any file, and the version block it finds through the parser, as
// the library reads the version of a Windows module that an update replaces. Offsets and sizes
// in the headers and the resource tree may point anywhere.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "platform/pe_resources.h"
#include "platform/version_info.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string image(reinterpret_cast<const char*>(data), size);
    plat::pe::LooksLikeImage(image);
    std::string block;
    const plat::pe::Lookup found = plat::pe::FirstResourceOfType(image, plat::pe::kRtVersion, &block);
    if (found != plat::pe::Lookup::Found) return 0;
    if (block.size() > image.size()) std::abort();
    plat::ver::VersionInfo info;
    info.Parse(block);
    return 0;
}
