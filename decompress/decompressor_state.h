// The dispatcher's process-wide state, shared by every CDecompressionObjects instance and by
// the progress function that the expanders call. Unguarded: one run at a time.
#pragma once
#include <cstdint>
#include <string>

#include "entry/progress_data.h"
#include "platform/cfile.h"
#include "platform/library.h"
#include "rivzip/compress_performance.h"

// LZSS_ExpandFile: (source, destination, progress function, reserved 0) -> negative on failure.
using LzssExpandFn = std::int32_t (*)(plat::CFile& source, plat::CFile& destination,
                                      void (*progress)(SCompressPerformance&), std::uint32_t value);

struct DecompressorState {
    plat::lib::HModule library = nullptr;
    LzssExpandFn expandEntry = nullptr;
    std::string loadedFrom;  // the candidate text that loaded library
    ProgressCallback progressCallback = nullptr;
    std::uint32_t progressCounter = 0;
};

// The one state of the process.
DecompressorState& Decompressor();
