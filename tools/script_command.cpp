// `pexupdate script "TEXT" [--row CONTENTFILE:N]`: for people who write content files. Parses and
// checks a dynamic-field text the way the updater does for a row's "DynamicFieldInfo" column,
// shows what it means and why it would be refused, and can try it on a row of a content file.
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "commands/update_services.h"
#include "expr/execution_plan.h"
#include "expr/expression_text.h"
#include "manifest/content_table.h"
#include "platform/paths.h"
#include "tools/command.h"

namespace {

const char kUsage[] =
    "usage: pexupdate script \"TEXT\" [--row CONTENTFILE:N]\n\n"
    "Parses TEXT as the dynamic-field script of a content-file row (the \"DynamicFieldInfo\"\n"
    "column, after the row's &#x2C; escapes are decoded), checks it against the language's\n"
    "names and types, and prints each assignment of the plan and every validation comment.\n"
    "A text that does not parse gets the parser's own message (\"syntax error\") first.\n"
    "With --row, a valid plan is also executed against row N (counted from 0, as the trace log\n"
    "counts rows) of the content file, and the cells it changed are printed; the file itself is\n"
    "not changed. CONTENTFILE is a Windows path on the machine, or a host path starting with '/'.\n"
    "An assignment to a column that the content file lacks (FORCED without a \"Force Download\"\n"
    "column) stores nothing and is printed as \"not stored\"; the plan still succeeds, as in a\n"
    "real run.\n"
    "Exit status: 0 when the text is valid (and, with --row, ran without failure), 1 otherwise.\n";

struct RowChoice {
    std::string file;
    long row = -1;
};

bool ParseRowChoice(const std::string& text, RowChoice* choice) {
    const size_t colon = text.rfind(':');
    if (colon == std::string::npos || colon + 1 == text.size()) return false;
    char* end = nullptr;
    choice->row = std::strtol(text.c_str() + colon + 1, &end, 10);
    choice->file = text.substr(0, colon);
    if (!choice->file.empty() && choice->file[0] == '/') choice->file = plat::paths::ToWindows(choice->file);
    return *end == '\0' && choice->row >= 0 && !choice->file.empty();
}

// The row's services, which also print each assignment that found no column to store into.
class ReportingServices : public UpdateServices {
public:
    using UpdateServices::UpdateServices;
    std::int32_t SetSymbol(std::string name, COverrideExpression& value) override {
        const std::int32_t hr = UpdateServices::SetSymbol(name, value);
        if (hr < 0) {
            std::printf("not stored: %s = %s: the content file has no column \"%s\"\n", name.c_str(),
                        value.ValueText().c_str(), ColumnForSymbol(name).c_str());
        }
        return hr;
    }
};

// Runs the plan against the row and prints every cell that it changed.
int RunOnRow(ExecutionPlan& plan, const RowChoice& choice) {
    CContentTable table;
    if (table.LoadFromFile(choice.file) < 0) {
        std::fprintf(stderr, "pexupdate: cannot load the content file %s\n", choice.file.c_str());
        return 1;
    }
    if (static_cast<std::uint32_t>(choice.row) >= table.RowCount()) {
        std::fprintf(stderr, "pexupdate: %s has %u rows, no row %ld\n", choice.file.c_str(), table.RowCount(),
                     choice.row);
        return 1;
    }
    const auto row = static_cast<std::uint32_t>(choice.row);
    std::vector<std::string> before;
    for (std::uint32_t c = 0; c < table.ColumnCount(); ++c) before.push_back(table.Cell(row, c));
    RowReference reference{table, row};
    ReportingServices services(reference);
    const std::int32_t hr = plan.Execute(services);
    for (const std::string& comment : plan.Comments()) std::printf("failed: %s\n", comment.c_str());
    for (std::uint32_t c = 0; c < table.ColumnCount(); ++c)
        if (table.Cell(row, c) != before[c])
            std::printf("changed: %s: '%s' -> '%s'\n", table.ColumnName(c).c_str(), before[c].c_str(),
                        table.Cell(row, c).c_str());
    std::printf(hr < 0 ? "executed with failures\n" : "executed\n");
    return hr < 0 ? 1 : 0;
}

int RunScript(const std::vector<std::string>& args) {
    const bool help = args.size() == 1 && args[0] == "--help";
    RowChoice choice;
    const bool withRow = args.size() == 3 && args[1] == "--row";
    if (help || !(args.size() == 1 || withRow) || (withRow && !ParseRowChoice(args[2], &choice))) {
        std::fputs(kUsage, help ? stdout : stderr);
        return help ? 0 : 2;
    }
    ExecutionPlan plan;
    bool parsed = plan.Parse(args[0]);
    for (std::size_t i = 0; i < plan.Items().size(); ++i) {
        std::printf("item %zu: %s\n", i + 1, ExpressionText(plan.Items()[i]).c_str());
    }
    if (!parsed) {
        std::printf("not valid: the text does not parse\n");
        return 1;
    }
    bool valid = plan.Validate();
    for (const std::string& comment : plan.Comments()) std::printf("comment: %s\n", comment.c_str());
    std::printf(valid ? "valid\n" : "not valid\n");
    if (!valid) return 1;
    return withRow ? RunOnRow(plan, choice) : 0;
}

const pextool::CommandRegistrar kScript({"script", "parse and check a dynamic-field script",
                                         RunScript});

}  // namespace
