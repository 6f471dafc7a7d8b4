// Paths on Windows: the current directory and full paths are the system's own; a Windows path
// is already a host path.
#include "platform/paths.h"

#include <cctype>
#include <vector>

#include "platform/win32/windows_api.h"

namespace plat::paths {

namespace {

// Windows keeps a drive letter in the case it was given ("c:\x"); the platform always names
// drives in upper case, on every target, so that paths compare as texts.
std::string UpperDrive(std::string path) {
    if (path.size() >= 2 && path[1] == ':') {
        path[0] = static_cast<char>(std::toupper(static_cast<unsigned char>(path[0])));
    }
    return path;
}

}  // namespace

std::string CurrentDirectory() {
    std::vector<char> buffer(MAX_PATH);
    DWORD n = ::GetCurrentDirectoryA(static_cast<DWORD>(buffer.size()), buffer.data());
    if (n >= buffer.size()) {
        buffer.resize(n + 1);
        n = ::GetCurrentDirectoryA(static_cast<DWORD>(buffer.size()), buffer.data());
    }
    return UpperDrive(std::string(buffer.data(), n < buffer.size() ? n : 0));
}

bool ChangeDirectory(const std::string& winPath) {
    return ::SetCurrentDirectoryA(winPath.c_str()) != FALSE;
}

char CurrentDrive() {
    const std::string current = CurrentDirectory();
    return current.empty() ? 'C' : current[0];
}

std::string FullPath(const std::string& winPath) {
    if (winPath.empty()) return std::string();
    std::vector<char> buffer(MAX_PATH);
    DWORD n = ::GetFullPathNameA(winPath.c_str(), static_cast<DWORD>(buffer.size()), buffer.data(), nullptr);
    if (n >= buffer.size()) {
        buffer.resize(n + 1);
        n = ::GetFullPathNameA(winPath.c_str(), static_cast<DWORD>(buffer.size()), buffer.data(), nullptr);
    }
    if (n == 0 || n >= buffer.size()) return std::string();
    return UpperDrive(std::string(buffer.data(), n));
}

std::string ToHost(const std::string& winPath) { return winPath; }

std::string ToWindows(const std::string& hostPath) { return hostPath; }

}  // namespace plat::paths
