// The recursive timed mutex that guards the trace file.
#include "platform/sync.h"

#include <gtest/gtest.h>

#include <future>

namespace {

// The owner may take it again and must release every hold; meanwhile another thread's timed
// wait fails.
TEST(TimedMutexTest, OwnerMayTakeItAgainAndOthersWaitInVainUntilEveryHoldIsReleased) {
    plat::TimedMutex mutex;
    ASSERT_TRUE(mutex.Lock(500));
    ASSERT_TRUE(mutex.Lock(500));
    mutex.Unlock();
    EXPECT_FALSE(std::async(std::launch::async, [&] { return mutex.Lock(20); }).get());
    mutex.Unlock();
    EXPECT_TRUE(std::async(std::launch::async, [&] {
                    bool locked = mutex.Lock(500);
                    if (locked) mutex.Unlock();
                    return locked;
                }).get());
}

}  // namespace
