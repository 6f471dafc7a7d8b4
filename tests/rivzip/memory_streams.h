// Test helpers for the SZDD codec: byte source and sink in memory (short reads and failures on
// demand), a recorder of progress reports, and sample data.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "rivzip/byte_stream.h"
#include "rivzip/compress_performance.h"

namespace rivziptest {

using Bytes = std::vector<std::uint8_t>;

class MemorySource : public rivzip::ByteSource {
public:
    explicit MemorySource(const Bytes& data, std::uint32_t maxChunk = UINT32_MAX) : data_(data), maxChunk_(maxChunk) {}
    std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) override;
    std::uint64_t failAfter = UINT64_MAX;  // every read fails once this many bytes were delivered
    std::uint64_t delivered = 0;

private:
    const Bytes& data_;
    std::uint32_t maxChunk_;
};

class MemorySink : public rivzip::ByteSink {
public:
    bool Write(const std::uint8_t* bytes, std::uint32_t count) override;
    Bytes data;
    std::uint64_t failAfter = UINT64_MAX;  // refuses a write that would pass this many bytes
    std::uint32_t largestWrite = 0;
    const MemorySource* watched = nullptr;  // its delivered count is noted at the first write
    std::uint64_t deliveredAtFirstWrite = 0;
};

// The progress function for tests: appends every report to Reports().
void Record(SCompressPerformance& report);
std::vector<SCompressPerformance>& Reports();

// Checks one operation's reports: a start with the total, a report at each 1 KiB boundary with
// processed growing and never past the total, an end with the final amount and the result.
void ExpectWellFormedReports(std::uint32_t total, std::uint32_t finalProcessed, std::int32_t result);

// Codec calls over memory; Compress expects success.
Bytes Compress(const Bytes& original, std::uint32_t maxChunk = UINT32_MAX);
std::int32_t Expand(const Bytes& szdd, Bytes* expanded, std::uint32_t maxChunk = UINT32_MAX);
// An SZDD header declaring the given length, followed by raw LZSS data.
Bytes Szdd(std::uint32_t declaredLength, const Bytes& data);

Bytes RandomBytes(std::size_t size, std::uint32_t seed);
Bytes TextLike(std::size_t size, std::uint32_t seed);

}  // namespace rivziptest
