// InflateProgress: the SCompressPerformance reports of one zlib expansion (see InflateFile).
#pragma once
#include <cstdint>

#include "rivzip/compress_performance.h"

class InflateProgress {
public:
    // A report for every kStep bytes of compressed data, as fine as Rivzip.dll's, so the
    // dispatcher's thinning moves the bar at the same pace for both formats.
    static constexpr std::uint32_t kStep = 1024;

    // total: the compressed bytes that will be consumed. progress may be null (no reports).
    InflateProgress(void (*progress)(SCompressPerformance&), std::uint64_t total);

    void Start();
    // Reports each step boundary that consumed has passed since the last call.
    void Advance(std::uint64_t consumed);
    // The ending report, with the amount consumed and the operation's result. Only after Start.
    void End(std::int32_t result);

private:
    void Send();

    void (*progress_)(SCompressPerformance&);
    SCompressPerformance record_{};
    unsigned shift_ = 0;           // the unit is 2^shift_ bytes
    std::uint64_t consumed_ = 0;
    std::uint64_t nextReport_ = kStep;
};
