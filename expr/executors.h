// The executors of the built-in functions, the assignment and the variables. Each takes the
// call node and the row's services, evaluates its parameters left to right and only as far as
// it needs them, and throws an "Error" node (code E_UNEXPECTED, fixed message) when a call is
// malformed.
#pragma once
#include "expr/override_expression.h"

class UpdateServices;

COverrideExpression ExecAND(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecOR(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecXOR(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecNOT(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecConCat(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecIIFS(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecIIFB(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecIIFN(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecIsUnderstood(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecFileVersionAtLeast(const COverrideExpression& call,
                                           UpdateServices& services);
COverrideExpression ExecFileExists(const COverrideExpression& call, UpdateServices& services);
COverrideExpression ExecAddPathSep(const COverrideExpression& call, UpdateServices& services);
// The assignment: stores the value of parameter 2 into the row symbol named by parameter 1;
// returns an "Error" node with code 0.
COverrideExpression SET(const COverrideExpression& call, UpdateServices& services);
// Reads a variable through the services' GetSymbol, tracing the lookup indented by the
// nesting depth.
COverrideExpression GetVar(const COverrideExpression& call, UpdateServices& services);
