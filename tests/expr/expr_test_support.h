// Helpers of the expression-language tests: a row with recording services and parsing of one
// text into a fresh plan. Their traces are read with pextest::TraceCapture.
#pragma once
#include <string>
#include <vector>

#include "commands/update_services.h"
#include "expr/execution_plan.h"
#include "expr/override_expression.h"
#include "manifest/content_table.h"

namespace exprtest {

// Services over one row that record the name of every GetSymbol ("AVAR HomeDir") before doing
// the real work.
class RecordingServices : public UpdateServices {
public:
    explicit RecordingServices(RowReference& row) : UpdateServices(row) {}
    COverrideExpression GetSymbol(std::string name) override {
        reads += (reads.empty() ? "" : " ") + name;
        return UpdateServices::GetSymbol(name);
    }
    std::string reads;
};

// A content table of one row built from a header and a data line, with recording services. The
// default header names two columns in another case than the scripts do: names match any case.
class TestRow {
public:
    explicit TestRow(const std::string& header = "FORCE DOWNLOAD,homedir,FileName,AVAR",
                     const std::string& line = "0,C:\\App,a.dll,1");
    std::string Cell(const std::string& column) const;
    CContentTable table;
    RowReference ref{table, 0};
    RecordingServices services{ref};
};

// plan.Parse(text) with stdout (where the parser reports) captured into *output when given.
bool QuietParse(ExecutionPlan& plan, const std::string& text, std::string* output = nullptr);

// The expression of "FORCED = <text>", unvalidated, for evaluating it directly.
COverrideExpression ParseExpression(const std::string& text);

}  // namespace exprtest
