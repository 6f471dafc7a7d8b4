// Marks tests that only make sense on one target of the platform. On Windows the machine is
// the real one, so the tests of the Linux emulation itself (machine roots, dosdevices and
// the Z: drive, flock as "in use", fork, ELF sections, POSIX shells) have nothing to test.
#pragma once
#include <gtest/gtest.h>

// First statement of a test that exercises only the Linux emulation: skipped on Windows.
#ifdef _WIN32
#define PEX_LINUX_ONLY() GTEST_SKIP() << "exercises the Linux emulation only"
#else
#define PEX_LINUX_ONLY() static_cast<void>(0)
#endif

// First statement of a test of behaviour that Windows has but Wine does not show, with why.
#ifdef _WIN32
#define PEX_NOT_UNDER_WINE(why) \
    if (::pextest::UnderWine()) GTEST_SKIP() << "not shown under Wine: " << (why)
#else
#define PEX_NOT_UNDER_WINE(why) static_cast<void>(0)
#endif

namespace pextest {
// True when the program runs under Wine (it exports wine_get_version from ntdll).
bool UnderWine();

// Why the tests of a file in use at the restart cannot pass under Wine.
constexpr const char* kWineSetupApi =
    "its SetupInstallFileEx stages the file in the temporary folder, queues the rename without "
    "replacing the target and does not report the target in use";
}  // namespace pextest
