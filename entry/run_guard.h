// Who may do the library's work: one run at a time in the process, one product run at a time
// on the machine.
//
// In the process: while a [RUN] install command waits for its program, the Windows build
// dispatches the host's window messages, so host code can call the library again from them, as
// it can from a progress callback. Such a nested run would, among the rest, clean up the
// backups that the run it interrupted still needs. It is refused: it traces one line and
// returns at once, touching nothing (no registry, no file, no progress call).
//
// On the machine: two host processes that update the same products at once undo each other's
// work (one removes the content file and the downloads that the other is still applying). A
// product run therefore holds the machine lock kProductRunLockName; a run of another process
// waits for it up to kProductRunLockWaitMs, then gives that product up as one failure, touching
// nothing; the next run applies it.
#pragma once
#include <cstdint>

#include "platform/machine_lock.h"

constexpr const char* kProductRunLockName = "Vantric.Mendler.ProductRun";
// Five minutes. A product run normally takes seconds; one whose [RUN] command waits for its
// program may take longer (up to ten minutes), and a host that started a second run is better
// told, as a failure of the product, than kept waiting for all of that.
constexpr std::uint32_t kProductRunLockWaitMs = 5 * 60 * 1000;

// Held by UpdateAll for the whole of its run.
class UpdateAllRun {
public:
    // Refused (Entered false), with its trace line, while a run is in progress in the process.
    // Entered, it gives the trace file another chance after a failed open in an earlier run.
    UpdateAllRun();
    ~UpdateAllRun();
    UpdateAllRun(const UpdateAllRun&) = delete;
    UpdateAllRun& operator=(const UpdateAllRun&) = delete;

    bool Entered() const { return entered_; }
    // Marks the next product run that this thread starts as this run's own, not a nested one.
    void HandOverToProduct();

private:
    bool entered_;
};

// Held by CManifestParser::ProcessUpdateInformation for the whole of its run.
class ProductRun {
public:
    // What ProcessUpdateInformation returns when its run is refused: one failure.
    static constexpr std::int32_t kRefusedResult = 1;

    // Refused, with a trace line, while a run is in progress in the process (other than the
    // UpdateAll that handed this run over), or when the machine lock stays held by another
    // process for kProductRunLockWaitMs. Entered on its own (not from UpdateAll), it gives the
    // trace file another chance after a failed open in an earlier run.
    ProductRun();
    ~ProductRun();
    ProductRun(const ProductRun&) = delete;
    ProductRun& operator=(const ProductRun&) = delete;

    bool Entered() const { return entered_; }

private:
    bool TakeMachineLock();

    bool entered_ = false;
    plat::MachineLock lock_;
};
