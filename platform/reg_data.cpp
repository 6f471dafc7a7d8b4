// Registry data as people read and write it with `reg`.
#include "platform/reg_data.h"

#include <cstdio>
#include <vector>

#include "platform/reg_path.h"
#include "platform/registry.h"

namespace plat::reg {

namespace {

struct TypeEntry {
    std::uint32_t type;
    const char* name;
    bool settable;  // offered by `reg add /t`
};

const TypeEntry kTypes[] = {
    {kRegNone, "REG_NONE", true},
    {kRegSz, "REG_SZ", true},
    {kRegExpandSz, "REG_EXPAND_SZ", true},
    {kRegBinary, "REG_BINARY", true},
    {kRegDword, "REG_DWORD", true},
    {5, "REG_DWORD_BIG_ENDIAN", false},
    {6, "REG_LINK", false},
    {kRegMultiSz, "REG_MULTI_SZ", true},
    {8, "REG_RESOURCE_LIST", false},
    {9, "REG_FULL_RESOURCE_DESCRIPTOR", false},
    {10, "REG_RESOURCE_REQUIREMENTS_LIST", false},
    {11, "REG_QWORD", false},
};

std::uint64_t LittleEndian(const std::string& data) {
    std::uint64_t v = 0;
    for (size_t i = data.size(); i-- > 0;) v = (v << 8) | static_cast<unsigned char>(data[i]);
    return v;
}

std::string UpperHex(const std::string& data) {
    static const char kDigits[] = "0123456789ABCDEF";
    std::string text;
    for (unsigned char c : data) {
        text += kDigits[c >> 4];
        text += kDigits[c & 15];
    }
    return text;
}

std::string MultiText(const std::string& data) {
    std::vector<std::string> parts;
    size_t start = 0;
    while (start < data.size()) {
        size_t end = data.find('\0', start);
        if (end == std::string::npos) end = data.size();
        parts.push_back(data.substr(start, end - start));
        start = end + 1;
    }
    while (!parts.empty() && parts.back().empty()) parts.pop_back();  // the terminator
    std::string text;
    for (size_t i = 0; i < parts.size(); ++i) text += (i ? "\\0" : "") + parts[i];
    return text;
}

int HexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

bool ParseDword(const std::string& text, std::string* data) {
    bool hex = text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X');
    size_t start = hex ? 2 : 0;
    if (text.size() == start) return false;
    std::uint64_t v = 0;
    for (size_t i = start; i < text.size(); ++i) {
        int d = hex ? HexDigit(text[i]) : (text[i] >= '0' && text[i] <= '9' ? text[i] - '0' : -1);
        if (d < 0) return false;
        v = v * (hex ? 16 : 10) + static_cast<std::uint64_t>(d);
        if (v > 0xFFFFFFFFu) return false;
    }
    data->clear();
    for (int i = 0; i < 4; ++i) data->push_back(static_cast<char>((v >> (8 * i)) & 0xFF));
    return true;
}

bool ParseHex(const std::string& text, std::string* data) {
    if (text.size() % 2) return false;
    data->clear();
    for (size_t i = 0; i < text.size(); i += 2) {
        int hi = HexDigit(text[i]), lo = HexDigit(text[i + 1]);
        if (hi < 0 || lo < 0) return false;
        data->push_back(static_cast<char>(hi * 16 + lo));
    }
    return true;
}

std::string MultiData(const std::string& text, const std::string& separator) {
    std::string data;
    size_t start = 0;
    while (!text.empty() && start <= text.size()) {
        size_t end = separator.empty() ? std::string::npos : text.find(separator, start);
        if (end == std::string::npos) end = text.size();
        data += text.substr(start, end - start) + '\0';
        start = end + separator.size();
        if (end == text.size()) break;
    }
    return data + '\0';
}

}  // namespace

std::string TypeName(std::uint32_t type) {
    for (const TypeEntry& t : kTypes)
        if (t.type == type) return t.name;
    char text[24];
    std::snprintf(text, sizeof text, "REG_0x%X", type);
    return text;
}

bool TypeFromName(const std::string& name, std::uint32_t* type) {
    for (const TypeEntry& t : kTypes) {
        if (t.settable && NamesEqual(name, t.name)) {
            *type = t.type;
            return true;
        }
    }
    return false;
}

std::string DataText(std::uint32_t type, const std::string& data) {
    if (type == kRegSz || type == kRegExpandSz) return data.substr(0, data.find('\0'));
    if (type == kRegMultiSz) return MultiText(data);
    if ((type == kRegDword && data.size() == 4) || (type == 11 && data.size() == 8)) {
        char text[24];
        std::snprintf(text, sizeof text, "0x%llx",
                      static_cast<unsigned long long>(LittleEndian(data)));
        return text;
    }
    return UpperHex(data);
}

bool DataFromText(std::uint32_t type, const std::string& text, const std::string& separator,
                  std::string* data, std::string* message) {
    switch (type) {
        case kRegDword:
            if (ParseDword(text.empty() ? "0" : text, data)) return true;
            *message = "REG_DWORD data must be a number from 0 to 4294967295 (or 0x hex)";
            return false;
        case kRegBinary:
            if (ParseHex(text, data)) return true;
            *message = "REG_BINARY data must be pairs of hexadecimal digits";
            return false;
        case kRegMultiSz:
            *data = MultiData(text, separator);
            return true;
        default:
            *data = text + '\0';
            return true;
    }
}

}  // namespace plat::reg
