// The connection to the machine's registry database, its statement cache and its schema.
#include "platform/posix/registry_db.h"

#include <sys/stat.h>
#include <unistd.h>

#include <unordered_map>

#include "platform/errors.h"
#include "platform/machine.h"

namespace plat::reg::db {

namespace {

// Keys are rows under their parent; the two hives are the rows without a parent. `fold` is the
// name with ASCII letters in lower case: names match on it, and subkeys enumerate in its
// byte order ('_' sorts before the letters, as on Windows). Names are blobs because they are
// single-byte texts in the system code page, not UTF-8.
const char* const kSchema =
    "CREATE TABLE IF NOT EXISTS keys("
    " id INTEGER PRIMARY KEY,"
    " parent INTEGER REFERENCES keys(id) ON DELETE CASCADE,"
    " name BLOB NOT NULL, fold BLOB NOT NULL);"
    "CREATE UNIQUE INDEX IF NOT EXISTS keys_child ON keys(parent, fold);"
    "CREATE TABLE IF NOT EXISTS vals("
    " key_id INTEGER NOT NULL REFERENCES keys(id) ON DELETE CASCADE,"
    " seq INTEGER NOT NULL, name BLOB NOT NULL, fold BLOB NOT NULL,"
    " type INTEGER NOT NULL, data BLOB NOT NULL,"
    " PRIMARY KEY(key_id, fold)) WITHOUT ROWID;"
    "CREATE UNIQUE INDEX IF NOT EXISTS vals_order ON vals(key_id, seq);"
    // Every Windows machine has these; HKEY_CLASSES_ROOT is a view of the last one.
    "INSERT INTO keys(id, parent, name, fold) VALUES"
    " (1, NULL, CAST('HKEY_LOCAL_MACHINE' AS BLOB), CAST('hkey_local_machine' AS BLOB)),"
    " (2, NULL, CAST('HKEY_CURRENT_USER' AS BLOB), CAST('hkey_current_user' AS BLOB)),"
    " (3, 1, CAST('SOFTWARE' AS BLOB), CAST('software' AS BLOB)),"
    " (4, 3, CAST('Classes' AS BLOB), CAST('classes' AS BLOB));"
    "PRAGMA user_version = 1;";

struct State {
    sqlite3* conn = nullptr;
    pid_t pid = 0;
    bool readOnly = false;
    std::uint64_t generation = 0;
    int batchDepth = 0;
    std::unordered_map<const char*, sqlite3_stmt*> cache;
};

State& S() {
    static State state;
    return state;
}

std::string FolderPath() { return plat::machine::Root(); }
std::string FilePath() { return FolderPath() + "/registry.db"; }

// Write permission that root cannot bypass: a path without any write bit is read-only.
bool PermitsWriting(const std::string& path) {
    struct stat st;
    if (stat(path.c_str(), &st) != 0) return false;
    return (st.st_mode & 0222) != 0 && access(path.c_str(), W_OK) == 0;
}

bool FileExists(const std::string& path) {
    struct stat st;
    return stat(path.c_str(), &st) == 0;
}

bool DiskPermitsWriting() {
    std::string file = FilePath();
    return PermitsWriting(FolderPath()) && (!FileExists(file) || PermitsWriting(file));
}

void Close() {
    State& s = S();
    for (auto& entry : s.cache) sqlite3_finalize(entry.second);
    s.cache.clear();
    if (s.conn) sqlite3_close_v2(s.conn);
    s.conn = nullptr;
    s.batchDepth = 0;
}

void OnRootChange() {
    auto lock = Lock();
    Close();
    ++S().generation;
}

// A connection inherited through fork belongs to the parent: drop it without closing, since
// closing would touch the parent's locks and WAL.
void ForgetInheritedConnection() {
    State& s = S();
    if (!s.conn || s.pid == getpid()) return;
    s.cache.clear();
    s.conn = nullptr;
    s.batchDepth = 0;
}

long CreateSchema() {
    if (long rc = Exec("BEGIN IMMEDIATE")) return rc;
    long rc = 0;
    {
        Statement version = Prepare("PRAGMA user_version");
        if (version.Step() == SQLITE_ROW && version.Int(0) == 0)
            rc = ErrorFor(sqlite3_exec(S().conn, kSchema, nullptr, nullptr, nullptr));
    }
    if (rc) {
        Exec("ROLLBACK");
        return rc;
    }
    return Exec("COMMIT");
}

long Configure(bool writable) {
    sqlite3_busy_timeout(S().conn, 60000);
    if (long rc = Exec("PRAGMA foreign_keys = ON")) return rc;
    if (!writable) return 0;
    if (long rc = Exec("PRAGMA journal_mode = WAL")) return rc;
    if (long rc = Exec("PRAGMA synchronous = FULL")) return rc;
    return CreateSchema();
}

long OpenConnection(const std::string& path, int flags, bool writable) {
    State& s = S();
    int rc = sqlite3_open_v2(path.c_str(), &s.conn, flags, nullptr);
    long code = rc == SQLITE_OK ? Configure(writable) : ErrorFor(rc);
    if (code) {
        Close();
        return code;
    }
    s.pid = getpid();
    s.readOnly = !writable;
    return 0;
}

}  // namespace

std::unique_lock<std::mutex> Lock() {
    static std::mutex m;
    return std::unique_lock<std::mutex>(m);
}

Statement::~Statement() {
    if (!stmt_) return;
    sqlite3_reset(stmt_);
    sqlite3_clear_bindings(stmt_);
}

Statement& Statement::Bind(int index, std::int64_t value) {
    if (stmt_) sqlite3_bind_int64(stmt_, index, value);
    return *this;
}

Statement& Statement::Bind(int index, const std::string& bytes) {
    if (stmt_) sqlite3_bind_blob(stmt_, index, bytes.data(), static_cast<int>(bytes.size()),
                                 SQLITE_TRANSIENT);
    return *this;
}

int Statement::Step() { return stmt_ ? sqlite3_step(stmt_) : SQLITE_MISUSE; }

std::int64_t Statement::Int(int column) const { return sqlite3_column_int64(stmt_, column); }

std::string Statement::Bytes(int column) const {
    const void* p = sqlite3_column_blob(stmt_, column);
    int n = sqlite3_column_bytes(stmt_, column);
    return p ? std::string(static_cast<const char*>(p), static_cast<size_t>(n)) : std::string();
}

long Open() {
    static bool registered = (plat::machine::OnRootChange(&OnRootChange), true);
    (void)registered;
    ForgetInheritedConnection();
    if (S().conn) return 0;
    std::string file = FilePath();
    mkdir(FolderPath().c_str(), 0777);
    if (DiskPermitsWriting())
        return OpenConnection(file, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE, true);
    if (FileExists(file)) return OpenConnection(file, SQLITE_OPEN_READONLY, false);
    // Nothing to read and no right to create it: an empty registry, which refuses writes.
    long rc = OpenConnection(":memory:", SQLITE_OPEN_READWRITE, true);
    S().readOnly = true;
    return rc;
}

Statement Prepare(const char* sql) {
    State& s = S();
    auto it = s.cache.find(sql);
    if (it != s.cache.end()) return Statement(it->second);
    sqlite3_stmt* stmt = nullptr;
    if (sqlite3_prepare_v3(s.conn, sql, -1, SQLITE_PREPARE_PERSISTENT, &stmt, nullptr) !=
        SQLITE_OK)
        return Statement(nullptr);
    s.cache.emplace(sql, stmt);
    return Statement(stmt);
}

long Exec(const char* sql) {
    Statement st = Prepare(sql);
    int rc = st.Step();
    return rc == SQLITE_DONE || rc == SQLITE_ROW ? 0 : ErrorFor(rc);
}

long CheckWritable() {
    if (!DiskPermitsWriting()) return kErrorAccessDenied;
    if (!S().readOnly) return 0;
    if (S().batchDepth > 0) return kErrorAccessDenied;
    Close();
    return Open();
}

long ErrorFor(int sqliteResult) {
    switch (sqliteResult & 0xFF) {
        case SQLITE_OK:
        case SQLITE_DONE:
        case SQLITE_ROW: return 0;
        case SQLITE_READONLY:
        case SQLITE_PERM:
        case SQLITE_AUTH: return kErrorAccessDenied;
        case SQLITE_FULL: return kErrorDiskFull;
        case SQLITE_CONSTRAINT: return kErrorKeyDeleted;
        default: return kErrorIoFailed;
    }
}

int Changes() { return sqlite3_changes(S().conn); }

std::int64_t LastInsertId() { return sqlite3_last_insert_rowid(S().conn); }

std::uint64_t Generation() { return S().generation; }

int& BatchDepth() { return S().batchDepth; }

}  // namespace plat::reg::db
