#include "tests/crash/machine_copies.h"

#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <map>
#include <stdexcept>

#include "platform/digest.h"
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
    const std::string bytes = ReadHostFile(file.string());
    plat::digest::Sha256 sha;
    std::string digest;
    if (!sha.Update(bytes.data(), bytes.size()) || !sha.Finish(&digest)) return "(no digest)";
    return std::string(readOnly ? "ro " : "rw ") + std::to_string(st.st_mtim.tv_sec) + "." +
           std::to_string(st.st_mtim.tv_nsec) + " " + digest;
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

std::string SnapshotMachine() {
    std::map<std::string, std::string> files;  // in name order, whatever order the folder lists
    const std::string root = plat::machine::Root();
    for (const auto& entry : fs::recursive_directory_iterator(root + "/drive_c")) {
        if (entry.is_regular_file()) files[entry.path().string().substr(root.size())] = FileEntry(entry.path());
    }
    std::string text;
    for (const auto& [path, entry] : files) text += path + " " + entry + "\n";
    return text + HiveText("HKEY_LOCAL_MACHINE") + HiveText("HKEY_CURRENT_USER");
}

}  // namespace pextest
