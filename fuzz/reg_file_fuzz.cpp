// The .reg importer's parser over any file: `pexupdate reg import` takes files from anywhere, in
// UTF-16, UTF-8 or single-byte text. A file is either read whole or refused with the line at
// fault; a refused file asks for no change at all.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "platform/reg_file.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes(reinterpret_cast<const char*>(data), size);
    std::vector<plat::reg::RegFileEntry> entries;
    plat::reg::RegFileError error;
    if (plat::reg::ParseRegFile(bytes, &entries, &error)) {
        for (const plat::reg::RegFileEntry& e : entries) {
            if (e.line < 1 || e.key.subKey.empty()) std::abort();
        }
    } else if (!entries.empty() || error.line < 1 || error.message.empty()) {
        std::abort();
    }
    return 0;
}
