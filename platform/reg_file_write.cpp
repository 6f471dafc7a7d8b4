// Writing keys as a .reg file, in the layout of the Windows registry editor.
#include <cstdio>

#include "platform/reg_file.h"
#include "platform/reg_text.h"
#include "platform/reg_tree.h"
#include "platform/registry.h"

namespace plat::reg {

namespace {

const char kEol[] = "\r\n";
// The registry editor keeps lines within 80 columns: "  " and 25 bytes, then the backslash.
constexpr size_t kLastHexColumn = 76;

std::string Quote(const std::string& text) {
    std::string quoted = "\"";
    for (char c : text) {
        if (c == '\\' || c == '"') quoted += '\\';
        quoted += c;
    }
    return quoted + "\"";
}

// Text that the "name"="text" form carries exactly: one NUL, at its end, and no line break.
bool PlainText(const std::string& data) {
    return !data.empty() && data.find('\0') == data.size() - 1 &&
           data.find_first_of("\r\n") == std::string::npos;
}

std::string HexForm(std::string line, const std::string& bytes) {
    size_t column = line.size();
    for (size_t i = 0; i < bytes.size(); ++i) {
        char digits[4];
        std::snprintf(digits, sizeof digits, "%02x", static_cast<unsigned char>(bytes[i]));
        line += digits;
        column += 2;
        if (i + 1 == bytes.size()) break;
        line += ',';
        if (++column > kLastHexColumn) {
            line += std::string("\\") + kEol + "  ";
            column = 2;
        }
    }
    return line;
}

std::string ValueEntry(const Value& v) {
    std::string line = (v.name.empty() ? std::string("@") : Quote(v.name)) + "=";
    if (v.type == kRegSz && PlainText(v.data))
        return line + Quote(v.data.substr(0, v.data.size() - 1));
    if (v.type == kRegDword && v.data.size() == 4) {
        unsigned value = 0;
        for (size_t i = 4; i-- > 0;) value = (value << 8) | static_cast<unsigned char>(v.data[i]);
        char text[16];
        std::snprintf(text, sizeof text, "dword:%08x", value);
        return line + text;
    }
    if (v.type == kRegBinary) return HexForm(line + "hex:", v.data);
    char form[24];
    std::snprintf(form, sizeof form, "hex(%x):", v.type);
    return HexForm(line + form, IsTextType(v.type) ? ToUtf16(v.data) : v.data);
}

long ExportKey(HKey key, const KeyPath& path, std::string* text) {
    std::vector<Value> values;
    if (long rc = ReadValues(key, &values)) return rc;
    *text += "[" + path.FullName() + "]" + kEol;
    for (const Value& v : values) *text += ValueEntry(v) + kEol;
    *text += kEol;
    std::vector<std::string> children;
    if (long rc = SubKeyNames(key, &children)) return rc;
    for (const std::string& name : children) {
        Key child;
        if (long rc = OpenKey(key, name, kKeyRead, child.out())) return rc;
        if (long rc = ExportKey(child.get(), path.Child(name), text)) return rc;
    }
    return 0;
}

}  // namespace

long ExportRegText(const KeyPath& path, std::string* text) {
    Key key;
    if (long rc = OpenKey(path.root, path.subKey, kKeyRead, key.out())) return rc;
    *text = std::string("Windows Registry Editor Version 5.00") + kEol + kEol;
    return ExportKey(key.get(), path, text);
}

long ExportRegFile(const KeyPath& path, std::string* fileBytes) {
    std::string text;
    if (long rc = ExportRegText(path, &text)) return rc;
    *fileBytes = "\xFF\xFE" + ToUtf16(text);
    return 0;
}

}  // namespace plat::reg
