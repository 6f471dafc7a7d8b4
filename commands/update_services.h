// UpdateServices: the only way a dynamic-field script reaches its own content-file row. A symbol
// in a script names a column of the row ("FORCED" names "Force Download"); GetSymbol reads the
// cell and SetSymbol writes it. One object is made for each row whose script runs and lives
// only while it runs; it owns nothing.
#pragma once
#include <cstdint>
#include <string>

#include "expr/override_expression.h"
#include "manifest/content_table.h"

// One row of a content table.
struct RowReference {
    CContentTable& table;
    std::uint32_t row;
};

class UpdateServices {
public:
    explicit UpdateServices(RowReference& row) : rowRef(row) {}

    // The symbol's cell as a value typed by the command table (a cell "1" read for FORCED is a
    // Bool true). A symbol that names no column gives an "Error" node (E_UNEXPECTED, "Illegal
    // attempt to get value for unknown symbol.") and logs nothing.
    virtual COverrideExpression GetSymbol(std::string name);
    // Stores value's ValueText into the symbol's cell and returns 0. A symbol that names no
    // column changes nothing and returns E_UNEXPECTED. Both outcomes are logged.
    virtual std::int32_t SetSymbol(std::string name, COverrideExpression& value);

    // The evaluation depth: 0 when made, reset by the plan before it runs, raised and lowered
    // by each evaluation step; it indents the variable-lookup trace lines.
    std::int32_t nestingLevel = 0;
    RowReference& rowRef;
};

// The column a symbol names: "Force Download" for FORCED in any case, otherwise the symbol.
std::string ColumnForSymbol(const std::string& name);
