// The trace log: the library's single diagnostic channel, one time-stamped line per event,
// written for support staff.
#pragma once
#include <memory>
#include <string>

#include "platform/cfile.h"
#include "platform/sync.h"

// The open log file and its mutex. Every file operation waits at most 500 ms for the mutex and
// does nothing when the wait fails.
class TraceFile {
public:
    TraceFile();
    virtual ~TraceFile();  // closes a handle still open
    TraceFile(const TraceFile&) = delete;
    TraceFile& operator=(const TraceFile&) = delete;

    bool Open(const std::string& name);  // read/write, shared, open-or-create, content kept
    bool Close();
    bool SeekToEnd();
    bool Write(const std::string& text);   // converts bare LF to CR LF
    bool Append(const std::string& text);  // seek to end and write, mutex held once for both
    bool IsOpen() const;

private:
    std::unique_ptr<plat::CFile> file_;
    plat::TimedMutex mutex_;
};

class TraceLog {
public:
    explicit TraceLog(const std::string& fileName = std::string());

    bool Open();
    void Close();
    void Delete();
    void Backup();
    void SetSubstitution(const std::string& search, const std::string& replacement);
    void SetFileName(const std::string& fileName);  // non-empty switches fileOutput on
    const std::string& FileName() const { return fileName_; }

    // Builds and writes one line (the body of TRACE).
    void Write(const std::string& message);

    bool enabled = true;
    bool timestamps = true;
    bool ensureNewline = true;
    bool fileOutput = false;
    bool keepOpen = false;

private:
    std::string fileName_;
    TraceFile file_;
    bool isOpen_ = false;
    std::string search_, replacement_;
};

// The process-wide log that every part of the library writes to.
extern TraceLog g_TraceLog;

// Formats printf-style and writes one line to the log; never throws.
void TRACE(TraceLog& log, const char* format, ...) __attribute__((format(printf, 2, 3)));
