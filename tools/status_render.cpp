// `pexupdate status`: the report as text and as JSON.
#include <nlohmann/json.hpp>

#include <string>

#include "tools/status_report.h"

namespace pextool::status {

const char kJsonShape[] =
    "{\"version\": 1, \"traceLog\": PATH, \"needsAttention\": BOOL, \"products\": [\n"
    "  {\"name\": TEXT, \"needsAttention\": BOOL,\n"
    "   \"contentFile\": {\"path\": PATH|null, \"present\": BOOL, \"loaded\": BOOL,\n"
    "                   \"loadFailure\": TEXT|null, \"rejectedCopy\": PATH|null},\n"
    "   \"rows\": {STATUS: COUNT, ...},\n"
    "   \"notApplied\": [{\"row\": N, \"fileName\": TEXT, \"folder\": PATH, \"status\": STATUS}],\n"
    "   \"interruptedRun\": null | {\"journal\": PATH,\n"
    "                              \"rows\": [{\"row\": N, \"steps\": KINDS, \"target\": PATH}]},\n"
    "   \"restartQueue\": [{\"from\": PATH, \"to\": PATH (\"\": deleted), \"replace\": BOOL}],\n"
    "   \"lastRun\": null | {\"log\": PATH, \"when\": \"YYYY/MM/DD - HH:MM:SS.mmm\",\n"
    "                       \"result\": FAILURES|null, \"explanation\": [LOG LINE, ...]}}]}\n"
    "Paths are Windows paths. Rows count from 0, as the trace log counts them. KINDS are the\n"
    "journal's record kinds in order (B backed up, R replaced, Q queued, X expanded, C committed).\n"
    "On exit 2 the document is {\"version\": 1, \"error\": TEXT}.\n";

namespace {

// Keys in the documented order.
using json = nlohmann::ordered_json;

json TextOrNull(const std::string& text) { return text.empty() ? json(nullptr) : json(text); }

json ContentFileJson(const ProductStatus& p) {
    return {{"path", TextOrNull(p.contentFile)},
            {"present", p.present},
            {"loaded", p.loaded},
            {"loadFailure", TextOrNull(p.loadFailure)},
            {"rejectedCopy", TextOrNull(p.rejectedCopy)}};
}

json InterruptedJson(const ProductStatus& p) {
    if (p.journal.empty()) return nullptr;
    json rows = json::array();
    for (const JournalRow& row : p.interrupted)
        rows.push_back({{"row", row.row}, {"steps", row.steps}, {"target", row.target}});
    return {{"journal", p.journal}, {"rows", rows}};
}

json LastRunJson(const LastRun& run) {
    if (!run.found) return nullptr;
    return {{"log", run.logFile},
            {"when", run.when},
            {"result", run.hasResult ? json(run.result) : json(nullptr)},
            {"explanation", run.explanation}};
}

json ProductJson(const ProductStatus& p) {
    json notApplied = json::array();
    for (const RowState& row : p.notApplied)
        notApplied.push_back({{"row", row.row}, {"fileName", row.fileName}, {"folder", row.folder}, {"status", row.status}});
    json queue = json::array();
    for (const plat::setup::PendingRename& op : p.queued)
        queue.push_back({{"from", op.from}, {"to", op.to}, {"replace", op.replace}});
    return {{"name", p.name},
            {"needsAttention", p.NeedsAttention()},
            {"contentFile", ContentFileJson(p)},
            {"rows", json(p.statusCounts)},
            {"notApplied", notApplied},
            {"interruptedRun", InterruptedJson(p)},
            {"restartQueue", queue},
            {"lastRun", LastRunJson(p.lastRun)}};
}

std::string ContentFileText(const ProductStatus& p) {
    if (p.contentFile.empty()) return "none registered";
    if (!p.present) return p.contentFile + " (missing)";
    if (!p.loaded) return p.contentFile + " (does not load: " + p.loadFailure + ")";
    std::string counts;
    for (const auto& [status, count] : p.statusCounts)
        counts += (counts.empty() ? "" : ", ") + std::to_string(count) + " " + status;
    return p.contentFile + " (" + (counts.empty() ? std::string("no rows") : counts) + ")";
}

std::string LastRunText(const LastRun& run) {
    if (!run.found) return "  last run: none in the trace log\n";
    std::string text = "  last run: " + run.when + " (" + run.logFile + "), ";
    if (!run.hasResult)
        text += "no result in the log\n";
    else
        text += "returned " + std::to_string(run.result) + (run.result == 1 ? " failure\n" : " failures\n");
    for (const std::string& line : run.explanation) text += "    > " + line + "\n";
    return text;
}

std::string ProductText(const ProductStatus& p) {
    std::string text = p.name + ": " + (p.NeedsAttention() ? "needs attention" : "up to date") + "\n";
    text += "  content file: " + ContentFileText(p) + "\n";
    if (!p.rejectedCopy.empty()) text += "  kept aside: " + p.rejectedCopy + " (a content file that did not load)\n";
    for (const RowState& row : p.notApplied)
        text += "  not applied: row " + std::to_string(row.row) + " " + row.fileName + " in " + row.folder + ": " +
                row.status + "\n";
    if (!p.journal.empty()) text += "  interrupted run, waiting for recovery: " + p.journal + "\n";
    for (const JournalRow& row : p.interrupted)
        text += "    row " + std::to_string(row.row) + " (" + row.steps + ")" + (row.target.empty() ? "" : " " + row.target) + "\n";
    for (const plat::setup::PendingRename& op : p.queued)
        text += "  restart queue: " + (op.to.empty() ? "delete " + op.from : op.from + " -> " + op.to) + "\n";
    return text + LastRunText(p.lastRun);
}

}  // namespace

std::string RenderText(const Report& report) {
    std::string text;
    for (const ProductStatus& product : report.products) text += ProductText(product);
    if (report.products.empty()) text += "No product is registered.\n";
    return text + "Trace log: " + report.traceLog + "\n";
}

std::string RenderJson(const Report& report) {
    json products = json::array();
    for (const ProductStatus& product : report.products) products.push_back(ProductJson(product));
    const json document = {{"version", 1},
                           {"traceLog", report.traceLog},
                           {"needsAttention", ExitCode(report) != 0},
                           {"products", products}};
    // Log lines and file names may hold bytes that are not UTF-8 (names in the Windows code page).
    return document.dump(2, ' ', false, json::error_handler_t::replace) + "\n";
}

}  // namespace pextool::status
