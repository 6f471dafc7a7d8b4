#include "tests/crash/machine_copies.h"

#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <stdexcept>

#include "platform/machine.h"
#include "platform/reg_file.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;

namespace pextest {

namespace {

std::string CopiesFolder() {
    std::error_code ec;
    if (fs::is_directory("/dev/shm", ec) && access("/dev/shm", W_OK) == 0) return "/dev/shm";
    return fs::temp_directory_path().string();
}

std::string FileEntry(const fs::path& file) {
    struct stat st {};
    if (stat(file.c_str(), &st) != 0) return "(gone)";
    const bool readOnly = (st.st_mode & S_IWUSR) == 0;
    return std::string(readOnly ? "ro " : "rw ") + std::to_string(st.st_mtim.tv_sec) + "." +
           std::to_string(st.st_mtim.tv_nsec) + " " + ReadHostFile(file.string());
}

std::string HiveText(const char* hive) {
    plat::reg::KeyPath path;
    std::string text;
    if (!plat::reg::ParseKeyPath(hive, &path) || plat::reg::ExportRegText(path, &text) != 0)
        return "(unreadable)";
    return text;
}

}  // namespace

MachineCopy::MachineCopy(const std::string& fromRoot) {
    // Closes the registry database, so that everything written is in its main file.
    plat::machine::SetRoot(plat::machine::Root());
    root_ = CopiesFolder() + "/pexcrash-XXXXXX";
    if (!mkdtemp(root_.data())) throw std::runtime_error("cannot create a machine copy");
    fs::copy(fromRoot, root_, fs::copy_options::recursive | fs::copy_options::copy_symlinks);
    plat::machine::SetRoot(root_);
}

MachineCopy::~MachineCopy() {
    std::error_code ec;
    fs::remove_all(root_, ec);
}

MachineSnapshot SnapshotMachine() {
    MachineSnapshot snapshot;
    const std::string root = plat::machine::Root();
    for (const auto& entry : fs::recursive_directory_iterator(root + "/drive_c")) {
        if (!entry.is_regular_file()) continue;
        snapshot["file:" + entry.path().string().substr(root.size())] = FileEntry(entry.path());
    }
    snapshot["reg:HKLM"] = HiveText("HKEY_LOCAL_MACHINE");
    snapshot["reg:HKCU"] = HiveText("HKEY_CURRENT_USER");
    return snapshot;
}

std::string SnapshotDifference(const MachineSnapshot& before, const MachineSnapshot& after) {
    std::string out;
    for (const auto& [key, value] : before) {
        auto it = after.find(key);
        if (it == after.end()) out += "  gone: " + key + "\n";
        else if (it->second != value) out += "  changed: " + key + "\n";
    }
    for (const auto& [key, value] : after) {
        if (!before.count(key)) out += "  new: " + key + "\n";
    }
    return out;
}

}  // namespace pextest
