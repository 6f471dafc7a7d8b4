// Registry key paths as people write them.
#include "platform/reg_path.h"

namespace plat::reg {

namespace {

struct RootName {
    const char* shortName;
    const char* longName;
    const HKey* root;
};

const RootName kRoots[] = {
    {"HKLM", "HKEY_LOCAL_MACHINE", &kLocalMachine},
    {"HKCU", "HKEY_CURRENT_USER", &kCurrentUser},
    {"HKCR", "HKEY_CLASSES_ROOT", &kClassesRoot},
};

std::string Trimmed(const std::string& path) {
    size_t begin = path.find_first_not_of('\\');
    if (begin == std::string::npos) return std::string();
    size_t end = path.find_last_not_of('\\');
    return path.substr(begin, end - begin + 1);
}

}  // namespace

bool NamesEqual(const std::string& a, const std::string& b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i) {
        char x = a[i], y = b[i];
        if (x >= 'a' && x <= 'z') x = static_cast<char>(x - 'a' + 'A');
        if (y >= 'a' && y <= 'z') y = static_cast<char>(y - 'a' + 'A');
        if (x != y) return false;
    }
    return true;
}

std::string KeyPath::FullName() const {
    return subKey.empty() ? rootName : rootName + "\\" + subKey;
}

KeyPath KeyPath::Child(const std::string& name) const {
    KeyPath child = *this;
    child.subKey = subKey.empty() ? name : subKey + "\\" + name;
    return child;
}

bool ParseKeyPath(const std::string& text, KeyPath* path) {
    size_t cut = text.find('\\');
    std::string head = text.substr(0, cut);
    for (const RootName& r : kRoots) {
        if (!NamesEqual(head, r.shortName) && !NamesEqual(head, r.longName)) continue;
        path->root = *r.root;
        path->rootName = r.longName;
        path->subKey = cut == std::string::npos ? std::string() : Trimmed(text.substr(cut));
        return true;
    }
    return false;
}

}  // namespace plat::reg
