// What `pexupdate status` reports: for each registered product, what its content file, the
// journal of an interrupted run, the restart queue and the trace log say about it. Gathered
// from the machine without changing anything on it.
#pragma once
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "platform/setup_install.h"

namespace pextool::status {

// A content-file row that is not applied.
struct RowState {
    std::uint32_t row = 0;
    std::string fileName, folder, status;
};

// A row that an interrupted run left for the next run to recover.
struct JournalRow {
    std::uint32_t row = 0;
    std::string steps;   // the kinds of its records, in order ("BR": backed up, then replaced)
    std::string target;  // the file it was working on; empty when no record names one
};

// The product's last run as the trace log tells it.
struct LastRun {
    bool found = false;
    std::string logFile;  // the log or its .bak
    std::string when;     // the time stamp of the run's first line
    bool hasResult = false;
    std::int32_t result = 0;                // the number of failures it returned
    std::vector<std::string> explanation;   // the lines that explain a failure, as written
};

struct ProductStatus {
    std::string name;
    std::string contentFile;  // as the registry names it; empty when it names none
    bool present = false;     // the content file exists
    bool loaded = false;      // and loads
    std::string loadFailure;
    std::string rejectedCopy;  // a copy kept aside that exists; empty when none
    std::map<std::string, std::uint32_t> statusCounts;
    std::vector<RowState> notApplied;
    std::string journal;  // the journal's path, when one exists
    std::vector<JournalRow> interrupted;
    std::vector<plat::setup::PendingRename> queued;
    LastRun lastRun;

    // Something pending or failed: a row not applied, an interrupted run, a queued file, a
    // content file that did not load, or a last run that returned failures.
    bool NeedsAttention() const;
};

struct Report {
    std::vector<ProductStatus> products;
    std::string traceLog;  // the log read (its .bak beside it)
};

// Gathers every registered product, or only the one named (which must be registered). False,
// with why, when the machine cannot be read.
bool Gather(const std::string& only, const std::string& traceLog, Report* report, std::string* error);

// Fills the product's last run from the trace log, or its .bak when the log has no run of it; a
// copy kept aside that the run names is noted too.
void ReadLastRun(const std::string& traceLog, ProductStatus* product);

// The report as text for a person, and as one JSON document (its shape in kJsonShape).
std::string RenderText(const Report& report);
std::string RenderJson(const Report& report);
extern const char kJsonShape[];

// 0 when nothing is pending or failed, 1 when something is.
int ExitCode(const Report& report);

// The library's trace log beside the library at libraryPath (a Windows path).
std::string TraceLogBeside(const std::string& libraryPath);

}  // namespace pextool::status
