// The trace log: the library's single diagnostic channel, one time-stamped line per event,
// written for support staff.
#pragma once
#include <memory>
#include <string>

#include "platform/append_file.h"
#include "platform/sync.h"

// The open log file and its mutex. Every file operation waits at most 500 ms for the mutex and
// does nothing when the wait fails (returning false). The mutex is recursive, so Append may hold
// it around the write, which takes it again.
class TraceFile {
public:
    TraceFile();
    virtual ~TraceFile();  // closes a handle still open
    TraceFile(const TraceFile&) = delete;
    TraceFile& operator=(const TraceFile&) = delete;

    // Opened for appending, shared for reading and writing with other openers, created when
    // missing, existing content kept. A handle still open is closed first. The name's host path
    // is mapped at its first open and kept; only a failed open, or ForgetMapping, maps it again.
    bool Open(const std::string& name);
    void ForgetMapping();
    bool Close();  // true when no handle is left open
    // Writes the text at the end of the file, every line feed not preceded by a carriage
    // return as CR LF, in one write: a failed write loses the whole line, never part of it.
    bool Write(const std::string& text);
    bool Append(const std::string& text);  // the write, mutex held once around it
    // Lets other openers' share checks through while the file stays open (keepOpen).
    void Release();
    bool IsOpen() const;

private:
    plat::AppendFile file_;
    plat::TimedMutex mutex_;
};

class TraceLog {
public:
    // A non-empty name is stored and switches fileOutput on.
    explicit TraceLog(const std::string& fileName = std::string());

    // Opens the file for appending; false (and fileOutput off) when the name is empty or the
    // file cannot be opened.
    bool Open();
    // Switches fileOutput on again when a failed open switched it off: such a loss lasts for
    // the rest of one run only, and each run of the library tries the file again.
    void ResumeFileOutput();
    void Close();   // closes the file if open
    void Delete();  // Close, then delete the file
    // Close, copy the file to the same name with the extension ".bak" (replacing an older
    // backup), then delete the file once the copy succeeded. When the copy fails the file stays,
    // and the new lines follow the previous run's: the previous log is never lost.
    void Backup();
    // Every occurrence of search in a line becomes replacement; an empty search disables it. A
    // replacement that contains the search text would never finish, so such a pair is refused
    // (false) and substitution is switched off.
    bool SetSubstitution(const std::string& search, const std::string& replacement);
    void SetFileName(const std::string& fileName);  // non-empty switches fileOutput on
    const std::string& FileName() const { return fileName_; }
    bool IsOpen() const { return isOpen_; }

    // Builds and writes one line (the body of TRACE): stamp, message, line feed, substitution,
    // then open if needed, append, and close unless keepOpen.
    void Write(const std::string& message);

    bool enabled = true;
    bool timestamps = true;
    bool ensureNewline = true;
    bool fileOutput = false;
    bool keepOpen = false;

private:
    std::string BuildLine(const std::string& message) const;
    void Output(const std::string& line);

    std::string fileName_;
    TraceFile file_;
    bool isOpen_ = false;
    bool openFailed_ = false;  // fileOutput was switched off by a failed open
    std::string search_, replacement_;
};

// The process-wide log that every part of the library writes to. It is constructed before the
// module's other static objects, so the application object's load hook can use it.
extern TraceLog g_TraceLog;

// Formats printf-style (no length limit) and writes one line to the log; never throws: a line
// whose building or writing fails is lost.
void TRACE(TraceLog& log, const char* format, ...) __attribute__((format(printf, 2, 3)));
