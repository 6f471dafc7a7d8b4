// The registry database of the emulated machine: one SQLite file, <machine root>/registry.db,
// shared by every process that uses the machine (WAL, synchronous=FULL, a busy time-out).
// Internal to the posix registry: callers hold Lock() around every use.
#pragma once
#include <sqlite3.h>

#include <cstdint>
#include <mutex>
#include <string>

namespace plat::reg::db {

// Windows' codes for the failures that only a storage layer has.
constexpr long kErrorIoFailed = 1016;    // ERROR_REGISTRY_IO_FAILED
constexpr long kErrorKeyDeleted = 1018;  // ERROR_KEY_DELETED

// Serialises the threads of this process over the one connection.
std::unique_lock<std::mutex> Lock();

// A statement from the cache, in use: it is reset and unbound when this object goes, so the
// cache can hand it out again. A statement that could not be prepared steps to an error.
class Statement {
public:
    explicit Statement(sqlite3_stmt* stmt) : stmt_(stmt) {}
    Statement(const Statement&) = delete;
    Statement& operator=(const Statement&) = delete;
    ~Statement();
    Statement& Bind(int index, std::int64_t value);
    Statement& Bind(int index, const std::string& bytes);  // bound as a blob
    // SQLITE_ROW, SQLITE_DONE or an error code.
    int Step();
    std::int64_t Int(int column) const;
    std::string Bytes(int column) const;

private:
    sqlite3_stmt* stmt_;
};

// Opens the current machine root's database when it is not open (again after a fork: a
// connection is never used across processes). 0, or the Windows code of the failure.
// A registry that cannot be written is opened read-only; one that does not exist and cannot
// be created reads as an empty registry.
long Open();

// The cached statement for sql, which must be a string literal (the cache keys on its address).
// Only after Open succeeded.
Statement Prepare(const char* sql);

// Runs a statement that returns no rows; 0 or the Windows code.
long Exec(const char* sql);

// 0 when the registry may be written, else 5: the database file (when it exists) and its
// folder must both carry write permission. The mode bits are checked as well as access(),
// because root passes access() on anything. Reopens a read-only connection for writing.
long CheckWritable();

// The Windows code for an SQLite result: 5 read-only, 112 disk full, 1018 for a key that has
// gone (a broken reference), 1016 for the rest.
long ErrorFor(int sqliteResult);

int Changes();
std::int64_t LastInsertId();

// Bumped whenever the machine root changes, which makes the handles of the old root stale.
std::uint64_t Generation();

// Depth of the batches (Transaction objects) open on the connection: writes inside a batch do
// not begin or commit a transaction of their own.
int& BatchDepth();

}  // namespace plat::reg::db
