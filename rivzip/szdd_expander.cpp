// The expander keeps the expanded data in one linear buffer: 4096 bytes of history (at first the
// window's blanks), then the block being produced. A match is a copy from a fixed distance back
// in that buffer, so the inner loop needs no ring arithmetic on the data and no per-byte bounds
// checks: it only runs while a whole flag group of input is at hand and a whole group of output
// fits. The last few bytes of the input go through a checked slow path.
#include "rivzip/szdd_expander.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <new>

#include "rivzip/progress_reporter.h"
#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_format.h"

namespace rivzip {
namespace {

using szdd::kMaxGroupInput;
using szdd::kMaxGroupOutput;
using szdd::kMaxMatch;
using szdd::kWindowMask;
using szdd::kWindowSize;

constexpr std::uint32_t kInputBlock = 64 * 1024;
constexpr std::uint32_t kInputBufferSize = kInputBlock + kMaxGroupInput;
constexpr std::uint32_t kOutputBlock = 64 * 1024;
// History, one block, one more group that may start just before the block is full, and room
// for a match copied as a fixed 18 bytes although it is shorter.
constexpr std::uint32_t kOutputBufferSize = kWindowSize + kOutputBlock + kMaxGroupOutput + kMaxMatch;

class Expander {
public:
    Expander(ByteSource& source, ByteSink& sink, RivzipProgressFn progress)
        : source_(source), sink_(sink), reporter_(progress, kRivzipOperationExpand) {}
    std::int32_t Run();

private:
    bool Allocate();
    bool Refill();
    std::int32_t ReadHeader(szdd::Header* header);
    std::int32_t DecodeAll(std::uint64_t declared);
    void DecodeFastGroups(const std::uint8_t* stop);
    bool DecodeTailGroup();
    bool Flush();
    std::uint8_t* CopyMatch(std::uint8_t* out, std::uint32_t b0, std::uint32_t b1) const;
    std::uint64_t Produced() const { return written_ + (out_ - (outBuf_.get() + kWindowSize)); }

