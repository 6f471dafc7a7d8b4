#include "rivzip/lzss_group_writer.h"

#include <cstring>
#include <new>

#include "rivzip/szdd_format.h"

namespace rivzip {
namespace {
constexpr std::uint32_t kBlock = 64 * 1024;
// A block, then one whole group that may start just before the block is full.
constexpr std::uint32_t kBufferSize = kBlock + szdd::kMaxGroupInput + szdd::kHeaderSize;
}  // namespace

LzssGroupWriter::LzssGroupWriter(ByteSink& sink)
    : sink_(sink), buffer_(new (std::nothrow) std::uint8_t[kBufferSize]) {}

void LzssGroupWriter::PutRaw(const std::uint8_t* bytes, std::uint32_t count) {
    std::memcpy(buffer_.get() + used_, bytes, count);
    used_ += count;
}

void LzssGroupWriter::OpenGroup() {
    if (items_ < 8) return;
    flagIndex_ = used_;
    buffer_[used_++] = 0;
    items_ = 0;
}

bool LzssGroupWriter::Literal(std::uint8_t byte) {
    OpenGroup();
    buffer_[flagIndex_] |= static_cast<std::uint8_t>(1u << items_);
    buffer_[used_++] = byte;
    return EndItem();
}

bool LzssGroupWriter::Match(std::uint32_t ringPosition, std::uint32_t length) {
    OpenGroup();
    buffer_[used_++] = static_cast<std::uint8_t>(ringPosition);
    buffer_[used_++] = static_cast<std::uint8_t>(((ringPosition >> 4) & 0xF0) | (length - szdd::kMinMatch));
    return EndItem();
}

// A block goes out only between groups, so a flag byte is never written before its items.
bool LzssGroupWriter::EndItem() {
    if (++items_ < 8 || used_ < kBlock) return true;
    return FlushBlock();
}

bool LzssGroupWriter::FlushBlock() {
    if (used_ == 0) return true;
    if (!sink_.Write(buffer_.get(), used_)) return false;
    written_ += used_;
    used_ = 0;
    return true;
}

bool LzssGroupWriter::Finish() {
    items_ = 8;
    return FlushBlock();
}

}  // namespace rivzip
