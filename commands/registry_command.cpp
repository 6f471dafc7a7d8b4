#include "commands/registry_command.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <limits>

namespace {

const char kNoType[] = "Invalid Registration Parameter - no type";
const char kNoValue[] = "Invalid Registration Parameter - no value";
const char kNoRootKey[] = "Invalid Registration Parameter - no root key";
const char kBadRootKey[] = "Invalid Registration Parameter - Bad Root Key.";

bool EqualsNoCase(const std::string& text, const char* word) {
    std::size_t i = 0;
    for (; i < text.size() && word[i] != '\0'; ++i) {
        if (std::toupper(static_cast<unsigned char>(text[i])) !=
            std::toupper(static_cast<unsigned char>(word[i]))) {
            return false;
        }
    }
    return i == text.size() && word[i] == '\0';
}

// The text from start up to the next stop character (or the end).
std::string TakeUntil(const std::string& text, std::size_t start, char stop) {
    if (start > text.size()) return std::string();
    const std::size_t end = text.find(stop, start);
    return text.substr(start, end == std::string::npos ? std::string::npos : end - start);
}

RegistryDataType ClassifyType(const std::string& type) {
    if (EqualsNoCase(type, "DWORD")) return RegistryDataType::Dword;
    if (EqualsNoCase(type, "STRING")) return RegistryDataType::String;
    return RegistryDataType::Unknown;
}

// Splits "ROOT\Key\Path" into its root and subkey; the message of a bad root, else nullptr.
const char* ParseKeyPath(const std::string& keyPath, RegistryAssignment* out) {
    const std::size_t slash = keyPath.find('\\');
    const std::string root = keyPath.substr(0, slash);
    if (root.empty()) return kNoRootKey;
    if (EqualsNoCase(root, "HKLM")) {
        out->root = RegistryRoot::LocalMachine;
    } else if (EqualsNoCase(root, "HKCU")) {
        out->root = RegistryRoot::CurrentUser;
    } else {
        return kBadRootKey;
    }
    out->subKey = slash == std::string::npos ? std::string() : keyPath.substr(slash + 1);
    return nullptr;
}

}  // namespace

const char* ParseRegistryAssignment(std::string parameter, RegistryAssignment* assignment) {
    for (char& c : parameter) {
        if (c == '/') c = '\\';
    }
    const std::size_t open = parameter.find('(');
    if (open == std::string::npos) return kNoType;
    const std::string type = TakeUntil(parameter, open + 1, ')');
    if (type.empty()) return kNoType;
    const std::size_t close = parameter.find(')');
    if (close == std::string::npos) return kNoType;
    const std::string remainder = TakeUntil(parameter, close + 1, ')');
    if (remainder.empty()) return kNoType;

    const std::string namePart = TakeUntil(remainder, 0, '=');
    if (namePart.empty()) return kNoValue;
    const std::size_t equals = remainder.find('=');
    if (equals == std::string::npos) return kNoValue;
    const std::string data = TakeUntil(remainder, equals + 1, '=');
    if (data.empty()) return kNoValue;
    const std::size_t lastSlash = namePart.rfind('\\');
    if (lastSlash == std::string::npos || lastSlash == 0) return kNoValue;

    RegistryAssignment result;
    if (const char* error = ParseKeyPath(namePart.substr(0, lastSlash), &result)) return error;
    result.valueName = namePart.substr(lastSlash + 1);
    result.type = ClassifyType(type);
    result.data = data;
    *assignment = result;
    return nullptr;
}

std::int32_t RegistryDwordFromText(const std::string& data) {
    std::size_t i = 0;
    while (i < data.size() && std::isspace(static_cast<unsigned char>(data[i]))) ++i;
    bool negative = false;
    if (i < data.size() && (data[i] == '+' || data[i] == '-')) negative = data[i++] == '-';
    // Accumulated as a magnitude one past INT32_MAX so that INT32_MIN is reachable.
    const std::int64_t limit = std::int64_t{std::numeric_limits<std::int32_t>::max()} + 1;
    std::int64_t magnitude = 0;
    for (; i < data.size() && data[i] >= '0' && data[i] <= '9'; ++i) {
        magnitude = std::min(limit, magnitude * 10 + (data[i] - '0'));
    }
    if (negative) return static_cast<std::int32_t>(-magnitude);
    return static_cast<std::int32_t>(std::min(magnitude, limit - 1));
}
