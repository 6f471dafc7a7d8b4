// Evaluation of a validated tree against one row's services.
#pragma once
#include <string>

#include "expr/override_expression.h"

class UpdateServices;

// A "Func" node runs its command-table executor; a name outside the table gives an "Error"
// node (E_UNEXPECTED, no message), returned rather than thrown. Any other node evaluates to a
// copy of itself. The services' nesting level is one deeper while the node runs. Failures of
// the executors pass through as thrown "Error" nodes.
COverrideExpression Evaluate(const COverrideExpression& node, UpdateServices& services);

// Throws the language's failure object: an "Error" node with code E_UNEXPECTED and message.
[[noreturn]] void ThrowFailure(const std::string& message);
