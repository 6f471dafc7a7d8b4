// On Windows the machine is the real one: there is no root to choose or to create, so these
// calls only report it.
#include "platform/machine.h"

#include "platform/win32/windows_api.h"

namespace plat::machine {

// The root of the drive that holds Windows, e.g. "C:\".
std::string Root() {
    char buffer[MAX_PATH];
    const UINT n = ::GetSystemWindowsDirectoryA(buffer, MAX_PATH);
    if (n < 3 || n >= MAX_PATH) return "C:\\";
    return std::string(buffer, 2) + "\\";
}

void SetRoot(const std::string&) {}

bool Ensure() { return true; }

// No root ever changes, so there is nothing to call back.
void OnRootChange(void (*)()) {}

}  // namespace plat::machine
