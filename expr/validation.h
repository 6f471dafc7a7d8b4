// The validation pass: checks a parsed tree against the command table before it runs.
#pragma once
#include <string>
#include <vector>

#include "expr/override_expression.h"

// True when node and its subtree conform to the command table (known names, parameter counts,
// parameter types, assignments of matching type to settable names). Each problem found appends
// one text to comments. The descent stops at the first invalid node, so a text reports the
// problems of the outermost call that fails. Never throws.
bool Validate(const COverrideExpression& node, std::vector<std::string>& comments);
