// The SZDD expander on hand-made and hostile data: the format's window rules, every kind of bad
// input giving its negative result without writing past the declared length, progress reports,
// and streaming with fixed buffers.
#include <gtest/gtest.h>

#include <random>
#include <string>

#include "rivzip/progress_reporter.h"
#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"
#include "tests/rivzip/memory_streams.h"

namespace rivziptest {
namespace {

std::string AsText(const Bytes& b) { return std::string(b.begin(), b.end()); }

// A match item's two bytes.
Bytes Match(std::uint32_t ringPosition, std::uint32_t length) {
    return {static_cast<std::uint8_t>(ringPosition),
            static_cast<std::uint8_t>(((ringPosition >> 4) & 0xF0) | (length - 3))};
}

Bytes Cat(std::initializer_list<Bytes> parts) {
    Bytes out;
    for (const Bytes& p : parts) out.insert(out.end(), p.begin(), p.end());
    return out;
}

TEST(SzddExpander, FollowsTheWindowRules) {
    Bytes out;
    // Literals then a copy of them from the first write position, 4096 - 16.
    EXPECT_EQ(Expand(Szdd(6, Cat({{0x07, 'a', 'b', 'c'}, Match(4080, 3)})), &out), 6);
    EXPECT_EQ(AsText(out), "abcabc");
    // The window starts out blank, wherever a match points before anything was written.
    EXPECT_EQ(Expand(Szdd(5, Cat({{0x00}, Match(7, 5)})), &out), 5);
    EXPECT_EQ(AsText(out), "     ");
    // A match overlapping the bytes it writes repeats them.
    EXPECT_EQ(Expand(Szdd(11, Cat({{0x03, 'x', 'y'}, Match(4080, 9)})), &out), 11);
    EXPECT_EQ(AsText(out), "xyxyxyxyxyx");
    // Two flag groups; the high nibble of the position is in the second byte.
    Bytes eight = Cat({{0xFF}, Bytes(8, 'q'), {0x01, 'r'}, Match(4080 + 7, 4)});
    EXPECT_EQ(Expand(Szdd(13, eight), &out), 13);
    EXPECT_EQ(AsText(out), "qqqqqqqqrqrqr");
}

TEST(SzddExpander, MatchReachesBackTheWholeWindow) {
    // 4096 literals, then a match at the ring position about to be written: the byte 4096 back.
    Bytes original = RandomBytes(4096, 11);
    Bytes data;
    for (std::size_t i = 0; i < original.size(); i += 8) {
        data.push_back(0xFF);
        data.insert(data.end(), original.begin() + i, original.begin() + i + 8);
    }
    Bytes tail = Cat({{0x00}, Match(rivzip::szdd::RingPosition(4096), 5)});
    Bytes out;
    ASSERT_EQ(Expand(Szdd(4101, Cat({data, tail})), &out), 4101);
    EXPECT_TRUE(Bytes(out.begin(), out.begin() + 4096) == original);
    EXPECT_TRUE(Bytes(out.begin() + 4096, out.end()) == Bytes(original.begin(), original.begin() + 5));
}

TEST(SzddExpander, RejectsWhatIsNoSzddHeader) {
    Bytes good = Compress(TextLike(1000, 12));
    Bytes out;
    for (std::size_t size = 0; size < rivzip::szdd::kHeaderSize; ++size) {
        EXPECT_EQ(Expand(Bytes(good.begin(), good.begin() + size), &out), kRivzipBadHeader) << size;
    }
    for (std::size_t at : {0, 3, 4, 7, 8}) {  // the magic and the mode byte
        Bytes bad = good;
        bad[at] ^= 0x01;
        EXPECT_EQ(Expand(bad, &out), kRivzipBadHeader) << at;
        EXPECT_TRUE(out.empty());
    }
    Bytes kwaj = good;
    std::copy_n("KWAJ", 4, kwaj.begin());
    EXPECT_EQ(Expand(kwaj, &out), kRivzipBadHeader);
}

TEST(SzddExpander, EveryTruncationFails) {
    Bytes original = Cat({TextLike(3000, 13), RandomBytes(500, 13)});
    Bytes good = Compress(original);
    Bytes out;
    for (std::size_t size = rivzip::szdd::kHeaderSize; size < good.size(); ++size) {
        EXPECT_EQ(Expand(Bytes(good.begin(), good.begin() + size), &out), kRivzipTruncated) << size;
        EXPECT_TRUE(std::equal(out.begin(), out.end(), original.begin()));
    }
    // A match cut after its first byte, at the very end of the data.
    EXPECT_EQ(Expand(Szdd(4, Cat({{0x01, 'a'}, {0x10}})), &out), kRivzipTruncated);
}

TEST(SzddExpander, DeclaredLengthMustMatchTheData) {
    Bytes original = TextLike(200000, 14);
    Bytes good = Compress(original);
    Bytes out;
    for (std::uint32_t declared : {0u, 1u, 65536u, 199999u}) {
        Bytes lying = good;
        rivzip::szdd::FormatHeader({0, declared}, lying.data());
        EXPECT_EQ(Expand(lying, &out), kRivzipLengthMismatch) << declared;
        EXPECT_LE(out.size(), declared) << "wrote past the declared length";
    }
    for (std::uint32_t declared : {200001u, 0xFFFFFFFFu}) {
        Bytes lying = good;
        rivzip::szdd::FormatHeader({0, declared}, lying.data());
        EXPECT_EQ(Expand(lying, &out), kRivzipTruncated) << declared;
        EXPECT_TRUE(out == original);
    }
    // Extra items after the last one are more data than declared; a flag byte with no item
    // after a full group carries none.
    EXPECT_EQ(Expand(Szdd(1, {0x03, 'a', 'b'}), &out), kRivzipLengthMismatch);
    EXPECT_EQ(Expand(Szdd(8, Cat({{0xFF}, Bytes(8, 'a'), {0x00}})), &out), 8);
}

TEST(SzddExpander, RandomDataAfterAHeaderNeverOverrunsTheDeclaredLength) {
    std::mt19937 rng(15);
    Bytes out;
    for (int round = 0; round < 300; ++round) {
        std::uint32_t declared = rng() % 5000;
        Bytes input = Szdd(declared, RandomBytes(rng() % 1500, rng()));
        std::int32_t result = Expand(input, &out, 1 + rng() % 64);
        EXPECT_LE(out.size(), declared);
        if (result >= 0) EXPECT_EQ(out.size(), declared);
        else EXPECT_TRUE(result == kRivzipTruncated || result == kRivzipLengthMismatch) << result;
    }
}

TEST(SzddExpander, ReadAndWriteFailuresGiveTheirCodes) {
    Bytes good = Compress(RandomBytes(300000, 16));
    for (std::uint64_t at : {0, 10, 14, 70000, 200000}) {
        MemorySource source(good);
        source.FailAfter(at);
        MemorySink sink;
        EXPECT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), kRivzipReadError) << at;
    }
    for (std::uint64_t at : {0, 65535, 250000}) {
        MemorySource source(good);
        MemorySink sink;
        sink.FailAfter(at);
        EXPECT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), kRivzipWriteError) << at;
    }
}

