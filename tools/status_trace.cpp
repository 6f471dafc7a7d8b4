// `pexupdate status`: a product's last run as the trace log tells it. The log holds the runs of
// the current process of the library, its .bak those of the one before (each load of the library
// moves the log aside), so the newer file that has a run of the product tells its last run.
#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "platform/files.h"
#include "tools/status_report.h"

namespace pextool::status {

namespace {

// A run's explanation is cut at this many lines; the log has the rest.
constexpr std::size_t kMaxExplanation = 20;

// A run's first line, and the lines that say what it returned.
const char kRunStart[] = "CManifestParser: LoadManifest, Project name is '";
const char kReturning[] = "CManifestParser: ProcessUpdateInformation, returning ";
const char kNothingToDo[] = "CManifestParser: ProcessUpdateInformation, No content file exists, nothing to do";
const char kKeptAside[] = "CManifestParser: ProcessUpdateInformation, rejected content file kept as '";

// Words of the lines that explain a failure: the failed copy or command, the rollback, a
// content file that did not load, a row the recovery could not finish.
const char* const kExplaining[] = {"fail", "unable", "roll", "rejected", "could not", "not successfull", "error"};
// Lines with those words that every run may write and that explain nothing: the analysis of a
// row that waits to be applied, an optional key that is missing, a row without an update date.
const char* const kNoise[] = {"UpgradeStatus is downloaded or application failed", "RegOpenKeyEx failed with 2",
                              "Unable to parse provided date time string ''"};

struct LogLine {
    std::string stamp;    // "YYYY/MM/DD - HH:MM:SS.mmm"; empty on the later lines of a multi-line trace
    std::string message;
};

// A stamped line: "YYYY/MM/DD - HH:MM:SS.mmm - message".
LogLine Split(const std::string& line) {
    constexpr std::size_t kStamp = 25;
    const bool stamped = line.size() >= kStamp + 3 && line.compare(kStamp, 3, " - ") == 0 && line[4] == '/' &&
                         line[7] == '/' && line.compare(10, 3, " - ") == 0;
    if (!stamped) return {"", line};
    return {line.substr(0, kStamp), line.substr(kStamp + 3)};
}

std::vector<LogLine> ReadLog(const std::string& path) {
    std::string bytes;
    std::vector<LogLine> lines;
    if (!plat::files::Exists(path) || !plat::files::ReadAll(path, &bytes)) return lines;
    std::size_t start = 0;
    while (start < bytes.size()) {
        std::size_t end = bytes.find('\n', start);
        if (end == std::string::npos) end = bytes.size();
        std::string line = bytes.substr(start, end - start);
        if (!line.empty() && line.back() == '\r') line.pop_back();
        lines.push_back(Split(line));
        start = end + 1;
    }
    return lines;
}

bool Explains(const std::string& message) {
    std::string lower = message;
    std::transform(lower.begin(), lower.end(), lower.begin(), [](unsigned char c) { return std::tolower(c); });
    if (std::any_of(std::begin(kNoise), std::end(kNoise),
                    [&](const char* noise) { return message.find(noise) != std::string::npos; }))
        return false;
    return std::any_of(std::begin(kExplaining), std::end(kExplaining),
                       [&](const char* word) { return lower.find(word) != std::string::npos; });
}

bool StartsWith(const std::string& text, const std::string& prefix) { return text.compare(0, prefix.size(), prefix) == 0; }

// The quoted name after prefix, up to its closing quote.
std::string Quoted(const std::string& message, const std::string& prefix) {
    const std::string rest = message.substr(prefix.size());
    return rest.substr(0, rest.rfind('\''));
}

bool IsRunOf(const LogLine& line, const std::string& product) {
    if (!StartsWith(line.message, kRunStart)) return false;
    const std::string name = Quoted(line.message, kRunStart);
    return name.size() == product.size() &&
           std::equal(name.begin(), name.end(), product.begin(),
                      [](char a, char b) { return std::tolower(static_cast<unsigned char>(a)) ==
                                                  std::tolower(static_cast<unsigned char>(b)); });
}

// Reads the run that starts at lines[first], up to the next run of any product.
void ReadRun(const std::vector<LogLine>& lines, std::size_t first, ProductStatus* product) {
    LastRun& run = product->lastRun;
    run.found = true;
    run.when = lines[first].stamp;
    for (std::size_t i = first + 1; i < lines.size() && !StartsWith(lines[i].message, kRunStart); ++i) {
        const std::string& message = lines[i].message;
        if (StartsWith(message, kReturning)) {
            run.hasResult = true;
            run.result = static_cast<std::int32_t>(std::atol(message.c_str() + std::strlen(kReturning)));
        } else if (message == kNothingToDo) {
            run.hasResult = true;
            run.result = 0;
        }
        if (StartsWith(message, kKeptAside) && product->rejectedCopy.empty()) {
            const std::string kept = Quoted(message, kKeptAside);
            if (plat::files::Exists(kept)) product->rejectedCopy = kept;
        }
        // A line without a stamp continues a multi-line trace (the content file's dump).
        if (!lines[i].stamp.empty() && Explains(message) && run.explanation.size() < kMaxExplanation) run.explanation.push_back(message);
    }
}

}  // namespace

void ReadLastRun(const std::string& traceLog, ProductStatus* product) {
    const std::string backup = traceLog.substr(0, traceLog.rfind('.')) + ".bak";
    for (const std::string& path : {traceLog, backup}) {
        const std::vector<LogLine> lines = ReadLog(path);
        for (std::size_t i = lines.size(); i-- > 0;) {
            if (!IsRunOf(lines[i], product->name)) continue;
            product->lastRun.logFile = path;
            ReadRun(lines, i, product);
            return;
        }
    }
}

}  // namespace pextool::status
