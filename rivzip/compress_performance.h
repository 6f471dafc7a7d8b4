// SCompressPerformance: the progress record that Rivzip.dll hands to the caller's progress
// function while it expands or compresses a file.
//
// Callers (the decompression dispatcher) read the record by byte offset, so the layout is part
// of the module's interface: `starting` at 6, `processed` at 8, `ending` at 20, `total` at 24.
// The other fields are extras for diagnostics; a caller that does not know them ignores them.
//
// Unit of `processed` and `total`: bytes of expanded data (for expansion, the bytes produced;
// for compression, the bytes of the original consumed). The dispatcher shifts both right by 3
// before it stores them in its signed 32-bit item counters. An SZDD file declares its expanded
// length in 32 bits, so every length we handle is below 4 GiB and fits `total` exactly; after
// the shift it is below 2^29 and fits the caller's signed counter too. A coarser unit would make
// small files show a total of 0; bits (bytes * 8) would overflow from 512 MiB on. `processed`
// only grows and never exceeds `total`; on a successful ending report it equals `total`.
#pragma once
#include <cstddef>
#include <cstdint>

struct SCompressPerformance {
    std::uint32_t recordSize;   //  0: sizeof(SCompressPerformance), to tell layouts apart
    std::uint16_t operation;    //  4: kRivzipOperationExpand or kRivzipOperationCompress
    std::uint8_t starting;      //  6: non-zero on the first report of an operation only
    std::uint8_t reserved;      //  7: zero
    std::uint32_t processed;    //  8: bytes of expanded data done so far
    std::uint32_t bytesRead;    // 12: bytes read from the source so far (low 32 bits)
    std::uint32_t bytesWritten; // 16: bytes written to the destination so far (low 32 bits)
    std::int32_t ending;        // 20: non-zero on the last report of an operation only
    std::uint32_t total;        // 24: bytes of expanded data in all
    std::int32_t result;        // 28: on the ending report, the operation's result; else 0
};

enum : std::uint16_t { kRivzipOperationExpand = 1, kRivzipOperationCompress = 2 };

static_assert(offsetof(SCompressPerformance, starting) == 6, "starting flag at offset 6");
static_assert(offsetof(SCompressPerformance, processed) == 8, "processed amount at offset 8");
static_assert(offsetof(SCompressPerformance, ending) == 20, "ending flag at offset 20");
static_assert(offsetof(SCompressPerformance, total) == 24, "total amount at offset 24");
static_assert(sizeof(SCompressPerformance) == 32, "record layout is fixed");

// The progress function a caller passes; may be null (no reports).
using RivzipProgressFn = void (*)(SCompressPerformance&);
