// A lock shared by every process of the machine, known by its name: a named mutex in the global
// namespace on Windows, a file in the machine root held with flock on the emulated machine. It
// dies with its holder: a process that ends while holding it (killed, crashed) leaves it free.
#pragma once
#include <cstdint>
#include <memory>
#include <string>

namespace plat {

class MachineLock {
public:
    // name: letters, digits and dots; the same name means the same lock in every process.
    explicit MachineLock(const std::string& name);
    ~MachineLock();  // releases the lock when held
    MachineLock(const MachineLock&) = delete;
    MachineLock& operator=(const MachineLock&) = delete;

    // Waits at most milliseconds (shortened by SetMachineLockWaitCap) for the lock. True when
    // this object holds it, also when its previous holder ended without releasing it. False
    // when the wait timed out (last error 258) or the lock cannot be made (its error); the
    // lock is then not held. On Windows the mutex belongs to the calling thread, so the thread
    // that acquired it releases it. Holding it already: true at once.
    bool Acquire(std::uint32_t milliseconds);
    void Release();
    bool Held() const;

private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

// For tests, which must not wait out a bound of minutes: every later Acquire waits at most
// this many milliseconds (0: it tries once). The cap stays until it is set again;
// kNoMachineLockWaitCap removes it.
constexpr std::uint32_t kNoMachineLockWaitCap = 0xFFFFFFFFu;
void SetMachineLockWaitCap(std::uint32_t milliseconds);

namespace detail {
// The wait that Acquire applies: the smaller of the request and the cap.
std::uint32_t CappedMachineLockWait(std::uint32_t milliseconds);
}  // namespace detail

}  // namespace plat
