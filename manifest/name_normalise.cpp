#include "manifest/name_normalise.h"

std::string TrimBlanks(const std::string& text) {
    const char* const blanks = " \t\n";
    const size_t first = text.find_first_not_of(blanks);
    if (first == std::string::npos) return std::string();
    return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

std::string NormaliseName(const std::string& name) {
    std::string out = TrimBlanks(name);
    for (char& c : out)
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    return out;
}
