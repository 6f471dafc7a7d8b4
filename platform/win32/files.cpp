// Files and folders through the Win32 "A" calls. Windows itself gives the rules that updates
// meet (sharing, missing folders, error codes); the few checks made here before a call are the
// documented Windows refusals that Wine, running as root, lets through: a read-only file is
// never overwritten.
#include "platform/files.h"

#include <algorithm>
#include <cstdio>
#include <cstring>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/win32/handle.h"

namespace plat::files {

namespace {

using win32::FindHandle;
using win32::Handle;

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

FileTime FromFileTime(const FILETIME& ft) {
    return (static_cast<FileTime>(ft.dwHighDateTime) << 32) | ft.dwLowDateTime;
}

FILETIME ToFileTime(FileTime t) {
    FILETIME ft;
    ft.dwLowDateTime = static_cast<DWORD>(t & 0xFFFFFFFFu);
    ft.dwHighDateTime = static_cast<DWORD>(t >> 32);
    return ft;
}

// A file that exists and carries the read-only attribute; the last error is left alone.
bool IsReadOnlyFile(const std::string& path) {
    const DWORD saved = ::GetLastError();
    const DWORD attributes = ::GetFileAttributesA(path.c_str());
    ::SetLastError(saved);
    return attributes != INVALID_FILE_ATTRIBUTES && !(attributes & FILE_ATTRIBUTE_DIRECTORY) &&
           (attributes & FILE_ATTRIBUTE_READONLY);
}

std::string FolderOf(const std::string& path) {
    const std::string full = paths::FullPath(path);
    const std::size_t cut = full.find_last_of('\\');
    return cut == std::string::npos ? std::string() : full.substr(0, cut + 1);
}

bool WriteFully(HANDLE file, const std::string& bytes) {
    std::size_t done = 0;
    while (done < bytes.size()) {
        const DWORD chunk = static_cast<DWORD>(std::min<std::size_t>(bytes.size() - done, 1u << 20));
        DWORD written = 0;
        if (!::WriteFile(file, bytes.data() + done, chunk, &written, nullptr)) return false;
        done += written;
    }
    return true;
}

// Whether a new name replaces an existing file: false with 5 for a read-only one.
bool MayReplace(const std::string& path) {
    return !IsReadOnlyFile(path) || Fail(kErrorAccessDenied);
}

// folder\<prefix up to 3 chars><4 hex digits>.tmp. GetTempFileNameA makes the same names, but
// with as few digits as the number needs on some systems (Wine), so the name is made here.
std::string TempNameFor(const std::string& folder, const std::string& prefix, unsigned number) {
    char hex[8];
    std::snprintf(hex, sizeof hex, "%04x", number & 0xFFFFu);
    return paths::AddSeparator(folder) + prefix.substr(0, 3) + hex + ".tmp";
}

// As GetTempFileNameA with a zero number: the first free name from a varying start is
// created empty; 3 when the folder is missing.
std::string TempName(const std::string& folder, const std::string& prefix) {
    const unsigned start = ::GetTickCount() ^ (::GetCurrentProcessId() << 8);
    for (unsigned i = 0; i < 0x10000u; ++i) {
        const unsigned number = (start + i) & 0xFFFFu;
        if (number == 0) continue;
        const std::string name = TempNameFor(folder, prefix, number);
        Handle file(::CreateFileA(name.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                  FILE_ATTRIBUTE_NORMAL, nullptr));
        if (file) return name;
        const DWORD error = ::GetLastError();
        if (error != ERROR_FILE_EXISTS && error != ERROR_ALREADY_EXISTS) return std::string();
    }
    SetLastErrorCode(kErrorFileExists);
    return std::string();
}

// CopyFileA leaves the copy in the cache; flushing it makes the bytes, and with NTFS's log the
// name, survive a power cut, as the emulated machine's copy does. A read-only copy (it keeps the
// source's attributes) cannot be opened for writing, so the attribute is lifted meanwhile. The
// copy is in place already, so a failed flush is left for the next one to make good.
void FlushCopy(const std::string& dst) {
    const DWORD saved = ::GetLastError();
    const DWORD attributes = ::GetFileAttributesA(dst.c_str());
    const bool readOnly = attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY);
    if (readOnly) ::SetFileAttributesA(dst.c_str(), attributes & ~DWORD{FILE_ATTRIBUTE_READONLY});
    {
        Handle file(::CreateFileA(dst.c_str(), GENERIC_WRITE, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                                  FILE_ATTRIBUTE_NORMAL, nullptr));
        if (file) ::FlushFileBuffers(file.get());
    }
    if (readOnly) ::SetFileAttributesA(dst.c_str(), attributes);
    ::SetLastError(saved);
}

}  // namespace

