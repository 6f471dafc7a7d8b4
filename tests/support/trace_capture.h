// Captures the trace log for one test: points g_TraceLog (or another log) at a fresh file on
// the current test machine and reads back the lines written, without their time stamps and
// line ends. Construct it after the pextest::TestMachine.
#pragma once
#include <string>
#include <vector>

#include "diag/trace_log.h"

namespace pextest {

class TraceCapture {
public:
    static constexpr const char* kDefaultPath = "C:\\pextest_trace.log";

    // Deletes any earlier file at the path, resets the log's switches to their defaults
    // (enabled, timestamps, ensureNewline on; keepOpen off; no substitution) and switches file
    // output on for the path.
    explicit TraceCapture(const std::string& winPath = kDefaultPath, TraceLog& log = g_TraceLog);
    // Closes the log and leaves it writing nowhere, so later tests do not write into a
    // machine root that is gone.
    ~TraceCapture();
    TraceCapture(const TraceCapture&) = delete;
    TraceCapture& operator=(const TraceCapture&) = delete;

    // The lines written so far, each without its time stamp and CR LF. A multi-line trace gives
    // one entry per line; only its first line carries a stamp.
    std::vector<std::string> Lines() const;
    // The lines joined, each followed by '\n': convenient for comparing a block of lines.
    std::string Text() const;
    // The file exactly as written (stamps and CR LF included); empty when there is no file.
    std::string Bytes() const;
    // True when some line equals the text.
    bool Contains(const std::string& line) const;
    // Forgets what was written so far (deletes the file).
    void Clear();

    const std::string& Path() const { return path_; }

private:
    std::string path_;
    TraceLog& log_;
};

// The lines of trace-file bytes, split at line feeds, with a carriage return before each
// line feed and a leading time stamp removed; nothing after the last line end is a line.
std::vector<std::string> TraceLines(const std::string& bytes);

}  // namespace pextest
