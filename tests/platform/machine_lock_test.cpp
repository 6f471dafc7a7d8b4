// The machine lock: one holder at a time among all the threads of a machine's processes, and a
// bounded wait that tests can cap. A holder killed with its lock: entry/run_guard_test.
#include "platform/machine_lock.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <future>

#include "platform/errors.h"
#include "tests/support/test_machine.h"

namespace {

constexpr char kName[] = "Vantric.PexTest.Lock";

// Whether a fresh lock object on another thread gets the lock within milliseconds, and the
// last error when it does not.
std::pair<bool, std::uint32_t> AcquireElsewhere(const char* name, std::uint32_t milliseconds) {
    return std::async(std::launch::async, [=] {
               plat::MachineLock other(name);
               const bool held = other.Acquire(milliseconds);
               return std::make_pair(held, held ? 0u : plat::LastError());
           }).get();
}

class MachineLockTest : public ::testing::Test {
protected:
    void TearDown() override { plat::SetMachineLockWaitCap(plat::kNoMachineLockWaitCap); }
    pextest::TestMachine machine;
};

TEST_F(MachineLockTest, OneHolderAtATimeUntilItReleases) {
    plat::MachineLock lock(kName);
    ASSERT_TRUE(lock.Acquire(0));
    EXPECT_TRUE(lock.Acquire(0)) << "held already";
    EXPECT_EQ(AcquireElsewhere(kName, 50), std::make_pair(false, std::uint32_t{plat::kErrorWaitTimeout}));
    EXPECT_TRUE(AcquireElsewhere("Vantric.PexTest.Other", 0).first) << "another name is another lock";

    // A wait of ten minutes, capped for tests, gives up at once.
    plat::SetMachineLockWaitCap(0);
    EXPECT_FALSE(AcquireElsewhere(kName, 10 * 60 * 1000).first);

    lock.Release();
    EXPECT_FALSE(lock.Held());
    EXPECT_TRUE(AcquireElsewhere(kName, 0).first);
    {
        plat::MachineLock scoped(kName);
        ASSERT_TRUE(scoped.Acquire(0));
    }
    EXPECT_TRUE(AcquireElsewhere(kName, 0).first) << "the destructor releases";
}

#ifndef _WIN32
// A lock whose file cannot be made is not held, and says why (not a time-out).
TEST_F(MachineLockTest, ALockThatCannotBeMadeIsNotHeld) {
    std::filesystem::create_directories(machine.Root() + "/" + kName + ".lock");
    plat::MachineLock lock(kName);
    EXPECT_FALSE(lock.Acquire(0));
    EXPECT_FALSE(lock.Held());
    EXPECT_NE(plat::LastError(), plat::kErrorWaitTimeout);
}
#endif

}  // namespace