TEST(SzddExpander, ReportsStartOneReportPerBlockAndEnd) {
    for (std::size_t size : {0, 1, 1023, 1024, 5000, 65536 + 1024, 400000}) {
        Bytes szdd = Compress(TextLike(size, 17));
        MemorySource source(szdd);
        MemorySink sink;
        ProgressLog log;
        std::int32_t result = rivzip::ExpandSzdd(source, sink, &ProgressLog::Record);
        ASSERT_EQ(result, static_cast<std::int32_t>(size));
        auto total = static_cast<std::uint32_t>(size);
        ExpectWellFormedReports(log.reports, total, total, result);
        EXPECT_EQ(log.reports.front().operation, kRivzipOperationExpand);
        EXPECT_EQ(log.reports.back().bytesRead, szdd.size());
        EXPECT_EQ(log.reports.back().bytesWritten, size);
    }
}

TEST(SzddExpander, ReportsEndAfterAFailureButNothingForABadHeader) {
    Bytes szdd = Compress(TextLike(10000, 18));
    szdd.resize(szdd.size() / 2);
    ProgressLog log;
    MemorySource source(szdd);
    MemorySink sink;
    EXPECT_EQ(rivzip::ExpandSzdd(source, sink, &ProgressLog::Record), kRivzipTruncated);
    ASSERT_FALSE(log.reports.empty());
    EXPECT_TRUE(log.reports.front().starting && log.reports.back().ending);
    EXPECT_EQ(log.reports.back().result, kRivzipTruncated);
    EXPECT_LE(log.reports.back().processed, 10000u);

    log.reports.clear();
    Bytes notSzdd(100, 'x');
    MemorySource other(notSzdd);
    EXPECT_EQ(rivzip::ExpandSzdd(other, sink, &ProgressLog::Record), kRivzipBadHeader);
    EXPECT_TRUE(log.reports.empty());
}

