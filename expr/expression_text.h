// A readable one-line form of a parsed tree, for people checking what a dynamic-field text
// means (the trace log's DisplayText shows calls without their parameters).
#pragma once
#include <string>

#include "expr/override_expression.h"

// Calls as name(p1, p2), parameterless names (variables) bare, literals as written in a text
// (TRUE, 2.5, "a\\b"), a name the table does not know as <unknown name>, other errors as
// <error: message>.
std::string ExpressionText(const COverrideExpression& node);
