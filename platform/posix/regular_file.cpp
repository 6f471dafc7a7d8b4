// RegularFile over a POSIX descriptor. The file's type is asked before it is opened, since
// opening a pipe for reading waits for a writer and opening a device may act on it.
#include "platform/regular_file.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace plat::files {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

}  // namespace

RegularFile::~RegularFile() {
    if (fd_ >= 0) ::close(fd_);
}

bool RegularFile::Open(const std::string& path) {
    if (fd_ >= 0) return Fail(kErrorInvalidHandle);
    FileStatus status;
    if (!GetStatus(path, &status)) return false;  // 2 or 3, as Windows tells them apart
    const std::string host = paths::ToHost(path);
    struct stat st;
    if (host.empty() || ::stat(host.c_str(), &st) != 0 || !S_ISREG(st.st_mode)) return Fail(kErrorAccessDenied);
    const int fd = ::open(host.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (fd < 0) return Fail(ErrorFromErrno(errno));
    // The name may have been given to something else between the two looks; a holder that
    // denies reading keeps an exclusive lock (see cfile.cpp).
    std::uint32_t refusal = kErrorSuccess;
    if (::fstat(fd, &st) != 0 || !S_ISREG(st.st_mode)) {
        refusal = kErrorAccessDenied;
    } else if (::flock(fd, LOCK_SH | LOCK_NB) != 0) {
        refusal = kErrorSharingViolation;
    }
    if (refusal != kErrorSuccess) {
        ::close(fd);
        return Fail(refusal);
    }
    ::flock(fd, LOCK_UN);
    fd_ = fd;
    size_ = static_cast<std::uint64_t>(st.st_size);
    SetLastErrorCode(kErrorSuccess);
    return true;
}

bool RegularFile::ReadAt(std::uint64_t at, std::size_t n, std::string* bytes) const {
    if (fd_ < 0 || at > size_ || n > size_ - at) return false;
    bytes->resize(n);
    std::size_t done = 0;
    while (done < n) {
        const ssize_t got = ::pread(fd_, &(*bytes)[done], n - done, static_cast<off_t>(at + done));
        if (got < 0 && errno == EINTR) continue;
        if (got <= 0) return false;  // cut short since it was opened, or unreadable
        done += static_cast<std::size_t>(got);
    }
    return true;
}

}  // namespace plat::files
