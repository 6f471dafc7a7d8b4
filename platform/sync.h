// An unnamed recursive mutex with timed waits (the owning thread may take it again).
#pragma once
#include <cstdint>
#include <memory>

namespace plat {

class TimedMutex {
public:
    TimedMutex();
    ~TimedMutex();
    TimedMutex(const TimedMutex&) = delete;
    TimedMutex& operator=(const TimedMutex&) = delete;
    // Waits at most milliseconds; false when the wait timed out.
    bool Lock(std::uint32_t milliseconds);
    void Unlock();

private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

// Local time with milliseconds (GetLocalTime).
struct LocalTimeStamp {
    int year, month, day, hour, minute, second, millisecond;
};
LocalTimeStamp LocalTime();

// Milliseconds since an arbitrary start, wrapping at 2^32 (GetTickCount).
std::uint32_t TickCount();

}  // namespace plat
