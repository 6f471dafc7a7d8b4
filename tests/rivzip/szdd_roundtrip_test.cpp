// The SZDD compressor and expander together: whatever goes in comes back, whatever its size,
// content or the way the source hands it over; and the compressor compresses.
#include <gtest/gtest.h>

#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_compressor.h"
#include "tests/rivzip/memory_streams.h"

namespace rivziptest {
namespace {

void ExpectRoundTrip(const Bytes& original, std::uint32_t maxChunk = UINT32_MAX) {
    Bytes back;
    ASSERT_EQ(Expand(Compress(original, maxChunk), &back, maxChunk), static_cast<std::int32_t>(original.size()));
    EXPECT_TRUE(back == original) << "size " << original.size();
}

TEST(SzddRoundTrip, SizesAroundEveryEdgeAndKindsOfContent) {
    // Around the match lengths, the window, the 1 KiB report and the 64 KiB I/O blocks.
    for (std::size_t size : {0, 1, 2, 3, 17, 18, 19, 1024, 4095, 4096, 4097, 65535, 65536, 65537, 69632, 131073}) {
        ExpectRoundTrip(TextLike(size, 1));
        ExpectRoundTrip(RandomBytes(size, 2));
    }
    Bytes allValues(70000), runs(200000);
    for (std::size_t i = 0; i < allValues.size(); ++i) allValues[i] = static_cast<std::uint8_t>(i);
    for (std::size_t i = 0; i < runs.size(); ++i) runs[i] = static_cast<std::uint8_t>(i / 1000 % 3 ? i / 1000 : 0);
    for (const Bytes& b : {allValues, runs, Bytes(100000, ' '), Bytes(100000, 0)}) ExpectRoundTrip(b);
}

TEST(SzddRoundTrip, SeveralMegabytesAndShortReads) {
    Bytes original;
    for (std::uint32_t part = 0; part < 8; ++part) {
        Bytes piece = part % 2 ? TextLike(400000, part) : RandomBytes(100000, part);
        original.insert(original.end(), piece.begin(), piece.end());
    }
    ExpectRoundTrip(original);
    for (std::uint32_t chunk : {1u, 7u, 17u, 4099u}) ExpectRoundTrip(TextLike(20000, chunk), chunk);
}

TEST(SzddCompressor, CompressesAndBoundsGrowth) {
    EXPECT_LT(Compress(TextLike(100000, 4)).size(), 50000u);
    EXPECT_LT(Compress(Bytes(100000, 0)).size(), 100000u / 8);
    // Incompressible data costs the header and one flag byte per eight literals.
    EXPECT_LE(Compress(RandomBytes(100000, 5)).size(), 14u + 100000 + 12500);
}

TEST(SzddCompressor, FailuresGiveTheirCodes) {
    Bytes original = RandomBytes(300000, 7);
    auto run = [&](std::uint32_t statedLength, std::uint64_t readFails, std::uint64_t writeFails) {
        MemorySource source(original);
        source.failAfter = readFails;
        MemorySink sink;
        sink.failAfter = writeFails;
        return rivzip::CompressSzdd(source, sink, {statedLength, 0}, nullptr);
    };
    EXPECT_EQ(run(300001, UINT64_MAX, UINT64_MAX), kRivzipTruncated) << "the source was shorter than stated";
    EXPECT_EQ(run(299999, UINT64_MAX, UINT64_MAX), kRivzipLengthMismatch) << "and longer";
    EXPECT_EQ(run(300000, 70000, UINT64_MAX), kRivzipReadError);
    EXPECT_EQ(run(300000, UINT64_MAX, 100000), kRivzipWriteError);
}

TEST(SzddCompressor, ReportsProgressOverTheOriginal) {
    for (std::uint32_t size : {0u, 1024u, 300001u}) {
        Bytes original = TextLike(size, 9);
        MemorySource source(original);
        MemorySink sink;
        Reports().clear();
        std::int32_t result = rivzip::CompressSzdd(source, sink, {size, 0}, &Record);
        ExpectWellFormedReports(size, size, result);
        EXPECT_EQ(Reports().back().operation, kRivzipOperationCompress);
        EXPECT_EQ(Reports().back().bytesWritten, sink.data.size());
    }
}

}  // namespace
}  // namespace rivziptest
