// Building the tree of a dynamic-field text: the operations the grammar's actions call. Nothing
// here evaluates anything; trace lines record what was built.
#pragma once
#include <string>

#include "expr/override_expression.h"

// Appends a copy of parameter to node's parameters and returns a copy of node.
COverrideExpression AddParameter(COverrideExpression& node, const COverrideExpression& parameter);

// Replaces the call's parameters by the items of the "Param" list, traces the call and its
// parameters, and returns the call.
COverrideExpression AttachParameters(COverrideExpression& call, COverrideExpression& paramList);

// A "Func" node named name with copies of the operands as its parameters, in order.
COverrideExpression MakeCall(const std::string& name, const COverrideExpression& operand);
COverrideExpression MakeCall(const std::string& name, const COverrideExpression& left,
                             const COverrideExpression& right);

// A parameterless "Func" node named text (as written) when text is in the command table;
// otherwise an "Error" node (E_UNEXPECTED, no message), which validation later rejects.
COverrideExpression CreateVariable(const std::string& text);

// The assignment setting = value: SET(variable, value), pushed into the current plan and
// returned.
COverrideExpression MakeAssignment(const COverrideExpression& setting, COverrideExpression& value);
