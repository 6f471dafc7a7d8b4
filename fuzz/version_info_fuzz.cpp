// The VS_VERSIONINFO parser over any block: the blocks come from the resources of whatever
// files an update names, so every length field may lie. Whatever parses must answer the
// queries the system makes of it.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "platform/version_info.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string block(reinterpret_cast<const char*>(data), size);
    plat::ver::VersionInfo info;
    if (!info.Parse(block)) {
        if (info.Fixed() != nullptr || !info.Strings().empty() || !info.Translations().empty())
            std::abort();
        return 0;
    }
    if (const plat::ver::FixedFileInfo* fixed = info.Fixed()) {
        if (fixed->signature != plat::ver::kFixedFileInfoSignature) std::abort();
    }
    std::string value;
    for (const plat::ver::VersionInfo::Entry& e : info.Strings()) {
        info.QueryString("\\StringFileInfo\\" + e.table + "\\" + e.name, &value);
    }
    for (const plat::ver::Translation& t : info.Translations()) {
        char table[9];
        std::snprintf(table, sizeof table, "%04X%04X", t.language, t.codePage);
        info.QueryString(std::string("\\StringFileInfo\\") + table + "\\FileVersion", &value);
    }
    return 0;
}
