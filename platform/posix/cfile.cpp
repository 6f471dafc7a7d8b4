// CFile over a POSIX file descriptor. Windows share modes are emulated with flock on the open
// description, because that is what the files layer reads as "in use" (error 32): a holder that
// denies others' writes or reads keeps a lock for as long as the file is open.
#include "platform/cfile.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/posix/folder_flush.h"
#include "platform/power_cut.h"

namespace plat {

namespace {

constexpr std::uint32_t kErrorNegativeSeek = 131;

bool Writing(unsigned flags) {
    return (flags & (CFile::modeWrite | CFile::modeReadWrite)) != 0;
}

// The lock an opener holds while the file is open. A reader that only denies writes takes a
// shared lock, so that several such readers may coexist as on Windows; every other denial is
// exclusive. Compatibility mode (no share flag) is exclusive, as the framework maps it.
int HeldLock(unsigned flags) {
    switch (flags & 0x70) {
    case CFile::shareDenyNone: return 0;
    case CFile::shareDenyWrite: return Writing(flags) ? LOCK_EX : LOCK_SH;
    default: return LOCK_EX;
    }
}

// Takes the share lock, or for a sharing opener checks that no holder denies its access.
// False when another description's lock conflicts (the file is in use).
bool ApplyShareMode(int fd, unsigned flags) {
    int held = HeldLock(flags);
    if (held != 0) return flock(fd, held | LOCK_NB) == 0;
    if (flock(fd, (Writing(flags) ? LOCK_EX : LOCK_SH) | LOCK_NB) != 0) return false;
    flock(fd, LOCK_UN);
    return true;
}

bool IsDirectory(const std::string& host) {
    struct stat st;
    return stat(host.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

// Refusals that POSIX would not make: a folder cannot be opened as a file, and a file without
// its write bit cannot be written even by root. Asked of the open descriptor, which costs no
// second lookup of the path (the trace log opens its file for every line). 0 when the open may
// stand.
std::uint32_t RefusalOf(int fd, bool writing) {
    struct stat st;
    if (fstat(fd, &st) != 0) return ErrorFromErrno(errno);
    if (S_ISDIR(st.st_mode)) return kErrorAccessDenied;
    if (writing && (st.st_mode & S_IWUSR) == 0) return kErrorAccessDenied;
    return 0;
}

// Windows tells a missing file (2) from a missing folder (3).
std::uint32_t OpenError(int err, const std::string& host) {
    if (err != ENOENT && err != ENOTDIR) return ErrorFromErrno(err);
    std::string::size_type slash = host.find_last_of('/');
    std::string parent = slash == std::string::npos ? "." : host.substr(0, slash == 0 ? 1 : slash);
    return IsDirectory(parent) ? kErrorFileNotFound : kErrorPathNotFound;
}

int AccessFlags(unsigned flags) {
    if (flags & CFile::modeReadWrite) return O_RDWR;
    if (flags & CFile::modeWrite) return O_WRONLY;
    return O_RDONLY;
}

}  // namespace

CFile::CFile() = default;

CFile::~CFile() {
    if (fd_ >= 0) ::close(fd_);
}

bool CFile::Open(const std::string& path, unsigned flags, CFileException* error) {
    auto fail = [&](std::uint32_t code) {
        SetLastErrorCode(code);
        if (error) *error = CFileException(code, path);
        return false;
    };
    if (fd_ >= 0) Close();
    std::string host = paths::ToHost(path);
    if (host.empty()) return fail(LastError() ? LastError() : kErrorPathNotFound);

    // Truncation waits until the refusals and the share check passed, so a file that may not be
    // written, or is in use, is never emptied. A folder opened for writing fails with EISDIR,
    // which is "access denied" too.
    int oflags = AccessFlags(flags) | O_CLOEXEC | ((flags & modeCreate) ? O_CREAT : 0);
    const bool creating = (flags & modeCreate) && ::access(host.c_str(), F_OK) != 0;
    int fd = ::open(host.c_str(), oflags, 0666);
    if (fd < 0) return fail(OpenError(errno, host));
    if (std::uint32_t refusal = RefusalOf(fd, Writing(flags))) {
        ::close(fd);
        return fail(refusal);
    }
    if (!ApplyShareMode(fd, flags)) {
        ::close(fd);
        return fail(kErrorSharingViolation);
    }
    if ((flags & modeCreate) && !(flags & modeNoTruncate) && ::ftruncate(fd, 0) != 0) {
        int err = errno;
        ::close(fd);
        return fail(ErrorFromErrno(err));
    }
    fd_ = fd;
    path_ = path;
    newName_ = creating;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

namespace {
[[noreturn]] void Throw(std::uint32_t code, const std::string& path) {
    SetLastErrorCode(code);
    throw CFileException(code, path);
}
}  // namespace

std::uint32_t CFile::Read(void* buffer, std::uint32_t count) {
    if (fd_ < 0) Throw(kErrorInvalidHandle, path_);
    auto* bytes = static_cast<char*>(buffer);
    std::uint32_t done = 0;
    while (done < count) {
        ssize_t n = ::read(fd_, bytes + done, count - done);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) Throw(ErrorFromErrno(errno), path_);
        if (n == 0) break;
        done += static_cast<std::uint32_t>(n);
    }
    return done;
}

void CFile::Write(const void* buffer, std::uint32_t count) {
    if (fd_ < 0) Throw(kErrorInvalidHandle, path_);
    if (!fault::Allow(fault::Op::Write)) Throw(LastError(), path_);
    const auto* bytes = static_cast<const char*>(buffer);
    std::uint32_t done = 0;
    while (done < count) {
        ssize_t n = ::write(fd_, bytes + done, count - done);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) Throw(ErrorFromErrno(errno), path_);
        done += static_cast<std::uint32_t>(n);
    }
}

std::uint64_t CFile::Seek(std::int64_t offset, unsigned from) {
    if (fd_ < 0) Throw(kErrorInvalidHandle, path_);
    int whence = from == end ? SEEK_END : from == current ? SEEK_CUR : SEEK_SET;
    off_t pos = ::lseek(fd_, static_cast<off_t>(offset), whence);
    if (pos < 0) Throw(errno == EINVAL ? kErrorNegativeSeek : ErrorFromErrno(errno), path_);
    return static_cast<std::uint64_t>(pos);
}

std::uint64_t CFile::GetLength() const {
    struct stat st;
    if (fd_ < 0) Throw(kErrorInvalidHandle, path_);
    if (::fstat(fd_, &st) != 0) Throw(ErrorFromErrno(errno), path_);
    return static_cast<std::uint64_t>(st.st_size);
}

std::uint64_t CFile::GetPosition() const {
    if (fd_ < 0) Throw(kErrorInvalidHandle, path_);
    off_t pos = ::lseek(fd_, 0, SEEK_CUR);
    if (pos < 0) Throw(ErrorFromErrno(errno), path_);
    return static_cast<std::uint64_t>(pos);
}

void CFile::Flush() {
    if (fd_ < 0) return;
    if (::fsync(fd_) != 0 && errno != EINVAL) Throw(ErrorFromErrno(errno), path_);
    power::FileFlushed(fd_);
    if (newName_ && posix::FlushFolder(posix::FolderOf(paths::ToHost(path_)))) newName_ = false;
}

void CFile::Close() {
    if (fd_ < 0) return;
    int fd = fd_;
    fd_ = -1;
    std::string path = std::move(path_);
    path_.clear();
    if (::close(fd) != 0 && errno != EINTR) Throw(ErrorFromErrno(errno), path);
}

}  // namespace plat