bool Copy(const std::string& src, const std::string& dst, bool failIfExists) {
    if (!fault::Allow(fault::Op::Copy)) return false;
    if (!failIfExists && !MayReplace(dst)) return false;
    if (!::CopyFileA(src.c_str(), dst.c_str(), failIfExists ? TRUE : FALSE)) return false;
    FlushCopy(dst);
    return true;
}

bool CopyToKeep(const std::string& src, const std::string& dst) { return Copy(src, dst, false); }

bool Rename(const std::string& from, const std::string& to, bool replace) {
    if (!fault::Allow(fault::Op::Rename)) return false;
    if (replace && !MayReplace(to)) return false;
    // Written through: the new name is on the disk when the call returns.
    const DWORD flags = MOVEFILE_WRITE_THROUGH | (replace ? MOVEFILE_REPLACE_EXISTING : 0);
    return ::MoveFileExA(from.c_str(), to.c_str(), flags) != FALSE;
}

bool Remove(const std::string& path) {
    if (!fault::Allow(fault::Op::Remove)) return false;
    return ::DeleteFileA(path.c_str()) != FALSE;
}

// Copies are flushed as they are made, and NTFS logs every deletion in order with the changes
// that follow it: nothing to gather.
FolderFlushBatch::FolderFlushBatch() = default;
FolderFlushBatch::~FolderFlushBatch() = default;
bool FolderFlushBatch::Flush() { return true; }

std::uint32_t GetAttributes(const std::string& path) {
    return ::GetFileAttributesA(path.c_str());
}

bool SetAttributes(const std::string& path, std::uint32_t attributes) {
    if (attributes == kInvalidAttributes) return Fail(kErrorInvalidParameter);
    if (!fault::Allow(fault::Op::Write)) return false;
    return ::SetFileAttributesA(path.c_str(), attributes) != FALSE;
}

bool GetStatus(const std::string& path, FileStatus* status) {
    WIN32_FILE_ATTRIBUTE_DATA data;
    if (!::GetFileAttributesExA(path.c_str(), GetFileExInfoStandard, &data)) return false;
    status->attributes = data.dwFileAttributes;
    const bool folder = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    status->size = folder ? 0 : (static_cast<std::uint64_t>(data.nFileSizeHigh) << 32) | data.nFileSizeLow;
    status->creation = FromFileTime(data.ftCreationTime);
    status->lastAccess = FromFileTime(data.ftLastAccessTime);
    status->lastWrite = FromFileTime(data.ftLastWriteTime);
    return true;
}

bool Exists(const std::string& path) {
    return ::GetFileAttributesA(path.c_str()) != INVALID_FILE_ATTRIBUTES;
}

