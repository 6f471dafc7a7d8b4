// Files and folders of the emulated machine, with the Windows rules that updates meet: read-only
// files refuse changes even to root, files held open (flock) or being run are in use, and a
// replaced file is never seen half written.
#include "platform/files.h"

#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <strings.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <random>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/posix/folder_flush.h"
#include "platform/power_cut.h"

namespace plat::files {

namespace {

constexpr std::uint32_t kErrorDirectory = 267;  // "the directory name is invalid"
// Seconds between 1601-01-01 and 1970-01-01.
constexpr std::int64_t kEpochDelta = 11644473600LL;
// Windows keeps a creation time that Linux cannot set; it is kept beside the file when the
// file system allows.
const char* const kCreationAttr = "user.pex.creation";

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

using posix::FlushFolder;
using posix::FolderOf;

std::string BaseName(const std::string& host) {
    const std::size_t slash = host.find_last_of('/');
    return slash == std::string::npos ? host : host.substr(slash + 1);
}

bool IsFolder(const std::string& host) {
    struct stat st;
    return stat(host.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

// The Windows code for a failed call on host: a missing name is "file not found" when its
// folder exists and "path not found" when the folder is missing too.
std::uint32_t CodeFor(int err, const std::string& host) {
    if (err == ENOENT) return IsFolder(FolderOf(host)) ? kErrorFileNotFound : kErrorPathNotFound;
    if (err == ENOTDIR) return kErrorPathNotFound;
    return ErrorFromErrno(err);
}

bool FailErrno(const std::string& host) { return Fail(CodeFor(errno, host)); }

// The host path of a Windows path; false with the last error set when it has none.
bool HostOf(const std::string& winPath, std::string* host) {
    *host = paths::ToHost(winPath);
    return !host->empty();
}

bool StatOf(const std::string& host, struct stat* st) {
    if (stat(host.c_str(), st) == 0) return true;
    return FailErrno(host);
}

// Read-only is the absence of the owner's write bit; root's ability to write anyway is
// what the emulation hides.
bool IsReadOnly(const struct stat& st) { return (st.st_mode & S_IWUSR) == 0; }

// Another open description holds a lock that the wanted access conflicts with.
bool LockedByOther(const std::string& host, int lockKind) {
    const int fd = open(host.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    if (fd < 0) return false;
    const bool locked = flock(fd, lockKind | LOCK_NB) != 0 && errno == EWOULDBLOCK;
    close(fd);  // also drops the lock if the attempt took it
    return locked;
}

// A running program's text cannot be opened for writing.
bool IsRunningText(const std::string& host) {
    const int fd = open(host.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC);
    if (fd >= 0) {
        close(fd);
        return false;
    }
    return errno == ETXTBSY;
}

bool InUse(const std::string& host) {
    return LockedByOther(host, LOCK_EX) || IsRunningText(host);
}

// The checks that Windows makes before replacing or deleting an existing file.
bool MayReplace(const std::string& host, const struct stat& st) {
    if (S_ISDIR(st.st_mode) || IsReadOnly(st)) return Fail(kErrorAccessDenied);
    if (InUse(host)) return Fail(kErrorSharingViolation);
    return true;
}

FileTime ToFileTime(const struct timespec& ts) {
    const std::int64_t seconds = static_cast<std::int64_t>(ts.tv_sec) + kEpochDelta;
    if (seconds < 0) return 0;
    return static_cast<FileTime>(seconds) * 10000000u + static_cast<FileTime>(ts.tv_nsec / 100);
}

struct timespec ToTimespec(FileTime ft) {
    struct timespec ts;
    ts.tv_sec = static_cast<time_t>(static_cast<std::int64_t>(ft / 10000000u) - kEpochDelta);
    ts.tv_nsec = static_cast<long>((ft % 10000000u) * 100);
    return ts;
}

FileTime CreationTime(const std::string& host, const struct stat& st) {
    FileTime stored = 0;
    if (getxattr(host.c_str(), kCreationAttr, &stored, sizeof stored) == sizeof stored) return stored;
    return ToFileTime(st.st_mtim);
}

std::uint32_t AttributesOf(const struct stat& st) {
    if (S_ISDIR(st.st_mode)) return kAttrDirectory;
    return IsReadOnly(st) ? kAttrReadOnly : kAttrNormal;
}

bool WriteFully(int fd, const char* data, std::size_t size) {
    while (size > 0) {
        const ssize_t n = write(fd, data, size);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) return false;
        data += n;
        size -= static_cast<std::size_t>(n);
    }
    return true;
}

bool CopyContent(int from, int to) {
    char buffer[1 << 16];
    for (;;) {
        const ssize_t n = read(from, buffer, sizeof buffer);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) return false;
        if (n == 0) return true;
        if (!WriteFully(to, buffer, static_cast<std::size_t>(n))) return false;
    }
}

// How a replacement file is finished before it takes the target's name.
struct Finish {
    mode_t mode = 0644;
    const struct timespec* times = nullptr;  // access and write time to keep, or none
    // The step that puts the new bytes in place is a rename of its own for the fault plan, so a
    // plan can stop a whole-file write after the data is flushed but before the target changes.
    bool renameStep = false;
    // Keep the replaced version as the target's spare (see SpareOf) instead of deleting it.
    bool keepSpare = false;
    // The folder's flush may wait for the end of a folder flush batch (a plain Copy).
    bool batched = false;
};

// A file that is rewritten again and again (the content file, after every group of a run)
// keeps its previous version under this hidden name, and the next version is written into it
// and then exchanged with the file. Writing each version into a new file and renaming it over
// the old one would free a file per write instead, and a file system without a journal
// searches past every file freed in the last minutes whenever it creates one: a run of N
// groups would cost N squared.
std::string SpareOf(const std::string& host) {
    return FolderOf(host) + "/.pex~" + BaseName(host).substr(0, 64) + ".prev";
}

// Opens the spare of host for writing; -1 when there is none that may be reused (it must be a
// plain file with no other name that nobody holds). It is written over from its start and then
// cut to the new length: emptying it first would free its blocks only to take them again.
int OpenSpare(const std::string& host) {
    const int fd = open(SpareOf(host).c_str(), O_WRONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
    if (fd < 0) return -1;
    struct stat st;
    if (fstat(fd, &st) != 0 || !S_ISREG(st.st_mode) || st.st_nlink != 1 || flock(fd, LOCK_EX | LOCK_NB) != 0) {
        close(fd);
        return -1;
    }
    return fd;
}

// Fills fd, gives it the finished mode and times and flushes it to the disk; closes fd. On
// failure *err is the cause.
bool FillAndFlush(int fd, const std::function<bool(int)>& fill, const Finish& finish, int* err) {
    bool ok = fill(fd) && fchmod(fd, finish.mode & 07777) == 0 &&
              (!finish.times || futimens(fd, finish.times) == 0) && fsync(fd) == 0;
    *err = errno;
    if (ok) power::FileFlushed(fd);
    if (close(fd) != 0 && ok) {
        ok = false;
        *err = errno;
    }
    return ok;
}

// Puts the flushed file at from in target's place in one step. With keepSpare the two names
// are exchanged and the replaced version becomes target's spare; where the file system cannot
// exchange names, or target does not exist yet, it is a plain rename. The folder is flushed, so
// that the new bytes keep the name after a power cut; a failed folder flush cannot undo the
// replacement any more, and is left for the next flush of the folder to make good.
bool TakeTargetName(const std::string& from, const std::string& target, const Finish& finish) {
    if (finish.keepSpare && renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, target.c_str(), RENAME_EXCHANGE) == 0) {
        if (rename(from.c_str(), SpareOf(target).c_str()) != 0) unlink(from.c_str());
    } else if (rename(from.c_str(), target.c_str()) != 0) {
        return false;
    }
    if (finish.batched) {
        posix::FlushFolderOrNote(FolderOf(target));
    } else {
        FlushFolder(FolderOf(target));
    }
    return true;
}

// Fills a temporary file beside target, flushes it to the disk and renames it over target, so
// that target holds either its old or its new content at every moment. The temporary file
// is removed on failure.
bool ReplaceAtomically(const std::string& target, const std::function<bool(int)>& fill,
                       const Finish& finish) {
    // The name is cut so that a long target name still leaves room for the temporary one.
    std::string temp = FolderOf(target) + "/.pex~" + BaseName(target).substr(0, 64) + ".XXXXXX";
    const int fd = mkostemp(temp.data(), O_CLOEXEC);
    if (fd < 0) return FailErrno(target);
    int err = 0;
    bool ok = FillAndFlush(fd, fill, finish, &err);
    if (ok && finish.renameStep && !fault::Allow(fault::Op::Rename)) {
        unlink(temp.c_str());
        return false;
    }
    if (ok && !TakeTargetName(temp, target, finish)) {
        ok = false;
        err = errno;
    }
    if (!ok) {
        unlink(temp.c_str());
        return Fail(CodeFor(err, target));
    }
    return true;
}

// ReplaceAtomically through target's spare, open as fd: no file is created or freed.
bool ReplaceThroughSpare(const std::string& target, int fd, const std::function<bool(int)>& fill,
                         const Finish& finish) {
    auto fillAndCut = [&fill](int out) {
        if (!fill(out)) return false;
        const off_t length = lseek(out, 0, SEEK_CUR);
        return length >= 0 && ftruncate(out, length) == 0;
    };
    int err = 0;
    bool ok = FillAndFlush(fd, fillAndCut, finish, &err);
    if (ok && finish.renameStep && !fault::Allow(fault::Op::Rename)) return false;
    const std::string spare = SpareOf(target);
    if (ok && renameat2(AT_FDCWD, spare.c_str(), AT_FDCWD, target.c_str(), RENAME_EXCHANGE) != 0) {
        ok = false;
        err = errno;
    }
    if (ok) FlushFolder(FolderOf(target));  // as TakeTargetName
    // Whatever failed, target is untouched and the spare holds nothing anybody needs.
    return ok || Fail(CodeFor(err, target));
}

// Checks the target of a copy or write: its folder exists, and an existing file may be
// replaced. *exists tells whether it exists.
bool CheckTarget(const std::string& host, bool failIfExists, bool* exists, struct stat* st) {
    *exists = stat(host.c_str(), st) == 0;
    if (!*exists) {
        const int err = errno;
        if (err != ENOENT) return Fail(CodeFor(err, host));
        return IsFolder(FolderOf(host)) || Fail(kErrorPathNotFound);
    }
    if (failIfExists) return Fail(kErrorFileExists);
    return MayReplace(host, *st);
}

// The refusals of reading a file: a folder, or a file whose holder denies reading.
bool MayRead(const std::string& host, struct stat* st) {
    if (!StatOf(host, st)) return false;
    if (S_ISDIR(st->st_mode)) return Fail(kErrorAccessDenied);
    // Reading is refused only when another opener denies it (an exclusive lock).
    return !LockedByOther(host, LOCK_SH) || Fail(kErrorSharingViolation);
}

bool OpenSource(const std::string& host, struct stat* st, int* fd) {
    if (!MayRead(host, st)) return false;
    *fd = open(host.c_str(), O_RDONLY | O_CLOEXEC);
    return *fd >= 0 || FailErrno(host);
}

// Wildcard match without regard to case: `*` any run of characters, `?` exactly one.
bool MatchFrom(const char* p, const char* n) {
    const char* star = nullptr;
    const char* resume = nullptr;
    while (*n) {
        if (*p == '*') {
            star = p++;
            resume = n;
        } else if (*p && (*p == '?' || std::tolower(static_cast<unsigned char>(*p)) ==
                                           std::tolower(static_cast<unsigned char>(*n)))) {
            ++p;
            ++n;
        } else if (star) {
            p = star + 1;
            n = ++resume;
        } else {
            return false;
        }
    }
    while (*p == '*') ++p;
    return *p == '\0';
}

bool WildcardMatch(const std::string& pattern, const std::string& name) {
    if (MatchFrom(pattern.c_str(), name.c_str())) return true;
    // As on Windows, "x.*" also finds "x", and so "*.*" finds every name.
    const std::size_t n = pattern.size();
    return n >= 2 && pattern.compare(n - 2, 2, ".*") == 0 && name.find('.') == std::string::npos &&
           MatchFrom(pattern.substr(0, n - 2).c_str(), name.c_str());
}

std::string SelfExecutable() {
    char buffer[4096];
    const ssize_t n = readlink("/proc/self/exe", buffer, sizeof buffer - 1);
    return n > 0 ? std::string(buffer, static_cast<std::size_t>(n)) : std::string();
}

}  // namespace

namespace {

// Copy after the fault plan allowed it. batched: its folder's flush may wait for the end of a
// folder flush batch.
bool CopyAllowed(const std::string& src, const std::string& dst, bool failIfExists, bool batched) {
    std::string from, to;
    if (!HostOf(src, &from) || !HostOf(dst, &to)) return false;
    struct stat srcStat, dstStat;
    int in = -1;
    if (!OpenSource(from, &srcStat, &in)) return false;
    bool exists = false;
    bool ok = CheckTarget(to, failIfExists, &exists, &dstStat);
    // A file copied onto itself is open twice, which Windows refuses.
    if (ok && exists && dstStat.st_ino == srcStat.st_ino && dstStat.st_dev == srcStat.st_dev) {
        ok = Fail(kErrorSharingViolation);
    }
    if (ok) {
        // The copy keeps the source's attributes and its access and write times.
        const struct timespec times[2] = {srcStat.st_atim, srcStat.st_mtim};
        Finish finish;
        finish.mode = srcStat.st_mode;
        finish.times = times;
        finish.batched = batched;
        ok = ReplaceAtomically(to, [in](int out) { return CopyContent(in, out); }, finish);
    }
    close(in);
    return ok;
}

// CopyToKeep by a second name for the file: only for a plain file that nobody holds, to a name
// that is free, in the same file system. Returns false, having changed nothing, when it cannot.
bool LinkToKeep(const std::string& from, const std::string& to) {
    struct stat st;
    if (lstat(from.c_str(), &st) != 0 || !S_ISREG(st.st_mode) || InUse(from)) return false;
    if (link(from.c_str(), to.c_str()) != 0) return false;
    // The new name must be on the disk before the caller replaces the source: without a journal
    // nothing else orders the two.
    const bool durable = FlushFolder(FolderOf(to));
    if (!durable) unlink(to.c_str());
    return durable;
}

}  // namespace

bool Copy(const std::string& src, const std::string& dst, bool failIfExists) {
    if (!fault::Allow(fault::Op::Copy)) return false;
    return CopyAllowed(src, dst, failIfExists, true);
}

bool CopyToKeep(const std::string& src, const std::string& dst) {
    if (!fault::Allow(fault::Op::Copy)) return false;
    std::string from, to;
    if (!HostOf(src, &from) || !HostOf(dst, &to)) return false;
    struct stat st, kept;
    if (!MayRead(from, &st)) return false;  // the refusals of a copy come first
    if (lstat(to.c_str(), &kept) == 0) {
        // Already that very file (an earlier attempt kept it so, and it has not been replaced).
        if (kept.st_ino == st.st_ino && kept.st_dev == st.st_dev) return true;
    } else if (errno == ENOENT && LinkToKeep(from, to)) {
        return true;
    }
    // The backup's name must be on the disk before its source is replaced: never batched.
    return CopyAllowed(src, dst, false, false);
}

bool Rename(const std::string& from, const std::string& to, bool replace) {
    if (!fault::Allow(fault::Op::Rename)) return false;
    std::string a, b;
    if (!HostOf(from, &a) || !HostOf(to, &b)) return false;
    struct stat st;
    if (lstat(a.c_str(), &st) != 0) return FailErrno(a);
    // A running program may be renamed on Windows; a file held open may not.
    if (!S_ISDIR(st.st_mode) && LockedByOther(a, LOCK_EX)) return Fail(kErrorSharingViolation);
    struct stat target;
    if (lstat(b.c_str(), &target) == 0) {
        if (!replace) return Fail(kErrorAlreadyExists);
        if (!MayReplace(b, target)) return false;
    } else if (!IsFolder(FolderOf(b))) {
        return Fail(kErrorPathNotFound);
    }
    if (rename(a.c_str(), b.c_str()) != 0) return FailErrno(b);
    // Written through, as MOVEFILE_WRITE_THROUGH: both names are on the disk when it returns.
    FlushFolder(FolderOf(b));
    if (FolderOf(a) != FolderOf(b)) FlushFolder(FolderOf(a));
    return true;
}

bool Remove(const std::string& path) {
    if (!fault::Allow(fault::Op::Remove)) return false;
    std::string host;
    if (!HostOf(path, &host)) return false;
    struct stat st;
    if (lstat(host.c_str(), &st) != 0) return FailErrno(host);
    if (!S_ISLNK(st.st_mode) && !MayReplace(host, st)) return false;
    if (unlink(host.c_str()) != 0) return FailErrno(host);
    unlink(SpareOf(host).c_str());  // the previous version of a file that WriteAllDurably kept
    // A deletion that a later step counts on (a backup gone before the journal that names it)
    // must not come back after a power cut; a removal batch flushes it with its others.
    posix::FlushFolderOrNote(FolderOf(host));
    return true;
}

std::uint32_t GetAttributes(const std::string& path) {
    std::string host;
    struct stat st;
    if (!HostOf(path, &host) || !StatOf(host, &st)) return kInvalidAttributes;
    return AttributesOf(st);
}

bool SetAttributes(const std::string& path, std::uint32_t attributes) {
    if (attributes == kInvalidAttributes) return Fail(kErrorInvalidParameter);
    if (!fault::Allow(fault::Op::Write)) return false;
    std::string host;
    struct stat st;
    if (!HostOf(path, &host) || !StatOf(host, &st)) return false;
    // Folders have no read-only state that Windows enforces; only files keep it.
    if (S_ISDIR(st.st_mode)) return true;
    const mode_t mode = (attributes & kAttrReadOnly) ? (st.st_mode & ~mode_t{0222})
                                                     : (st.st_mode | S_IWUSR);
    if (chmod(host.c_str(), mode & 07777) != 0) return FailErrno(host);
    return true;
}

bool GetStatus(const std::string& path, FileStatus* status) {
    std::string host;
    struct stat st;
    if (!HostOf(path, &host) || !StatOf(host, &st)) return false;
    status->attributes = AttributesOf(st);
    status->size = S_ISDIR(st.st_mode) ? 0 : static_cast<std::uint64_t>(st.st_size);
    status->lastWrite = ToFileTime(st.st_mtim);
    status->lastAccess = ToFileTime(st.st_atim);
    status->creation = CreationTime(host, st);
    return true;
}

bool Exists(const std::string& path) {
    std::string host;
    struct stat st;
    return HostOf(path, &host) && StatOf(host, &st);
}

bool SetTimes(const std::string& path, FileTime creation, FileTime lastAccess, FileTime lastWrite) {
    if (!fault::Allow(fault::Op::Write)) return false;
    std::string host;
    struct stat st;
    if (!HostOf(path, &host) || !StatOf(host, &st)) return false;
    struct timespec times[2];
    times[0] = lastAccess ? ToTimespec(lastAccess) : timespec{0, UTIME_OMIT};
    times[1] = lastWrite ? ToTimespec(lastWrite) : timespec{0, UTIME_OMIT};
    if (utimensat(AT_FDCWD, host.c_str(), times, 0) != 0) return FailErrno(host);
    // Best effort: a file system without user attributes reports the write time instead.
    if (creation) setxattr(host.c_str(), kCreationAttr, &creation, sizeof creation, 0);
    return true;
}

bool MakeDirectory(const std::string& path) {
    if (!fault::Allow(fault::Op::Write)) return false;
    std::string host;
    if (!HostOf(path, &host)) return false;
    if (mkdir(host.c_str(), 0777) == 0) {
        FlushFolder(FolderOf(host));  // what is then put in the folder needs the folder's name
        return true;
    }
    if (errno == EEXIST) return Fail(kErrorAlreadyExists);
    if (errno == ENOENT) return Fail(kErrorPathNotFound);
    return FailErrno(host);
}

bool RemoveDirectory(const std::string& path) {
    if (!fault::Allow(fault::Op::Remove)) return false;
    std::string host;
    if (!HostOf(path, &host)) return false;
    if (rmdir(host.c_str()) == 0) return true;
    if (errno == ENOTDIR) return Fail(kErrorDirectory);
    return FailErrno(host);
}

std::string TempFolder() { return "C:\\windows\\temp\\"; }

std::string TempFileName(const std::string& folder, const std::string& prefix, unsigned unique) {
    const std::string base = paths::AddSeparator(folder) + prefix.substr(0, 3);
    auto nameFor = [&base](unsigned number) {
        char hex[8];
        std::snprintf(hex, sizeof hex, "%04x", number & 0xFFFFu);
        return base + hex + ".tmp";
    };
    // With a number given the name is only composed, as Windows does.
    if (unique != 0) return nameFor(unique);
    std::string host;
    if (!HostOf(folder, &host)) return std::string();
    if (!IsFolder(host)) {
        SetLastErrorCode(kErrorPathNotFound);
        return std::string();
    }
    if (!fault::Allow(fault::Op::Write)) return std::string();
    static std::mt19937 numbers{std::random_device{}()};
    const unsigned start = numbers() & 0xFFFFu;
    for (unsigned i = 0; i < 0x10000u; ++i) {
        const unsigned number = (start + i) & 0xFFFFu;
        if (number == 0) continue;
        const std::string name = nameFor(number);
        // The lookup ignores case, so a name that differs only in case counts as taken.
        const std::string file = paths::ToHost(name);
        const int fd = open(file.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
        if (fd >= 0) {
            close(fd);
            return name;
        }
        if (errno != EEXIST) {
            FailErrno(file);
            return std::string();
        }
    }
    SetLastErrorCode(kErrorFileExists);
    return std::string();
}

std::vector<FindEntry> Find(const std::string& pattern) {
    std::vector<FindEntry> found;
    const std::string full = paths::FullPath(pattern);
    const std::size_t cut = full.find_last_of('\\');
    if (cut == std::string::npos) {
        SetLastErrorCode(kErrorPathNotFound);
        return found;
    }
    const std::string wanted = full.substr(cut + 1);
    std::string host;
    if (!HostOf(full.substr(0, cut + 1), &host)) return found;
    DIR* dir = opendir(host.c_str());
    if (!dir) {
        SetLastErrorCode(errno == ENOENT || errno == ENOTDIR ? kErrorPathNotFound : ErrorFromErrno(errno));
        return found;
    }
    while (dirent* e = readdir(dir)) {
        const std::string name = e->d_name;
        if (name == "." || name == ".." || !WildcardMatch(wanted, name)) continue;
        struct stat st;
        if (stat((host + "/" + name).c_str(), &st) != 0) continue;
        const std::uint64_t size = S_ISDIR(st.st_mode) ? 0 : static_cast<std::uint64_t>(st.st_size);
        found.push_back(FindEntry{name, AttributesOf(st), size, ToFileTime(st.st_mtim)});
    }
    closedir(dir);
    // Windows file systems list a folder in name order without regard to case.
    std::sort(found.begin(), found.end(), [](const FindEntry& a, const FindEntry& b) {
        return strcasecmp(a.name.c_str(), b.name.c_str()) < 0;
    });
    SetLastErrorCode(found.empty() ? kErrorFileNotFound : kErrorSuccess);
    return found;
}

std::string ModuleFileName(const void* addressInModule) {
    std::string host;
    Dl_info info{};
    if (addressInModule) {
        if (!dladdr(addressInModule, &info) || !info.dli_fname) {
            SetLastErrorCode(kErrorModNotFound);
            return std::string();
        }
        host = info.dli_fname;
    }
    // The program itself is reported by the name it was started with; /proc knows its file.
    if (host.empty() || host.find('/') == std::string::npos || host == program_invocation_name) {
        host = SelfExecutable();
    }
    if (char* real = realpath(host.c_str(), nullptr)) {
        host = real;
        free(real);
    }
    if (host.empty()) {
        SetLastErrorCode(kErrorModNotFound);
        return std::string();
    }
    return paths::ToWindows(host);
}

bool ReadAll(const std::string& path, std::string* bytes, std::uint64_t maxBytes) {
    std::string host;
    struct stat st;
    int fd = -1;
    if (!HostOf(path, &host) || !OpenSource(host, &st, &fd)) return false;
    bytes->clear();
    char buffer[1 << 16];
    ssize_t n = 0;
    std::uint32_t error = 0;
    if (static_cast<std::uint64_t>(st.st_size) > maxBytes) error = kErrorFileTooLarge;
    while (error == 0 && (n = read(fd, buffer, sizeof buffer)) != 0) {
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) {
            error = ErrorFromErrno(errno);
        } else if (bytes->size() + static_cast<std::size_t>(n) > maxBytes) {
            error = kErrorFileTooLarge;
        } else {
            bytes->append(buffer, static_cast<std::size_t>(n));
        }
    }
    close(fd);
    if (error != 0) bytes->clear();
    return error == 0 || Fail(error);
}

bool WriteAllDurably(const std::string& path, const std::string& bytes) {
    if (!fault::Allow(fault::Op::Write)) return false;
    std::string host;
    if (!HostOf(path, &host)) return false;
    struct stat st;
    bool exists = false;
    if (!CheckTarget(host, false, &exists, &st)) return false;
    Finish finish;
    if (exists) finish.mode = st.st_mode;
    finish.renameStep = true;
    finish.keepSpare = true;
    auto fill = [&bytes](int fd) { return WriteFully(fd, bytes.data(), bytes.size()); };
    const int spare = exists ? OpenSpare(host) : -1;
    if (spare >= 0) return ReplaceThroughSpare(host, spare, fill, finish);
    return ReplaceAtomically(host, fill, finish);
}

}  // namespace plat::files
