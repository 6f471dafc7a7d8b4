// CompressSzdd: streams the original from a byte source into SZDD data on a byte sink.
//
// The header comes first and holds the expanded length, so the caller states the length of the
// source up front (a CFile knows it); a source that then delivers fewer bytes gives
// kRivzipTruncated, more bytes kRivzipLengthMismatch. Memory is fixed (about 230 KB): the source
// is read in blocks of 64 KiB with the last 4 KiB kept for matching, and the output is written in
// blocks of 64 KiB. Matching is lazy by one byte over hash chains, matches reach back at most
// MatchFinder::kMaxDistance bytes and never into the window's initial blanks.
//
// Result: the number of compressed bytes written (clamped to 2^31-1), or a negative
// RivzipResult (kRivzipReadError, kRivzipWriteError, kRivzipTruncated, kRivzipLengthMismatch,
// kRivzipNoMemory). Progress: ProgressReporter, processed being bytes of the original consumed.
#pragma once
#include <cstdint>

#include "rivzip/byte_stream.h"
#include "rivzip/compress_performance.h"

namespace rivzip {

struct CompressInput {
    std::uint32_t length = 0;       // bytes the source will deliver
    std::uint8_t missingChar = 0;   // the header's last character of the original name
};

std::int32_t CompressSzdd(ByteSource& source, ByteSink& sink, const CompressInput& input,
                          RivzipProgressFn progress);

}  // namespace rivzip
