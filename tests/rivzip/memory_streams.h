// Test helpers for the SZDD codec: byte sources and sinks in memory (with short reads and
// failures on demand), a recorder of progress reports, and sample data.
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
    explicit MemorySource(const Bytes& data, std::uint32_t maxChunk = 0xFFFFFFFFu)
        : data_(data), maxChunk_(maxChunk) {}
    // Fails every read once this many bytes were delivered.
    void FailAfter(std::uint64_t bytes) { failAfter_ = bytes; }
    std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) override;
    std::uint64_t Delivered() const { return offset_; }

private:
    const Bytes& data_;
    std::uint32_t maxChunk_;
    std::uint64_t offset_ = 0;
    std::uint64_t failAfter_ = UINT64_MAX;
};

class MemorySink : public rivzip::ByteSink {
public:
    // Refuses the write that would take it past this many bytes.
    void FailAfter(std::uint64_t bytes) { failAfter_ = bytes; }
    bool Write(const std::uint8_t* data, std::uint32_t count) override;
    Bytes data;
    std::uint32_t writes = 0;

private:
    std::uint64_t failAfter_ = UINT64_MAX;
};

// Collects the reports of the progress function Record (one recorder at a time).
class ProgressLog {
public:
    ProgressLog();
    ~ProgressLog();
    static void Record(SCompressPerformance& report);
    std::vector<SCompressPerformance> reports;
};

// Checks the shape of one operation's reports: a start with the total, middle reports at every
// 1 KiB boundary with processed growing, an end with the result. Adds test failures.
void ExpectWellFormedReports(const std::vector<SCompressPerformance>& reports, std::uint32_t total,
                             std::uint32_t finalProcessed, std::int32_t result);

// Codec calls over memory; Compress expects success.
Bytes Compress(const Bytes& original, std::uint32_t maxChunk = 0xFFFFFFFFu);
std::int32_t Expand(const Bytes& szdd, Bytes* expanded, std::uint32_t maxChunk = 0xFFFFFFFFu);

// SZDD data with the given declared length and raw LZSS data.
Bytes Szdd(std::uint32_t declaredLength, const Bytes& data);

// Sample data, the same for the same arguments.
Bytes RandomBytes(std::size_t size, std::uint32_t seed);
Bytes TextLike(std::size_t size, std::uint32_t seed);
Bytes Runs(std::size_t size);
Bytes AllByteValues(std::size_t size);

}  // namespace rivziptest
