#include "expr/expression_text.h"

#include <cstdio>

namespace {

// The string as a quoted literal that scans back to the same value.
std::string QuotedText(const std::string& value) {
    std::string text = "\"";
    for (char c : value) {
        if (c == '\\' || c == '"') text += '\\';
        if (c == '\n') {
            text += "\\n";
            continue;
        }
        text += c;
    }
    return text + "\"";
}

std::string NumberText(double value) {
    char text[64];
    std::snprintf(text, sizeof text, "%.15g", value);
    return text;
}

std::string CallText(const COverrideExpression& node) {
    if (node.params.empty()) return node.name;
    std::string text = node.name + "(";
    for (std::size_t i = 0; i < node.params.size(); ++i) {
        if (i > 0) text += ", ";
        text += ExpressionText(node.params[i]);
    }
    return text + ")";
}

}  // namespace

std::string ExpressionText(const COverrideExpression& node) {
    using Node = COverrideExpression;
    switch (node.type) {
        case Node::kBool: return node.boolValue ? "TRUE" : "FALSE";
        case Node::kNumber: return NumberText(node.number);
        case Node::kString: return QuotedText(node.stringValue);
        case Node::kFunc: return CallText(node);
        case Node::kError:
            return node.name.empty() ? "<unknown name>" : "<error: " + node.name + ">";
        default: return "<" + std::string(Node::TypeName(node.type)) + ">";
    }
}
