// AppendFile over a POSIX descriptor in append mode. The share check of CFile's "deny none"
// writers is one non-blocking exclusive flock, held while a line is written: it fails when
// another opener denies writes (CFile's holders of a shared or an exclusive lock).
#include "platform/append_file.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/paths.h"

namespace plat {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

// With O_CREAT a missing name is made, so ENOENT means a missing folder.
std::uint32_t OpenError(int err) {
    return err == ENOENT || err == ENOTDIR ? std::uint32_t{kErrorPathNotFound} : ErrorFromErrno(err);
}

}  // namespace

AppendFile::~AppendFile() {
    if (fd_ >= 0) ::close(fd_);
}

bool AppendFile::Open(const std::string& path) {
    Close();
    if (path != path_ || mapped_.empty()) {
        path_ = path;
        mapped_ = paths::ToHost(path);
        checkMode_ = true;
    }
    if (OpenMapped()) return true;
    // A folder made, removed or spelled otherwise since the mapping: map the path again.
    const std::uint32_t error = LastError();
    const std::string again = paths::ToHost(path);
    if (again.empty() || again == mapped_) return Fail(error);
    mapped_ = again;
    checkMode_ = true;
    return OpenMapped();
}

// Windows refuses to write a read-only file, which root could do here. Asked at the first open
// after the path was mapped, not at every line: a status query is half the cost of a line.
std::uint32_t AppendFile::ModeRefusal(int fd) {
    if (!checkMode_) return 0;
    struct stat st;
    if (fstat(fd, &st) != 0) return ErrorFromErrno(errno);
    if ((st.st_mode & S_IWUSR) == 0) return kErrorAccessDenied;
    checkMode_ = false;
    return 0;
}

bool AppendFile::OpenMapped() {
    if (mapped_.empty()) return Fail(kErrorPathNotFound);
    const int fd = ::open(mapped_.c_str(), O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0666);
    if (fd < 0) return Fail(OpenError(errno));
    std::uint32_t refusal = ModeRefusal(fd);
    if (refusal == 0 && flock(fd, LOCK_EX | LOCK_NB) != 0) refusal = kErrorSharingViolation;
    if (refusal != 0) {
        ::close(fd);
        return Fail(refusal);
    }
    fd_ = fd;
    locked_ = true;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

bool AppendFile::Append(const char* data, std::size_t size) {
    if (fd_ < 0) return Fail(kErrorInvalidHandle);
    if (!fault::Allow(fault::Op::Write)) return false;
    if (!locked_ && flock(fd_, LOCK_EX | LOCK_NB) != 0) return Fail(kErrorSharingViolation);
    locked_ = true;
    for (std::size_t done = 0; done < size;) {
        const ssize_t n = ::write(fd_, data + done, size - done);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) return Fail(ErrorFromErrno(errno));
        done += static_cast<std::size_t>(n);
    }
    return true;
}

void AppendFile::Release() {
    if (fd_ >= 0 && locked_) flock(fd_, LOCK_UN);
    locked_ = false;
}

void AppendFile::Close() {
    if (fd_ >= 0) ::close(fd_);  // the share lock goes with the descriptor
    fd_ = -1;
    locked_ = false;
}

}  // namespace plat
