// Results of Rivzip.dll's operations. Zero or more is success (the number of bytes written,
// clamped to the largest 32-bit signed value); every failure has its own negative code so a
// trace line that prints the result says what went wrong.
#pragma once
#include <cstdint>

enum RivzipResult : std::int32_t {
    kRivzipBadHeader = -1,       // not an SZDD file: wrong or short header, unknown mode
    kRivzipTruncated = -2,       // the data ends before the declared length is produced
    kRivzipReadError = -3,       // the source could not be read
    kRivzipWriteError = -4,      // the destination could not be written (or positioned)
    kRivzipLengthMismatch = -5,  // the data produces more than the declared length
    kRivzipTooLarge = -6,        // compress: the original is 4 GiB or more
    kRivzipNoMemory = -7,        // the working buffers could not be allocated
};

// A success result: the byte count, clamped so it stays non-negative in 32 bits.
inline std::int32_t RivzipSuccess(std::uint64_t bytes) {
    return bytes > 0x7FFFFFFFu ? 0x7FFFFFFF : static_cast<std::int32_t>(bytes);
}
