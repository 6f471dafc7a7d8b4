// Whole update runs as a host makes them (`pexupdate --machine DIR all`: load Mendler.dll, start
// its log, UpdateAll over the registered products), each beside the floor program (pexfloor,
// floor.c) doing the same file work with the same durability on an identical machine, in the
// same repetition. Every file is installed over an existing target, so every file is backed up.
//
// Scenarios (installed files 100 to a folder, C:\App\d000, d001, ..., unless said otherwise):
//   small    1,000 files of 64 KiB, one group each (a row without a FileGroup has a group of
//            its own, and the content file is written back after every group)
//   small-grouped  the same files in 10 groups of 100
//   small-one      the same files in one group
//   large    8 files of 64 MiB in one folder, one group each
//   files/N  N files of 4 KiB in one group: the cost per file
//   folder/N N files of 4 KiB in one group, all in one folder: the cost of a crowded folder
//   groups/N N files of 4 KiB, one group each: the cost per group (the content file is
//            written back after every group)
//   chain/N  N files of 4 KiB in N groups, each depending on the group that sorts after it, so
//            that every pass of the application loop applies exactly one group
// A name ending in "-nolog" is the same run without the trace log's file: the programs run
// from a copy of the program folder in which "log" is a plain file, so the library cannot open
// its log and builds every line without writing it. The difference is what the log's file costs.
//
// The floor does the library's specified writes beside the file work: when the run wrote a log,
// the C loop appends as many lines of the same mean length (open, one write, close each), and
// the status (the content file's size) is written and flushed after every group.
//
// The time of a repetition is the UpdateAll run; the counters carry the floor's time beside it.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <filesystem>
#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/machine.h"
#include "platform/registry.h"

extern char** environ;

