// Values of the emulated registry: query, set, delete, enumerate. Data is kept as the bytes
// given, in the order the values were created.
#include <cstring>

#include "platform/errors.h"
#include "platform/posix/registry_db.h"
#include "platform/posix/registry_handle.h"
#include "platform/posix/registry_write.h"
#include "platform/registry.h"

namespace plat::reg {

using detail::Done;

namespace {

// Hands out type and data as RegQueryValueEx does: with no buffer only the size; a buffer too
// small gets 234 and the size needed.
long Deliver(std::int64_t storedType, const std::string& bytes, std::uint32_t* type,
             std::uint8_t* data, std::uint32_t* size) {
    if (type) *type = static_cast<std::uint32_t>(storedType);
    if (!size) return 0;
    auto needed = static_cast<std::uint32_t>(bytes.size());
    if (data && *size < needed) {
        *size = needed;
        return kErrorMoreData;
    }
    if (data && needed) std::memcpy(data, bytes.data(), needed);
    *size = needed;
    return 0;
}

// The value name of key row, with type and data when wanted; 2 when it is missing.
long Find(std::int64_t row, const std::string& name, std::uint32_t* type, std::uint8_t* data,
          std::uint32_t* size) {
    db::Statement st = db::Prepare("SELECT type, data FROM vals WHERE key_id = ?1 AND fold = ?2");
    st.Bind(1, row).Bind(2, detail::Fold(name));
    int rc = st.Step();
    if (rc == SQLITE_DONE) return kErrorFileNotFound;
    if (rc != SQLITE_ROW) return db::ErrorFor(rc);
    return Deliver(st.Int(0), st.Bytes(1), type, data, size);
}

long QueryLocked(HKey key, const std::string& name, std::uint32_t* type, std::uint8_t* data,
                 std::uint32_t* size) {
    if (data && !size) return kErrorInvalidParameter;
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeyQueryValue, &row)) return rc;
    return Find(row, name, type, data, size);
}

// Replaces the data of an existing value in place, so it keeps its name and position.
long Replace(std::int64_t row, const std::string& name, std::uint32_t type,
             const std::string& bytes, bool* replaced) {
    db::Statement st =
        db::Prepare("UPDATE vals SET type = ?3, data = ?4 WHERE key_id = ?1 AND fold = ?2");
    st.Bind(1, row).Bind(2, detail::Fold(name)).Bind(3, type).Bind(4, bytes);
    if (long rc = db::ErrorFor(st.Step())) return rc;
    *replaced = db::Changes() > 0;
    return 0;
}

long Append(std::int64_t row, const std::string& name, std::uint32_t type,
            const std::string& bytes) {
    db::Statement st = db::Prepare(
        "INSERT INTO vals(key_id, seq, name, fold, type, data)"
        " SELECT ?1, COALESCE(MAX(seq), 0) + 1, ?2, ?3, ?4, ?5 FROM vals WHERE key_id = ?1");
    st.Bind(1, row).Bind(2, name).Bind(3, detail::Fold(name)).Bind(4, type).Bind(5, bytes);
    return db::ErrorFor(st.Step());
}

long SetLocked(HKey key, const std::string& name, std::uint32_t type, const std::uint8_t* data,
               std::uint32_t size) {
    if (!data && size) return kErrorInvalidParameter;
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeySetValue, &row)) return rc;
    std::string bytes(reinterpret_cast<const char*>(data), data ? size : 0);
    db::WriteScope w;
    bool replaced = false;
    if (long rc = w.Begin()) return rc;
    if (long rc = w.Allow()) return rc;
    if (long rc = Replace(row, name, type, bytes, &replaced)) return rc;
    if (!replaced) {
        if (long rc = Append(row, name, type, bytes)) return rc;
    }
    return w.Commit();
}

long DeleteLocked(HKey key, const std::string& name) {
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeySetValue, &row)) return rc;
    if (long rc = Find(row, name, nullptr, nullptr, nullptr)) return rc;
    db::WriteScope w;
    if (long rc = w.Begin()) return rc;
    if (long rc = w.Allow()) return rc;
    db::Statement st = db::Prepare("DELETE FROM vals WHERE key_id = ?1 AND fold = ?2");
    st.Bind(1, row).Bind(2, detail::Fold(name));
    if (long rc = db::ErrorFor(st.Step())) return rc;
    if (db::Changes() == 0) return kErrorFileNotFound;  // another process was first
    return w.Commit();
}

long EnumLocked(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize,
                std::uint32_t* type, std::uint8_t* data, std::uint32_t* dataSize) {
    if (!nameSize || (data && !dataSize)) return kErrorInvalidParameter;
    std::int64_t row = 0;
    if (long rc = detail::Existing(key, kKeyQueryValue, &row)) return rc;
    db::Statement st = db::Prepare(
        "SELECT name, type, data FROM vals WHERE key_id = ?1 ORDER BY seq LIMIT 1 OFFSET ?2");
    st.Bind(1, row).Bind(2, static_cast<std::int64_t>(index));
    if (long rc = detail::NextName(st, name, nameSize)) return rc;
    return Deliver(st.Int(1), st.Bytes(2), type, data, dataSize);
}

}  // namespace

long QueryValue(HKey key, const std::string& name, std::uint32_t* type, std::uint8_t* data,
                std::uint32_t* size) {
    auto lock = db::Lock();
    return Done(QueryLocked(key, name, type, data, size));
}

long SetValue(HKey key, const std::string& name, std::uint32_t type, const std::uint8_t* data,
              std::uint32_t size) {
    auto lock = db::Lock();
    return Done(SetLocked(key, name, type, data, size));
}

long DeleteValue(HKey key, const std::string& name) {
    auto lock = db::Lock();
    return Done(DeleteLocked(key, name));
}

long EnumValue(HKey key, std::uint32_t index, char* name, std::uint32_t* nameSize,
               std::uint32_t* type, std::uint8_t* data, std::uint32_t* dataSize) {
    auto lock = db::Lock();
    return Done(EnumLocked(key, index, name, nameSize, type, data, dataSize));
}

}  // namespace plat::reg
