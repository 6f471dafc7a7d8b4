// Helpers of the expression-language tests: a row with recording services, parsing of one
// text into a fresh plan, and the trace lines a test produced (without time stamps).
#pragma once
#include <memory>
#include <string>
#include <vector>

#include "commands/update_services.h"
#include "expr/execution_plan.h"
#include "expr/override_expression.h"
#include "manifest/content_table.h"
#include "tests/support/test_machine.h"

namespace exprtest {

// A content table of one row built from a header and a data line, and services over that row
// that record every GetSymbol and SetSymbol before doing the real work.
class RecordingServices : public UpdateServices {
public:
    explicit RecordingServices(RowReference& row) : UpdateServices(row) {}
    COverrideExpression GetSymbol(std::string name) override {
        reads.push_back(name);
        return UpdateServices::GetSymbol(name);
    }
    std::int32_t SetSymbol(std::string name, COverrideExpression& value) override {
        writes.push_back(name + "=" + value.ValueText());
        return UpdateServices::SetSymbol(name, value);
    }
    std::vector<std::string> reads, writes;
};

class TestRow {
public:
    explicit TestRow(const std::string& header = "Force Download,HomeDir,FileName,AVAR",
                     const std::string& line = "0,C:\\App,a.dll,1");
    std::string Cell(const std::string& column) const;
    CContentTable table;
    RowReference ref{table, 0};
    RecordingServices services{ref};
};

// Parses text into a fresh plan; stdout (where the parser reports) is captured into output.
struct Parsed {
    bool ok = false;
    std::vector<std::string> items;  // ExpressionText of each item
    std::string output;
};
Parsed ParseText(const std::string& text);

// The expression of "FORCED = <text>", unvalidated, for evaluating it directly.
COverrideExpression ParseExpression(const std::string& text);

// Runs the plan's validation and returns its comments, or {"valid"} when it passed.
std::vector<std::string> ValidationOf(const std::string& text);

// Routes the trace log into a file of a fresh machine, without time stamps, while it lives.
class TraceRecorder {
public:
    TraceRecorder();
    ~TraceRecorder();
    TraceRecorder(const TraceRecorder&) = delete;
    TraceRecorder& operator=(const TraceRecorder&) = delete;
    // The lines written since construction (or the last Clear), without line ends.
    std::vector<std::string> Lines() const;
    void Clear();
    const pextest::TestMachine& Machine() const { return machine_; }

private:
    pextest::TestMachine machine_;
};

// The message of the failure object that evaluating node throws; "no failure" otherwise.
std::string FailureOf(const COverrideExpression& node, UpdateServices& services);

}  // namespace exprtest
