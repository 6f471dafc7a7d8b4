#include "expr/override_expression.h"

#include <cstdio>
#include <cstdlib>

#include "expr/command_table.h"
#include "expr/override_grammar.hpp"

namespace {

std::string UpperAscii(std::string text) {
    for (char& c : text) {
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    }
    return text;
}

// C "%f": six decimals, and as many integer digits as the value needs.
std::string FormatFixed(double value) {
    int size = std::snprintf(nullptr, 0, "%f", value);
    std::string text(static_cast<std::size_t>(size) + 1, '\0');
    std::snprintf(text.data(), text.size(), "%f", value);
    text.resize(static_cast<std::size_t>(size));
    return text;
}

std::string HexCode(std::int32_t code) {
    char text[16];
    std::snprintf(text, sizeof text, "%x", static_cast<unsigned>(static_cast<std::uint32_t>(code)));
    return text;
}

}  // namespace

COverrideExpression COverrideExpression::FromText(std::int32_t type, const std::string& text) {
    COverrideExpression node;
    node.SetFrom(type, text);
    return node;
}

COverrideExpression COverrideExpression::FromToken(int token, const std::string& text) {
    std::int32_t type = kString;
    if (token == TOK_FUNCTION_NAME) type = kFunc;
    else if (token == TOK_NUMBER) type = kNumber;
    else if (token == TOK_TRUE || token == TOK_FALSE) type = kBool;
    return FromText(type, text);
}

COverrideExpression COverrideExpression::FromSymbol(const std::string& name,
                                                    const std::string& text) {
    const CommandEntry* entry = LookupCommand(name);
    return FromText(entry ? entry->resultType : kNone, text);
}

COverrideExpression COverrideExpression::Failure(std::int32_t code, const std::string& message) {
    COverrideExpression node;
    node.type = kError;
    node.code = code;
    node.name = message;
    return node;
}

COverrideExpression COverrideExpression::FromBool(bool value) {
    COverrideExpression node;
    node.type = kBool;
    node.boolValue = value;
    return node;
}

COverrideExpression COverrideExpression::FromString(const std::string& text) {
    return FromText(kString, text);
}

COverrideExpression COverrideExpression::ParamList() {
    COverrideExpression node;
    node.type = kParam;
    return node;
}

void COverrideExpression::SetFrom(std::int32_t newType, const std::string& text) {
    type = newType;
    switch (newType) {
        case kNone:
        case kString: stringValue = text; break;
        case kBool: {
            std::string upper = UpperAscii(text);
            boolValue = upper == "TRUE" || upper == "1" || upper == "T";
            break;
        }
        case kNumber: number = std::atof(text.c_str()); break;
        case kFunc: name = text; break;
        default: break;
    }
}

std::int32_t COverrideExpression::ResultType() const {
    if (type == kFunc) {
        if (const CommandEntry* entry = LookupCommand(name)) return entry->resultType;
    }
    return type;
}

bool COverrideExpression::IsSettable() const {
    const CommandEntry* entry = LookupCommand(name);
    return entry != nullptr && entry->settable;
}

const std::string& COverrideExpression::ValueText() {
    switch (type) {
        case kBool: stringValue = boolValue ? "1" : "0"; break;
        case kNumber: stringValue = FormatFixed(number); break;
        case kError: stringValue = "0x" + HexCode(code); break;
        default: break;
    }
    return stringValue;
}

const std::string& COverrideExpression::DisplayText() {
    switch (type) {
        case kBool: stringValue = boolValue ? "true" : "false"; break;
        case kNumber: stringValue = FormatFixed(number); break;
        case kFunc: stringValue = name + "()"; break;
        case kParam: {
            std::string joined;
            for (std::size_t i = 0; i < params.size(); ++i) {
                if (i > 0) joined += ",";
                joined += params[i].DisplayText();
            }
            stringValue = joined;
            break;
        }
        case kError:
            stringValue = "HResult: 0x" + HexCode(code) +
                          (code < 0 ? "(Failed!):" : "(Succeeded!):") + name;
            break;
        default: break;  // "None", "String" and unknown tags show their string value
    }
    return stringValue;
}

const char* COverrideExpression::TypeName(std::int32_t type) {
    switch (type) {
        case kNone: return "None";
        case kBool: return "Bool";
        case kNumber: return "Number";
        case kString: return "String";
        case kFunc: return "Func";
        case kParam: return "Param";
        case kError: return "Error";
        default: return "unknown type";
    }
}
