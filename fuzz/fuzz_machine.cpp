#include "fuzz/fuzz_machine.h"

#include <stdlib.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

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

}  // namespace

const std::string& UseFreshMachine() {
    std::string& root = RootStore();
    if (!root.empty()) return root;
    std::string tmpl = (fs::temp_directory_path() / "pexfuzz-XXXXXX").string();
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
