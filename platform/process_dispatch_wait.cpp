// The responsive wait: a wait on the process that wakes for window messages, dispatches them
// and goes on waiting for what is left of the time-out. Portable over the backend's
// WaitOrInput and DispatchMessages.
#include "platform/process.h"
#include "platform/sync.h"

namespace plat::proc {

WaitResult WaitDispatching(Process& process, std::uint32_t timeoutMs, bool dispatchMessages) {
    if (!dispatchMessages) return Wait(process, timeoutMs);
    std::uint32_t remaining = timeoutMs;
    std::uint32_t since = TickCount();
    for (;;) {
        WaitResult r = WaitOrInput(process, remaining);
        if (r != WaitResult::Input) return r;
        DispatchMessages();
        if (timeoutMs == kInfinite) continue;
        std::uint32_t now = TickCount();
        // A tick counter that wrapped since the last look counts from zero.
        std::uint32_t elapsed = now >= since ? now - since : now;
        remaining = elapsed < remaining ? remaining - elapsed : 0;
        since = now;
    }
}

}  // namespace plat::proc
