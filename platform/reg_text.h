// The character encodings of .reg files. The registry's texts are single-byte (the "A" view);
// a .reg file is UTF-16LE (what the Windows registry editor writes), UTF-8 or single-byte.
// A byte and a UTF-16 code unit convert one to one (Latin-1), so every byte survives a round
// trip; a character beyond one byte, which only a foreign file can hold, becomes '?'.
#pragma once
#include <cstdint>
#include <string>

namespace plat::reg {

// The text of a file in single-byte characters: UTF-16LE when it starts with its byte-order
// mark (or, without one, when its odd bytes are NULs), UTF-8 when it starts with its mark or
// holds valid multi-byte sequences, else the bytes as they are. A mark is dropped.
std::string DecodeRegText(const std::string& fileBytes);

// Whether a value type holds text (REG_SZ, REG_EXPAND_SZ, REG_MULTI_SZ), which a version 5
// file writes as UTF-16LE.
bool IsTextType(std::uint32_t type);

// UTF-16LE bytes of single-byte text, one code unit per byte, without a byte-order mark.
std::string ToUtf16(const std::string& text);

// Single-byte text of UTF-16LE bytes; an odd last byte counts as a code unit of its own.
std::string FromUtf16(const std::string& bytes);

}  // namespace plat::reg
