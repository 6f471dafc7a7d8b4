// Processes through CreateProcessA; waits through WaitForSingleObject and
// MsgWaitForMultipleObjects; window messages through the thread's own message pump.
// A Process object keeps the process id; the process handle that goes with it is kept in a
// table of this module, so the interface needs no Windows type.
#include "platform/process.h"

#include <map>
#include <mutex>
#include <utility>
#include <vector>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/win32/windows_api.h"

namespace plat::proc {

struct ProcessAccess {
    static void Set(Process& p, int id) {
        p.id_ = id;
        p.ended_ = false;
        p.exitCode_ = kStillActive;
    }
    static void MarkEnded(Process& p, std::uint32_t code) {
        p.ended_ = true;
        p.exitCode_ = code;
    }
    static bool Ended(const Process& p) { return p.ended_; }
    static std::uint32_t Code(const Process& p) { return p.exitCode_; }
};

namespace {

std::mutex& TableLock() {
    static std::mutex m;
    return m;
}
std::map<int, HANDLE>& Table() {
    static std::map<int, HANDLE> handles;
    return handles;
}

HANDLE HandleOf(const Process& p) {
    std::lock_guard<std::mutex> hold(TableLock());
    auto it = Table().find(p.Id());
    return it == Table().end() ? nullptr : it->second;
}

void Keep(int id, HANDLE h) {
    std::lock_guard<std::mutex> hold(TableLock());
    Table()[id] = h;
}

void Forget(int id) {
    HANDLE h = nullptr;
    {
        std::lock_guard<std::mutex> hold(TableLock());
        auto it = Table().find(id);
        if (it == Table().end()) return;
        h = it->second;
        Table().erase(it);
    }
    ::CloseHandle(h);
}

// CreateProcess reports a program in a missing folder as a missing file on some systems (Wine);
// the platform tells the two apart, as Windows' own file calls do: 3 when the folder is missing.
std::uint32_t StartError(const std::string& commandLine) {
    const DWORD error = ::GetLastError();
    const std::vector<std::string> args = SplitCommandLine(commandLine);
    if (error != ERROR_FILE_NOT_FOUND || args.empty()) return error;
    const std::string program = paths::FullPath(args[0]);
    const std::size_t cut = program.find_last_of('\\');
    if (args[0].find_first_of("\\/:") == std::string::npos || cut == std::string::npos) return error;
    const DWORD folder = ::GetFileAttributesA(program.substr(0, cut + 1).c_str());
    const bool missing = folder == INVALID_FILE_ATTRIBUTES || !(folder & FILE_ATTRIBUTE_DIRECTORY);
    return missing ? std::uint32_t{kErrorPathNotFound} : error;
}

// Records the end of a process whose handle is signalled.
WaitResult Ended(Process& p, HANDLE h) {
    DWORD code = 0;
    ::GetExitCodeProcess(h, &code);
    ProcessAccess::MarkEnded(p, code);
    return WaitResult::Ended;
}

// The process handle of a held process, or null with the last error set.
HANDLE Held(const Process& p) {
    HANDLE h = p ? HandleOf(p) : nullptr;
    if (!h) SetLastErrorCode(kErrorInvalidHandle);
    return h;
}

}  // namespace

Process::Process(Process&& other) noexcept { *this = std::move(other); }

Process& Process::operator=(Process&& other) noexcept {
    if (this != &other) {
        Close();
        id_ = std::exchange(other.id_, 0);
        ended_ = other.ended_;
        exitCode_ = other.exitCode_;
    }
    return *this;
}

Process::~Process() { Close(); }

void Process::Close() {
    if (id_ > 0) Forget(id_);
    id_ = 0;
    ended_ = false;
    exitCode_ = kStillActive;
}

bool Start(const std::string& commandLine, const std::string& directory, Process* process) {
    process->Close();
    if (!fault::Allow(fault::Op::ProcessStart)) return false;
    // CreateProcessA may write into the command line, so it gets a copy of its own.
    std::vector<char> line(commandLine.begin(), commandLine.end());
    line.push_back('\0');
    STARTUPINFOA startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION info{};
    if (!::CreateProcessA(nullptr, line.data(), nullptr, nullptr, FALSE, 0, nullptr,
                          directory.empty() ? nullptr : directory.c_str(), &startup, &info)) {
        SetLastErrorCode(StartError(commandLine));
        return false;
    }
    ::CloseHandle(info.hThread);
    Keep(static_cast<int>(info.dwProcessId), info.hProcess);
    ProcessAccess::Set(*process, static_cast<int>(info.dwProcessId));
    SetLastErrorCode(kErrorSuccess);
    return true;
}

WaitResult Wait(Process& p, std::uint32_t timeoutMs) {
    HANDLE h = Held(p);
    if (!h) return WaitResult::Failed;
    switch (::WaitForSingleObject(h, timeoutMs)) {
        case WAIT_OBJECT_0: return Ended(p, h);
        case WAIT_TIMEOUT: return WaitResult::TimedOut;
        default: return WaitResult::Failed;
    }
}

WaitResult WaitOrInput(Process& p, std::uint32_t timeoutMs) {
    HANDLE h = Held(p);
    if (!h) return WaitResult::Failed;
    switch (::MsgWaitForMultipleObjects(1, &h, FALSE, timeoutMs, QS_ALLINPUT)) {
        case WAIT_OBJECT_0: return Ended(p, h);
        case WAIT_OBJECT_0 + 1: return WaitResult::Input;
        case WAIT_TIMEOUT: return WaitResult::TimedOut;
        default: return WaitResult::Failed;
    }
}

void DispatchMessages() {
    MSG msg;
    while (::PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE)) {
        ::TranslateMessage(&msg);
        ::DispatchMessageA(&msg);
    }
}

bool ExitCode(Process& p, std::uint32_t* code) {
    HANDLE h = Held(p);
    if (!h) return false;
    if (ProcessAccess::Ended(p)) {
        *code = ProcessAccess::Code(p);
        return true;
    }
    DWORD c = 0;
    if (!::GetExitCodeProcess(h, &c)) return false;
    *code = c;
    return true;
}

bool Terminate(Process& p, std::uint32_t exitCode) {
    HANDLE h = Held(p);
    if (!h) return false;
    if (::WaitForSingleObject(h, 0) == WAIT_OBJECT_0) return true;  // already ended
    if (!::TerminateProcess(h, exitCode)) return false;
    ::WaitForSingleObject(h, INFINITE);
    ProcessAccess::MarkEnded(p, exitCode);
    return true;
}

}  // namespace plat::proc