bool SetTimes(const std::string& path, FileTime creation, FileTime lastAccess, FileTime lastWrite) {
    if (!fault::Allow(fault::Op::Write)) return false;
    // Backup semantics let a folder be opened too; every other opener stays welcome.
    Handle file(::CreateFileA(path.c_str(), FILE_WRITE_ATTRIBUTES,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                              OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    if (!file) return false;
    const FILETIME c = ToFileTime(creation), a = ToFileTime(lastAccess), w = ToFileTime(lastWrite);
    return ::SetFileTime(file.get(), creation ? &c : nullptr, lastAccess ? &a : nullptr,
                         lastWrite ? &w : nullptr) != FALSE;
}

bool MakeDirectory(const std::string& path) {
    if (!fault::Allow(fault::Op::Write)) return false;
    return ::CreateDirectoryA(path.c_str(), nullptr) != FALSE;
}

bool RemoveDirectory(const std::string& path) {
    if (!fault::Allow(fault::Op::Remove)) return false;
    return ::RemoveDirectoryA(path.c_str()) != FALSE;
}

std::string TempFolder() {
    char buffer[MAX_PATH + 1];
    const DWORD n = ::GetTempPathA(sizeof buffer, buffer);
    if (n == 0 || n > MAX_PATH) return "C:\\windows\\temp\\";
    return paths::AddSeparator(std::string(buffer, n));
}

std::string TempFileName(const std::string& folder, const std::string& prefix, unsigned unique) {
    // With a number given the name is only composed, as Windows does.
    if (unique != 0) return TempNameFor(folder, prefix, unique);
    if (!fault::Allow(fault::Op::Write)) return std::string();
    return TempName(folder, prefix);
}

std::vector<FindEntry> Find(const std::string& pattern) {
    std::vector<FindEntry> found;
    WIN32_FIND_DATAA data;
    FindHandle search(::FindFirstFileA(pattern.c_str(), &data));
    if (!search) return found;
    do {
        if (std::strcmp(data.cFileName, ".") == 0 || std::strcmp(data.cFileName, "..") == 0) continue;
        const bool folder = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
        const std::uint64_t size =
            folder ? 0 : (static_cast<std::uint64_t>(data.nFileSizeHigh) << 32) | data.nFileSizeLow;
        found.push_back(FindEntry{data.cFileName, data.dwFileAttributes, size,
                                  FromFileTime(data.ftLastWriteTime)});
    } while (::FindNextFileA(search.get(), &data));
    // NTFS lists a folder in name order without regard to case; other file systems may not.
    std::sort(found.begin(), found.end(), [](const FindEntry& a, const FindEntry& b) {
        return ::lstrcmpiA(a.name.c_str(), b.name.c_str()) < 0;
    });
    SetLastErrorCode(found.empty() ? kErrorFileNotFound : kErrorSuccess);
    return found;
}

std::string ModuleFileName(const void* addressInModule) {
    HMODULE module = nullptr;
    if (addressInModule &&
        !::GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS |
                                  GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                              static_cast<LPCSTR>(addressInModule), &module)) {
        return std::string();
    }
    char buffer[MAX_PATH];
    const DWORD n = ::GetModuleFileNameA(module, buffer, MAX_PATH);
    if (n == 0 || n >= MAX_PATH) return std::string();
    return std::string(buffer, n);
}

bool ReadAll(const std::string& path, std::string* bytes, std::uint64_t maxBytes) {
    // Reading is refused only when another opener denies it.
    Handle file(::CreateFileA(path.c_str(), GENERIC_READ,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                              OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file) return false;
    bytes->clear();
    LARGE_INTEGER size{};
    if (!::GetFileSizeEx(file.get(), &size)) return false;
    const auto tooLarge = [bytes] {
        bytes->clear();
        ::SetLastError(ERROR_FILE_TOO_LARGE);
        return false;
    };
    if (static_cast<std::uint64_t>(size.QuadPart) > maxBytes) return tooLarge();
    char buffer[1 << 16];
    DWORD n = 0;
    for (;;) {
        if (!::ReadFile(file.get(), buffer, sizeof buffer, &n, nullptr)) return false;
        if (n == 0) return true;
        if (bytes->size() + n > maxBytes) return tooLarge();
        bytes->append(buffer, n);
    }
}

bool WriteAllDurably(const std::string& path, const std::string& bytes) {
    if (!fault::Allow(fault::Op::Write)) return false;
    if (!MayReplace(path)) return false;
    const std::string temp = TempName(FolderOf(path), "pex");
    if (temp.empty()) return false;
    bool ok = false;
    {
        Handle file(::CreateFileA(temp.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                                  FILE_ATTRIBUTE_NORMAL, nullptr));
        ok = file && WriteFully(file.get(), bytes) && ::FlushFileBuffers(file.get());
    }
    // Putting the new bytes in place is a step of its own for the fault plan, so a plan can stop
    // the write after the data is flushed but before the target changes. Write-through: the
    // rename is on the disk before the call returns.
    ok = ok && fault::Allow(fault::Op::Rename) &&
         ::MoveFileExA(temp.c_str(), path.c_str(), MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH);
    if (!ok) {
        const DWORD err = ::GetLastError();
        ::DeleteFileA(temp.c_str());
        ::SetLastError(err);
    }
    return ok;
}

}  // namespace plat::files
