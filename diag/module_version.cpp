#include "diag/module_version.h"

#include <cstdio>

#include "commands/platform_utilities.h"

ModuleVersion::ModuleVersion(const std::string& path) {
    if (!GetFileVersion(path, &mostSignificant_, &leastSignificant_))
        mostSignificant_ = leastSignificant_ = 0;
}

const char* ModuleVersion::Text(bool twoDigits) const {
    static char buffer[64];
    std::snprintf(buffer, sizeof buffer, twoDigits ? "Version %02d.%02d.%02d.%02d" : "Version %d.%d.%d.%d",
                  Major(), Minor(), Build(), Revision());
    return buffer;
}
