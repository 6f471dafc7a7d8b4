// The SZDD expander on hand-made and hostile data: the format's window rules, every kind of bad
// input giving its negative result without writing past the declared length, progress reports,
// and streaming in fixed blocks.
#include <gtest/gtest.h>

#include <random>
#include <string>

#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"
#include "tests/rivzip/memory_streams.h"

namespace rivziptest {
namespace {

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

TEST(SzddExpander, FollowsTheWindowRules) {
    // The first write position is 4096 - 16; the window starts blank; an overlapping match
    // repeats; the position's high nibble sits in the second byte.
    EXPECT_EQ(ExpandText(Szdd(6, Cat({{0x07, 'a', 'b', 'c'}, M(4080, 3)}))), "abcabc");
    EXPECT_EQ(ExpandText(Szdd(5, Cat({{0x00}, M(7, 5)}))), "     ");
    EXPECT_EQ(ExpandText(Szdd(11, Cat({{0x03, 'x', 'y'}, M(4080, 9)}))), "xyxyxyxyxyx");
    EXPECT_EQ(ExpandText(Szdd(13, Cat({{0xFF}, Bytes(8, 'q'), {0x01, 'r'}, M(4087, 4)}))), "qqqqqqqqrqrqr");
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
    EXPECT_EQ(ExpandText(Szdd(4, {0x01, 'a', 0x10})), "[-2]") << "a match cut after its first byte";
    for (std::uint32_t declared : {0u, 65536u, 200499u, 200501u, 0xFFFFFFFFu}) {
        Bytes lying = good;
        rivzip::szdd::FormatHeader({0, declared}, lying.data());
        Bytes out;
        EXPECT_EQ(Expand(lying, &out), declared < 200500 ? kRivzipLengthMismatch : kRivzipTruncated);
        EXPECT_LE(out.size(), declared) << "wrote past the declared length";
    }
    // A flag byte without items after a full group carries no data; an item past the end does.
    EXPECT_EQ(ExpandText(Szdd(8, Cat({{0xFF}, Bytes(8, 'a'), {0x00}}))), "aaaaaaaa");
    EXPECT_EQ(ExpandText(Szdd(1, {0x03, 'a', 'b'})), "[-5]");
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

TEST(SzddExpander, ReadAndWriteFailuresGiveTheirCodes) {
    Bytes good = Compress(RandomBytes(300000, 16));
    for (std::uint64_t at : {0, 10, 70000, 200000}) {
        MemorySource source(good);
        source.failAfter = at;
        MemorySink sink;
        EXPECT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), kRivzipReadError) << at;
    }
    for (std::uint64_t at : {0, 250000}) {
        MemorySource source(good);
        MemorySink sink;
        sink.failAfter = at;
        EXPECT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), kRivzipWriteError) << at;
    }
}

TEST(SzddExpander, ReportsStartOneReportPerBlockAndEnd) {
    for (std::uint32_t size : {0u, 1u, 1024u, 66560u, 400000u}) {
        Bytes szdd = Compress(TextLike(size, 17));
        MemorySource source(szdd);
        MemorySink sink;
        Reports().clear();
        std::int32_t result = rivzip::ExpandSzdd(source, sink, &Record);
        ASSERT_EQ(result, static_cast<std::int32_t>(size));
        ExpectWellFormedReports(size, size, result);
        EXPECT_EQ(Reports().back().bytesRead, szdd.size());
    }
    // A failure still ends what it started; a file that is no SZDD starts nothing.
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
