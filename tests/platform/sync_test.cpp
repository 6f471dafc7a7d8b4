// The recursive timed mutex that guards the trace file.
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

}  // namespace
