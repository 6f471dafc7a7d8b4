// The compressor holds the original in one buffer: up to 4 KiB already coded (the matcher's
// history), then the bytes still to code. When fewer than kLookahead bytes are left to code it
// slides the buffer and reads the next block behind them.
#include "rivzip/szdd_compressor.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <new>

#include "rivzip/lzss_group_writer.h"
#include "rivzip/match_finder.h"
#include "rivzip/progress_reporter.h"
#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_format.h"

namespace rivzip {
namespace {

constexpr std::uint32_t kBlock = 64 * 1024;
// Bytes needed ahead of a position: a lazy look at the next position with a full-length match,
// and 3 bytes behind its end for the last hash insert.
constexpr std::uint32_t kLookahead = 1 + szdd::kMaxMatch + 3;
constexpr std::uint32_t kBufferSize = szdd::kWindowSize + kBlock + kLookahead;

class Compressor {
public:
    Compressor(ByteSource& source, ByteSink& sink, const CompressInput& input, RivzipProgressFn progress)
        : source_(source), input_(input), writer_(sink), reporter_(progress, kRivzipOperationCompress) {}
    std::int32_t Run();

private:
    bool Fill();
    std::int32_t CodeAll();
    bool CodeStep();
    MatchFinder::Match Find(std::uint64_t position);
    void InsertRange(std::uint64_t from, std::uint64_t to);
    bool Emit(std::uint64_t position, const MatchFinder::Match& match);
    const std::uint8_t* At(std::uint64_t position) const { return buffer_.get() + (position - base_); }
    std::uint64_t Available() const { return end_ - next_; }

    ByteSource& source_;
    CompressInput input_;
    LzssGroupWriter writer_;
    ProgressReporter reporter_;
    MatchFinder finder_;
    std::unique_ptr<std::uint8_t[]> buffer_;
    std::uint64_t base_ = 0;  // absolute position of buffer_[0]
    std::uint64_t next_ = 0;  // first position not yet coded
    std::uint64_t end_ = 0;   // end of the bytes read so far
    bool eof_ = false;
};

// Slides the buffer so that it keeps the matcher's history, then reads until it is full or the
// source ends. False on a read error.
bool Compressor::Fill() {
    std::uint64_t keepFrom = next_ > szdd::kWindowSize ? next_ - szdd::kWindowSize : 0;
    keepFrom = std::max(keepFrom, base_);
    std::memmove(buffer_.get(), At(keepFrom), end_ - keepFrom);
    base_ = keepFrom;
    while (!eof_ && end_ - base_ < kBufferSize) {
        std::int64_t got = source_.Read(buffer_.get() + (end_ - base_),
                                        static_cast<std::uint32_t>(kBufferSize - (end_ - base_)));
        if (got < 0) return false;
        eof_ = got == 0;
        end_ += got;
    }
    return true;
}

MatchFinder::Match Compressor::Find(std::uint64_t position) {
    std::uint64_t left = end_ - position;
    auto maxLength = static_cast<std::uint32_t>(std::min<std::uint64_t>(left, szdd::kMaxMatch));
    return finder_.FindAndInsert(At(position), position, maxLength);
}

// Inserts the positions [from, to) that still have 3 bytes behind them.
void Compressor::InsertRange(std::uint64_t from, std::uint64_t to) {
    for (std::uint64_t p = from; p < to && p + szdd::kMinMatch <= end_; ++p) finder_.Insert(At(p), p);
}

bool Compressor::Emit(std::uint64_t position, const MatchFinder::Match& match) {
    if (match.length == 0) return writer_.Literal(*At(position));
    return writer_.Match(szdd::RingPosition(match.source), match.length);
}

// Codes one literal or match at next_, looking one position further for a longer match.
bool Compressor::CodeStep() {
    std::uint64_t here = next_;
    MatchFinder::Match match = Find(here);
    if (match.length == 0) {
        next_ = here + 1;
        return Emit(here, match);
    }
    if (match.length < szdd::kMaxMatch && here + 1 < end_) {
        MatchFinder::Match later = Find(here + 1);
        if (later.length > match.length) {
            InsertRange(here + 2, here + 1 + later.length);
            next_ = here + 1 + later.length;
            return Emit(here, MatchFinder::Match{}) && Emit(here + 1, later);
        }
        InsertRange(here + 2, here + match.length);
    } else {
        InsertRange(here + 1, here + match.length);
    }
    next_ = here + match.length;
    return Emit(here, match);
}

std::int32_t Compressor::CodeAll() {
    for (;;) {
        if (Available() < kLookahead && !eof_) {
            if (!Fill()) return kRivzipReadError;
            if (end_ > input_.length) return kRivzipLengthMismatch;
        }
        if (Available() == 0) break;
        if (!CodeStep()) return kRivzipWriteError;
        reporter_.SetIo(end_, writer_.Written());
        reporter_.Advance(static_cast<std::uint32_t>(next_));
    }
    if (end_ < input_.length) return kRivzipTruncated;
    if (!writer_.Finish()) return kRivzipWriteError;
    return RivzipSuccess(writer_.Written());
}

std::int32_t Compressor::Run() {
    buffer_.reset(new (std::nothrow) std::uint8_t[kBufferSize]);
    if (!buffer_ || !writer_.Allocated()) return kRivzipNoMemory;
    std::uint8_t header[szdd::kHeaderSize];
    szdd::FormatHeader(szdd::Header{input_.missingChar, input_.length}, header);
    writer_.PutRaw(header, sizeof header);
    reporter_.Start(input_.length);
    std::int32_t result = CodeAll();
    reporter_.SetIo(end_, writer_.Written());
    reporter_.End(static_cast<std::uint32_t>(std::min<std::uint64_t>(next_, input_.length)), result);
    return result;
}

}  // namespace

std::int32_t CompressSzdd(ByteSource& source, ByteSink& sink, const CompressInput& input,
                          RivzipProgressFn progress) {
    Compressor compressor(source, sink, input, progress);
    return compressor.Run();
}

}  // namespace rivzip
