// The SZDD file format (COMPRESS.EXE / EXPAND.EXE): a 14-byte header, then LZSS data.
//
// Header: "SZDD" 0x88 0xF0 0x27 0x33, the mode 'A', the last character of the original file name
// (which the compressed name replaces by '_'; 0 when unknown), the expanded length as 32-bit
// little-endian.
// Data: groups of one flag byte and up to eight items, the flag's bits taken from the lowest up.
// Bit 1: one literal byte. Bit 0: a match of two bytes b0 b1 that copies (b1 & 0x0F) + 3 bytes
// from ring position b0 | ((b1 & 0xF0) << 4) of a 4096-byte window that starts out filled with
// blanks and whose first written position is 4096 - 16. The data simply ends after the last item.
#pragma once
#include <cstdint>

namespace rivzip::szdd {

constexpr std::uint32_t kHeaderSize = 14;
constexpr std::uint8_t kMagic[8] = {'S', 'Z', 'D', 'D', 0x88, 0xF0, 0x27, 0x33};
constexpr std::uint8_t kModeLzss = 'A';

constexpr std::uint32_t kWindowSize = 4096;
constexpr std::uint32_t kWindowMask = kWindowSize - 1;
constexpr std::uint32_t kFirstRingPosition = kWindowSize - 16;
constexpr std::uint8_t kWindowFill = 0x20;
constexpr std::uint32_t kMinMatch = 3;
constexpr std::uint32_t kMaxMatch = 18;
// Longest flag group in the data: a flag byte and eight matches.
constexpr std::uint32_t kMaxGroupInput = 1 + 8 * 2;
// Most bytes one flag group can expand to.
constexpr std::uint32_t kMaxGroupOutput = 8 * kMaxMatch;

struct Header {
    std::uint8_t missingChar = 0;
    std::uint32_t expandedLength = 0;
};

// Reads a header from 14 bytes; false when they are not an SZDD header of mode 'A'.
bool ParseHeader(const std::uint8_t* bytes, Header* header);
// Writes the 14 header bytes.
void FormatHeader(const Header& header, std::uint8_t* bytes);

// The ring position of the expanded byte with the given index.
constexpr std::uint32_t RingPosition(std::uint64_t index) {
    return static_cast<std::uint32_t>((kFirstRingPosition + index) & kWindowMask);
}

}  // namespace rivzip::szdd
