// Files and folders of the machine, by Windows path. Every operation sets the last error on
// failure to the code Windows gives (see errors.h). The Windows semantics that updates rely on
// hold on both targets: a read-only file cannot be overwritten or deleted (5), even by root; a
// file held by another open description (flock) or being run is in use (32).
#pragma once
#include <cstdint>
#include <string>
#include <vector>

namespace plat::files {

// Attribute bits, as Windows numbers them.
constexpr std::uint32_t kAttrReadOnly = 0x01;
constexpr std::uint32_t kAttrHidden = 0x02;
constexpr std::uint32_t kAttrDirectory = 0x10;
constexpr std::uint32_t kAttrArchive = 0x20;
constexpr std::uint32_t kAttrNormal = 0x80;
constexpr std::uint32_t kInvalidAttributes = 0xFFFFFFFFu;

// A file time: 100-nanosecond intervals since 1601-01-01 UTC (FILETIME).
using FileTime = std::uint64_t;

// Copies src to dst. With failIfExists an existing dst gives 80. A copy never leaves a torn
// target: it writes a temporary file beside dst, flushes it and renames it over dst. The
// source's last-write time is kept. The copy, bytes and name, survives a power cut once it
// returns (on Windows the copy is flushed after CopyFile).
bool Copy(const std::string& src, const std::string& dst, bool failIfExists);

// Copy (overwriting) for a copy to keep, such as the backup of a file about to be replaced:
// neither dst nor src is written to in place afterwards, only replaced whole (as Copy, Rename
// and WriteAllDurably do) or deleted. The emulated machine then gives dst the very file that src
// names, a second name for it (when nobody holds src and dst is free), which copies no bytes
// and takes no new file; flushed so that the name survives a power cut. Windows copies.
bool CopyToKeep(const std::string& src, const std::string& dst);

// Renames (moves) a file, replacing an existing target when replace is set. Written through:
// the new name survives a power cut once it returns.
bool Rename(const std::string& from, const std::string& to, bool replace);

// Deletes a file (not a folder). The emulated machine flushes the folder, so that the deletion
// survives a power cut once it returns; Windows has no such call, and NTFS's log only keeps it
// ahead of any later change that is flushed.
bool Remove(const std::string& path);

// Deletions and copies whose folders are flushed together. While a batch lives (one per thread
// at a time), Remove and Copy on the emulated machine do not flush the folder of the name they
// change but note it, and Flush, or the end of the batch, flushes every noted folder once. For
// changes that nothing orders among themselves (the copies of a group's files, a run's clean-up
// of its backups and downloads); a step that counts on them comes after Flush, and CopyToKeep
// still flushes at once (its name must be on the disk before its source is replaced). On
// Windows there is nothing to gather.
class FolderFlushBatch {
public:
    FolderFlushBatch();
    ~FolderFlushBatch();  // flushes what is noted
    FolderFlushBatch(const FolderFlushBatch&) = delete;
    FolderFlushBatch& operator=(const FolderFlushBatch&) = delete;
    // Flushes the folders noted so far; false when one of them could not be flushed.
    bool Flush();

private:
    [[maybe_unused]] bool outermost_ = false;  // an inner batch leaves the notes to this one
};

// Attributes of a file or folder; kInvalidAttributes and the last error when missing.
std::uint32_t GetAttributes(const std::string& path);
// Sets the attributes (only read-only is stored; the others are accepted and ignored).
bool SetAttributes(const std::string& path, std::uint32_t attributes);

struct FileStatus {
    std::uint32_t attributes = 0;
    std::uint64_t size = 0;
    FileTime creation = 0, lastAccess = 0, lastWrite = 0;
};
// Status of a file or folder (CFile::GetStatus); false and the last error when missing.
bool GetStatus(const std::string& path, FileStatus* status);
bool Exists(const std::string& path);

// Sets the times of an existing file; a zero time leaves that time as it is.
bool SetTimes(const std::string& path, FileTime creation, FileTime lastAccess, FileTime lastWrite);

// Creates one folder: 183 when it exists, 3 when its parent is missing.
bool MakeDirectory(const std::string& path);
// Removes an empty folder.
bool RemoveDirectory(const std::string& path);

// The temporary folder, with its trailing backslash (C:\windows\temp\ on the emulated machine).
std::string TempFolder();
// GetTempFileName: folder\<prefix up to 3 chars><4 hex digits>.tmp, created empty when unique
// is 0. Empty text and the last error on failure.
std::string TempFileName(const std::string& folder, const std::string& prefix, unsigned unique = 0);

// Wildcard search (`*`, `?`, without regard to case) in one folder. The names are the files'
// own. An empty result with last error 2 when nothing matches, 3 when the folder is missing.
struct FindEntry {
    std::string name;
    std::uint32_t attributes = 0;
    std::uint64_t size = 0;
    FileTime lastWrite = 0;
};
std::vector<FindEntry> Find(const std::string& pattern);

// The Windows path of the module that contains the given address (of a function or object
// in that module); with nullptr, the host program's file.
std::string ModuleFileName(const void* addressInModule);

// Whole-file helpers for the system's own files (content file, logs).
// A file of more than maxBytes is refused with 223 (ERROR_FILE_TOO_LARGE), judged by its size
// before anything is read and again while reading, in case it grows meanwhile.
bool ReadAll(const std::string& path, std::string* bytes, std::uint64_t maxBytes = UINT64_MAX);
// Writes durably: the new bytes are flushed to the disk before they take the file's name, in one
// step, so the file holds its old or its new content at every moment, also after a power cut.
// On failure the old file stays as it was. (The emulation keeps the previous version hidden
// beside the file to write the next one into; Remove removes it with the file.)
bool WriteAllDurably(const std::string& path, const std::string& bytes);

}  // namespace plat::files
