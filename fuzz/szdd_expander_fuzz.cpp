// The SZDD expander over any bytes, and the codec's round trip. A downloaded LZW file is
// whatever arrived, so the expander must fail cleanly on anything that is not a sound SZDD
// stream, and it must never hand the sink more than the header declares.
//
// First byte: bit 0 chooses the mode (0: expand the rest as SZDD data; 1: compress the rest,
// expand the result and compare), bits 1-7 the most bytes one read of the source delivers, so
// the block boundaries of the streaming code fall everywhere.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "rivzip/byte_stream.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"

namespace {

using Bytes = std::vector<std::uint8_t>;

void Check(bool condition) {
    if (!condition) std::abort();
}

class ChunkedSource : public rivzip::ByteSource {
public:
    ChunkedSource(const std::uint8_t* data, std::size_t size, std::uint32_t chunk)
        : data_(data), size_(size), chunk_(chunk) {}
    std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) override {
        const std::size_t n = std::min<std::size_t>({count, chunk_, size_ - at_});
        std::memcpy(buffer, data_ + at_, n);
        at_ += n;
        return static_cast<std::int64_t>(n);
    }

private:
    const std::uint8_t* data_;
    std::size_t size_;
    std::uint32_t chunk_;
    std::size_t at_ = 0;
};

class MemorySink : public rivzip::ByteSink {
public:
    explicit MemorySink(bool keep) : keep_(keep) {}
    bool Write(const std::uint8_t* data, std::uint32_t count) override {
        written += count;
        if (keep_) bytes.insert(bytes.end(), data, data + count);
        return true;
    }
    std::uint64_t written = 0;
    Bytes bytes;

private:
    bool keep_;
};

// Progress reports must stay within the declared total.
void Progress(SCompressPerformance& report) { Check(report.processed <= report.total); }

void ExpandAny(const std::uint8_t* data, std::size_t size, std::uint32_t chunk) {
    ChunkedSource source(data, size, chunk);
    MemorySink sink(false);
    const std::int32_t result = rivzip::ExpandSzdd(source, sink, Progress);
    rivzip::szdd::Header header;
    if (size < rivzip::szdd::kHeaderSize || !rivzip::szdd::ParseHeader(data, &header)) {
        Check(result < 0 && sink.written == 0);
        return;
    }
    Check(sink.written <= header.expandedLength);
    if (result >= 0) Check(sink.written == header.expandedLength);
}

void RoundTrip(const std::uint8_t* data, std::size_t size, std::uint32_t chunk) {
    ChunkedSource original(data, size, chunk);
    MemorySink compressed(true);
    rivzip::CompressInput input;
    input.length = static_cast<std::uint32_t>(size);
    input.missingChar = 'x';
    Check(rivzip::CompressSzdd(original, compressed, input, Progress) >= 0);

    ChunkedSource source(compressed.bytes.data(), compressed.bytes.size(), chunk);
    MemorySink expanded(true);
    Check(rivzip::ExpandSzdd(source, expanded, Progress) == static_cast<std::int32_t>(size));
    Check(expanded.bytes.size() == size && std::equal(expanded.bytes.begin(), expanded.bytes.end(), data));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::uint32_t chunk = (data[0] >> 1) == 0 ? 0xFFFFFFFFu : (data[0] >> 1);
    if (data[0] & 1) {
        RoundTrip(data + 1, size - 1, chunk);
    } else {
        ExpandAny(data + 1, size - 1, chunk);
    }
    return 0;
}
