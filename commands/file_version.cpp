// File versions read from version information, as the snapshot and the scripts show them.
#include <cstdio>

#include "commands/platform_utilities.h"
#include "platform/version_info.h"

bool GetFileVersion(const std::string& path, std::uint32_t* mostSignificant,
                    std::uint32_t* leastSignificant) {
    // The caller's path is held in a buffer of 261 characters, as the system call requires.
    const std::string held = path.substr(0, 260);
    plat::ver::VersionInfo info;
    if (!plat::ver::Read(held, &info) || info.Fixed() == nullptr) return false;
    *mostSignificant = info.Fixed()->fileVersionMS;
    *leastSignificant = info.Fixed()->fileVersionLS;
    return true;
}

bool GetFileVersionText(const std::string& path, std::string* text) {
    std::uint32_t ms = 0, ls = 0;
    text->clear();
    if (!GetFileVersion(path, &ms, &ls)) return false;
    char buffer[48];
    std::snprintf(buffer, sizeof buffer, "%hd.%hd.%hd.%hd", static_cast<short>(ms >> 16),
                  static_cast<short>(ms & 0xFFFF), static_cast<short>(ls >> 16),
                  static_cast<short>(ls & 0xFFFF));
    *text = buffer;
    return true;
}
