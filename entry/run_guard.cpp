// The run guards: the process's run state and the machine lock around each product run.
#include "entry/run_guard.h"

#include <mutex>
#include <thread>

#include "diag/trace_log.h"
#include "platform/errors.h"

namespace {

// Guarded by a mutex so that a run started on another thread is refused as well.
struct RunState {
    std::mutex mutex;
    bool updateAll = false;             // an UpdateAll run is in progress
    bool product = false;               // a product run is in progress
    std::thread::id productHandedOver;  // the thread whose next product run is UpdateAll's own
};

RunState& State() {
    static RunState state;
    return state;
}

std::uint32_t Seconds(std::uint32_t milliseconds) { return milliseconds / 1000; }

}  // namespace

UpdateAllRun::UpdateAllRun() {
    RunState& state = State();
    {
        const std::lock_guard<std::mutex> hold(state.mutex);
        entered_ = !state.updateAll && !state.product;
        if (entered_) state.updateAll = true;
    }
    if (!entered_) {
        TRACE(g_TraceLog, "UpdateAll, a run is already in progress in this process, returning at once");
        return;
    }
    g_TraceLog.ResumeFileOutput();
}

UpdateAllRun::~UpdateAllRun() {
    if (!entered_) return;
    RunState& state = State();
    const std::lock_guard<std::mutex> hold(state.mutex);
    state.updateAll = false;
    state.productHandedOver = std::thread::id();
}

void UpdateAllRun::HandOverToProduct() {
    RunState& state = State();
    const std::lock_guard<std::mutex> hold(state.mutex);
    if (entered_) state.productHandedOver = std::this_thread::get_id();
}

ProductRun::ProductRun() : lock_(kProductRunLockName) {
    RunState& state = State();
    bool alone = false;
    {
        const std::lock_guard<std::mutex> hold(state.mutex);
        const bool handedOver = state.updateAll && state.productHandedOver == std::this_thread::get_id();
        entered_ = !state.product && (!state.updateAll || handedOver);
        if (entered_) {
            state.product = true;
            state.productHandedOver = std::thread::id();
            alone = !state.updateAll;
        }
    }
    if (!entered_) {
        TRACE(g_TraceLog,
              "CManifestParser: ProcessUpdateInformation, a run is already in progress in this process, returning %d",
              static_cast<int>(kRefusedResult));
        return;
    }
    if (alone) g_TraceLog.ResumeFileOutput();
    if (TakeMachineLock()) return;
    const std::lock_guard<std::mutex> hold(state.mutex);
    state.product = false;
    entered_ = false;
}

ProductRun::~ProductRun() {
    if (!entered_) return;
    lock_.Release();  // before the next product run of this process may ask for it
    RunState& state = State();
    const std::lock_guard<std::mutex> hold(state.mutex);
    state.product = false;
}

bool ProductRun::TakeMachineLock() {
    if (lock_.Acquire(0)) return true;
    std::uint32_t error = plat::LastError();  // before a trace line can change it
    if (error == plat::kErrorWaitTimeout) {
        TRACE(g_TraceLog,
              "CManifestParser: ProcessUpdateInformation, another process is updating this machine, waiting up to "
              "%u seconds",
              Seconds(kProductRunLockWaitMs));
        if (lock_.Acquire(kProductRunLockWaitMs)) return true;
        error = plat::LastError();
    }
    TRACE(g_TraceLog,
          "CManifestParser: ProcessUpdateInformation, the machine's update lock was not obtained (error %u), "
          "returning %d",
          error, static_cast<int>(kRefusedResult));
    return false;
}
