#include "rivzip/progress_reporter.h"

namespace rivzip {

ProgressReporter::ProgressReporter(RivzipProgressFn progress, std::uint16_t operation)
    : progress_(progress), nextReport_(progress ? kProgressBlock : UINT64_MAX) {
    record_.recordSize = sizeof(SCompressPerformance);
    record_.operation = operation;
}

void ProgressReporter::Start(std::uint32_t total) {
    record_.total = total;
    record_.starting = 1;
    Send();
    record_.starting = 0;
}

void ProgressReporter::SetIo(std::uint64_t bytesRead, std::uint64_t bytesWritten) {
    record_.bytesRead = static_cast<std::uint32_t>(bytesRead);
    record_.bytesWritten = static_cast<std::uint32_t>(bytesWritten);
}

void ProgressReporter::Report(std::uint32_t processed) {
    nextReport_ = (static_cast<std::uint64_t>(processed) / kProgressBlock + 1) * kProgressBlock;
    record_.processed = processed;
    Send();
}

void ProgressReporter::End(std::uint32_t processed, std::int32_t result) {
    record_.processed = processed;
    record_.ending = 1;
    record_.result = result;
    Send();
}

void ProgressReporter::Send() {
    // The callee may change the record it is given; it gets a copy so our counters stay ours.
    if (!progress_) return;
    SCompressPerformance copy = record_;
    progress_(copy);
}

}  // namespace rivzip
