// The character encodings of .reg files.
#include "platform/reg_text.h"

#include <cstdint>

#include "platform/registry.h"

namespace plat::reg {

namespace {

char Narrow(std::uint32_t codePoint) {
    return codePoint <= 0xFF ? static_cast<char>(codePoint) : '?';
}

bool StartsWith(const std::string& bytes, const char* mark, size_t n) {
    return bytes.size() >= n && bytes.compare(0, n, mark, n) == 0;
}

// A BOM-less UTF-16LE file of ASCII syntax has a NUL in every odd byte of its first line.
bool LooksUtf16(const std::string& bytes) {
    if (bytes.size() < 4) return false;
    for (size_t i = 1; i < bytes.size() && i < 40; i += 2)
        if (bytes[i] != '\0' || bytes[i - 1] == '\0') return false;
    return true;
}

// Length of the UTF-8 sequence at i, and its code point; 0 when it is not one.
size_t Utf8Sequence(const std::string& s, size_t i, std::uint32_t* codePoint) {
    auto byte = [&](size_t k) { return static_cast<unsigned char>(s[k]); };
    unsigned char lead = byte(i);
    size_t n = lead >= 0xF0 && lead < 0xF5 ? 4 : lead >= 0xE0 ? 3 : lead >= 0xC2 ? 2 : 0;
    if (lead >= 0xF5 || n == 0 || i + n > s.size()) return 0;
    std::uint32_t cp = lead & (0x7F >> n);
    for (size_t k = 1; k < n; ++k) {
        if ((byte(i + k) & 0xC0) != 0x80) return 0;
        cp = (cp << 6) | (byte(i + k) & 0x3F);
    }
    const std::uint32_t kSmallest[] = {0, 0, 0x80, 0x800, 0x10000};
    if (cp < kSmallest[n] || cp > 0x10FFFF) return 0;
    *codePoint = cp;
    return n;
}

// Decodes UTF-8 when all of it is valid and some of it is beyond ASCII; false otherwise.
bool DecodeUtf8(const std::string& bytes, size_t start, std::string* text) {
    bool multiByte = false;
    std::string out;
    for (size_t i = start; i < bytes.size();) {
        if (static_cast<unsigned char>(bytes[i]) < 0x80) {
            out += bytes[i++];
            continue;
        }
        std::uint32_t cp = 0;
        size_t n = Utf8Sequence(bytes, i, &cp);
        if (n == 0) return false;
        out += Narrow(cp);
        multiByte = true;
        i += n;
    }
    if (!multiByte && start == 0) return false;
    *text = out;
    return true;
}

}  // namespace

std::string DecodeRegText(const std::string& fileBytes) {
    if (StartsWith(fileBytes, "\xFF\xFE", 2)) return FromUtf16(fileBytes.substr(2));
    if (LooksUtf16(fileBytes)) return FromUtf16(fileBytes);
    bool utf8Mark = StartsWith(fileBytes, "\xEF\xBB\xBF", 3);
    std::string text;
    if (DecodeUtf8(fileBytes, utf8Mark ? 3 : 0, &text)) return text;
    return utf8Mark ? fileBytes.substr(3) : fileBytes;
}

bool IsTextType(std::uint32_t type) {
    return type == kRegSz || type == kRegExpandSz || type == kRegMultiSz;
}

std::string ToUtf16(const std::string& text) {
    std::string bytes;
    bytes.reserve(text.size() * 2);
    for (char c : text) {
        bytes += c;
        bytes += '\0';
    }
    return bytes;
}

std::string FromUtf16(const std::string& bytes) {
    std::string text;
    text.reserve(bytes.size() / 2 + 1);
    auto unitAt = [&](size_t i) {
        std::uint32_t unit = static_cast<unsigned char>(bytes[i]);
        if (i + 1 < bytes.size())
            unit |= static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[i + 1])) << 8;
        return unit;
    };
    for (size_t i = 0; i < bytes.size(); i += 2) {
        std::uint32_t unit = unitAt(i);
        text += Narrow(unit);
        // A surrogate pair is one character: one '?' for both halves.
        if (unit >= 0xD800 && unit < 0xDC00 && i + 2 < bytes.size()) {
            std::uint32_t next = unitAt(i + 2);
            if (next >= 0xDC00 && next < 0xE000) i += 2;
        }
    }
    return text;
}

}  // namespace plat::reg
