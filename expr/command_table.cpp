#include "expr/command_table.h"

#include "expr/executors.h"

namespace {

using T = COverrideExpression;
constexpr std::int32_t B = T::kBool, S = T::kString, N = T::kNumber, O = T::kNone;

const CommandEntry kCommands[] = {
    {"AND", ExecAND, B, false, 2, {B, B, O, O, O}},
    {"OR", ExecOR, B, false, 2, {B, B, O, O, O}},
    {"XOR", ExecXOR, B, false, 2, {B, B, O, O, O}},
    {"NOT", ExecNOT, B, false, 1, {B, O, O, O, O}},
    {"CONCAT", ExecConCat, S, false, 2, {S, S, O, O, O}},
    {"IIFS", ExecIIFS, S, false, 3, {B, S, S, O, O}},
    {"IIFB", ExecIIFB, B, false, 3, {B, B, B, O, O}},
    {"IIFN", ExecIIFN, N, false, 3, {B, N, N, O, O}},
    {"IsUnderstood", ExecIsUnderstood, B, false, 1, {S, O, O, O, O}},
    {"FileVersionAtLeast", ExecFileVersionAtLeast, B, false, 2, {S, S, O, O, O}},
    {"FileExists", ExecFileExists, B, false, 1, {S, O, O, O, O}},
    {"AddPathSep", ExecAddPathSep, S, false, 1, {S, O, O, O, O}},
    {"SET", SET, O, false, 2, {O, O, O, O, O}},
    // Variables: no parameters; slot 1 repeats the variable's type.
    {"AVAR", GetVar, B, false, 0, {B, O, O, O, O}},
    {"BVAR", GetVar, B, false, 0, {B, O, O, O, O}},
    {"CVAR", GetVar, B, false, 0, {S, O, O, O, O}},
    {"FORCED", GetVar, B, true, 0, {B, O, O, O, O}},
    {"HomeDir", GetVar, S, true, 0, {S, O, O, O, O}},
    {"FileName", GetVar, S, true, 0, {S, O, O, O, O}},
};

char UpperAscii(char c) { return (c >= 'a' && c <= 'z') ? static_cast<char>(c - 'a' + 'A') : c; }

bool EqualsIgnoringCase(const std::string& a, const char* b) {
    std::size_t i = 0;
    for (; i < a.size() && b[i] != '\0'; ++i) {
        if (UpperAscii(a[i]) != UpperAscii(b[i])) return false;
    }
    return i == a.size() && b[i] == '\0';
}

}  // namespace

const CommandEntry* CommandTable() { return kCommands; }

std::size_t CommandTableSize() { return sizeof(kCommands) / sizeof(kCommands[0]); }

const CommandEntry* LookupCommand(const std::string& name) {
    for (const CommandEntry& entry : kCommands) {
        if (EqualsIgnoringCase(name, entry.name)) return &entry;
    }
    return nullptr;
}
