#include "expr/version_text.h"

#include <cstdlib>

namespace {

bool AllDigits(const std::string& text) {
    for (char c : text) {
        if (c < '0' || c > '9') return false;
    }
    return true;
}

// atoi's reading of the part, refusing a zero that is not written as digits.
bool ReadPart(const std::string& part, std::uint32_t* value) {
    // strtol instead of atoi: the same reading, without undefined behaviour on overflow.
    int number = static_cast<int>(std::strtol(part.c_str(), nullptr, 10));
    if (number == 0 && !AllDigits(part)) return false;
    *value = static_cast<std::uint32_t>(number);
    return true;
}

}  // namespace

bool ParseVersionText(const std::string& text, std::uint32_t* mostSignificant,
                      std::uint32_t* leastSignificant) {
    std::uint32_t parts[4] = {};
    std::size_t start = 0;
    for (int i = 0; i < 3; ++i) {
        std::size_t dot = text.find('.', start);
        if (dot == std::string::npos) return false;
        if (!ReadPart(text.substr(start, dot - start), &parts[i])) return false;
        start = dot + 1;
    }
    if (!ReadPart(text.substr(start), &parts[3])) return false;
    *mostSignificant = (parts[0] << 16) | parts[1];
    *leastSignificant = (parts[2] << 16) | parts[3];
    return true;
}
