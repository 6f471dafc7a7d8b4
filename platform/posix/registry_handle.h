// Key handles of the emulated registry and the walk from a handle to a key row.
// Internal to the posix registry; every function here runs under db::Lock().
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "platform/posix/registry_db.h"
#include "platform/registry.h"

namespace plat::reg {

// An open key: the row it stands for and the rights it was opened with. A handle belongs to
// the machine root it was opened on (generation); the predefined roots belong to every root.
struct KeyTag {
    std::int64_t row;  // 0 for HKEY_CLASSES_ROOT, which is found through HKLM on each use
    std::uint32_t access;
    std::uint64_t generation;
    bool predefined;
};

namespace detail {

// The rows of the two hives.
constexpr std::int64_t kLocalMachineRow = 1;
constexpr std::int64_t kCurrentUserRow = 2;

// A name as the registry matches it: ASCII letters in lower case.
std::string Fold(const std::string& name);

// The key meant by handle key and the path subKey below it, as a row to start from and the
// names to follow. 6 for a stale handle, 5 when the handle lacks the rights `need`, or the
// code of a database that cannot be opened.
long Target(HKey key, std::uint32_t need, const std::string& subKey, std::int64_t* from,
            std::vector<std::string>* names);

// Follows names from row from; 2 when one of them is missing.
long Walk(std::int64_t from, const std::vector<std::string>& names, std::int64_t* row);

// Target and Walk together, for the key a handle itself stands for.
long Existing(HKey key, std::uint32_t need, std::int64_t* row);

HKey NewHandle(std::int64_t row, std::uint32_t access);

// Steps an enumeration's query (one row, the name in its first column) and copies the name into
// the caller's buffer: 259 past the last item, 234 when the buffer is too small.
long NextName(db::Statement& st, char* name, std::uint32_t* nameSize);

// Sets the thread's last error to code and returns it, as every registry call ends.
long Done(long code);

}  // namespace detail
}  // namespace plat::reg
