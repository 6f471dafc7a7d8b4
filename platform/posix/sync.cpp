#include "platform/sync.h"

#include <chrono>
#include <ctime>
#include <mutex>

namespace plat {

struct TimedMutex::Impl {
    std::recursive_timed_mutex mutex;
};

TimedMutex::TimedMutex() : impl_(std::make_unique<Impl>()) {}
TimedMutex::~TimedMutex() = default;

bool TimedMutex::Lock(std::uint32_t milliseconds) {
    return impl_->mutex.try_lock_for(std::chrono::milliseconds(milliseconds));
}

void TimedMutex::Unlock() {
    impl_->mutex.unlock();
}

LocalTimeStamp LocalTime() {
    timespec now{};
    clock_gettime(CLOCK_REALTIME, &now);
    tm local{};
    localtime_r(&now.tv_sec, &local);
    return {local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour,
            local.tm_min,         local.tm_sec,     static_cast<int>(now.tv_nsec / 1000000)};
}

std::uint32_t TickCount() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    auto ms = static_cast<std::uint64_t>(now.tv_sec) * 1000u + static_cast<std::uint64_t>(now.tv_nsec) / 1000000u;
    return static_cast<std::uint32_t>(ms);
}

}  // namespace plat
