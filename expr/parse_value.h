// The value the parser keeps on its stack for a token or a reduced rule. The generated parser
// copies stack values on every reduction (its default action, then the push of the result);
// holding the node behind a shared pointer makes those copies cost nothing, and the grammar's
// actions move the nodes out of their operands into the node they build. Parsing is therefore
// linear in the text, however long a chain of operators or arguments grows.
#pragma once
#include <memory>
#include <utility>

#include "expr/override_expression.h"

struct ParseValue {
    std::shared_ptr<COverrideExpression> node;
    // Levels of the node's tree: 1 for a literal or a variable, one more than the deepest
    // parameter for a call. A "Param" list carries the depth of its deepest item.
    int depth = 1;
};

inline ParseValue Hold(COverrideExpression&& node, int depth = 1) {
    return ParseValue{std::make_shared<COverrideExpression>(std::move(node)), depth};
}

// The node of an operand, to be moved into the node being built (the operand is then spent).
inline COverrideExpression&& Take(const ParseValue& value) { return std::move(*value.node); }
