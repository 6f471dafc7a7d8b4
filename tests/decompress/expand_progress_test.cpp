// Which of the library's progress reports reach the host's callback, and with which amounts.
#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "decompress/decompression_objects.h"
#include "rivzip/compress_performance.h"

namespace dectest {
namespace {

std::vector<std::pair<std::int32_t, std::int32_t>> seen;  // item total, item done at each call

bool Note(CProgressData* progress) {
    seen.emplace_back(progress->ItemTotal, progress->ItemDone);
    return false;  // a refusal that the library never hears of
}

void Send(std::uint32_t processed, bool starting = false, bool ending = false) {
    SCompressPerformance record{};
    record.processed = processed;
    record.total = 6001 * 8;
    record.starting = starting;
    record.ending = ending;
    CDecompressionObjects::ExpandProgress(record);
}

// A start, 6000 further reports and an end: the start reaches the callback twice (total, then
// done), the 2500th and 5000th further report once each, and the end once, with the total.
TEST(ExpandProgress, PassesTheStartTheEndAndEvery2500thReport) {
    g_ProgressData = CProgressData();
    CDecompressionObjects::SetProgressCallback(&Note);
    Send(0, true);
    for (std::uint32_t n = 1; n <= 6000; ++n) Send(n * 8);
    Send(12345, false, true);
    CDecompressionObjects::SetProgressCallback(nullptr);
    EXPECT_EQ(seen, (decltype(seen){{6001, 0}, {6001, 0}, {6001, 2500}, {6001, 5000}, {6001, 6001}}));
}

}  // namespace
}  // namespace dectest
