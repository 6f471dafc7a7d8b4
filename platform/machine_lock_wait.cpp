// The tests' cap on machine-lock waits, shared by both backends.
#include <algorithm>
#include <atomic>

#include "platform/machine_lock.h"

namespace plat {

namespace {
std::atomic<std::uint32_t> g_cap{kNoMachineLockWaitCap};
}  // namespace

void SetMachineLockWaitCap(std::uint32_t milliseconds) { g_cap = milliseconds; }

std::uint32_t detail::CappedMachineLockWait(std::uint32_t milliseconds) { return std::min(milliseconds, g_cap.load()); }

}  // namespace plat
