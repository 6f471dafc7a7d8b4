#include "decompress/inflate_progress.h"

InflateProgress::InflateProgress(void (*progress)(SCompressPerformance&), std::uint64_t total)
    : progress_(progress) {
    while ((total >> shift_) > 0xFFFFFFFFu) ++shift_;
    record_.recordSize = sizeof record_;
    record_.operation = kRivzipOperationExpand;
    record_.total = static_cast<std::uint32_t>(total >> shift_);
}

void InflateProgress::Start() {
    record_.starting = 1;
    Send();
    record_.starting = 0;
}

void InflateProgress::Advance(std::uint64_t consumed) {
    consumed_ = consumed;
    if (!progress_) return;
    while (consumed_ >= nextReport_) {
        record_.processed = static_cast<std::uint32_t>(nextReport_ >> shift_);
        Send();
        nextReport_ += kStep;
    }
}

void InflateProgress::End(std::int32_t result) {
    record_.processed = static_cast<std::uint32_t>(consumed_ >> shift_);
    record_.bytesRead = static_cast<std::uint32_t>(consumed_);
    record_.ending = 1;
    record_.result = result;
    Send();
}

void InflateProgress::Send() {
    if (progress_) progress_(record_);
}
