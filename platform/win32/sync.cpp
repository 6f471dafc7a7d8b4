// The timed mutex is a Windows mutex (recursive by nature); time comes from the system clock.
#include "platform/sync.h"

#include "platform/win32/handle.h"

namespace plat {

struct TimedMutex::Impl {
    win32::Handle mutex{::CreateMutexA(nullptr, FALSE, nullptr)};
};

TimedMutex::TimedMutex() : impl_(std::make_unique<Impl>()) {}
TimedMutex::~TimedMutex() = default;

bool TimedMutex::Lock(std::uint32_t milliseconds) {
    // An owner that ended without releasing (abandoned) still hands the mutex over.
    const DWORD r = ::WaitForSingleObject(impl_->mutex.get(), milliseconds);
    return r == WAIT_OBJECT_0 || r == WAIT_ABANDONED;
}

void TimedMutex::Unlock() {
    ::ReleaseMutex(impl_->mutex.get());
}

LocalTimeStamp LocalTime() {
    SYSTEMTIME t;
    ::GetLocalTime(&t);
    return {t.wYear, t.wMonth, t.wDay, t.wHour, t.wMinute, t.wSecond, t.wMilliseconds};
}

std::uint32_t TickCount() { return ::GetTickCount(); }

}  // namespace plat
