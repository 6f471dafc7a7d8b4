#include "expr/validation.h"

#include "expr/command_table.h"

namespace {

// Every parameter position the call has, up to the five typed slots, against its slot type.
bool CheckParameterTypes(const COverrideExpression& node, const CommandEntry& entry,
                         std::vector<std::string>& comments) {
    bool valid = true;
    for (std::size_t n = 1; n <= node.params.size() && n <= 5; ++n) {
        const COverrideExpression& parameter = node.params[n - 1];
        std::int32_t expected = entry.paramTypes[n - 1];
        if (parameter.ResultType() != expected) {
            comments.push_back(node.name + ": Type mismatch for Parameter # " + std::to_string(n) +
                               " " + parameter.name + " - expected " +
                               COverrideExpression::TypeName(expected));
            valid = false;
        }
    }
    return valid;
}

bool CheckAssignment(const COverrideExpression& node, std::vector<std::string>& comments) {
    const COverrideExpression& target = node.params[0];
    const COverrideExpression& value = node.params[1];
    bool valid = true;
    if (target.ResultType() != value.ResultType()) {
        comments.push_back("Type mismatch between " + target.name + " and " + value.name);
        valid = false;
    }
    if (!target.IsSettable()) {
        comments.push_back("Attempting to set unsettable object:" + target.name);
        valid = false;
    }
    return valid;
}

// The checks of the node itself, without its parameters.
bool CheckCall(const COverrideExpression& node, std::vector<std::string>& comments) {
    const CommandEntry* entry = LookupCommand(node.name);
    if (entry == nullptr) {
        comments.push_back("Unknown command:" + node.name);
        return false;
    }
    bool valid = true;
    if (static_cast<int>(node.params.size()) != entry->paramCount) {
        comments.push_back("Wrong # of parameters for " + node.name + " - expects " +
                           std::to_string(entry->paramCount));
        valid = false;
    }
    // Only the exact upper-case SET built by an assignment is checked as an assignment.
    if (node.name != "SET") {
        valid = CheckParameterTypes(node, *entry, comments) && valid;
    } else if (node.params.size() >= 2) {
        valid = CheckAssignment(node, comments) && valid;
    }
    return valid;
}

}  // namespace

bool Validate(const COverrideExpression& node, std::vector<std::string>& comments) {
    if (node.type != COverrideExpression::kFunc) return true;
    bool valid = CheckCall(node, comments);
    for (const COverrideExpression& parameter : node.params) {
        if (!valid) break;
        valid = Validate(parameter, comments);
    }
    return valid;
}
