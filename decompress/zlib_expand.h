// InflateFile: expands a zlib or gzip stream with zlib, streaming with fixed memory (two 64 KiB
// buffers and zlib's own state) whatever the size.
//
// Reads source from its current position to its end and writes the expanded data to
// destination from its current position. The format is recognised from the stream's header.
// Several streams one after the other (gzip's concatenated members) expand to the concatenation
// of their data; anything after a stream that is not another stream is corrupt data.
//
// Result: the number of bytes written (clamped to 2^31-1), or a negative zlib code:
// Z_DATA_ERROR for corrupt data (a failed header, check value or length, a preset dictionary),
// Z_BUF_ERROR for data that ends before its stream does (an empty source included),
// Z_MEM_ERROR when the buffers cannot be had, Z_ERRNO when a file cannot be read or written.
// On failure *why says what went wrong, for the log. Nothing is thrown.
//
// Progress (progress may be null) comes in SCompressPerformance records, as from Rivzip.dll: one
// starting report, one report per 1 KiB of compressed data consumed, and one ending report,
// also after a failure. The amounts are bytes of compressed data: the expanded size of a zlib
// stream is not known before its end, while the compressed size is, so the bar moves evenly.
// A source of 4 GiB or more counts in units of 2, 4, ... bytes, so the total fits in 32 bits.
#pragma once
#include <cstdint>
#include <string>

#include "platform/cfile.h"
#include "rivzip/compress_performance.h"

std::int32_t InflateFile(plat::CFile& source, plat::CFile& destination,
                         void (*progress)(SCompressPerformance&), std::string* why);
