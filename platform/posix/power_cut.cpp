// The durable state of the emulated drive C (rules in platform/power_cut.h). Files are known by
// inode: a folder's durable names map to inodes, an inode has durable bytes. Every inode seen is
// held open, so that its number is never given to another file while the state is kept.
#include "platform/power_cut.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <map>
#include <mutex>
#include <random>
#include <vector>

#include "platform/machine.h"

namespace plat::power {

namespace {

struct Entry {
    ino_t ino = 0;
    bool folder = false;
};
using Listing = std::map<std::string, Entry>;

struct Content {
    std::string bytes;
    mode_t mode = 0644;
    struct timespec times[2] = {};
};

struct State {
    std::mutex lock;
    bool active = false;
    std::string drive;                  // <root>/drive_c
    std::map<ino_t, Listing> listings;  // durable names of each folder
    std::map<ino_t, Content> contents;  // durable bytes of each file
    std::map<ino_t, int> held;          // an open descriptor of every inode seen
};

State& TheState() {
    static State state;
    return state;
}

bool ReadFully(int fd, std::string* bytes) {
    bytes->clear();
    char buffer[1 << 16];
    for (off_t at = 0;;) {
        const ssize_t n = pread(fd, buffer, sizeof buffer, at);
        if (n < 0) return false;
        if (n == 0) return true;
        bytes->append(buffer, static_cast<std::size_t>(n));
        at += n;
    }
}

// Holds the inode that host names open, once.
void Hold(State& state, ino_t ino, const std::string& host) {
    if (state.held.count(ino)) return;
    const int fd = open(host.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (fd >= 0) state.held[ino] = fd;
}

// The content of an open file as it is now.
bool CurrentContent(int fd, Content* content) {
    struct stat st;
    if (fstat(fd, &st) != 0 || !ReadFully(fd, &content->bytes)) return false;
    content->mode = st.st_mode & 07777;
    content->times[0] = st.st_atim;
    content->times[1] = st.st_mtim;
    return true;
}

// The names in a folder as they are now; links and special files are not modelled.
Listing CurrentListing(State& state, const std::string& host) {
    Listing listing;
    DIR* dir = opendir(host.c_str());
    if (!dir) return listing;
    while (dirent* e = readdir(dir)) {
        const std::string name = e->d_name;
        struct stat st;
        if (name == "." || name == ".." || lstat((host + "/" + name).c_str(), &st) != 0) continue;
        if (!S_ISDIR(st.st_mode) && !S_ISREG(st.st_mode)) continue;
        listing[name] = Entry{st.st_ino, S_ISDIR(st.st_mode)};
        Hold(state, st.st_ino, host + "/" + name);
    }
    closedir(dir);
    return listing;
}

// Records a folder and everything below it as durable.
void RecordTree(State& state, const std::string& host, ino_t ino) {
    const Listing listing = CurrentListing(state, host);
    state.listings[ino] = listing;
    for (const auto& [name, entry] : listing) {
        const std::string path = host + "/" + name;
        if (entry.folder) {
            RecordTree(state, path, entry.ino);
        } else if (state.held.count(entry.ino)) {
            CurrentContent(state.held[entry.ino], &state.contents[entry.ino]);
        }
    }
}

// Builds what survives into the folder out: durable state, or with rng a random mix of it and
// the live state at the same names (live: the host folder now there, or empty).
class Survivor {
public:
    Survivor(State& state, unsigned seed) : state_(state), rng_(seed), random_(seed != 0) {}

    void Folder(ino_t ino, const std::string& live, const std::string& out) {
        mkdir(out.c_str(), 0777);
        Listing listing = state_.listings[ino];
        struct stat st;
        if (random_ && !live.empty() && stat(live.c_str(), &st) == 0 && st.st_ino == ino) {
            Listing now = CurrentListing(state_, live);
            if (Coin()) listing = now;
        }
        for (const auto& [name, entry] : listing) {
            const std::string from = live.empty() ? live : live + "/" + name;
            if (entry.folder) Folder(entry.ino, from, out + "/" + name);
            else File(entry.ino, out + "/" + name);
        }
    }

private:
    bool Coin() { return (rng_() & 1u) != 0; }

    void File(ino_t ino, const std::string& out) {
        auto made = made_.find(ino);
        if (made != made_.end() && link(made->second.c_str(), out.c_str()) == 0) return;
        made_[ino] = out;
        Content content = state_.contents[ino];  // a file never flushed is empty
        Content now;
        auto held = state_.held.find(ino);
        if (random_ && held != state_.held.end() && CurrentContent(held->second, &now) && Coin()) content = now;
        const int fd = open(out.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
        if (fd < 0) return;
        if (write(fd, content.bytes.data(), content.bytes.size()) < 0) content.mode = 0;
        fchmod(fd, content.mode);
        futimens(fd, content.times);
        close(fd);
    }

    State& state_;
    std::mt19937 rng_;
    bool random_;
    std::map<ino_t, std::string> made_;  // the first name written for each inode
};

void Forget(State& state) {
    for (const auto& [ino, fd] : state.held) close(fd);
    state.held.clear();
    state.listings.clear();
    state.contents.clear();
    state.active = false;
}

}  // namespace

void Start() {
    State& state = TheState();
    std::lock_guard<std::mutex> hold(state.lock);
    Forget(state);
    state.drive = machine::Root() + "/drive_c";
    struct stat st;
    if (stat(state.drive.c_str(), &st) != 0) return;
    RecordTree(state, state.drive, st.st_ino);
    state.active = true;
}

void Stop() {
    State& state = TheState();
    std::lock_guard<std::mutex> hold(state.lock);
    Forget(state);
}

void Cut(unsigned seed) {
    State& state = TheState();
    std::lock_guard<std::mutex> hold(state.lock);
    if (!state.active) return;
    struct stat st;
    const std::string built = state.drive + ".cut";
    std::error_code ignored;
    std::filesystem::remove_all(built, ignored);
    if (stat(state.drive.c_str(), &st) == 0) Survivor(state, seed).Folder(st.st_ino, state.drive, built);
    std::filesystem::remove_all(state.drive, ignored);
    rename(built.c_str(), state.drive.c_str());
    Forget(state);
}

void FileFlushed(int fd) {
    State& state = TheState();
    std::lock_guard<std::mutex> hold(state.lock);
    struct stat st;
    if (!state.active || fstat(fd, &st) != 0 || !S_ISREG(st.st_mode)) return;
    Hold(state, st.st_ino, "/proc/self/fd/" + std::to_string(fd));
    CurrentContent(state.held.count(st.st_ino) ? state.held[st.st_ino] : fd, &state.contents[st.st_ino]);
}

void FolderFlushed(const std::string& hostFolder) {
    State& state = TheState();
    std::lock_guard<std::mutex> hold(state.lock);
    struct stat st;
    if (!state.active || stat(hostFolder.c_str(), &st) != 0) return;
    state.listings[st.st_ino] = CurrentListing(state, hostFolder);
}

}  // namespace plat::power
