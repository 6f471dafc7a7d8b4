#include "commands/update_services.h"

#include "diag/trace_log.h"

std::string ColumnForSymbol(const std::string& name) {
    std::string upper = name;
    for (char& c : upper) {
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    }
    return upper == "FORCED" ? std::string("Force Download") : name;
}

COverrideExpression UpdateServices::GetSymbol(std::string name) {
    std::string column = ColumnForSymbol(name);
    int index = rowRef.table.ColumnIndex(column);
    if (index < 0) {
        return COverrideExpression::Failure(COverrideExpression::kUnexpected,
                                            "Illegal attempt to get value for unknown symbol.");
    }
    const std::string& cell = rowRef.table.Cell(rowRef.row, static_cast<std::uint32_t>(index));
    TRACE(g_TraceLog, "Getting Symbol: %s --> FieldName:[%s]=[%s]\n", name.c_str(), column.c_str(),
          cell.c_str());
    return COverrideExpression::FromSymbol(name, cell);
}

std::int32_t UpdateServices::SetSymbol(std::string name, COverrideExpression& value) {
    std::string column = ColumnForSymbol(name);
    int index = rowRef.table.ColumnIndex(column);
    if (index < 0) {
        // Writing a column the content file lacks would have to add it; the row stays as it is.
        TRACE(g_TraceLog, "Setting Symbol: %s(%s) not done: the content file has no such column\n",
              name.c_str(), column.c_str());
        return COverrideExpression::kUnexpected;
    }
    auto col = static_cast<std::uint32_t>(index);
    rowRef.table.SetCell(rowRef.row, col, value.ValueText());
    TRACE(g_TraceLog, "Setting Symbol: %s(%s) to %s\n", name.c_str(), column.c_str(),
          rowRef.table.Cell(rowRef.row, col).c_str());
    return 0;
}
