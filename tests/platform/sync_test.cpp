// The recursive timed mutex and the clocks that the trace log uses.
#include "platform/sync.h"

#include <gtest/gtest.h>

#include <future>
#include <thread>

namespace {

TEST(TimedMutexTest, OwnerMayTakeItAgainAndMustReleaseEveryHold) {
    plat::TimedMutex mutex;
    ASSERT_TRUE(mutex.Lock(500));
    ASSERT_TRUE(mutex.Lock(500));
    mutex.Unlock();
    // Still held once: another thread cannot have it.
    EXPECT_FALSE(std::async(std::launch::async, [&] { return mutex.Lock(0); }).get());
    mutex.Unlock();
    EXPECT_TRUE(std::async(std::launch::async, [&] {
                    bool locked = mutex.Lock(500);
                    if (locked) mutex.Unlock();
                    return locked;
                }).get());
}

TEST(TimedMutexTest, WaitFailsWhileAnotherThreadHoldsIt) {
    plat::TimedMutex mutex;
    std::promise<void> held, release;
    std::thread holder([&] {
        mutex.Lock(500);
        held.set_value();
        release.get_future().wait();
        mutex.Unlock();
    });
    held.get_future().wait();
    EXPECT_FALSE(mutex.Lock(20));
    release.set_value();
    holder.join();
    EXPECT_TRUE(mutex.Lock(500));
    mutex.Unlock();
}

TEST(LocalTimeTest, FieldsAreCalendarValues) {
    plat::LocalTimeStamp t = plat::LocalTime();
    EXPECT_GE(t.year, 2000);
    EXPECT_TRUE(t.month >= 1 && t.month <= 12);
    EXPECT_TRUE(t.day >= 1 && t.day <= 31);
    EXPECT_TRUE(t.hour >= 0 && t.hour <= 23);
    EXPECT_TRUE(t.minute >= 0 && t.minute <= 59);
    EXPECT_TRUE(t.second >= 0 && t.second <= 60);
    EXPECT_TRUE(t.millisecond >= 0 && t.millisecond <= 999);
}

}  // namespace
