#include "fuzz/fuzz_machine.h"

#include <signal.h>
#include <stdlib.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "platform/machine.h"
#include "platform/paths.h"

namespace fs = std::filesystem;

namespace pexfuzz {

namespace {

std::string& RootStore() {
    static std::string root;
    return root;
}

void RemoveRoot() {
    std::error_code ec;
    fs::remove_all(RootStore(), ec);
}

// libFuzzer ends a process that found something without running its exit handlers, so roots
// are named after their process and the roots of processes that are gone are removed by the
// next one.
void RemoveRootsOfEndedProcesses(const fs::path& folder) {
    std::error_code ec;
    for (const fs::directory_entry& entry : fs::directory_iterator(folder, ec)) {
        const std::string name = entry.path().filename().string();
        if (name.rfind("pexfuzz-", 0) != 0) continue;
        char* end = nullptr;
        const long pid = std::strtol(name.c_str() + 8, &end, 10);
        if (pid <= 0 || *end != '-') continue;
        if (kill(static_cast<pid_t>(pid), 0) != 0 && errno == ESRCH) {
            fs::remove_all(entry.path(), ec);
        }
    }
}

}  // namespace

const std::string& UseFreshMachine() {
    std::string& root = RootStore();
    if (!root.empty()) return root;
    RemoveRootsOfEndedProcesses(fs::temp_directory_path());
    const std::string name = "pexfuzz-" + std::to_string(getpid()) + "-XXXXXX";
    std::string tmpl = (fs::temp_directory_path() / name).string();
    if (!mkdtemp(tmpl.data())) {
        std::perror("pexfuzz: cannot create a machine root");
        std::abort();
    }
    root = tmpl;
    // The link is made before the platform first looks at the root, so the emulation adopts it
    // instead of pointing Z: at the host's root.
    fs::create_directories(root + "/dosdevices");
    fs::create_directories(root + "/host_z");
    fs::create_symlink("../host_z", root + "/dosdevices/z:");
    plat::machine::SetRoot(root);
    plat::machine::Ensure();
    plat::paths::ChangeDirectory("C:\\");
    std::atexit(RemoveRoot);
    return root;
}

void PutFile(const std::string& winPath, const std::string& bytes) {
    const fs::path host = plat::paths::ToHost(winPath);
    fs::create_directories(host.parent_path());
    std::ofstream(host, std::ios::binary | std::ios::trunc) << bytes;
}

std::string ReadHostFile(const std::string& hostPath) {
    std::ifstream in(hostPath, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

}  // namespace pexfuzz
