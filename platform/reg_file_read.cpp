// Reading .reg files into the changes they ask for.
#include "platform/reg_file.h"

#include "platform/reg_text.h"
#include "platform/registry.h"

namespace plat::reg {

namespace {

const char kVersion5[] = "Windows Registry Editor Version 5.00";
const char kVersion4[] = "REGEDIT4";

struct Line {
    int number;  // of its first physical line
    std::string text;
};

std::string Trim(const std::string& s) {
    size_t begin = s.find_first_not_of(" \t\r");
    if (begin == std::string::npos) return std::string();
    return s.substr(begin, s.find_last_not_of(" \t\r") - begin + 1);
}

bool StartsNoCase(const std::string& s, size_t pos, const char* prefix) {
    for (size_t i = 0; prefix[i]; ++i) {
        if (pos + i >= s.size()) return false;
        char c = s[pos + i];
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
        if (c != prefix[i]) return false;
    }
    return true;
}

// Physical lines joined where one ends in a backslash; blank lines and comments dropped.
std::vector<Line> LogicalLines(const std::string& text) {
    std::vector<Line> lines;
    bool continues = false;
    int number = 0;
    for (size_t start = 0; start < text.size();) {
        size_t end = text.find('\n', start);
        if (end == std::string::npos) end = text.size();
        std::string line = Trim(text.substr(start, end - start));
        start = end + 1;
        ++number;
        if (continues) {
            lines.back().text += line;
        } else if (!line.empty() && line[0] != ';') {
            lines.push_back({number, line});
        } else {
            continue;
        }
        std::string& last = lines.back().text;
        continues = !last.empty() && last.back() == '\\';
        if (continues) last.pop_back();
    }
    return lines;
}

int HexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

// A hexadecimal number of 1 to maxDigits digits filling all of text.
bool HexNumber(const std::string& text, size_t maxDigits, std::uint32_t* value) {
    if (text.empty() || text.size() > maxDigits) return false;
    *value = 0;
    for (char c : text) {
        int d = HexDigit(c);
        if (d < 0) return false;
        *value = *value * 16 + static_cast<std::uint32_t>(d);
    }
    return true;
}

// Comma-separated bytes of one or two hex digits; a trailing comma is allowed.
bool HexList(const std::string& text, std::string* bytes) {
    bytes->clear();
    size_t start = 0;
    while (start < text.size()) {
        size_t end = text.find(',', start);
        if (end == std::string::npos) end = text.size();
        std::uint32_t byte = 0;
        if (!HexNumber(Trim(text.substr(start, end - start)), 2, &byte)) return false;
        bytes->push_back(static_cast<char>(byte));
        start = end + 1;
    }
    return true;
}

// The quoted text starting at pos (on its quote), unescaped; pos ends past the closing quote.
bool Quoted(const std::string& s, size_t* pos, std::string* text) {
    text->clear();
    for (size_t i = *pos + 1; i < s.size(); ++i) {
        if (s[i] == '"') {
            *pos = i + 1;
            return true;
        }
        if (s[i] == '\\' && i + 1 < s.size() && (s[i + 1] == '\\' || s[i + 1] == '"')) ++i;
        *text += s[i];
    }
    return false;
}

class Parser {
public:
    Parser(std::vector<RegFileEntry>* entries, RegFileError* error)
        : entries_(entries), error_(error) {}
    bool Header(const Line& line);
    bool Statement(const Line& line);

private:
    bool Fail(int line, const std::string& message);
    bool Section(const Line& line);
    bool Value(const Line& line);
    bool Data(const std::string& text, RegFileEntry* entry, std::string* why) const;
    bool HexData(const std::string& text, RegFileEntry* entry, std::string* why) const;

