// The machine lock on the emulated machine: "<machine root>/<name>.lock" held with flock. The
// kernel drops a flock when the last descriptor of its open file goes, so the lock ends with
// the process that held it, however that process ended. The descriptor is not inherited by
// programs the holder starts ([RUN] commands), which could otherwise outlive it and keep the
// lock.
#include "platform/machine_lock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <filesystem>

#include "platform/errors.h"
#include "platform/machine.h"
#include "platform/sync.h"

namespace plat {

namespace {

// flock has no time-out, so a contended lock is tried again at this interval.
constexpr std::uint32_t kRetryMs = 20;

void Pause(std::uint32_t milliseconds) {
    timespec pause{static_cast<time_t>(milliseconds / 1000), static_cast<long>(milliseconds % 1000) * 1000000L};
    while (nanosleep(&pause, &pause) != 0 && errno == EINTR) {
    }
}

}  // namespace

struct MachineLock::Impl {
    std::string name;
    int fd = -1;
};

MachineLock::MachineLock(const std::string& name) : impl_(std::make_unique<Impl>()) { impl_->name = name; }

MachineLock::~MachineLock() { Release(); }

bool MachineLock::Acquire(std::uint32_t milliseconds) {
    if (Held()) return true;
    const std::string root = machine::Root();
    std::error_code ignored;
    std::filesystem::create_directories(root, ignored);
    const int fd = open((root + "/" + impl_->name + ".lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0666);
    if (fd < 0) {
        SetLastErrorCode(ErrorFromErrno(errno));
        return false;
    }
    const std::uint32_t wait = detail::CappedMachineLockWait(milliseconds);
    const std::uint32_t start = TickCount();
    for (;;) {
        if (flock(fd, LOCK_EX | LOCK_NB) == 0) {
            impl_->fd = fd;
            return true;
        }
        const int err = errno;
        const std::uint32_t waited = TickCount() - start;  // unsigned: right across a wrap
        if (err != EWOULDBLOCK || waited >= wait) {
            close(fd);
            SetLastErrorCode(err == EWOULDBLOCK ? kErrorWaitTimeout : ErrorFromErrno(err));
            return false;
        }
        Pause(std::min(kRetryMs, wait - waited));
    }
}

void MachineLock::Release() {
    if (!Held()) return;
    close(impl_->fd);  // drops the flock
    impl_->fd = -1;
}

bool MachineLock::Held() const { return impl_->fd >= 0; }

}  // namespace plat
