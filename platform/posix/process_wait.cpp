// Waiting for host processes: a pidfd polled with the time-out where the kernel has one, short
// naps otherwise. Linux has no window messages, so input never arrives and dispatching is empty.
#include <poll.h>
#include <signal.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <climits>
#include <mutex>
#include <utility>
#include <vector>

#include "platform/errors.h"
#include "platform/posix/process_handle.h"

namespace plat::proc {

namespace {

using Clock = std::chrono::steady_clock;

std::mutex& OrphanLock() {
    static std::mutex m;
    return m;
}
std::vector<int>& Orphans() {
    static std::vector<int> pids;
    return pids;
}

std::uint32_t CodeOf(int status) {
    if (WIFEXITED(status)) return static_cast<std::uint32_t>(WEXITSTATUS(status));
    if (WIFSIGNALED(status)) return 128u + static_cast<std::uint32_t>(WTERMSIG(status));
    return 0;
}

// Reaps the process if it has ended; true when it has. A child that cannot be waited for
// (reaped elsewhere, SIGCHLD ignored) counts as ended, its code unknown (0).
bool Poll(Process& p) {
    if (ProcessAccess::Ended(p)) return true;
    int status = 0;
    pid_t r = waitpid(p.Id(), &status, WNOHANG);
    if (r == p.Id()) ProcessAccess::MarkEnded(p, CodeOf(status));
    if (r < 0 && errno == ECHILD) ProcessAccess::MarkEnded(p, 0);
    return ProcessAccess::Ended(p);
}

// Sleeps until the pid can be reaped or the deadline passes. A pidfd wakes at once when the
// child ends; without one (old kernels) we nap briefly between checks.
void Block(int pid, Clock::time_point deadline) {
    long fd = syscall(SYS_pidfd_open, pid, 0);
    auto left = [&] {
        auto ms = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
        return static_cast<int>(std::clamp<long long>(ms.count() + 1, 0, INT_MAX));
    };
    if (fd >= 0) {
        pollfd pfd{static_cast<int>(fd), POLLIN, 0};
        poll(&pfd, 1, left());
        close(static_cast<int>(fd));
        return;
    }
    timespec nap{0, 2 * 1000 * 1000};
    if (left() > 0) nanosleep(&nap, nullptr);
}

}  // namespace

void Orphan(int pid) {
    std::lock_guard<std::mutex> lock(OrphanLock());
    Orphans().push_back(pid);
}

void ReapOrphans() {
    std::lock_guard<std::mutex> lock(OrphanLock());
    auto& pids = Orphans();
    pids.erase(std::remove_if(pids.begin(), pids.end(),
                              [](int pid) {
                                  int status;
                                  pid_t r = waitpid(pid, &status, WNOHANG);
                                  return r == pid || (r < 0 && errno == ECHILD);
                              }),
               pids.end());
}

Process::Process(Process&& other) noexcept { *this = std::move(other); }

Process& Process::operator=(Process&& other) noexcept {
    if (this != &other) {
        Close();
        id_ = std::exchange(other.id_, 0);
        ended_ = other.ended_;
        exitCode_ = other.exitCode_;
    }
    return *this;
}

Process::~Process() { Close(); }

void Process::Close() {
    if (id_ > 0 && !Poll(*this)) Orphan(id_);
    id_ = 0;
    ended_ = false;
    exitCode_ = kStillActive;
}

WaitResult Wait(Process& p, std::uint32_t timeoutMs) {
    if (!p) {
        SetLastErrorCode(kErrorInvalidHandle);
        return WaitResult::Failed;
    }
    if (timeoutMs == kInfinite && !ProcessAccess::Ended(p)) {
        int status = 0;
        pid_t r;
        while ((r = waitpid(p.Id(), &status, 0)) < 0 && errno == EINTR) {}
        if (r == p.Id()) ProcessAccess::MarkEnded(p, CodeOf(status));
    }
    auto deadline = Clock::now() + std::chrono::milliseconds(timeoutMs);
    while (!Poll(p)) {
        if (Clock::now() >= deadline) return WaitResult::TimedOut;
        Block(p.Id(), deadline);
    }
    return WaitResult::Ended;
}

WaitResult WaitOrInput(Process& p, std::uint32_t timeoutMs) { return Wait(p, timeoutMs); }

void DispatchMessages() {}

bool ExitCode(Process& p, std::uint32_t* code) {
    if (!p) {
        SetLastErrorCode(kErrorInvalidHandle);
        return false;
    }
    *code = Poll(p) ? ProcessAccess::Code(p) : kStillActive;
    return true;
}

bool Terminate(Process& p, std::uint32_t exitCode) {
    if (!p) {
        SetLastErrorCode(kErrorInvalidHandle);
        return false;
    }
    if (Poll(p)) return true;  // already ended: nothing is left to end
    kill(p.Id(), SIGKILL);
    Wait(p, kInfinite);
    ProcessAccess::MarkEnded(p, exitCode);
    return true;
}

}  // namespace plat::proc
