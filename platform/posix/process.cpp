// Starting a Windows command line on the host: the program is found as Windows finds it and
// started with posix_spawn, so no shell ever interprets the line.
#include "platform/process.h"

#include <spawn.h>
#include <strings.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstring>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/machine.h"
#include "platform/paths.h"
#include "platform/posix/process_handle.h"
#include "platform/posix/search_path.h"

extern char** environ;

namespace plat::proc {

namespace {

constexpr std::uint32_t kErrorDirectory = 267;
constexpr std::uint32_t kErrorBadExeFormat = 193;

bool EndsWithNoCase(const std::string& s, const std::string& tail) {
    return s.size() >= tail.size() && strcasecmp(s.c_str() + s.size() - tail.size(), tail.c_str()) == 0;
}

// The spellings tried for one name: as given; on Linux our programs carry no ".exe", so a
// name ending in it is also tried without; a name without extension also with ".exe".
std::vector<std::string> Spellings(const std::string& name) {
    std::vector<std::string> out{name};
    std::size_t slash = name.find_last_of("\\/");
    std::string last = slash == std::string::npos ? name : name.substr(slash + 1);
    if (EndsWithNoCase(last, ".exe") && last.size() > 4) out.push_back(name.substr(0, name.size() - 4));
    if (last.find('.') == std::string::npos) out.push_back(name + ".exe");
    return out;
}

// The host file of one program name; empty with the last error set when it is not found.
std::string FindProgram(const std::string& name) {
    if (name.empty()) {
        SetLastErrorCode(kErrorFileNotFound);
        return {};
    }
    if (search::NamesPath(name)) {
        std::string full = paths::FullPath(name);
        for (const std::string& s : Spellings(full)) {
            std::string host = search::ExistingFile(s);
            if (!host.empty()) return host;
        }
        SetLastErrorCode(search::FolderExists(full) ? kErrorFileNotFound : kErrorPathNotFound);
        return {};
    }
    std::string host = search::Find(search::Folders(false), Spellings(name));
    if (host.empty()) SetLastErrorCode(kErrorFileNotFound);
    return host;
}

// Windows tries an unquoted program path that contains blanks at every blank, shortest first:
// C:\Program Files\a b.exe is tried as "C:\Program", "C:\Program Files\a", then in full.
std::string FindProgramOfLine(const std::string& line, const std::string& first) {
    std::string host = FindProgram(first);
    std::size_t start = line.find_first_not_of(" \t");
    if (!host.empty() || start == std::string::npos || line[start] == '"') return host;
    std::uint32_t firstError = LastError();
    for (std::size_t blank = line.find_first_of(" \t", start); blank != std::string::npos;
         blank = line.find_first_of(" \t", blank + 1)) {
        std::string prefix = line.substr(start, blank - start);
        if (prefix.size() <= first.size()) continue;
        host = FindProgram(prefix);
        if (!host.empty()) return host;
    }
    SetLastErrorCode(firstError);
    return {};
}

// The working folder on the host; empty with 267 when it is missing.
std::string HostDirectory(const std::string& directory) {
    std::string win = directory.empty() ? paths::CurrentDirectory() : directory;
    std::string host = paths::ToHost(paths::FullPath(win));
    struct stat st;
    if (host.empty() || stat(host.c_str(), &st) != 0 || !S_ISDIR(st.st_mode)) {
        SetLastErrorCode(kErrorDirectory);
        return {};
    }
    return host;
}

// The caller's environment, with PEX_MACHINE naming this machine so that a child of the
// emulated machine runs on the same machine (as a Wine child shares its prefix).
std::vector<std::string> ChildEnvironment() {
    std::vector<std::string> env;
    for (char** e = environ; e && *e; ++e) {
        if (std::strncmp(*e, "PEX_MACHINE=", 12) != 0) env.emplace_back(*e);
    }
    env.push_back("PEX_MACHINE=" + machine::Root());
    return env;
}

std::vector<char*> Pointers(std::vector<std::string>& texts) {
    std::vector<char*> out;
    for (std::string& t : texts) out.push_back(t.data());
    out.push_back(nullptr);
    return out;
}

std::uint32_t SpawnError(int err) {
    if (err == ENOEXEC) return kErrorBadExeFormat;
    return ErrorFromErrno(err);
}

bool Spawn(const std::string& program, std::vector<std::string> args, const std::string& dir,
           int* pid) {
    std::vector<std::string> env = ChildEnvironment();
    std::vector<char*> argv = Pointers(args), envp = Pointers(env);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addchdir_np(&actions, dir.c_str());
    int err = posix_spawn(pid, program.c_str(), &actions, nullptr, argv.data(), envp.data());
    posix_spawn_file_actions_destroy(&actions);
    if (err != 0) SetLastErrorCode(SpawnError(err));
    return err == 0;
}

}  // namespace

bool Start(const std::string& commandLine, const std::string& directory, Process* process) {
    process->Close();
    if (!fault::Allow(fault::Op::ProcessStart)) return false;
    ReapOrphans();
    std::vector<std::string> args = SplitCommandLine(commandLine);
    std::string program = FindProgramOfLine(commandLine, args.empty() ? std::string() : args[0]);
    if (program.empty()) return false;
    std::string dir = HostDirectory(directory);
    if (dir.empty()) return false;
    int pid = 0;
    if (!Spawn(program, args, dir, &pid)) return false;
    ProcessAccess::Set(*process, pid);
    SetLastErrorCode(kErrorSuccess);
    return true;
}

}  // namespace plat::proc
