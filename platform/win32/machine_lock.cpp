// The machine lock on Windows: a mutex named "Global\<name>", shared by the processes of every
// session. Windows hands a mutex whose owner ended without releasing it to the next waiter as
// abandoned, which counts as acquired: the lock ends with the thread that held it.
#include "platform/machine_lock.h"

#include <utility>

#include "platform/errors.h"
#include "platform/win32/handle.h"

namespace plat {

struct MachineLock::Impl {
    std::string name;
    win32::Handle mutex;
    bool held = false;
};

MachineLock::MachineLock(const std::string& name) : impl_(std::make_unique<Impl>()) { impl_->name = name; }

MachineLock::~MachineLock() { Release(); }

namespace {

// A mutex made by a process of another user may refuse full access; waiting and releasing is
// all the lock needs.
HANDLE OpenOrCreate(const std::string& name) {
    HANDLE mutex = ::CreateMutexA(nullptr, FALSE, name.c_str());
    if (mutex == nullptr && ::GetLastError() == ERROR_ACCESS_DENIED)
        mutex = ::OpenMutexA(SYNCHRONIZE | MUTEX_MODIFY_STATE, FALSE, name.c_str());
    return mutex;
}

}  // namespace

bool MachineLock::Acquire(std::uint32_t milliseconds) {
    if (Held()) return true;
    win32::Handle mutex(OpenOrCreate("Global\\" + impl_->name));
    if (!mutex) {
        SetLastErrorCode(static_cast<std::uint32_t>(::GetLastError()));
        return false;
    }
    const DWORD r = ::WaitForSingleObject(mutex.get(), detail::CappedMachineLockWait(milliseconds));
    if (r != WAIT_OBJECT_0 && r != WAIT_ABANDONED) {
        SetLastErrorCode(r == WAIT_TIMEOUT ? kErrorWaitTimeout : static_cast<std::uint32_t>(::GetLastError()));
        return false;
    }
    impl_->mutex = std::move(mutex);
    impl_->held = true;
    return true;
}

void MachineLock::Release() {
    if (!Held()) return;
    ::ReleaseMutex(impl_->mutex.get());
    impl_->mutex.Reset();
    impl_->held = false;
}

bool MachineLock::Held() const { return impl_->held; }

}  // namespace plat
