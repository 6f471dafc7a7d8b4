// TraceLog and TRACE: one line per call, built from the local time stamp and the caller's
// printf-style message, then appended to the log file.
#include "diag/trace_log.h"

#include <cstdarg>
#include <cstdio>
#include <vector>

#include "platform/files.h"
#include "platform/paths.h"

// Constructed ahead of the default-priority static objects: the application object's load
// hook, in another file of the module, writes to the log.
TraceLog g_TraceLog __attribute__((init_priority(200)));

TraceLog::TraceLog(const std::string& fileName) {
    SetFileName(fileName);
}

void TraceLog::SetFileName(const std::string& fileName) {
    fileName_ = fileName;
    file_.ForgetMapping();  // mapped once per configuration
    openFailed_ = false;
    if (!fileName_.empty()) fileOutput = true;
}

bool TraceLog::SetSubstitution(const std::string& search, const std::string& replacement) {
    bool loops = !search.empty() && replacement.find(search) != std::string::npos;
    search_ = loops ? std::string() : search;
    replacement_ = loops ? std::string() : replacement;
    return !loops;
}

bool TraceLog::Open() {
    isOpen_ = !fileName_.empty() && file_.Open(fileName_);
    if (!isOpen_) {
        openFailed_ = openFailed_ || fileOutput;
        fileOutput = false;
    }
    return isOpen_;
}

void TraceLog::ResumeFileOutput() {
    if (openFailed_ && !fileName_.empty()) fileOutput = true;
    openFailed_ = false;
}

void TraceLog::Close() {
    if (isOpen_) file_.Close();
    isOpen_ = false;
}

void TraceLog::Delete() {
    Close();
    if (!fileName_.empty()) plat::files::Remove(fileName_);
}

void TraceLog::Backup() {
    Close();
    if (fileName_.empty()) return;
    plat::paths::PathParts parts = plat::paths::SplitPath(fileName_);
    parts.ext = ".bak";
    if (plat::files::Copy(fileName_, plat::paths::MakePath(parts), false)) Delete();
}

namespace {

std::string Stamp() {
    plat::LocalTimeStamp t = plat::LocalTime();
    char stamp[64];
    std::snprintf(stamp, sizeof stamp, "%04d/%02d/%02d - %02d:%02d:%02d.%03d - ", t.year, t.month,
                  t.day, t.hour, t.minute, t.second, t.millisecond);
    return stamp;
}

// vsnprintf measures first, so a message of any length is formatted whole.
std::string FormatText(const char* format, va_list args) {
    va_list measure;
    va_copy(measure, args);
    int length = std::vsnprintf(nullptr, 0, format, measure);
    va_end(measure);
    if (length <= 0) return std::string();
    std::vector<char> buffer(static_cast<std::size_t>(length) + 1);
    std::vsnprintf(buffer.data(), buffer.size(), format, args);
    return std::string(buffer.data(), static_cast<std::size_t>(length));
}

}  // namespace

std::string TraceLog::BuildLine(const std::string& message) const {
    std::string line = timestamps ? Stamp() + message : message;
    if (ensureNewline && (line.empty() || line.back() != '\n')) line += '\n';
    if (search_.empty()) return line;
    // Each search restarts at the beginning of the line, so a replacement that completes a
    // new occurrence with the text before it is replaced as well.
    for (std::size_t at; (at = line.find(search_)) != std::string::npos;)
        line.replace(at, search_.size(), replacement_);
    return line;
}

void TraceLog::Output(const std::string& line) {
    if (fileOutput && !isOpen_) Open();
    if (fileOutput && isOpen_) file_.Append(line);
    if (!keepOpen) {
        Close();
    } else if (isOpen_) {
        file_.Release();  // other programs may open the log between the lines of a burst
    }
}

void TraceLog::Write(const std::string& message) {
    if (!enabled) return;
    Output(BuildLine(message));
}

void TRACE(TraceLog& log, const char* format, ...) {
    if (!log.enabled || format == nullptr) return;
    va_list args;
    va_start(args, format);
    try {
        log.Write(FormatText(format, args));
    } catch (...) {
        // A lost line must never take the caller down with it.
    }
    va_end(args);
}
