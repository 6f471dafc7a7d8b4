// COverrideExpression: the one value type of the dynamic-field language. The same object is a
// scanner token's value, a node of the parsed tree, a run-time value and the error object that
// evaluation throws. It is a plain value: copies are deep, parameters included.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

class COverrideExpression {
public:
    // Type tags; the numbers are part of the language's vocabulary (5 is unused on purpose).
    enum Type : std::int32_t {
        kNone = 0,
        kBool = 1,
        kNumber = 2,
        kString = 3,
        kFunc = 4,
        kParam = 6,
        kError = 7,
    };
    // E_UNEXPECTED: the code of every failure the language raises.
    static constexpr std::int32_t kUnexpected = static_cast<std::int32_t>(0x8000FFFFu);

    // The empty node: "None", empty texts, false, 0.0, code 0, no parameters.
    COverrideExpression() = default;

    // A node of the given type whose value is taken from text (see SetFrom).
    static COverrideExpression FromText(std::int32_t type, const std::string& text);
    // The value of a scanner token: TOK_FUNCTION_NAME gives "Func", TOK_NUMBER "Number",
    // TOK_TRUE and TOK_FALSE "Bool", every other code "String"; the value comes from text.
    static COverrideExpression FromToken(int token, const std::string& text);
    // The value of a named symbol read from a row: the type is the command table's result type
    // of name ("None" for a name outside the table), the value comes from text.
    static COverrideExpression FromSymbol(const std::string& name, const std::string& text);
    // An "Error" node; the message is kept in name.
    static COverrideExpression Failure(std::int32_t code, const std::string& message = std::string());
    static COverrideExpression FromBool(bool value);
    static COverrideExpression FromString(const std::string& text);
    // An empty "Param" list, the carrier of a call's arguments while they are parsed.
    static COverrideExpression ParamList();

    // Sets the type tag to type and converts text into the field that type uses: "None" and
    // "String" keep the text, "Bool" is true for TRUE, 1 or T in any case, "Number" is C atof
    // of the text, "Func" takes the text as its name. Other types store nothing else.
    void SetFrom(std::int32_t type, const std::string& text);

    // The command table's result type for a "Func" named in the table; otherwise the own type.
    std::int32_t ResultType() const;
    bool IsBool() const { return ResultType() == kBool; }
    bool IsString() const { return ResultType() == kString; }
    // True when name is a command-table entry that may be assigned.
    bool IsSettable() const;

    // The value as stored in a row cell: "1"/"0", "%f", "0x<hex code>" or the string value.
    // Both text forms leave their result in stringValue as well.
    const std::string& ValueText();
    // The value as traces and messages show it.
    const std::string& DisplayText();

    // "None", "Bool", ..., or "unknown type".
    static const char* TypeName(std::int32_t type);

    std::int32_t type = kNone;
    std::string name;  // "Func": the called name; "Error": the message
    bool boolValue = false;
    double number = 0.0;
    std::string stringValue;
    std::int32_t code = 0;  // "Error": HRESULT-style, negative means failure
    std::vector<COverrideExpression> params;
};
