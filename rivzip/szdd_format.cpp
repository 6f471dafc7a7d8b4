#include "rivzip/szdd_format.h"

#include <cstring>

namespace rivzip::szdd {

bool ParseHeader(const std::uint8_t* bytes, Header* header) {
    if (std::memcmp(bytes, kMagic, sizeof kMagic) != 0 || bytes[8] != kModeLzss) return false;
    header->missingChar = bytes[9];
    header->expandedLength = static_cast<std::uint32_t>(bytes[10]) |
                             static_cast<std::uint32_t>(bytes[11]) << 8 |
                             static_cast<std::uint32_t>(bytes[12]) << 16 |
                             static_cast<std::uint32_t>(bytes[13]) << 24;
    return true;
}

void FormatHeader(const Header& header, std::uint8_t* bytes) {
    std::memcpy(bytes, kMagic, sizeof kMagic);
    bytes[8] = kModeLzss;
    bytes[9] = header.missingChar;
    for (int i = 0; i < 4; ++i) bytes[10 + i] = static_cast<std::uint8_t>(header.expandedLength >> (8 * i));
}

}  // namespace rivzip::szdd