// Data that expands to 144 bytes per group of eight full-length matches, made as it is read, so
// neither side of the test holds the whole file.
class GeneratedSource : public rivzip::ByteSource {
public:
    explicit GeneratedSource(std::uint32_t groups) : groups_(groups) {
        rivzip::szdd::FormatHeader({0, groups * 144}, header_);
    }
    std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) override {
        std::uint32_t n = 0;
        for (; n < count && offset_ < rivzip::szdd::kHeaderSize + 17ull * groups_; ++n, ++offset_) {
            buffer[n] = offset_ < rivzip::szdd::kHeaderSize ? header_[offset_] : GroupByte((offset_ - 14) % 17);
        }
        return n;
    }
    std::uint64_t offset_ = 0;

private:
    static std::uint8_t GroupByte(std::uint64_t i) { return i == 0 ? 0x00 : (i % 2 ? 0x30 : 0x0F); }
    std::uint32_t groups_;
    std::uint8_t header_[14];
};

class CountingSink : public rivzip::ByteSink {
public:
    explicit CountingSink(const GeneratedSource& source) : source_(source) {}
    bool Write(const std::uint8_t* data, std::uint32_t count) override {
        if (total == 0) sourceReadAtFirstWrite = source_.offset_;
        largestWrite = std::max(largestWrite, count);
        for (std::uint32_t i = 0; i < count; ++i) allBlank &= data[i] == ' ';
        total += count;
        ++writes;
        return true;
    }
    const GeneratedSource& source_;
    std::uint64_t total = 0, sourceReadAtFirstWrite = 0;
    std::uint32_t largestWrite = 0, writes = 0;
    bool allBlank = true;
};

TEST(SzddExpander, StreamsInBoundedBlocks) {
    const std::uint32_t groups = 200000;  // about 28 MB expanded from 3.4 MB
    GeneratedSource source(groups);
    CountingSink sink(source);
    ASSERT_EQ(rivzip::ExpandSzdd(source, sink, nullptr), static_cast<std::int32_t>(groups * 144));
    EXPECT_EQ(sink.total, groups * 144ull);
    EXPECT_TRUE(sink.allBlank);
    // Output leaves in blocks of about 64 KiB as soon as the first is full, long before the
    // source is used up: what is held at once does not grow with the file.
    EXPECT_LE(sink.largestWrite, 64u * 1024 + rivzip::szdd::kMaxGroupOutput);
    EXPECT_LE(sink.sourceReadAtFirstWrite, 2u * (64 * 1024 + 17));
    EXPECT_GE(sink.writes, sink.total / (64 * 1024 + rivzip::szdd::kMaxGroupOutput));
}

}  // namespace
}  // namespace rivziptest