namespace {

namespace fs = std::filesystem;
namespace reg = plat::reg;

struct Scenario {
    int files;
    std::size_t size;
    enum Grouping { kOneGroupEach, kOneGroup, kGroupsOf100, kChain } grouping;
    // Installed files per folder (C:\App\d000, d001, ...); 0 puts them all in C:\App.
    int perFolder = 100;
    bool logFile = true;
};

// The folder of file i, below C:\App.
std::string FolderOf(const Scenario& s, int i) {
    if (s.perFolder == 0) return "";
    char name[16];
    std::snprintf(name, sizeof name, "d%03d", i / s.perFolder);
    return name;
}

const char* const kProductKey = "Software\\Vantric\\Pex\\Bench";
const char* const kContent = "C:\\Pex\\Bench_content.txt";

std::string BinFolder() { return fs::read_symlink("/proc/self/exe").parent_path().string(); }

std::string ScratchFolder() {
    const char* base = std::getenv("PEX_BENCH_TMP");
    const std::string folder = base && *base ? std::string(base) : fs::temp_directory_path().string();
    fs::create_directories(folder);
    return folder;
}

void WriteHostFile(const std::string& path, const std::string& bytes) {
    const int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    bool ok = fd >= 0;
    for (std::size_t done = 0; ok && done < bytes.size();) {
        const ssize_t n = ::write(fd, bytes.data() + done, bytes.size() - done);
        ok = n > 0;
        done += ok ? static_cast<std::size_t>(n) : 0;
    }
    if (fd >= 0) ::close(fd);
    if (!ok) throw std::runtime_error("cannot write " + path);
}

// Bytes of one version of the files: text-like, so that nothing can take a short cut.
std::string Contents(std::size_t size, char version) {
    std::string bytes;
    bytes.reserve(size + 64);
    for (unsigned line = 0; bytes.size() < size; ++line)
        bytes += "Vantric module " + std::to_string(line * 2654435761u) + " version " + version + "\r\n";
    bytes.resize(size);
    return bytes;
}

// The bytes of file i: the shared bytes of its version, headed by the file's own tag.
std::string Version(const std::string& shared, int file, char version) {
    std::string bytes = shared;
    const std::string tag = std::to_string(file) + version;
    bytes.replace(0, std::min(tag.size(), bytes.size()), tag.substr(0, bytes.size()));
    return bytes;
}

std::string FileName(int i) {
    char name[32];
    std::snprintf(name, sizeof name, "f%05d.dll", i);
    return name;
}

std::string GroupName(int i) {
    char name[32];
    std::snprintf(name, sizeof name, "G%05d", i);
    return name;
}

void SetText(const std::string& name, const std::string& text) {
    reg::Key key;
    if (reg::CreateKey(reg::kLocalMachine, kProductKey, reg::kKeyAllAccess, key.out(), nullptr) != 0 ||
        reg::SetValue(key.get(), name, reg::kRegSz, reinterpret_cast<const std::uint8_t*>(text.c_str()),
                      static_cast<std::uint32_t>(text.size() + 1)) != 0)
        throw std::runtime_error("cannot write the product's registry entries");
}

// One machine with the product registered, its downloads and its installed targets, flushed
// to the disk so that neither contender pays for the set-up's writes.
class Machine {
public:
    explicit Machine(const Scenario& s) {
        std::string tmpl = ScratchFolder() + "/pexrun-XXXXXX";
        if (!mkdtemp(tmpl.data())) throw std::runtime_error("cannot create a machine root");
        root_ = tmpl;
        plat::machine::SetRoot(root_);
        plat::machine::Ensure();
        const std::string c = root_ + "/drive_c";
        fs::create_directories(c + "/Pex/cache");
        fs::create_directories(c + "/App");
        std::string content =
            "FileName,UpgradeStatus,HomeDir,DynamicFieldInfo,Force Download,Snoozable,InterestedParties,"
            "DownLoadCacheFile,FileGroup,DependancyOrder,NeedsDecompression,Command,UpdateDate,Comment\r\n";
        const std::string oldBytes = Contents(s.size, 'o'), newBytes = Contents(s.size, 'n');
        for (int i = 0; i < s.files; ++i) {
            const std::string name = FileName(i), folder = FolderOf(s, i);
            const std::string app = c + "/App" + (folder.empty() ? "" : "/" + folder);
            fs::create_directories(app);
            WriteHostFile(app + "/" + name, Version(oldBytes, i, 'o'));
            WriteHostFile(c + "/Pex/cache/" + name + ".new", Version(newBytes, i, 'n'));
            pairs_ += app + "/" + name + "\t" + c + "/Pex/cache/" + name + ".new\n";
            std::string group, depends;
            if (s.grouping == Scenario::kOneGroup) group = "Everything";
            if (s.grouping == Scenario::kGroupsOf100) group = "Part" + std::to_string(i / 100);
            if (s.grouping == Scenario::kChain) {
                group = GroupName(i);
                if (i + 1 < s.files) depends = GroupName(i + 1);
            }
            const std::string home = "C:\\App" + (folder.empty() ? "" : "\\" + folder);
            content += name + ",Downloaded," + home + ",,0,0,Nobody,C:\\Pex\\cache\\" + name + ".new," + group +
                       "," + depends + ",0,,,\r\n";
        }
        WriteHostFile(c + "/Pex/Bench_content.txt", content);
        contentBytes_ = content.size();
        SetText("ContentFileName", kContent);
        SetText("ContentFileMode", "");
        SetText("ContentFileTarget", "");
        SetText("DefaultPath", "C:\\App");
        WriteHostFile(root_ + "/pairs.txt", pairs_);
        // The registry is closed so that the run opens it as the only user.
        plat::machine::SetRoot(ScratchFolder());
        sync();
    }
    // Removed only when the program ends: deleting thousands of files right before the next
    // run would slow that run's file creation (a file system without a journal does not reuse an
    // inode deleted in the last half minute, and searches past each one).
    ~Machine() {
        if (!keep_) Leftovers().push_back(root_);
    }
    static std::vector<std::string>& Leftovers() {
        static std::vector<std::string> roots;
        return roots;
    }
    static void RemoveLeftovers() {
        std::error_code ec;
        for (const std::string& root : Leftovers()) fs::remove_all(root, ec);
        Leftovers().clear();
    }
    void Keep() { keep_ = true; }
    const std::string& Root() const { return root_; }
    std::string PairsFile() const { return root_ + "/pairs.txt"; }
    std::size_t ContentBytes() const { return contentBytes_; }
    std::string DriveC() const { return root_ + "/drive_c"; }

private:
    std::string root_, pairs_;
    std::size_t contentBytes_ = 0;
    bool keep_ = false;
};

struct Timing {
    double seconds = -1;  // wall time; negative when the program failed
    double cpu = 0;       // user and system time of the program
};

// Runs a program to its end.
Timing Run(const std::vector<std::string>& args) {
    std::vector<char*> argv;
    for (const std::string& a : args) argv.push_back(const_cast<char*>(a.c_str()));
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    const auto start = std::chrono::steady_clock::now();
    pid_t pid = 0;
    int status = 0;
    struct rusage usage {};
    const bool spawned = posix_spawn(&pid, argv[0], &actions, nullptr, argv.data(), environ) == 0;
    posix_spawn_file_actions_destroy(&actions);
    Timing t;
    if (!spawned || wait4(pid, &status, 0, &usage) != pid) return t;
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    t.cpu = static_cast<double>(usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) +
            static_cast<double>(usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) * 1e-6;
    if (WIFEXITED(status) && WEXITSTATUS(status) == 0) t.seconds = seconds;
    return t;
}

// The programs run without the log's file: a copy of the host, the library and what they load,
// beside a plain file called "log" where the library would make its log folder.
std::string NoLogBinFolder(const std::string& bin) {
    const std::string folder = ScratchFolder() + "/nolog-bin";
    static bool made = false;
    if (!made) {
        fs::remove_all(folder);
        fs::create_directories(folder);
        for (const char* name : {"pexupdate", "Mendler.dll", "Rivzip.dll", "libpexplatform.so"})
            fs::copy_file(bin + "/" + name, folder + "/" + name);
        WriteHostFile(folder + "/log", "");
        made = true;
    }
    return folder;
}

// A run starts without an earlier log, so that no run pays for rotating another's.
void ForgetLogs(const std::string& bin) {
    std::error_code ec;
    fs::remove(bin + "/log/pex_support_mendler.log", ec);
    fs::remove(bin + "/log/pex_support_mendler.bak", ec);
}

// The lines of the log that the last run left and their bytes (0 without one).
struct LogSize {
    double lines = 0, bytes = 0;
};
LogSize LogLines(const std::string& bin) {
    LogSize size;
    const int fd = ::open((bin + "/log/pex_support_mendler.log").c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return size;
    char buffer[1 << 16];
    for (ssize_t n; (n = ::read(fd, buffer, sizeof buffer)) > 0;) {
        size.lines += static_cast<double>(std::count(buffer, buffer + n, '\n'));
        size.bytes += static_cast<double>(n);
    }
    ::close(fd);
    return size;
}

// Files per group, for the floor's status writes.
int GroupFiles(const Scenario& s) {
    switch (s.grouping) {
        case Scenario::kOneGroup: return s.files;
        case Scenario::kGroupsOf100: return 100;
        default: return 1;
    }
}

// The floor's command line: the file work, the log's lines as the run wrote them, the status.
std::vector<std::string> FloorCommand(const std::string& bin, const Machine& m, const Scenario& s,
                                      const LogSize& log) {
    std::vector<std::string> args{bin + "/pexfloor", m.PairsFile(), "--status", m.Root() + "/status.txt",
                                  "--status-bytes", std::to_string(m.ContentBytes()), "--group-files",
                                  std::to_string(GroupFiles(s))};
    if (log.lines > 0) {
        const auto lines = static_cast<long>(log.lines);
        args.insert(args.end(), {"--log", m.Root() + "/floor.log", "--lines", std::to_string(lines),
                                 "--line-bytes", std::to_string(static_cast<long>(log.bytes) / lines)});
    }
    return args;
}

// A complete success: the content file is gone and the targets hold their new bytes.
bool Installed(const Machine& m, const Scenario& s) {
    const int files = s.files;
    std::error_code ec;
    if (fs::exists(m.DriveC() + "/Pex/Bench_content.txt", ec)) return false;
    for (int i : {0, files - 1}) {
        const std::string tag = std::to_string(i) + 'n';
        std::string head(tag.size(), '\0');
        const std::string folder = FolderOf(s, i);
        const std::string path = m.DriveC() + "/App/" + (folder.empty() ? "" : folder + "/") + FileName(i);
        const int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
        if (fd < 0) return false;
        const bool read = ::read(fd, head.data(), head.size()) == static_cast<ssize_t>(head.size());
        ::close(fd);
        if (!read || head != tag) return false;
    }
    return true;
}

void BM_UpdateAll(benchmark::State& state, Scenario scenario) {
    const std::string bin = BinFolder();
    const std::string host = scenario.logFile ? bin : NoLogBinFolder(bin);
    Timing mendler, floor;
    LogSize lines;
    for (auto _ : state) {
        {
            Machine m(scenario);
            ForgetLogs(bin);
            mendler = Run({host + "/pexupdate", "--machine", m.Root(), "all", "--quiet"});
            if (mendler.seconds < 0 || !Installed(m, scenario)) {
                state.SkipWithError("the update run failed");
                break;
            }
            lines = scenario.logFile ? LogLines(bin) : LogSize{};
        }
        {
            Machine m(scenario);
            floor = Run(FloorCommand(bin, m, scenario, lines));
            if (floor.seconds < 0) {
                state.SkipWithError("the floor program failed");
                break;
            }
        }
        state.SetIterationTime(mendler.seconds);
    }
    state.counters["mendler_s"] = mendler.seconds;
    state.counters["floor_s"] = floor.seconds;
    state.counters["mendler_cpu_s"] = mendler.cpu;
    state.counters["floor_cpu_s"] = floor.cpu;
    state.counters["ratio"] = floor.seconds > 0 ? mendler.seconds / floor.seconds : 0;
    state.counters["files"] = scenario.files;
    state.counters["log_lines"] = lines.lines;
    state.counters["bytes"] = static_cast<double>(scenario.size) * scenario.files;
}

// PEX_BENCH_PREPARE=NAME makes the machine of one scenario and keeps it, for profiling a run by
// hand (`pexupdate --machine ROOT all`, `pexfloor ROOT/pairs.txt`); it prints the root.
std::map<std::string, Scenario>& Scenarios() {
    static std::map<std::string, Scenario> all;
    return all;
}

void Register(const std::string& name, Scenario scenario, int repetitions) {
    Scenarios()[name] = scenario;
    benchmark::RegisterBenchmark(("BM_UpdateAll/" + name).c_str(), BM_UpdateAll, scenario)
        ->Iterations(1)
        ->Repetitions(repetitions)
        ->UseManualTime()
        ->Unit(benchmark::kMillisecond);
}

}  // namespace

int main(int argc, char** argv) {
    const auto each = Scenario::kOneGroupEach, one = Scenario::kOneGroup, chain = Scenario::kChain;
    Scenario noLog{1000, 64u << 10, each};
    noLog.logFile = false;
    Register("small", {1000, 64u << 10, each}, 5);
    Register("small-nolog", noLog, 5);
    Register("small-grouped", {1000, 64u << 10, Scenario::kGroupsOf100}, 3);
    Register("small-one", {1000, 64u << 10, one}, 3);
    Register("large", {8, 64u << 20, each, 0}, 3);
    for (int n : {10, 100, 1000, 10000}) Register("files/" + std::to_string(n), {n, 4096, one}, n < 1000 ? 3 : 1);
    for (int n : {10, 100, 1000}) Register("folder/" + std::to_string(n), {n, 4096, one, 0}, n < 1000 ? 3 : 1);
    for (int n : {10, 100, 1000}) Register("groups/" + std::to_string(n), {n, 4096, each}, n < 1000 ? 3 : 1);
    // A chain of N groups writes about 11 N² trace lines (13 million for 1,000): its longest
    // point runs without the log's file, the others both ways.
    for (int n : {10, 30, 100, 300}) Register("chain/" + std::to_string(n), {n, 4096, chain}, n < 300 ? 3 : 1);
    for (int n : {10, 30, 100, 300, 1000}) {
        Scenario s{n, 4096, chain};
        s.logFile = false;
        Register("chain-nolog/" + std::to_string(n), s, n < 300 ? 3 : 1);
    }
    if (const char* name = std::getenv("PEX_BENCH_PREPARE")) {
        auto it = Scenarios().find(name);
        if (it == Scenarios().end()) return 2;
        Machine m(it->second);
        m.Keep();
        std::printf("%s\n", m.Root().c_str());
        return 0;
    }
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    Machine::RemoveLeftovers();
    return 0;
}
