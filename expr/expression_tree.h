// Building the tree of a dynamic-field text: the operations the grammar's actions call. Nothing
// here evaluates anything; trace lines record what was built. Operands are moved into the node
// built from them, never copied, so building a tree costs time in proportion to its size.
#pragma once
#include <string>

#include "expr/override_expression.h"

// Appends parameter to node's parameters and returns node.
COverrideExpression& AddParameter(COverrideExpression& node, COverrideExpression&& parameter);

// Replaces the call's parameters by the items of the "Param" list, traces the call and its
// parameters, and returns the call.
COverrideExpression AttachParameters(COverrideExpression&& call, COverrideExpression&& paramList);

// A "Func" node named name with the operands as its parameters, in order.
COverrideExpression MakeCall(const std::string& name, COverrideExpression&& operand);
COverrideExpression MakeCall(const std::string& name, COverrideExpression&& left,
                             COverrideExpression&& right);

// A parameterless "Func" node named text (as written) when text is in the command table;
// otherwise an "Error" node (E_UNEXPECTED, no message), which validation later rejects.
COverrideExpression CreateVariable(const std::string& text);

// The assignment setting = value: SET(variable, value), pushed into the current plan, which
// keeps the only copy (the grammar makes no further use of an assignment).
void MakeAssignment(const COverrideExpression& setting, COverrideExpression&& value);