    ByteSource& source_;
    ByteSink& sink_;
    ProgressReporter reporter_;
    std::unique_ptr<std::uint8_t[]> inBuf_, outBuf_;
    const std::uint8_t* in_ = nullptr;
    const std::uint8_t* inEnd_ = nullptr;
    bool eof_ = false;
    std::uint8_t* out_ = nullptr;
    // Ring position of outBuf_[i] is (i + ringBias_) & kWindowMask.
    std::uint32_t ringBias_ = szdd::kFirstRingPosition - kWindowSize;
    std::uint64_t read_ = 0, written_ = 0;
};

bool Expander::Allocate() {
    inBuf_.reset(new (std::nothrow) std::uint8_t[kInputBufferSize]);
    outBuf_.reset(new (std::nothrow) std::uint8_t[kOutputBufferSize]);
    if (!inBuf_ || !outBuf_) return false;
    std::memset(outBuf_.get(), szdd::kWindowFill, kWindowSize);
    in_ = inEnd_ = inBuf_.get();
    out_ = outBuf_.get() + kWindowSize;
    return true;
}

// Moves the unread rest to the front and reads once more behind it; sets eof_ at the end.
bool Expander::Refill() {
    std::size_t rest = inEnd_ - in_;
    std::memmove(inBuf_.get(), in_, rest);
    std::int64_t got = source_.Read(inBuf_.get() + rest, static_cast<std::uint32_t>(kInputBufferSize - rest));
    if (got < 0) return false;
    in_ = inBuf_.get();
    inEnd_ = in_ + rest + got;
    eof_ = got == 0;
    read_ += got;
    return true;
}

std::int32_t Expander::ReadHeader(szdd::Header* header) {
    while (inEnd_ - in_ < szdd::kHeaderSize && !eof_) {
        if (!Refill()) return kRivzipReadError;
    }
    if (inEnd_ - in_ < szdd::kHeaderSize || !szdd::ParseHeader(in_, header)) return kRivzipBadHeader;
    in_ += szdd::kHeaderSize;
    return 0;
}

inline std::uint8_t* Expander::CopyMatch(std::uint8_t* out, std::uint32_t b0, std::uint32_t b1) const {
    std::uint32_t position = b0 | ((b1 & 0xF0) << 4);
    std::uint32_t length = (b1 & 0x0F) + szdd::kMinMatch;
    std::uint32_t here = static_cast<std::uint32_t>(out - outBuf_.get()) + ringBias_;
    std::uint32_t distance = ((here - position - 1) & kWindowMask) + 1;  // 1..4096
    const std::uint8_t* from = out - distance;
    if (distance >= kMaxMatch) {
        std::memcpy(out, from, kMaxMatch);  // no overlap; the bytes past length are rewritten later
    } else {
        for (std::uint32_t i = 0; i < length; ++i) out[i] = from[i];  // overlapping: a repeat
    }
    return out + length;
}

// Decodes whole groups while a complete group of input is buffered and out_ is below stop.
void Expander::DecodeFastGroups(const std::uint8_t* stop) {
    const std::uint8_t* in = in_;
    const std::uint8_t* inSafe = inEnd_ - kMaxGroupInput;
    std::uint8_t* out = out_;
    while (in <= inSafe && out < stop) {
        std::uint32_t flags = *in++;
        if (flags == 0xFF) {
            // Eight literals: what incompressible stretches are made of, copied without testing
            // each flag (a branch that noise makes unpredictable).
            std::memcpy(out, in, 8);
            in += 8;
            out += 8;
            continue;
        }
        for (int item = 0; item < 8; ++item, flags >>= 1) {
            if (flags & 1) {
                *out++ = *in++;
            } else {
                out = CopyMatch(out, in[0], in[1]);
                in += 2;
            }
        }
    }
    in_ = in;
    out_ = out;
}

// One group at the very end of the input, checking every byte; false when a match is cut off.
bool Expander::DecodeTailGroup() {
    std::uint32_t flags = *in_++;
    for (int item = 0; item < 8 && in_ < inEnd_; ++item, flags >>= 1) {
        if (flags & 1) {
            *out_++ = *in_++;
        } else {
            if (inEnd_ - in_ < 2) return false;
            out_ = CopyMatch(out_, in_[0], in_[1]);
            in_ += 2;
        }
    }
    return true;
}

// Writes the produced block and keeps its last 4096 bytes as the history of the next one.
bool Expander::Flush() {
    std::uint8_t* block = outBuf_.get() + kWindowSize;
    std::uint32_t count = static_cast<std::uint32_t>(out_ - block);
    if (count == 0) return true;
    if (!sink_.Write(block, count)) return false;
    written_ += count;
    std::memmove(outBuf_.get(), out_ - kWindowSize, kWindowSize);
    out_ = block;
    ringBias_ += count;
    return true;
}

std::int32_t Expander::DecodeAll(std::uint64_t declared) {
    std::uint8_t* const flushAt = outBuf_.get() + kWindowSize + kOutputBlock;
    for (;;) {
        std::uint64_t produced = Produced();
        if (produced > declared) return kRivzipLengthMismatch;
        reporter_.SetIo(read_, written_);
        reporter_.Advance(static_cast<std::uint32_t>(produced));
        if (out_ >= flushAt && !Flush()) return kRivzipWriteError;
        if (inEnd_ - in_ < kMaxGroupInput && !eof_) {
            if (!Refill()) return kRivzipReadError;
            continue;
        }
        if (inEnd_ - in_ >= kMaxGroupInput) {
            // Run until the block is full, the next report is due or the data overshoots.
            std::uint64_t room = std::min<std::uint64_t>(declared + 1, reporter_.NextReport()) - Produced();
            std::uint8_t* stop = out_ + std::min<std::uint64_t>(room, flushAt - out_);
            DecodeFastGroups(stop);
        } else if (in_ < inEnd_) {
            if (!DecodeTailGroup()) return kRivzipTruncated;
        } else {
            break;
        }
    }
    if (!Flush()) return kRivzipWriteError;
    return Produced() == declared ? RivzipSuccess(declared) : kRivzipTruncated;
}

std::int32_t Expander::Run() {
    if (!Allocate()) return kRivzipNoMemory;
    szdd::Header header;
    std::int32_t result = ReadHeader(&header);
    if (result < 0) return result;
    reporter_.Start(header.expandedLength);
    result = DecodeAll(header.expandedLength);
    // Never less than an earlier report: bytes produced but not written still count.
    std::uint64_t done = std::min<std::uint64_t>(Produced(), header.expandedLength);
    reporter_.SetIo(read_, written_);
    reporter_.End(static_cast<std::uint32_t>(done), result);
    return result;
}

}  // namespace

std::int32_t ExpandSzdd(ByteSource& source, ByteSink& sink, RivzipProgressFn progress) {
    Expander expander(source, sink, progress);
    return expander.Run();
}

}  // namespace rivzip
