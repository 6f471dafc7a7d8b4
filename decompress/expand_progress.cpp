// The progress function that the expanders call, and the callback it reports to.
#include "decompress/decompression_objects.h"
#include "decompress/decompressor_state.h"

namespace {
// The library reports every few kilobytes; passing each report on would make the host redraw
// its bar far more often than it can show a change.
constexpr std::uint32_t kReportsPerCallback = 2500;
}  // namespace

void CDecompressionObjects::SetProgressCallback(ProgressCallback callback) {
    Decompressor().progressCallback = callback;
}

void CDecompressionObjects::ExpandProgress(SCompressPerformance& performance) {
    DecompressorState& state = Decompressor();
    if (performance.starting) {
        state.progressCounter = 0;
        if (state.progressCallback) {
            g_ProgressData.SetItemTotal(static_cast<std::int32_t>(performance.total >> 3));
            state.progressCallback(&g_ProgressData);
        }
    }
    if (!performance.ending && state.progressCounter++ % kReportsPerCallback != 0) return;
    if (!state.progressCallback) return;
    const std::uint32_t done = performance.ending ? performance.total : performance.processed;
    g_ProgressData.SetItemDone(static_cast<std::int32_t>(done >> 3));
    state.progressCallback(&g_ProgressData);  // its answer cannot stop the library
}
