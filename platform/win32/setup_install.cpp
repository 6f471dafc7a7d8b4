// Installing a file through SetupInstallFileExA, which copies at once or, for a target in use,
// queues the replacement for the next restart.
#include "platform/setup_install.h"

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/win32/windows_api.h"

#include <setupapi.h>

namespace plat::setup {

bool InstallFile(const std::string& source, const std::string& destination,
                 std::uint32_t copyStyle, bool* inUse) {
    *inUse = false;
    if (!fault::Allow(fault::Op::Copy)) return false;
    // Windows refuses to replace a read-only file; Wine running as root would not.
    const DWORD attributes = ::GetFileAttributesA(destination.c_str());
    if (attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) &&
        !(attributes & FILE_ATTRIBUTE_DIRECTORY)) {
        SetLastErrorCode(kErrorAccessDenied);
        return false;
    }
    BOOL wasInUse = FALSE;
    if (!::SetupInstallFileExA(nullptr, nullptr, source.c_str(), nullptr, destination.c_str(),
                               copyStyle, nullptr, nullptr, &wasInUse)) {
        return false;
    }
    *inUse = wasInUse != FALSE;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

}  // namespace plat::setup
