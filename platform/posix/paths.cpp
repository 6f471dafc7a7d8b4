// The current directory and the mapping between Windows paths and host paths through the
// machine root's dosdevices links.
#include "platform/paths.h"

#include <dirent.h>
#include <strings.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <climits>
#include <filesystem>
#include <mutex>
#include <vector>

#include "platform/errors.h"
#include "platform/machine.h"

namespace plat::paths {

namespace {

namespace fs = std::filesystem;

const char* const kInitialDirectory = "C:\\";

std::mutex& Lock() {
    static std::mutex m;
    return m;
}
std::string& Current() {
    static std::string current = kInitialDirectory;
    return current;
}

bool HasDrive(const std::string& p) {
    return p.size() >= 2 && p[1] == ':' && std::isalpha(static_cast<unsigned char>(p[0]));
}

std::vector<std::string> SplitComponents(const std::string& text) {
    std::vector<std::string> out;
    std::size_t start = 0;
    while (start <= text.size()) {
        std::size_t end = text.find('\\', start);
        if (end == std::string::npos) end = text.size();
        if (end > start) out.push_back(text.substr(start, end - start));
        start = end + 1;
    }
    return out;
}

// Joins prefix (e.g. "C:" or "\\server\share") with the folded components of rest.
std::string Fold(const std::string& prefix, const std::string& rest, bool keepTrailing) {
    std::vector<std::string> kept;
    for (const std::string& c : SplitComponents(rest)) {
        if (c == ".") continue;
        if (c == "..") {
            // As Windows does, ".." at the root stays at the root.
            if (!kept.empty()) kept.pop_back();
            continue;
        }
        kept.push_back(c);
    }
    std::string out = prefix + "\\";
    for (std::size_t i = 0; i < kept.size(); ++i) out += (i ? "\\" : "") + kept[i];
    if (keepTrailing && !kept.empty()) out += '\\';
    return out;
}

// The absolute Windows path of the current directory of a drive. Only the current drive
// remembers a folder; every other drive starts at its root.
std::string DriveDirectory(char letter) {
    std::string cur = CurrentDirectory();
    if (std::toupper(static_cast<unsigned char>(letter)) == cur[0]) return cur;
    return std::string(1, static_cast<char>(std::toupper(static_cast<unsigned char>(letter)))) + ":\\";
}

// The host folder a drive letter stands for, following its dosdevices link; empty when the
// drive is not mapped.
std::string DriveHostFolder(const std::string& root, char letter) {
    const std::string devices = root + "/dosdevices";
    const std::string link = devices + "/" +
        static_cast<char>(std::tolower(static_cast<unsigned char>(letter))) + ":";
    // Every mapped path comes through here (every trace line opens its file anew), so the link
    // is read with one call instead of a status query followed by the read.
    char buffer[PATH_MAX];
    const ssize_t length = readlink(link.c_str(), buffer, sizeof buffer);
    if (length < 0 || static_cast<std::size_t>(length) >= sizeof buffer) {
        struct stat st;
        // A real folder in place of the link serves as the drive itself.
        return stat(link.c_str(), &st) == 0 && S_ISDIR(st.st_mode) ? link : std::string();
    }
    fs::path target(std::string(buffer, static_cast<std::size_t>(length)));
    if (target.is_relative()) target = fs::path(devices) / target;
    std::string host = target.lexically_normal().string();
    while (host.size() > 1 && host.back() == '/') host.pop_back();
    return host;
}

std::string JoinHost(const std::string& dir, const std::string& name) {
    return (dir == "/" ? "" : dir) + "/" + name;
}

// The entry of the host folder dir that is called name, without regard to ASCII case; the
// exact spelling wins when it exists. Empty when there is none.
std::string MatchChild(const std::string& dir, const std::string& name) {
    struct stat st;
    if (lstat(JoinHost(dir, name).c_str(), &st) == 0) return name;
    DIR* d = opendir(dir.c_str());
    if (!d) return std::string();
    std::string found;
    while (dirent* e = readdir(d)) {
        if (strcasecmp(e->d_name, name.c_str()) == 0) {
            found = e->d_name;
            break;
        }
    }
    closedir(d);
    return found;
}

// Missing pieces of a machine are made on its first use.
void EnsureOnce(const std::string& root) {
    static std::mutex m;
    static std::string ensured;
    std::lock_guard<std::mutex> hold(m);
    if (ensured == root) return;
    ensured = root;
    const std::uint32_t saved = LastError();
    machine::Ensure();
    SetLastErrorCode(saved);
}

bool CheckFolder(const std::string& host, std::uint32_t* error) {
    struct stat st;
    if (stat(host.c_str(), &st) == 0) {
        *error = S_ISDIR(st.st_mode) ? kErrorSuccess : kErrorPathNotFound;
        return S_ISDIR(st.st_mode);
    }
    const int err = errno;
    if (err != ENOENT) {
        *error = ErrorFromErrno(err);
        return false;
    }
    const std::string parent = fs::path(host).parent_path().string();
    *error = stat(parent.c_str(), &st) == 0 ? kErrorFileNotFound : kErrorPathNotFound;
    return false;
}

// The drive whose folder holds the canonical host path, and that folder. The deepest drive
// wins; Z: (the host's root) holds everything, even when its link is missing.
char DriveHolding(const std::string& root, const std::string& host, std::string* folderOut) {
    char best = 'Z';
    *folderOut = "/";
    DIR* d = opendir((root + "/dosdevices").c_str());
    while (dirent* e = d ? readdir(d) : nullptr) {
        const std::string name = e->d_name;
        if (name.size() != 2 || name[1] != ':' || !std::isalpha(static_cast<unsigned char>(name[0]))) continue;
        std::error_code ec;
        std::string folder = fs::weakly_canonical(DriveHostFolder(root, name[0]), ec).string();
        if (ec || folder.empty()) continue;
        while (folder.size() > 1 && folder.back() == '/') folder.pop_back();
        const bool inside = host == folder || host.compare(0, folder.size() + 1, folder + "/") == 0;
        if (inside && folder.size() > folderOut->size()) {
            best = static_cast<char>(std::toupper(static_cast<unsigned char>(name[0])));
            *folderOut = folder;
        }
    }
    if (d) closedir(d);
    return best;
}

}  // namespace

namespace detail {
std::string ChildOfFolder(const std::string& dir, const std::string& name) { return MatchChild(dir, name); }

void ResetCurrentDirectory() {
    std::lock_guard<std::mutex> hold(Lock());
    Current() = kInitialDirectory;
}
}  // namespace detail

std::string CurrentDirectory() {
    std::lock_guard<std::mutex> hold(Lock());
    return Current();
}

char CurrentDrive() { return CurrentDirectory()[0]; }

bool ChangeDirectory(const std::string& winPath) {
    const std::string full = FullPath(winPath);
    const std::string host = ToHost(full);
    if (host.empty()) return false;
    std::uint32_t error = kErrorSuccess;
    if (!CheckFolder(host, &error)) {
        SetLastErrorCode(error);
        return false;
    }
    std::string stored = full;
    if (stored.size() > 3 && stored.back() == '\\') stored.pop_back();
    std::lock_guard<std::mutex> hold(Lock());
    Current() = stored;
    return true;
}

std::string FullPath(const std::string& winPath) {
    if (winPath.empty()) return std::string();
    std::string p = winPath;
    for (char& c : p) {
        if (c == '/') c = '\\';
    }
    const bool trailing = p.back() == '\\';
    if (p.rfind("\\\\", 0) == 0) {
        // \\server\share\...: the server and share form the root.
        std::vector<std::string> c = SplitComponents(p);
        if (c.size() < 2) return p;
        const std::string prefix = "\\\\" + c[0] + "\\" + c[1];
        // The rest starts where the share's name ends in p; doubled separators before it make
        // p longer than the prefix, so the prefix's length is no position in p.
        const std::size_t server = p.find_first_not_of('\\');
        const std::size_t share = p.find_first_not_of('\\', p.find('\\', server));
        const std::size_t rest = std::min(p.find('\\', share), p.size());
        return Fold(prefix, p.substr(rest), trailing);
    }
    if (HasDrive(p)) {
        const std::string drive(1, static_cast<char>(std::toupper(static_cast<unsigned char>(p[0]))));
        const std::string rest = p.substr(2);
        if (!rest.empty() && rest[0] == '\\') return Fold(drive + ":", rest, trailing);
        // "C:x" is relative to the current folder of drive C.
        return Fold(drive + ":", DriveDirectory(p[0]).substr(2) + "\\" + rest, trailing);
    }
    const std::string cur = CurrentDirectory();
    if (p[0] == '\\') return Fold(cur.substr(0, 2), p, trailing);
    return Fold(cur.substr(0, 2), cur.substr(2) + "\\" + p, trailing);
}

std::string ToHost(const std::string& winPath) {
    const std::string full = FullPath(winPath);
    if (!HasDrive(full)) {
        SetLastErrorCode(kErrorPathNotFound);
        return std::string();
    }
    const std::string root = machine::Root();
    EnsureOnce(root);
    std::string host = DriveHostFolder(root, full[0]);
    if (host.empty()) {
        SetLastErrorCode(kErrorPathNotFound);
        return std::string();
    }
    const std::vector<std::string> components = SplitComponents(full.substr(2));
    // Most paths name existing files exactly as spelled, and then every component matches
    // itself: one status query of the whole path stands for one per component. A new file in
    // an exactly spelled folder needs only its own name matched.
    std::string exact = host;
    for (const std::string& c : components) exact = JoinHost(exact, c);
    struct stat st;
    if (lstat(exact.c_str(), &st) == 0) return exact;
    if (components.size() > 1) {
        const std::string folder = exact.substr(0, exact.size() - components.back().size() - 1);
        if (stat(folder.c_str(), &st) == 0 && S_ISDIR(st.st_mode)) {
            const std::string name = MatchChild(folder, components.back());
            return JoinHost(folder, name.empty() ? components.back() : name);
        }
    }
    bool matching = true;
    for (const std::string& c : components) {
        std::string name = matching ? MatchChild(host, c) : std::string();
        // Past the first missing component nothing can exist; the rest keeps the given case.
        if (name.empty()) {
            matching = false;
            name = c;
        }
        host = JoinHost(host, name);
    }
    return host;
}

std::string ToWindows(const std::string& hostPath) {
    if (hostPath.empty()) return std::string();
    std::error_code ec;
    fs::path abs = fs::weakly_canonical(fs::absolute(hostPath, ec), ec);
    std::string host = abs.lexically_normal().string();
    while (host.size() > 1 && host.back() == '/') host.pop_back();
    std::string folder;
    const char letter = DriveHolding(machine::Root(), host, &folder);
    std::string rest = host.substr(std::min(host.size(), folder == "/" ? 1 : folder.size() + 1));
    for (char& c : rest) {
        if (c == '/') c = '\\';
    }
    return std::string(1, letter) + ":\\" + rest;
}

}  // namespace plat::paths
