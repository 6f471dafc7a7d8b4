// ExpandSzdd: streams SZDD data from a byte source to a byte sink.
//
// Memory stays fixed (about 140 KB of buffers) whatever the size: the source is read in blocks of
// 64 KiB and the expanded data is written in blocks of 64 KiB, keeping only the last 4096 bytes
// as the window. The expanded length must match the header exactly.
//
// Result: the number of bytes written (clamped to 2^31-1) on success, otherwise a negative
// RivzipResult: kRivzipBadHeader (no SZDD header; nothing is written and nothing reported),
// kRivzipTruncated (data ends early, mid-match or short of the declared length),
// kRivzipLengthMismatch (data goes on past the declared length; the sink never receives more
// than the declared length), kRivzipReadError, kRivzipWriteError, kRivzipNoMemory.
// Progress: see ProgressReporter; the total is the declared length. After a starting report an
// ending report always follows, also on failure.
#pragma once
#include <cstdint>

#include "rivzip/byte_stream.h"
#include "rivzip/compress_performance.h"

namespace rivzip {

std::int32_t ExpandSzdd(ByteSource& source, ByteSink& sink, RivzipProgressFn progress);

}  // namespace rivzip
