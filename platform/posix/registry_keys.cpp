// Keys of the emulated registry: open, create, close, delete, enumerate, count.

#include "platform/errors.h"
#include "platform/posix/registry_db.h"
#include "platform/posix/registry_handle.h"
#include "platform/posix/registry_write.h"
#include "platform/registry.h"

namespace plat::reg {

using detail::Done;

namespace {

long InsertKey(std::int64_t parent, const std::string& name, std::int64_t* row) {
    db::Statement st =
        db::Prepare("INSERT INTO keys(parent, name, fold) VALUES(?1, ?2, ?3)");
    st.Bind(1, parent).Bind(2, name).Bind(3, detail::Fold(name));
    if (long rc = db::ErrorFor(st.Step())) return rc;
    *row = db::LastInsertId();
    return 0;
}

// Creates what is missing of names below from, inside the write w; row is the last key.
long CreatePath(std::int64_t from, const std::vector<std::string>& names, db::WriteScope& w,
                std::int64_t* row) {
    *row = from;
    for (const std::string& name : names) {
        std::int64_t next = 0;
        long rc = detail::Walk(*row, {name}, &next);
        if (rc == kErrorFileNotFound) {
            if ((rc = w.Allow()) == 0) rc = InsertKey(*row, name, &next);
        }
        if (rc) return rc;
        *row = next;
    }
    return 0;
}

long CreateLocked(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result,
                  std::uint32_t* disposition) {
    std::int64_t from = 0, row = 0;
    std::vector<std::string> names;
    if (long rc = detail::Target(parent, 0, subKey, &from, &names)) return rc;
    long rc = detail::Walk(from, names, &row);
    std::uint32_t outcome = kOpenedExistingKey;
    if (rc == kErrorFileNotFound) {
        if ((parent->access & kKeyCreateSubKey) == 0) return kErrorAccessDenied;
        db::WriteScope w;
        if ((rc = w.Begin()) == 0 && (rc = CreatePath(from, names, w, &row)) == 0)
            rc = w.Commit();
        outcome = kCreatedNewKey;
    }
    if (rc) return rc;
    *result = detail::NewHandle(row, access);
    if (disposition) *disposition = outcome;
    return 0;
}

// 2 when the key is gone, 5 when it still has subkeys.
long WhyNotDeleted(std::int64_t row) {
    db::Statement st = db::Prepare(
        "SELECT EXISTS(SELECT 1 FROM keys WHERE id = ?1),"
        " EXISTS(SELECT 1 FROM keys WHERE parent = ?1)");
    st.Bind(1, row);
    if (int rc = st.Step(); rc != SQLITE_ROW) return db::ErrorFor(rc);
    if (!st.Int(0)) return kErrorFileNotFound;
    return st.Int(1) ? long{kErrorAccessDenied} : 0;
}

long DeleteLocked(HKey parent, const std::string& subKey) {
    std::int64_t from = 0, row = 0;
    std::vector<std::string> names;
    if (long rc = detail::Target(parent, 0, subKey, &from, &names)) return rc;
    if (parent->predefined && names.empty()) return kErrorAccessDenied;  // a hive stays
    if (long rc = detail::Walk(from, names, &row)) return rc;
    if (row == detail::kLocalMachineRow || row == detail::kCurrentUserRow)
        return kErrorAccessDenied;
    if (long rc = WhyNotDeleted(row)) return rc;
    db::WriteScope w;
    if (long rc = w.Begin()) return rc;
    if (long rc = w.Allow()) return rc;
    // The condition is repeated in the statement: another process may have added a subkey.
    db::Statement st = db::Prepare(
        "DELETE FROM keys WHERE id = ?1 AND NOT EXISTS(SELECT 1 FROM keys WHERE parent = ?1)");
    st.Bind(1, row);
    if (long rc = db::ErrorFor(st.Step())) return rc;
    if (db::Changes() == 0) return WhyNotDeleted(row);
    return w.Commit();
}

long EnumLocked(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize) {
    if (!nameSize) return kErrorInvalidParameter;
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeyEnumerateSubKeys, &row)) return rc;
    db::Statement st =
        db::Prepare("SELECT name FROM keys WHERE parent = ?1 ORDER BY fold LIMIT 1 OFFSET ?2");
    st.Bind(1, row).Bind(2, static_cast<std::int64_t>(index));
    return detail::NextName(st, name, nameSize);
}

long InfoLocked(HKey key, std::uint32_t* subKeys, std::uint32_t* values) {
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeyQueryValue, &row)) return rc;
    db::Statement st = db::Prepare(
        "SELECT EXISTS(SELECT 1 FROM keys WHERE id = ?1),"
        " (SELECT COUNT(*) FROM keys WHERE parent = ?1),"
        " (SELECT COUNT(*) FROM vals WHERE key_id = ?1)");
    st.Bind(1, row);
    if (int rc = st.Step(); rc != SQLITE_ROW) return db::ErrorFor(rc);
    if (!st.Int(0)) return db::kErrorKeyDeleted;
    if (subKeys) *subKeys = static_cast<std::uint32_t>(st.Int(1));
    if (values) *values = static_cast<std::uint32_t>(st.Int(2));
    return 0;
}

}  // namespace

long OpenKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result) {
    auto lock = db::Lock();
    if (!result) return Done(kErrorInvalidParameter);
    *result = nullptr;
    std::int64_t row = 0;
    std::int64_t from = 0;
    std::vector<std::string> names;
    long rc = detail::Target(parent, 0, subKey, &from, &names);
    if (rc == 0) rc = detail::Walk(from, names, &row);
    if (rc == 0) *result = detail::NewHandle(row, access);
    return Done(rc);
}

long CreateKey(HKey parent, const std::string& subKey, std::uint32_t access, HKey* result,
               std::uint32_t* disposition) {
    auto lock = db::Lock();
    if (!result) return Done(kErrorInvalidParameter);
    *result = nullptr;
    return Done(CreateLocked(parent, subKey, access, result, disposition));
}

long CloseKey(HKey key) {
    if (!key) return Done(kErrorInvalidHandle);
    if (!key->predefined) delete key;
    return Done(0);
}

long DeleteKey(HKey parent, const std::string& subKey) {
    auto lock = db::Lock();
    return Done(DeleteLocked(parent, subKey));
}

long EnumKey(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize) {
    auto lock = db::Lock();
    return Done(EnumLocked(key, index, name, nameSize));
}

long QueryInfoKey(HKey key, std::uint32_t* subKeys, std::uint32_t* values) {
    auto lock = db::Lock();
    return Done(InfoLocked(key, subKeys, values));
}

}  // namespace plat::reg