    std::vector<RegFileEntry>* entries_;
    RegFileError* error_;
    bool unicode_ = true;
    bool inKey_ = false;      // a [KEY] section is open
    bool inDeleted_ = false;  // a [-KEY] section is open
    KeyPath key_;
};

bool Parser::Fail(int line, const std::string& message) {
    error_->line = line;
    error_->message = message;
    return false;
}

bool Parser::Header(const Line& line) {
    if (line.text == kVersion5 || line.text == kVersion4) {
        unicode_ = line.text == kVersion5;
        return true;
    }
    return Fail(line.number, std::string("not a registry file: the first line must be \"") +
                                 kVersion5 + "\" or \"" + kVersion4 + "\"");
}

bool Parser::Statement(const Line& line) {
    if (line.text[0] == '[') return Section(line);
    if (line.text[0] == '"' || line.text[0] == '@') return Value(line);
    return Fail(line.number, "expected a [key] line or a value line");
}

bool Parser::Section(const Line& line) {
    const std::string& t = line.text;
    if (t.back() != ']') return Fail(line.number, "a key line must end with ']'");
    bool remove = t.size() > 1 && t[1] == '-';
    std::string name = t.substr(remove ? 2 : 1, t.size() - (remove ? 3 : 2));
    KeyPath key;
    if (!ParseKeyPath(name, &key))
        return Fail(line.number, "unknown root key in [" + name + "]");
    if (key.subKey.empty()) return Fail(line.number, "a root key cannot be changed as a whole");
    RegFileEntry entry;
    entry.kind = remove ? RegFileEntry::Kind::DeleteKey : RegFileEntry::Kind::CreateKey;
    entry.line = line.number;
    entry.key = key;
    entries_->push_back(entry);
    key_ = key;
    inKey_ = !remove;
    inDeleted_ = remove;
    return true;
}

bool Parser::Value(const Line& line) {
    if (!inKey_) {
        return Fail(line.number, inDeleted_ ? "a value under a key being deleted"
                                            : "a value before the first [key] line");
    }
    RegFileEntry entry;
    entry.line = line.number;
    entry.key = key_;
    size_t pos = 1;  // past the '@' of the default value
    if (line.text[0] == '"') {
        pos = 0;
        if (!Quoted(line.text, &pos, &entry.name))
            return Fail(line.number, "the value name has no closing quote");
    }
    pos = line.text.find_first_not_of(" \t", pos);
    if (pos == std::string::npos || line.text[pos] != '=')
        return Fail(line.number, "expected '=' after the value name");
    std::string why;
    if (!Data(Trim(line.text.substr(pos + 1)), &entry, &why)) return Fail(line.number, why);
    entries_->push_back(entry);
    return true;
}

bool Parser::Data(const std::string& text, RegFileEntry* entry, std::string* why) const {
    entry->kind = RegFileEntry::Kind::SetValue;
    if (text == "-") {
        entry->kind = RegFileEntry::Kind::DeleteValue;
        return true;
    }
    if (!text.empty() && text[0] == '"') {
        size_t pos = 0;
        entry->type = kRegSz;
        bool closed = Quoted(text, &pos, &entry->data);
        entry->data += '\0';
        *why = closed ? "unexpected text after the quoted value" : "the value has no closing quote";
        return closed && pos == text.size();
    }
    if (StartsNoCase(text, 0, "dword:")) {
        std::uint32_t v = 0;
        *why = "dword: needs 1 to 8 hexadecimal digits";
        if (!HexNumber(text.substr(6), 8, &v)) return false;
        entry->type = kRegDword;
        entry->data.clear();
        for (int i = 0; i < 4; ++i) entry->data += static_cast<char>((v >> (8 * i)) & 0xFF);
        return true;
    }
    if (StartsNoCase(text, 0, "hex")) return HexData(text, entry, why);
    *why = "unrecognised value data (expected \"text\", dword:, hex:, hex(N): or -)";
    return false;
}

bool Parser::HexData(const std::string& text, RegFileEntry* entry, std::string* why) const {
    size_t colon = text.find(':');
    std::string form = text.substr(0, colon);
    entry->type = kRegBinary;
    *why = "malformed hex( type ) before ':'";
    if (colon == std::string::npos) return false;
    bool typed = form.size() > 3;  // hex(N): rather than hex:
    if (typed && (form[3] != '(' || form.back() != ')' ||
                  !HexNumber(form.substr(4, form.size() - 5), 8, &entry->type)))
        return false;
    *why = "malformed hex bytes (expected two-digit hexadecimal numbers separated by commas)";
    if (!HexList(text.substr(colon + 1), &entry->data)) return false;
    if (unicode_ && IsTextType(entry->type)) entry->data = FromUtf16(entry->data);
    return true;
}

}  // namespace

bool ParseRegFile(const std::string& fileBytes, std::vector<RegFileEntry>* entries,
                  RegFileError* error) {
    entries->clear();
    std::vector<Line> lines = LogicalLines(DecodeRegText(fileBytes));
    Parser parser(entries, error);
    if (lines.empty()) {
        error->line = 1;
        error->message = "empty file: not a registry file";
        return false;
    }
    if (!parser.Header(lines[0])) return false;
    for (size_t i = 1; i < lines.size(); ++i) {
        if (!parser.Statement(lines[i])) {
            entries->clear();
            return false;
        }
    }
    return true;
}

}  // namespace plat::reg
