// Row preparation: runs once over every freshly loaded content table, before the analysis.
#include "commands/row_preparation.h"

#include <exception>

#include "commands/update_services.h"
#include "diag/trace_log.h"
#include "expr/execution_plan.h"
#include "manifest/manifest_parser.h"
#include "model/upgrade_status.h"

namespace {

std::string ReplaceAll(std::string text, const std::string& from, const std::string& to) {
    for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

void LogComments(const ExecutionPlan& plan) {
    for (const std::string& comment : plan.Comments()) TRACE(g_TraceLog, "%s\n", comment.c_str());
}

// Parses, validates and runs one row's script against the row.
void RunRowPlan(CContentTable& table, std::uint32_t row, const std::string& script) {
    const int fileName = table.ColumnIndex("FileName");
    TRACE(g_TraceLog, "Evaluating Dynamic Fields for file %s: [%s]\n",
          fileName < 0 ? "" : table.Cell(row, static_cast<std::uint32_t>(fileName)).c_str(),
          script.c_str());
    ExecutionPlan plan;
    if (!plan.Parse(script)) {
        TRACE(g_TraceLog, "Error Creating Plan");
        return;
    }
    if (!plan.Validate()) {
        TRACE(g_TraceLog, "Evaluation Plan Not Valid.  Validation Results:\n");
        LogComments(plan);
        return;
    }
    RowReference reference{table, row};
    UpdateServices services(reference);
    const std::int32_t hr = plan.Execute(services);
    if (hr < 0) {
        TRACE(g_TraceLog, "Execute Plan FAILED! HResult = 0x%x\n", static_cast<unsigned>(hr));
        LogComments(plan);
    } else {
        TRACE(g_TraceLog, "Execute Plan SUCCEEDED! HResult = 0x%x", static_cast<unsigned>(hr));
    }
}

// A failure other than the language's own while the row's plan is made or checked (memory
// ran out) is that row's failure: the next row goes on.
void EvaluateRow(CContentTable& table, std::uint32_t row, const std::string& script) {
    try {
        RunRowPlan(table, row, script);
    } catch (const std::exception& failure) {
        TRACE(g_TraceLog, "EvaluateDynamicFields: plan of row %u abandoned: %s\n",
              static_cast<unsigned>(row), failure.what());
    }
}

}  // namespace

std::int32_t LoadContentRows(CContentTable& table, const std::string& path,
                             const std::string& defaultDirectory) {
    const std::int32_t hr = table.LoadFromFile(path, true, ',');
    if (hr < 0) return hr;
    // Without these the analysis would take every row as a file without a name, or never as
    // downloaded, and a run would end by discarding rows it never looked at.
    for (const char* column : {"FileName", "UpgradeStatus"}) {
        if (table.ColumnIndex(column) < 0) return table.FailLoad(std::string("there is no column ") + column);
    }
    NormalizeUpgradeStatus(table);
    ResolveHomeDirs(table, defaultDirectory);
    return EvaluateDynamicFields(table);
}

void ResolveHomeDirs(CContentTable& table, const std::string& defaultDirectory) {
    const int column = table.ColumnIndex("HomeDir");
    for (std::uint32_t row = 0; row < table.RowCount(); ++row) {
        const std::string home = column < 0 ? std::string() : table.Cell(row, static_cast<std::uint32_t>(column));
        const std::string resolved = CManifestParser::sResolveDirectoryInformation(home, defaultDirectory);
        if (column >= 0) table.SetCell(row, static_cast<std::uint32_t>(column), resolved);
    }
}

std::int32_t EvaluateDynamicFields(CContentTable& table) {
    const int column = table.ColumnIndex("DynamicFieldInfo");
    if (column < 0) return 0;
    for (std::uint32_t row = 0; row < table.RowCount(); ++row) {
        const std::string cell = table.Cell(row, static_cast<std::uint32_t>(column));
        if (cell.empty()) continue;
        EvaluateRow(table, row, ReplaceAll(ReplaceAll(cell, "&#x2C;", ","), "&#x2c;", ","));
    }
    return 0;
}
