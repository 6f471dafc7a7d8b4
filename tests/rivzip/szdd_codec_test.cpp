// The SZDD compressor and expander over memory: whatever goes in comes back, whatever its size,
// content or the way the source hands it over; the compressor compresses; the expander follows
// the format's window rules on hand-made data (cases/szdd_expand.txt) and gives every kind of
// bad input its negative result without writing past the declared length; failures, progress
// reports, and streaming in fixed blocks.
#include <gtest/gtest.h>

#include <random>
#include <string>

#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"
#include "tests/rivzip/memory_streams.h"
#include "tests/support/case_file.h"

namespace rivziptest {
namespace {

void ExpectRoundTrip(const Bytes& original, std::uint32_t maxChunk = UINT32_MAX) {
    Bytes back;
    ASSERT_EQ(Expand(Compress(original, maxChunk), &back, maxChunk), static_cast<std::int32_t>(original.size()));
    EXPECT_TRUE(back == original) << "size " << original.size();
}

// Expands and gives the text, or the result code in brackets.
std::string ExpandText(const Bytes& szdd) {
    Bytes out;
    std::int32_t result = Expand(szdd, &out);
    return result >= 0 ? std::string(out.begin(), out.end()) : "[" + std::to_string(result) + "]";
}

Bytes Cat(std::initializer_list<Bytes> parts) {
    Bytes out;
    for (const Bytes& p : parts) out.insert(out.end(), p.begin(), p.end());
    return out;
}

// A match item of the given ring position and length.
Bytes M(std::uint32_t position, std::uint32_t length) {
    return {static_cast<std::uint8_t>(position), static_cast<std::uint8_t>(((position >> 4) & 0xF0) | (length - 3))};
}

TEST(SzddRoundTrip, SizesAroundEveryEdgeKindsOfContentAndShortReads) {
    // Around the match lengths, the window, the 1 KiB report and the 64 KiB I/O blocks.
    for (std::size_t size : {0, 1, 2, 3, 17, 18, 19, 1024, 4095, 4096, 4097, 65535, 65536, 65537, 69632, 131073}) {
        ExpectRoundTrip(TextLike(size, 1));
        ExpectRoundTrip(RandomBytes(size, 2));
    }
    Bytes allValues(70000), runs(200000), megabytes;
    for (std::size_t i = 0; i < allValues.size(); ++i) allValues[i] = static_cast<std::uint8_t>(i);
    for (std::size_t i = 0; i < runs.size(); ++i) runs[i] = static_cast<std::uint8_t>(i / 1000 % 3 ? i / 1000 : 0);
    for (std::uint32_t part = 0; part < 8; ++part) {
        Bytes piece = part % 2 ? TextLike(400000, part) : RandomBytes(100000, part);
        megabytes.insert(megabytes.end(), piece.begin(), piece.end());
    }
    for (const Bytes& b : {allValues, runs, Bytes(100000, ' '), Bytes(100000, 0), megabytes}) ExpectRoundTrip(b);
    for (std::uint32_t chunk : {1u, 7u, 17u, 4099u}) ExpectRoundTrip(TextLike(20000, chunk), chunk);
}

TEST(SzddCompressor, CompressesAndBoundsGrowth) {
    EXPECT_LT(Compress(TextLike(100000, 4)).size(), 50000u);
    EXPECT_LT(Compress(Bytes(100000, 0)).size(), 100000u / 8);
    // Incompressible data costs the header and one flag byte per eight literals.
    EXPECT_LE(Compress(RandomBytes(100000, 5)).size(), 14u + 100000 + 12500);
}

TEST(SzddExpander, FollowsTheWindowRules) {
    for (const pextest::Case& c : pextest::ReadCases("rivzip/cases/szdd_expand.txt")) {
        SCOPED_TRACE(c.where);
        const std::string data = pextest::Unescape(c[1]);
        EXPECT_EQ(ExpandText(Szdd(std::stoul(c[0]), Bytes(data.begin(), data.end()))), pextest::Unescape(c[2]));
    }
    // A match at the position about to be written reaches back the whole window.
    Bytes data;
    for (int group = 0; group < 512; ++group) data = Cat({data, {0xFF}, Bytes(8, static_cast<std::uint8_t>(group))});
    std::string out = ExpandText(Szdd(4099, Cat({data, {0x00}, M(rivzip::szdd::RingPosition(4096), 3)})));
    EXPECT_EQ(out.substr(4096), std::string(3, '\0'));
}

TEST(SzddExpander, RejectsHeadersTruncationsAndLyingLengths) {
    Bytes original = Cat({TextLike(200000, 13), RandomBytes(500, 13)});
    Bytes good = Compress(original);
    for (std::size_t size = 0; size < 14; ++size) EXPECT_EQ(ExpandText(Bytes(good.begin(), good.begin() + size)), "[-1]");
    for (std::size_t at : {0, 4, 7, 8}) {  // the magic and the mode byte
        Bytes bad = good;
        bad[at] ^= 0x01;
        EXPECT_EQ(ExpandText(bad), "[-1]") << at;
    }
    for (std::size_t size = 14; size < good.size(); size += 1 + size / 50) {
        EXPECT_EQ(ExpandText(Bytes(good.begin(), good.begin() + size)), "[-2]") << size;
    }
    for (std::uint32_t declared : {0u, 65536u, 200499u, 200501u, 0xFFFFFFFFu}) {
        Bytes lying = good;
        rivzip::szdd::FormatHeader({0, declared}, lying.data());
        Bytes out;
        EXPECT_EQ(Expand(lying, &out), declared < 200500 ? kRivzipLengthMismatch : kRivzipTruncated);
        EXPECT_LE(out.size(), declared) << "wrote past the declared length";
    }
}

TEST(SzddExpander, RandomDataNeverOverrunsTheDeclaredLength) {
    std::mt19937 rng(15);
    for (int round = 0; round < 300; ++round) {
        std::uint32_t declared = rng() % 5000;
        Bytes out;
        std::int32_t result = Expand(Szdd(declared, RandomBytes(rng() % 1500, rng())), &out, 1 + rng() % 64);
        EXPECT_TRUE(result >= 0 ? out.size() == declared
                                : out.size() <= declared && (result == kRivzipTruncated || result == kRivzipLengthMismatch));
    }
}

// A source that fails or holds another length than stated, or a sink that refuses, in either
// direction.
TEST(SzddCodec, FailuresGiveTheirCodes) {
    const Bytes original = RandomBytes(300000, 7), packed = Compress(original);
    auto run = [&](bool compress, std::uint64_t readFails, std::uint64_t writeFails, std::uint32_t stated = 300000) {
        MemorySource source(compress ? original : packed);
        source.failAfter = readFails;
        MemorySink sink;
        sink.failAfter = writeFails;
        return compress ? rivzip::CompressSzdd(source, sink, {stated, 0}, nullptr)
                        : rivzip::ExpandSzdd(source, sink, nullptr);
    };
    EXPECT_EQ(run(true, UINT64_MAX, UINT64_MAX, 300001), kRivzipTruncated) << "the source was shorter than stated";
    EXPECT_EQ(run(true, UINT64_MAX, UINT64_MAX, 299999), kRivzipLengthMismatch) << "and longer";
    EXPECT_EQ(run(true, 70000, UINT64_MAX), kRivzipReadError);
    EXPECT_EQ(run(true, UINT64_MAX, 100000), kRivzipWriteError);
    for (std::uint64_t at : {0, 10, 70000, 200000}) EXPECT_EQ(run(false, at, UINT64_MAX), kRivzipReadError) << at;
    for (std::uint64_t at : {0, 250000}) EXPECT_EQ(run(false, UINT64_MAX, at), kRivzipWriteError) << at;
}

// Both directions report over the original: a start, one report per block and an end. A failed
// expansion still ends what it started; a file that is no SZDD starts nothing.
TEST(SzddCodec, ReportsStartOneReportPerBlockAndEnd) {
    for (std::uint32_t size : {0u, 1u, 1024u, 66560u, 300001u}) {
        const Bytes original = TextLike(size, 17);
        MemorySource source(original);
        MemorySink packed, expanded;
        Reports().clear();
        ExpectWellFormedReports(size, size, rivzip::CompressSzdd(source, packed, {size, 0}, &Record));
        EXPECT_EQ(Reports().back().operation, kRivzipOperationCompress);
        EXPECT_EQ(Reports().back().bytesWritten, packed.data.size());

        MemorySource szdd(packed.data);
        Reports().clear();
        ASSERT_EQ(rivzip::ExpandSzdd(szdd, expanded, &Record), static_cast<std::int32_t>(size));
        ExpectWellFormedReports(size, size, static_cast<std::int32_t>(size));
        EXPECT_EQ(Reports().back().bytesRead, packed.data.size());
    }
    Bytes cut = Compress(TextLike(10000, 18));
    cut.resize(cut.size() / 2);
    Bytes notSzdd(100, 'x');
    MemorySource source(cut), other(notSzdd);
    MemorySink sink;
    Reports().clear();
    EXPECT_EQ(rivzip::ExpandSzdd(source, sink, &Record), kRivzipTruncated);
    EXPECT_EQ(Reports().back().result, kRivzipTruncated);
    Reports().clear();
    EXPECT_EQ(rivzip::ExpandSzdd(other, sink, &Record), kRivzipBadHeader);
    EXPECT_TRUE(Reports().empty());
}

TEST(SzddExpander, StreamsInFixedBlocks) {
    Bytes szdd = Compress(Bytes(20000000, 0));
    MemorySource source(szdd);
    MemorySink sink;
    sink.watched = &source;
    ASSERT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), 20000000);
    // Output leaves in blocks of about 64 KiB, the first long before the source is used up.
    EXPECT_LE(sink.largestWrite, 65536u + rivzip::szdd::kMaxGroupOutput);
    EXPECT_LE(sink.deliveredAtFirstWrite, 2u * (65536 + 17));
    EXPECT_GT(szdd.size(), 2000000u);
}

}  // namespace
}  // namespace rivziptest
