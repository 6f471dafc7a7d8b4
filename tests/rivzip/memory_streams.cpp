#include "tests/rivzip/memory_streams.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>

#include "rivzip/progress_reporter.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"
#include "rivzip/szdd_format.h"

namespace rivziptest {

std::int64_t MemorySource::Read(std::uint8_t* buffer, std::uint32_t count) {
    if (delivered >= failAfter) return -1;
    std::uint64_t n = std::min<std::uint64_t>({count, maxChunk_, data_.size() - delivered});
    std::copy_n(data_.begin() + delivered, n, buffer);
    delivered += n;
    return static_cast<std::int64_t>(n);
}

bool MemorySink::Write(const std::uint8_t* bytes, std::uint32_t count) {
    if (data.size() + count > failAfter) return false;
    if (data.empty() && watched) deliveredAtFirstWrite = watched->delivered;
    largestWrite = std::max(largestWrite, count);
    data.insert(data.end(), bytes, bytes + count);
    return true;
}

std::vector<SCompressPerformance>& Reports() {
    static std::vector<SCompressPerformance> reports;
    return reports;
}

void Record(SCompressPerformance& report) { Reports().push_back(report); }

void ExpectWellFormedReports(std::uint32_t total, std::uint32_t finalProcessed, std::int32_t result) {
    const auto& reports = Reports();
    ASSERT_GE(reports.size(), 2u);
    EXPECT_TRUE(reports.front().starting && !reports.front().ending && reports.front().processed == 0);
    EXPECT_TRUE(reports.back().ending && !reports.back().starting);
    EXPECT_EQ(reports.back().processed, finalProcessed);
    EXPECT_EQ(reports.back().result, result);
    const std::uint32_t block = rivzip::ProgressReporter::kProgressBlock;
    EXPECT_EQ(reports.size() - 2, finalProcessed / block) << "one report per block done";
    for (std::size_t i = 1; i < reports.size(); ++i) {
        EXPECT_EQ(reports[i].total, total);
        EXPECT_LE(reports[i].processed, total);
        EXPECT_GE(reports[i].processed, reports[i - 1].processed);
        if (i + 1 < reports.size()) {
            EXPECT_EQ(reports[i].processed / block, i) << "report " << i;
        }
    }
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
    static const std::string kWords[] = {"update ", "file ", "the ", "version ", "install ", "Vantric ",
                                         "registry ", "product\r\n", "a ", "content "};
    std::mt19937 rng(seed);
    Bytes out;
    while (out.size() < size) {
        const std::string& word = kWords[rng() % 10];
        out.insert(out.end(), word.begin(), word.end());
    }
    out.resize(size);
    return out;
}

}  // namespace rivziptest
