// The sandbox of the tests on a real Windows machine (see machine_sandbox.h).
#ifdef _WIN32
#include "tests/support/machine_sandbox.h"

#include <cctype>
#include <fstream>
#include <set>
#include <string>
#include <vector>

#include "platform/fault.h"
#include "platform/files.h"
#include "platform/registry.h"
#include "platform/setup_install.h"

namespace pextest::sandbox {

namespace {

using Baseline = std::set<std::string>;

const char* const kBaselineFile = "C:\\windows\\pex-test-baseline.txt";

struct WatchedKey {
    const char* label;
    plat::reg::HKey root;
    const char* path;
};
const WatchedKey kWatchedKeys[] = {
    {"HKLM", plat::reg::kLocalMachine, ""},
    {"HKLM", plat::reg::kLocalMachine, "Software"},
    {"HKLM", plat::reg::kLocalMachine, "Software\\Classes"},
    {"HKLM", plat::reg::kLocalMachine, "Software\\Classes\\CLSID"},
    {"HKCU", plat::reg::kCurrentUser, ""},
    {"HKCU", plat::reg::kCurrentUser, "Software"},
    {"HKCU", plat::reg::kCurrentUser, "Software\\Classes"},
};

std::string Lower(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

std::string Join(const std::string& parent, const std::string& name) {
    return parent.empty() ? name : parent + "\\" + name;
}

std::vector<std::string> WatchedFolders() {
    std::string temp = plat::files::TempFolder();
    temp.pop_back();
    return {"C:", "C:\\Program Files", "C:\\windows\\temp", "C:\\windows\\system32", temp};
}

std::vector<std::string> FolderEntries(const std::string& folder) {
    std::vector<std::string> out;
    for (const auto& e : plat::files::Find(folder + "\\*")) out.push_back(Join(folder, e.name));
    return out;
}

std::vector<std::string> SubKeys(plat::reg::HKey root, const std::string& path) {
    std::vector<std::string> out;
    plat::reg::Key key;
    if (plat::reg::OpenKey(root, path, plat::reg::kKeyRead, key.out()) != 0) return out;
    char name[256];
    for (std::uint32_t i = 0;; ++i) {
        std::uint32_t size = sizeof name;
        if (plat::reg::EnumKey(key.get(), i, name, &size) != 0) break;
        out.push_back(Join(path, name));
    }
    return out;
}

Baseline Take() {
    Baseline b;
    for (const std::string& folder : WatchedFolders())
        for (const std::string& entry : FolderEntries(folder)) b.insert(Lower(entry));
    for (const WatchedKey& w : kWatchedKeys)
        for (const std::string& key : SubKeys(w.root, w.path)) b.insert(Lower(Join(w.label, key)));
    return b;
}

// The run's baseline: read from its file, or taken now and stored there.
const Baseline& RunBaseline() {
    static const Baseline baseline = [] {
        Baseline b;
        std::ifstream in(kBaselineFile);
        for (std::string line; std::getline(in, line);) b.insert(line);
        if (!b.empty()) return b;
        b = Take();
        std::ofstream out(kBaselineFile);
        for (const std::string& entry : b) out << entry << '\n';
        return b;
    }();
    return baseline;
}

void RemoveTree(const std::string& path) {
    const std::uint32_t attributes = plat::files::GetAttributes(path);
    if (attributes == plat::files::kInvalidAttributes) return;
    if (attributes & plat::files::kAttrDirectory) {
        for (const std::string& entry : FolderEntries(path)) RemoveTree(entry);
        plat::files::RemoveDirectory(path);
        return;
    }
    plat::files::SetAttributes(path, plat::files::kAttrNormal);
    plat::files::Remove(path);
}

void RemoveKeyTree(plat::reg::HKey root, const std::string& path) {
    for (const std::string& sub : SubKeys(root, path)) RemoveKeyTree(root, sub);
    plat::reg::DeleteKey(root, path);
}

}  // namespace

void Restore() {
    plat::fault::Clear();
    const Baseline& baseline = RunBaseline();
    for (const std::string& folder : WatchedFolders())
        for (const std::string& entry : FolderEntries(folder))
            if (!baseline.count(Lower(entry))) RemoveTree(entry);
    for (const WatchedKey& w : kWatchedKeys)
        for (const std::string& key : SubKeys(w.root, w.path))
            if (!baseline.count(Lower(Join(w.label, key)))) RemoveKeyTree(w.root, key);
    plat::setup::WritePendingRenames({});
}

}  // namespace pextest::sandbox
#endif
