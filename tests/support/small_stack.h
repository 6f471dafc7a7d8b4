// Runs work on a thread of its own with a stack of a chosen size and waits for it. The main
// thread of a Windows program has 1 MiB of stack, far less than a Linux main thread, and
// std::thread cannot choose; code that recurses must stay inside that. The work should record
// its results for the calling thread to check rather than assert itself.
#pragma once
#include <cstddef>
#include <functional>

namespace pextest {

constexpr std::size_t kWindowsMainStack = 1u << 20;

// False when no thread could be started (the work did not run).
bool RunOnStack(std::size_t stackBytes, const std::function<void()>& work);

}  // namespace pextest
