#include "tests/rivzip/memory_streams.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "rivzip/progress_reporter.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"

namespace rivziptest {

std::int64_t MemorySource::Read(std::uint8_t* buffer, std::uint32_t count) {
    if (offset_ >= failAfter_) return -1;
    std::uint64_t n = std::min<std::uint64_t>({count, maxChunk_, data_.size() - offset_});
    std::copy_n(data_.begin() + offset_, n, buffer);
    offset_ += n;
    return static_cast<std::int64_t>(n);
}

bool MemorySink::Write(const std::uint8_t* bytes, std::uint32_t count) {
    if (data.size() + count > failAfter_) return false;
    data.insert(data.end(), bytes, bytes + count);
    ++writes;
    return true;
}

static ProgressLog* g_log = nullptr;

ProgressLog::ProgressLog() { g_log = this; }
ProgressLog::~ProgressLog() { g_log = nullptr; }
void ProgressLog::Record(SCompressPerformance& report) {
    if (g_log) g_log->reports.push_back(report);
}

void ExpectWellFormedReports(const std::vector<SCompressPerformance>& reports, std::uint32_t total,
                             std::uint32_t finalProcessed, std::int32_t result) {
    ASSERT_GE(reports.size(), 2u);
    const SCompressPerformance& first = reports.front();
    const SCompressPerformance& last = reports.back();
    EXPECT_TRUE(first.starting != 0 && first.ending == 0 && first.processed == 0);
    EXPECT_EQ(first.total, total);
    EXPECT_TRUE(last.ending != 0 && last.starting == 0);
    EXPECT_EQ(last.processed, finalProcessed);
    EXPECT_EQ(last.result, result);
    std::uint32_t block = rivzip::ProgressReporter::kProgressBlock;
    for (std::size_t i = 1; i < reports.size(); ++i) {
        const SCompressPerformance& r = reports[i];
        EXPECT_EQ(r.total, total);
        EXPECT_LE(r.processed, total);
        EXPECT_GE(r.processed, reports[i - 1].processed) << "report " << i;
        if (i + 1 < reports.size()) {
            EXPECT_TRUE(r.starting == 0 && r.ending == 0);
            EXPECT_GE(r.processed, i * block) << "a middle report before its block is done";
            EXPECT_LT(r.processed, (i + 1) * block) << "a block without its report";
        }
    }
    std::size_t middle = reports.size() - 2;
    EXPECT_EQ(middle, finalProcessed / block) << "one report per block done";
}

Bytes Compress(const Bytes& original, std::uint32_t maxChunk) {
    MemorySource source(original, maxChunk);
    MemorySink sink;
    rivzip::CompressInput input{static_cast<std::uint32_t>(original.size()), 'x'};
    std::int32_t result = rivzip::CompressSzdd(source, sink, input, nullptr);
    EXPECT_EQ(result, static_cast<std::int32_t>(sink.data.size()));
    return sink.data;
}

std::int32_t Expand(const Bytes& szdd, Bytes* expanded, std::uint32_t maxChunk) {
    MemorySource source(szdd, maxChunk);
    MemorySink sink;
    std::int32_t result = rivzip::ExpandSzdd(source, sink, nullptr);
    *expanded = std::move(sink.data);
    return result;
}

Bytes Szdd(std::uint32_t declaredLength, const Bytes& data) {
    Bytes out(rivzip::szdd::kHeaderSize);
    rivzip::szdd::FormatHeader(rivzip::szdd::Header{0, declaredLength}, out.data());
    out.insert(out.end(), data.begin(), data.end());
    return out;
}

Bytes RandomBytes(std::size_t size, std::uint32_t seed) {
    std::mt19937 rng(seed);
    Bytes out(size);
    for (auto& b : out) b = static_cast<std::uint8_t>(rng());
    return out;
}

Bytes TextLike(std::size_t size, std::uint32_t seed) {
    static const char* const kWords[] = {"update ", "file ", "the ", "version ", "install ", "Vantric ",
                                         "registry ", "product\r\n", "a ", "content "};
    std::mt19937 rng(seed);
    Bytes out;
    while (out.size() < size) {
        const char* word = kWords[rng() % 10];
        out.insert(out.end(), word, word + std::char_traits<char>::length(word));
    }
    out.resize(size);
    return out;
}

Bytes Runs(std::size_t size) {
    Bytes out(size);
    for (std::size_t i = 0; i < size; ++i) out[i] = static_cast<std::uint8_t>((i / 1000) % 3 == 0 ? 0 : i / 1000);
    return out;
}

Bytes AllByteValues(std::size_t size) {
    Bytes out(size);
    for (std::size_t i = 0; i < size; ++i) out[i] = static_cast<std::uint8_t>(i);
    return out;
}

}  // namespace rivziptest
