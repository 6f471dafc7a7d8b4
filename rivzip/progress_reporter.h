// ProgressReporter: sends one operation's SCompressPerformance reports to the caller's progress
// function: one starting report, one report each time another kProgressBlock bytes of expanded
// data are done, and one ending report. Without a progress function it does nothing.
#pragma once
#include <cstdint>

#include "rivzip/compress_performance.h"

namespace rivzip {

class ProgressReporter {
public:
    // A report per 1 KiB of expanded data. The dispatcher passes on only every 2500th report,
    // so a coarser block (say the 64 KiB I/O block) would move its bar only every 160 MB and a
    // file below that would jump from empty to full; at 1 KiB the bar moves every 2.5 MB, at the
    // cost of one cheap call per KiB.
    static constexpr std::uint32_t kProgressBlock = 1024;

    ProgressReporter(RivzipProgressFn progress, std::uint16_t operation);

    // The starting report, with the total amount. Call once, first.
    void Start(std::uint32_t total);
    // Reports when processed has reached the next block boundary; call as work advances, with
    // processed growing by less than a block per call.
    void Advance(std::uint32_t processed) {
        if (processed >= nextReport_) Report(processed);
    }
    // The processed amount at which Advance reports next (never, without a progress function),
    // so that a tight loop can run up to it without calling Advance.
    std::uint64_t NextReport() const { return nextReport_; }
    // Byte counts carried in the records as extras.
    void SetIo(std::uint64_t bytesRead, std::uint64_t bytesWritten);
    // The ending report, with the final processed amount and the operation's result. Only
    // after Start.
    void End(std::uint32_t processed, std::int32_t result);

private:
    void Report(std::uint32_t processed);
    void Send();

    RivzipProgressFn progress_;
    SCompressPerformance record_{};
    std::uint64_t nextReport_;
};

}  // namespace rivzip
