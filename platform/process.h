// Processes of the machine: start a Windows command line, wait for the process with a time-out,
// read its exit code. Failures set the last error to the code Windows gives (2 for a program
// that is not found).
#pragma once
#include <cstdint>
#include <string>
#include <vector>

namespace plat::proc {

// A wait without end (INFINITE).
constexpr std::uint32_t kInfinite = 0xFFFFFFFFu;
// The exit code of a process that is still running (STILL_ACTIVE).
constexpr std::uint32_t kStillActive = 259;

// CommandLineToArgvW: blanks and tabs separate arguments outside quotes; a quote toggles
// quoting ("" inside quotes gives one quote); 2n backslashes before a quote give n backslashes
// and the quote acts, 2n+1 give n backslashes and a literal quote; other backslashes are kept.
// The first argument (the program) takes everything up to the next blank or closing quote,
// backslashes and all, as Windows reads a program name.
std::vector<std::string> SplitCommandLine(const std::string& commandLine);

// Owner of a started process. Closing the handle leaves the process running, as closing a
// Windows process handle does.
class Process {
public:
    Process() = default;
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;
    Process(Process&& other) noexcept;
    Process& operator=(Process&& other) noexcept;
    ~Process();

    explicit operator bool() const { return id_ > 0; }
    // The operating system's process id; 0 when no process is held.
    int Id() const { return id_; }
    void Close();

private:
    friend struct ProcessAccess;
    int id_ = 0;
    bool ended_ = false;
    std::uint32_t exitCode_ = kStillActive;
};

// CreateProcess without an application name: the first argument of the command line names
// the program, which is searched in the folder of the host program, the current folder, then
// PATH (the name as given, ".exe" added to a name without extension, and on Linux also the name
// without its ".exe"). An unquoted program path containing blanks is tried at each blank, as
// Windows does. The process starts without a shell in directory (empty: the current folder),
// with the caller's environment. False and the last error when it cannot start: 2 program not
// found, 3 its folder missing, 267 directory missing. The fault plan is asked first.
bool Start(const std::string& commandLine, const std::string& directory, Process* process);

enum class WaitResult {
    Ended,     // the process has ended; its exit code is known
    TimedOut,  // still running after the time-out; it is left running
    Input,     // input arrived for the calling thread (never on Linux: it has no message queue)
    Failed,    // no process, or the wait failed (last error set)
};

// WaitForSingleObject on the process: Ended or TimedOut (kInfinite never times out).
WaitResult Wait(Process& process, std::uint32_t timeoutMs);

// MsgWaitForMultipleObjects on the process and on every kind of input for the calling thread.
WaitResult WaitOrInput(Process& process, std::uint32_t timeoutMs);

// Removes every queued window message of the calling thread, translating and dispatching each.
// A no-op where there is no message queue.
void DispatchMessages();

// Waits for the process up to timeoutMs in all. With dispatchMessages the calling thread's
// window messages are dispatched whenever they arrive and the time spent is taken off the
// time that remains (a wrapped tick counter counts from zero), so the time-out still holds.
WaitResult WaitDispatching(Process& process, std::uint32_t timeoutMs, bool dispatchMessages);

// GetExitCodeProcess: the exit code, kStillActive while running. A process ended by a signal
// reports 128 + the signal number, as a shell does. False when no process is held.
bool ExitCode(Process& process, std::uint32_t* code);

// TerminateProcess: ends the process with exitCode and waits until it has ended.
bool Terminate(Process& process, std::uint32_t exitCode);

}  // namespace plat::proc
