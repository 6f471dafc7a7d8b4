// The progress function that Rivzip.dll and the zlib expansion call: which reports reach the
// host's callback, and with which amounts.
#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "decompress/decompression_objects.h"
#include "rivzip/compress_performance.h"

namespace dectest {
namespace {

using Calls = std::vector<std::pair<std::int32_t, std::int32_t>>;  // item total, item done

Calls& Seen() {
    static Calls calls;
    return calls;
}

bool Note(CProgressData* progress) {
    Seen().emplace_back(progress->ItemTotal, progress->ItemDone);
    return false;  // a refusal that the library never hears of
}

SCompressPerformance Report(std::uint32_t processed, std::uint32_t total, bool starting = false, bool ending = false) {
    SCompressPerformance record{};
    record.processed = processed;
    record.total = total;
    record.starting = starting ? 1 : 0;
    record.ending = ending ? 1 : 0;
    return record;
}

class ExpandProgress : public ::testing::Test {
protected:
    void SetUp() override {
        Seen().clear();
        g_ProgressData = CProgressData();
        CDecompressionObjects::SetProgressCallback(&Note);
    }
    void TearDown() override { CDecompressionObjects::SetProgressCallback(nullptr); }

    static void Send(SCompressPerformance record) { CDecompressionObjects::ExpandProgress(record); }
};

// A start, 6000 further reports and an end: the start reaches the callback twice (total, then
// done), the 2500th and 5000th further report once each, the end once: five calls in all.
TEST_F(ExpandProgress, PassesTheStartTheEndAndEvery2500thReport) {
    constexpr std::uint32_t kTotal = 6001 * 8;
    Send(Report(0, kTotal, true));
    for (std::uint32_t n = 1; n <= 6000; ++n) Send(Report(n * 8, kTotal));
    Send(Report(12345, kTotal, false, true));  // the end reports the total, whatever was processed
    EXPECT_EQ(Seen(), (Calls{{6001, 0}, {6001, 0}, {6001, 2500}, {6001, 5000}, {6001, 6001}}));
    EXPECT_TRUE(g_ProgressData.ItemTotalSet && g_ProgressData.ItemDoneSet);
}

TEST_F(ExpandProgress, EachStartCountsAfresh) {
    Send(Report(0, 800, true));
    for (int n = 0; n < 10; ++n) Send(Report(8, 800));
    Send(Report(0, 1600, true));
    EXPECT_EQ(Seen(), (Calls{{100, 0}, {100, 0}, {200, 0}, {200, 0}}));
}

TEST_F(ExpandProgress, WithoutACallbackNothingIsReported) {
    CDecompressionObjects::SetProgressCallback(nullptr);
    Send(Report(0, 800, true));
    Send(Report(800, 800, false, true));
    EXPECT_TRUE(Seen().empty());
    EXPECT_FALSE(g_ProgressData.ItemTotalSet || g_ProgressData.ItemDoneSet);
}

}  // namespace
}  // namespace dectest
