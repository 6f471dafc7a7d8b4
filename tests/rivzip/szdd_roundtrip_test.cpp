// The SZDD compressor and expander together: whatever goes in comes back, whatever its size,
// content or the way the source hands it over, and the compressor actually compresses.
#include <gtest/gtest.h>

#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"
#include "tests/rivzip/memory_streams.h"

namespace rivziptest {
namespace {

void ExpectRoundTrip(const Bytes& original, std::uint32_t maxChunk = 0xFFFFFFFFu) {
    Bytes szdd = Compress(original, maxChunk);
    Bytes back;
    ASSERT_EQ(Expand(szdd, &back, maxChunk), static_cast<std::int32_t>(original.size()));
    ASSERT_EQ(back.size(), original.size());
    EXPECT_TRUE(back == original) << "size " << original.size();
}

TEST(SzddRoundTrip, SmallAndEdgeSizes) {
    // Around the match lengths, the window, the 64 KiB I/O blocks and the 1 KiB report blocks.
    for (std::size_t size : {0, 1, 2, 3, 4, 17, 18, 19, 1023, 1024, 1025, 4078, 4095, 4096, 4097, 8192,
                             65535, 65536, 65537, 65536 + 4096, 131071, 131072, 131073}) {
        ExpectRoundTrip(TextLike(size, 1));
        ExpectRoundTrip(RandomBytes(size, 2));
    }
}

TEST(SzddRoundTrip, ContentKinds) {
    ExpectRoundTrip(AllByteValues(256));
    ExpectRoundTrip(AllByteValues(70000));
    ExpectRoundTrip(Runs(200000));
    ExpectRoundTrip(Bytes(100000, 0x20));  // the window's own fill byte
    ExpectRoundTrip(Bytes(100000, 0x00));
}

TEST(SzddRoundTrip, SeveralMegabytesOfMixedData) {
    Bytes original;
    for (std::uint32_t part = 0; part < 12; ++part) {
        Bytes piece = part % 3 == 0 ? RandomBytes(150000, part) : part % 3 == 1 ? TextLike(300000, part)
                                                                                 : Runs(250000);
        original.insert(original.end(), piece.begin(), piece.end());
    }
    ExpectRoundTrip(original);
}

TEST(SzddRoundTrip, ShortReadsOnBothSides) {
    Bytes original = TextLike(50000, 3);
    for (std::uint32_t chunk : {1u, 2u, 7u, 17u, 4099u}) ExpectRoundTrip(original, chunk);
}

TEST(SzddCompressor, CompressesAndBoundsGrowth) {
    Bytes text = TextLike(100000, 4);
    EXPECT_LT(Compress(text).size(), text.size() / 2);
    Bytes zeros(100000, 0);
    EXPECT_LT(Compress(zeros).size(), zeros.size() / 8);
    // Incompressible data costs one flag byte per eight literals, and the header.
    Bytes noise = RandomBytes(100000, 5);
    EXPECT_LE(Compress(noise).size(), rivzip::szdd::kHeaderSize + noise.size() + (noise.size() + 7) / 8);
}

TEST(SzddCompressor, WritesHeaderWithLengthAndMissingCharacter) {
    Bytes original = TextLike(300, 6);
    MemorySource source(original);
    MemorySink sink;
    ASSERT_GE(rivzip::CompressSzdd(source, sink, {300, 'l'}, nullptr), 0);
    rivzip::szdd::Header header;
    ASSERT_TRUE(rivzip::szdd::ParseHeader(sink.data.data(), &header));
    EXPECT_EQ(header.expandedLength, 300u);
    EXPECT_EQ(header.missingChar, 'l');
}

TEST(SzddCompressor, SourceThatDisagreesWithItsStatedLengthFails) {
    Bytes original = TextLike(5000, 7);
    MemorySource shorter(original);
    MemorySink sink1;
    EXPECT_EQ(rivzip::CompressSzdd(shorter, sink1, {5001, 0}, nullptr), kRivzipTruncated);
    MemorySource longer(original);
    MemorySink sink2;
    EXPECT_EQ(rivzip::CompressSzdd(longer, sink2, {4999, 0}, nullptr), kRivzipLengthMismatch);
}

TEST(SzddCompressor, ReadAndWriteFailuresGiveTheirCodes) {
    Bytes original = RandomBytes(300000, 8);
    MemorySource failing(original);
    failing.FailAfter(70000);
    MemorySink sink;
    EXPECT_EQ(rivzip::CompressSzdd(failing, sink, {300000, 0}, nullptr), kRivzipReadError);
    MemorySource source(original);
    MemorySink full;
    full.FailAfter(100000);
    EXPECT_EQ(rivzip::CompressSzdd(source, full, {300000, 0}, nullptr), kRivzipWriteError);
}

TEST(SzddCompressor, ReportsProgressOverTheOriginal) {
    for (std::size_t size : {0, 1000, 1024, 70000, 300001}) {
        Bytes original = TextLike(size, 9);
        MemorySource source(original);
        MemorySink sink;
        ProgressLog log;
        auto length = static_cast<std::uint32_t>(size);
        std::int32_t result = rivzip::CompressSzdd(source, sink, {length, 0}, &ProgressLog::Record);
        ASSERT_GE(result, 0);
        ExpectWellFormedReports(log.reports, length, length, result);
        EXPECT_EQ(log.reports.front().operation, kRivzipOperationCompress);
        EXPECT_EQ(log.reports.back().bytesWritten, sink.data.size());
    }
}

}  // namespace
}  // namespace rivziptest
