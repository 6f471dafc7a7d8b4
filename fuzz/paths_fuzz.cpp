// The path mapper over any texts: paths come from content files, registry values and scripts.
// Checked besides not failing:
// - _makepath undoes _splitpath;
// - a full path is absolute and stays what it is when made full again, and every component of
//   it was a component of the path given or of the current directory (folding only drops);
// - a host path, when there is one, lies inside the machine root (no path leaves the machine).
// First byte: the merge flags of ComposePath; the rest is two paths separated by a NUL (the
// first may also become the current directory).
#include <cstdint>
#include <cstdlib>
#include <set>
#include <string>

#include "fuzz/fuzz_machine.h"
#include "platform/paths.h"

namespace {

void Check(bool condition) {
    if (!condition) std::abort();
}

std::set<std::string> Components(const std::string& path) {
    std::set<std::string> out;
    std::string current;
    for (char c : path + "\\") {
        if (c == '\\' || c == '/') {
            out.insert(current);
            current.clear();
        } else {
            current += c;
        }
    }
    return out;
}

char Upper(char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; }

void CheckFullPath(const std::string& path) {
    const std::string full = plat::paths::FullPath(path);
    if (path.empty()) {
        Check(full.empty());
        return;
    }
    const bool unc = full.compare(0, 2, "\\\\") == 0;
    Check(unc || (full.size() >= 3 && full[1] == ':' && full[2] == '\\'));
    Check(plat::paths::FullPath(full) == full);
    std::set<std::string> known = Components(path);
    known.insert(std::string());  // the root's trailing separator
    const std::set<std::string> current = Components(plat::paths::CurrentDirectory());
    known.insert(current.begin(), current.end());
    std::string drive = path.size() >= 2 && path[1] == ':' ? path.substr(0, 2) : std::string();
    if (!drive.empty()) {
        // "C:x" is x in drive C's current folder: its components start after the colon.
        known.insert(std::string(1, Upper(drive[0])) + ":");
        const std::set<std::string> relative = Components(path.substr(2));
        known.insert(relative.begin(), relative.end());
    }
    for (const std::string& c : Components(full)) Check(known.count(c) > 0);
}

void CheckHostPath(const std::string& root, const std::string& path) {
    const std::string host = plat::paths::ToHost(path);
    Check(host.empty() || host.compare(0, root.size() + 1, root + "/") == 0);
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pexfuzz::UseFreshMachine();
    pexfuzz::PutFile("C:\\Program Files\\Vantric\\App\\a.dll", "x");
    pexfuzz::PutFile("Z:\\Shared\\b.txt", "x");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::string& root = pexfuzz::UseFreshMachine();
    const unsigned char flags = data[0];
    const std::string rest(reinterpret_cast<const char*>(data) + 1, size - 1);
    const std::size_t cut = rest.find('\0');
    const std::string first = rest.substr(0, cut);
    const std::string second = cut == std::string::npos ? std::string() : rest.substr(cut + 1);

    for (const std::string* p : {&first, &second}) {
        Check(plat::paths::MakePath(plat::paths::SplitPath(*p)) == *p);
    }
    plat::paths::ComposePath(first, second, flags);
    plat::paths::AddSeparator(first);

    // The current directory is part of every relative path's meaning: sometimes a folder of
    // the machine, sometimes the one the input names (when it exists).
    plat::paths::ChangeDirectory((flags & 1) ? "C:\\Program Files\\Vantric" : "C:\\");
    if (flags & 2) plat::paths::ChangeDirectory(second);
    CheckFullPath(first);
    CheckHostPath(root, first);
    CheckHostPath(root, second);
    return 0;
}
