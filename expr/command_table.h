// The command table: every name the dynamic-field language can call or read (built-in
// functions, the assignment SET and the row variables) with its executor, result type, settable
// flag and parameter signature. Validation checks trees against it; evaluation dispatches by it.
#pragma once
#include <cstddef>
#include <cstdint>
#include <string>

#include "expr/override_expression.h"

class UpdateServices;

// Runs one call node against the row's services; failures are thrown as "Error" nodes.
using Executor = COverrideExpression (*)(const COverrideExpression& call, UpdateServices& services);

struct CommandEntry {
    const char* name;
    Executor executor;
    std::int32_t resultType;
    bool settable;
    int paramCount;
    std::int32_t paramTypes[5];  // slots past paramCount hold "None"
};

// The table in its fixed order.
const CommandEntry* CommandTable();
std::size_t CommandTableSize();

// The first entry whose name equals name without regard to ASCII case; nullptr when none.
const CommandEntry* LookupCommand(const std::string& name);
