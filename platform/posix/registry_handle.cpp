// Key handles of the emulated registry and the walk from a handle to a key row.
#include "platform/posix/registry_handle.h"

#include <cstring>

#include "platform/errors.h"
#include "platform/posix/registry_db.h"

namespace plat::reg {

namespace {
KeyTag gLocalMachine{detail::kLocalMachineRow, kKeyAllAccess, 0, true};
KeyTag gCurrentUser{detail::kCurrentUserRow, kKeyAllAccess, 0, true};
KeyTag gClassesRoot{0, kKeyAllAccess, 0, true};
}  // namespace

const HKey kLocalMachine = &gLocalMachine;
const HKey kCurrentUser = &gCurrentUser;
const HKey kClassesRoot = &gClassesRoot;

namespace detail {

std::string Fold(const std::string& name) {
    std::string folded = name;
    for (char& c : folded)
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    return folded;
}

namespace {

// Empty components (a trailing backslash, doubled separators) name nothing.
void AppendPath(const std::string& path, std::vector<std::string>* names) {
    size_t start = 0;
    while (start <= path.size()) {
        size_t end = path.find('\\', start);
        if (end == std::string::npos) end = path.size();
        if (end > start) names->push_back(path.substr(start, end - start));
        start = end + 1;
    }
}

}  // namespace

long Target(HKey key, std::uint32_t need, const std::string& subKey, std::int64_t* from,
            std::vector<std::string>* names) {
    if (!key || (!key->predefined && key->generation != db::Generation()))
        return kErrorInvalidHandle;
    if ((key->access & need) != need) return kErrorAccessDenied;
    if (long rc = db::Open()) return rc;
    names->clear();
    *from = key->row;
    if (key == kClassesRoot) {
        *from = kLocalMachineRow;
        names->push_back("SOFTWARE");
        names->push_back("Classes");
    }
    AppendPath(subKey, names);
    return 0;
}

long Walk(std::int64_t from, const std::vector<std::string>& names, std::int64_t* row) {
    *row = from;
    for (const std::string& name : names) {
        db::Statement st = db::Prepare("SELECT id FROM keys WHERE parent = ?1 AND fold = ?2");
        st.Bind(1, *row).Bind(2, Fold(name));
        int rc = st.Step();
        if (rc == SQLITE_DONE) return kErrorFileNotFound;
        if (rc != SQLITE_ROW) return db::ErrorFor(rc);
        *row = st.Int(0);
    }
    return 0;
}

long Existing(HKey key, std::uint32_t need, std::int64_t* row) {
    std::int64_t from = 0;
    std::vector<std::string> names;
    if (long rc = Target(key, need, std::string(), &from, &names)) return rc;
    return Walk(from, names, row);
}

HKey NewHandle(std::int64_t row, std::uint32_t access) {
    return new KeyTag{row, access, db::Generation(), false};
}

long NextName(db::Statement& st, char* name, std::uint32_t* nameSize) {
    const int rc = st.Step();
    if (rc == SQLITE_DONE) return kErrorNoMoreItems;
    if (rc != SQLITE_ROW) return db::ErrorFor(rc);
    const std::string found = st.Bytes(0);
    if (!name || *nameSize < found.size() + 1) return kErrorMoreData;
    std::memcpy(name, found.c_str(), found.size() + 1);
    *nameSize = static_cast<std::uint32_t>(found.size());
    return 0;
}

long Done(long code) {
    SetLastErrorCode(static_cast<std::uint32_t>(code));
    return code;
}

}  // namespace detail
}  // namespace plat::reg
