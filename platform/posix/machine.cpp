// The machine root of the emulated Windows machine: where it is, and creating its pieces.
#include "platform/machine.h"

#include <dirent.h>
#include <strings.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <mutex>
#include <vector>

#include "platform/errors.h"

namespace plat::paths::detail {
// Defined beside the current directory (paths.cpp); a new machine starts at C:\ .
void ResetCurrentDirectory();
// The entry of a host folder named name without regard to ASCII case; empty when none.
std::string ChildOfFolder(const std::string& dir, const std::string& name);
}  // namespace plat::paths::detail

namespace plat::machine {

namespace {

std::mutex& Lock() {
    static std::mutex m;
    return m;
}
std::string& ChosenRoot() {
    static std::string root;
    return root;
}
std::vector<void (*)()>& Callbacks() {
    static std::vector<void (*)()> callbacks;
    return callbacks;
}

std::string Env(const char* name) {
    const char* v = std::getenv(name);
    return v ? std::string(v) : std::string();
}

std::string DefaultRoot() {
    std::string pex = Env("PEX_MACHINE");
    if (!pex.empty()) return pex;
    std::string data = Env("XDG_DATA_HOME");
    if (data.empty()) data = Env("HOME") + "/.local/share";
    return data + "/pex/machine";
}

std::string Absolute(const std::string& dir) {
    std::error_code ec;
    std::string abs = std::filesystem::absolute(dir, ec).lexically_normal().string();
    if (ec) abs = dir;
    while (abs.size() > 1 && abs.back() == '/') abs.pop_back();
    return abs;
}

bool Fail(int err) {
    SetLastErrorCode(ErrorFromErrno(err));
    return false;
}

bool MakeDir(const std::string& path) {
    if (mkdir(path.c_str(), 0777) == 0 || errno == EEXIST) return true;
    return Fail(errno);
}

// The entry of dir named name without regard to ASCII case, else name itself: an adopted
// drive_c may spell its folders "Windows" or "SYSTEM32".
std::string ChildNoCase(const std::string& dir, const std::string& name) {
    const std::string found = paths::detail::ChildOfFolder(dir, name);
    return found.empty() ? name : found;
}

bool MakeLinkIfMissing(const std::string& link, const char* target) {
    struct stat st;
    if (lstat(link.c_str(), &st) == 0) return true;
    if (symlink(target, link.c_str()) == 0 || errno == EEXIST) return true;
    return Fail(errno);
}

}  // namespace

std::string Root() {
    std::lock_guard<std::mutex> hold(Lock());
    if (ChosenRoot().empty()) return Absolute(DefaultRoot());
    return ChosenRoot();
}

void SetRoot(const std::string& hostDir) {
    std::vector<void (*)()> callbacks;
    {
        std::lock_guard<std::mutex> hold(Lock());
        callbacks = Callbacks();
    }
    // The callbacks run unlocked and before the switch, so they may still ask for the old root.
    for (auto callback : callbacks) callback();
    {
        std::lock_guard<std::mutex> hold(Lock());
        ChosenRoot() = Absolute(hostDir);
    }
    paths::detail::ResetCurrentDirectory();
}

void OnRootChange(void (*callback)()) {
    std::lock_guard<std::mutex> hold(Lock());
    auto& all = Callbacks();
    if (callback && std::find(all.begin(), all.end(), callback) == all.end()) all.push_back(callback);
}

bool Ensure() {
    const std::string root = Root();
    std::error_code ec;
    std::filesystem::create_directories(root, ec);
    if (ec) return Fail(ec.value());
    const std::string driveC = root + "/drive_c";
    const std::string devices = root + "/dosdevices";
    if (!MakeDir(driveC) || !MakeDir(devices)) return false;
    if (!MakeLinkIfMissing(devices + "/c:", "../drive_c")) return false;
    if (!MakeLinkIfMissing(devices + "/z:", "/")) return false;
    const std::string windows = driveC + "/" + ChildNoCase(driveC, "windows");
    if (!MakeDir(windows)) return false;
    for (const char* sub : {"system32", "temp"}) {
        if (!MakeDir(windows + "/" + ChildNoCase(windows, sub))) return false;
    }
    return true;
}

}  // namespace plat::machine
