// LzssGroupWriter: packs literals and matches into SZDD flag groups and writes them to a sink
// in blocks of 64 KiB.
#pragma once
#include <cstdint>
#include <memory>

#include "rivzip/byte_stream.h"

namespace rivzip {

class LzssGroupWriter {
public:
    explicit LzssGroupWriter(ByteSink& sink);
    bool Allocated() const { return buffer_ != nullptr; }

    // Raw bytes ahead of the data (the header); only before the first item.
    void PutRaw(const std::uint8_t* bytes, std::uint32_t count);
    // One literal byte. False when a full block could not be written.
    bool Literal(std::uint8_t byte);
    // A match of 3..18 bytes copied from the given ring position. False on a write failure.
    bool Match(std::uint32_t ringPosition, std::uint32_t length);
    // Writes what is left, the last group partly filled. False on a write failure.
    bool Finish();

    std::uint64_t Written() const { return written_; }

private:
    void OpenGroup();
    bool EndItem();
    bool FlushBlock();

    ByteSink& sink_;
    std::unique_ptr<std::uint8_t[]> buffer_;
    std::uint32_t used_ = 0;
    std::uint32_t flagIndex_ = 0;  // where the open group's flag byte sits
    int items_ = 8;                // items in the open group; 8 means none is open
    std::uint64_t written_ = 0;
};

}  // namespace rivzip
