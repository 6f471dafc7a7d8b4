// A module's application object starts when the module is loaded, before any of its entries can
// be called, and stops when the module is freed: on Windows through the C run-time's DllMain,
// on Linux through the loader's constructors and destructors. The module is PexAppModule.dll,
// built beside this test program.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <string>

#include "platform/library.h"
#include "platform/registry.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace {

// How often the module's hook of that name ran.
std::uint32_t Runs(const char* hook) {
    std::string bytes;
    std::uint32_t count = 0;
    if (pextest::GetRegValue(plat::reg::kCurrentUser, "Software\\Vantric\\PexAppModule", hook, &bytes) &&
        bytes.size() == sizeof count) {
        std::memcpy(&count, bytes.data(), sizeof count);
    }
    return count;
}

TEST(ModuleHooks, LoadingStartsTheApplicationAndFreeingStopsIt) {
    pextest::TestMachine m;
    plat::lib::Library module(plat::lib::Load("PexAppModule.dll"));
    ASSERT_TRUE(module);
    EXPECT_EQ(Runs("Started"), 1u);
    EXPECT_EQ(Runs("Stopped"), 0u);
    auto initialized = reinterpret_cast<bool (*)()>(plat::lib::FindExport(module.get(), "PexAppInitialized"));
    ASSERT_NE(initialized, nullptr);
    EXPECT_TRUE(initialized());

    module.Reset();
    EXPECT_EQ(Runs("Started"), 1u);
    EXPECT_EQ(Runs("Stopped"), 1u);
}

}  // namespace
