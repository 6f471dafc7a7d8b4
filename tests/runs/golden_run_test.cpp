// Golden runs: each folder of tests/runs is a whole run of the library on a fresh machine, kept
// as data (README.md there describes the format). One test per folder; a mismatch shows the
// difference; PEX_ACCEPT=1 writes what the run did as the new expectation instead.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include "commands/platform_utilities.h"
#include "platform/cfile.h"
#include "platform/digest.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/ole_date.h"
#include "platform/paths.h"
#include "platform/reg_file.h"
#include "platform/setup_install.h"
#include "tests/runs/golden_child.h"
#include "tests/support/environment.h"
#include "tests/support/platform_guard.h"
#include "tests/support/run_pexupdate.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;

namespace {

// The library's module as a host would have installed it: its trace log goes beside it.
const char* const kModule = "C:\\Mendler\\Mendler.dll";
const char* const kLogFolder = "C:\\Mendler\\log\\";
const char* const kLog = "C:\\Mendler\\log\\pex_support_mendler.log";

std::string Slurp(const fs::path& path) { return pextest::ReadHostFile(path.string()); }

std::vector<std::string> Words(const std::string& line) {
    std::istringstream in(line);
    std::vector<std::string> out;
    for (std::string w; in >> w;) out.push_back(w);
    return out;
}

std::vector<std::string> Lines(const std::string& text) {
    std::istringstream in(text);
    std::vector<std::string> out;
    for (std::string line; std::getline(in, line);) out.push_back(line);
    return out;
}

std::string Joined(const std::vector<std::string>& lines) {
    std::string out;
    for (const auto& l : lines) out += l + "\n";
    return out;
}

// The text as a regular expression that matches it literally.
std::string Escaped(const std::string& text) {
    return std::regex_replace(text, std::regex("[\\\\^$.|?*+()\\[\\]{}]"), "\\$&");
}

bool EndsWith(const std::string& text, const std::string& end) {
    return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

// A file time as "2020-01-02 03:04:05".
std::string FormatTime(plat::files::FileTime time) {
    const std::time_t seconds = static_cast<std::time_t>(time / 10000000 - 11644473600ULL);
    char text[32];
    std::strftime(text, sizeof text, "%Y-%m-%d %H:%M:%S", std::gmtime(&seconds));
    return text;
}

// What a run leaves outside the files that a scenario lists: open handles and processes.
int OpenHandles() {
#ifdef _WIN32
    return 0;  // Wine's handle counts include its own; the Linux build checks this.
#else
    return static_cast<int>(std::distance(fs::directory_iterator("/proc/self/fd"), fs::directory_iterator()));
#endif
}

std::vector<std::string> Names(const std::string& folder) {
    std::vector<std::string> out;
    for (const auto& e : plat::files::Find(folder + "*"))
        if (e.name != "." && e.name != "..") out.push_back(e.name);
    std::sort(out.begin(), out.end());
    return out;
}

std::string Sha256(const std::string& bytes) {
    plat::digest::Sha256 sha;
    std::string hex;
    if (!sha.Update(bytes.data(), bytes.size()) || !sha.Finish(&hex)) return "?";
    return hex.substr(0, 16);
}

class GoldenRun : public ::testing::Test {
public:
    explicit GoldenRun(fs::path folder) : folder_(std::move(folder)) {}

    void TestBody() override {
        if (!golden::IsScenarioProcess()) {
            const std::string name = "golden." + folder_.filename().string();
            EXPECT_EQ(golden::RunScenarioAlone(name), 0) << name << " failed in its own process (its output is above)";
            return;
        }
        machine_ = std::make_unique<pextest::TestMachine>();
        baseline_ = Names("C:\\");
        const plat::paths::PathParts bin = plat::paths::SplitPath(plat::lib::SearchFile("Mendler.dll"));
        binFolder_ = bin.drive + bin.dir;
        PrepareMachine();
        const std::vector<std::string> temp = LeftInTemp();
        std::vector<std::unique_ptr<plat::CFile>> held;
        std::unique_ptr<golden::LockHolder> lock;
        for (const std::string& line : Lines(Slurp(folder_ / "scenario.txt"))) {
            const auto w = Words(line);
            if (w.empty() || w[0][0] == '#') continue;
            if (w[0] == "hold") held.push_back(Hold(line.substr(line.find(w[1]))));
            else if (w[0] == "fault") Fault(w);
            else if (w[0] == "crash") crashAt_ = std::stoi(w.at(1));
            else if (w[0] == "lock") lock = std::make_unique<golden::LockHolder>();
            else if (w[0] == "module") PlaceModule(w.at(1), line.substr(line.find(w.at(2))));
            else if (w[0] == "run") Run(w, line);
            else if (w[0] == "pexupdate") Pexupdate(line);
            else ADD_FAILURE() << "unknown directive: " << line;
        }
        EXPECT_EQ(OpenHandles(), handles_) << "a run left a file handle open";
        EXPECT_FALSE(golden::ChildLeft()) << "a run left a child process";
        held.clear();
        lock.reset();
        for (const std::string& path : modules_) EXPECT_TRUE(plat::files::Remove(path)) << path;
        plat::fault::Clear();
        EXPECT_EQ(LeftInTemp(), temp) << "a run left a temporary file";
        Compare("trace.log", trace_);
        Compare("progress.txt", progress_);
        Compare("files.txt", Files());
        Compare("registry.reg", Registry());
        Compare("restart.txt", RestartQueue());
        if (!output_.empty()) Compare("output.txt", output_);
        CompareContentFiles();
    }

private:
    void PrepareMachine() {
        plat::reg::RegFileError regError;
        ASSERT_EQ(plat::reg::ImportRegFile(Slurp(folder_ / "machine.reg"), &regError), 0)
            << "machine.reg line " << regError.line << ": " << regError.message;
        const fs::path before = folder_ / "before";
        if (fs::exists(before))
            for (const auto& e : fs::recursive_directory_iterator(before)) {
                if (!e.is_regular_file()) continue;
                std::string path = fs::relative(e.path(), before).generic_string().insert(1, ":");
                std::replace(path.begin(), path.end(), '/', '\\');
                machine_->WriteFile(path, Slurp(e.path()));
            }
        // before.txt: "<path> [readonly] [written yyyy-mm-dd hh:mm:ss]" per line.
        for (const std::string& line : Lines(Slurp(folder_ / "before.txt"))) {
            const auto w = Words(line);
            if (w.empty() || w[0][0] == '#') continue;
            for (size_t i = 1; i < w.size(); ++i) {
                if (w[i] == "written" && i + 2 < w.size()) {
                    plat::OleDateTime date;
                    std::uint64_t t = 0;
                    EXPECT_TRUE(plat::ParseDateTime(w[i + 1] + " " + w[i + 2], &date) && plat::ToFileTime(date, &t) &&
                                plat::files::SetTimes(w[0], t, t, t))
                        << line;
                    i += 2;
                } else if (w[i] == "readonly") {
                    EXPECT_TRUE(plat::files::SetAttributes(w[0], 1)) << line;
                }
            }
        }
        // A time after this one came from the clock (a day back, for file systems that round).
        clock_ = (static_cast<plat::files::FileTime>(std::time(nullptr)) + 11644473600ULL - 86400) * 10000000;
    }

    // A module of the build (its bytes differ per build and platform, so it is taken away again
    // before the files are listed).
    void PlaceModule(const std::string& name, const std::string& path) {
        const plat::paths::PathParts parts = plat::paths::SplitPath(path);
        CreateDirectoryTree(parts.drive + parts.dir);
        EXPECT_TRUE(plat::files::Copy(binFolder_ + name, path, false)) << name << " to " << path;
        modules_.push_back(path);
    }

    std::unique_ptr<plat::CFile> Hold(const std::string& path) {
        auto file = std::make_unique<plat::CFile>();
        EXPECT_TRUE(file->Open(path, plat::CFile::modeRead | plat::CFile::shareDenyWrite)) << path;
        return file;
    }

    void Fault(const std::vector<std::string>& w) {
        static const std::map<std::string, plat::fault::Op> kOps = {
            {"copy", plat::fault::Op::Copy},       {"remove", plat::fault::Op::Remove},
            {"write", plat::fault::Op::Write},     {"rename", plat::fault::Op::Rename},
            {"regwrite", plat::fault::Op::RegWrite}, {"start", plat::fault::Op::ProcessStart},
            {"any", plat::fault::Op::Any}};
        ASSERT_GE(w.size(), 4u);
        plat::fault::FailNth(kOps.at(w[1]), std::stoi(w[2]), static_cast<std::uint32_t>(std::stoul(w[3])),
                             w.size() > 4 && w[4] == "persistent");
    }

    // One run: the host's UpdateAll (as Mendler.dll does when a host loads it) or one product.
    void Run(const std::vector<std::string>& w, const std::string& line) {
        const std::size_t nested = line.find(" nested");
        golden::Run run{w.size() > 2 && w[1] == "product" ? w[2] : "", nested != std::string::npos,
                        nested == std::string::npos ? "" : line.substr(std::min(line.size(), nested + 8))};
        if (crashAt_ > 0) {
            progress_ += line + ": cut off before its mutating operation " + std::to_string(crashAt_) + ": " +
                         golden::RunCutOff(run, crashAt_) + "\n";
            crashAt_ = 0;
            return;
        }
        if (handles_ < 0) handles_ = OpenHandles();
        progress_ += line + "\n";
        const std::string result = golden::RunHere(run, kModule, &progress_);
        progress_ += "returned " + result + "\n";
        KeepLog(line, true);
    }

    // The trace log after a run, or after a command that wrote one; the support snapshot lists registry values too.
    void KeepLog(const std::string& line, bool always = false) {
        const std::string log = Slurp(plat::paths::ToHost(kLog));
        if (always || log != lastLog_) trace_ += "#### " + line + "\n" + SortedValues(Normalised(log, true));
        lastLog_ = log;
    }

    // A command of the host program as a person runs it: what it printed and its exit status. It
    // runs from a copy beside the library's module, so that it reads the trace log of the runs.
    void Pexupdate(const std::string& line) {
        if (handles_ < 0) handles_ = OpenHandles();
        const std::string program = "C:\\Mendler\\" + pextest::ProgramFile("pexupdate");
        if (!plat::files::Exists(program)) {
            PlaceModule("Mendler.dll", kModule);
            fs::copy_file(PEXUPDATE_PATH, plat::paths::ToHost(program));
            modules_.push_back(program);
        }
        // "ARGS <<< TEXT" answers its prompts with TEXT, from a file beside the machine's drives.
        std::string args = line.substr(line.find("pexupdate") + 10);
        const std::string input = machine_->Root() + "/input.txt";
        const std::size_t answers = args.find(" <<< ");
        std::ofstream(input, std::ios::binary) << (answers == std::string::npos ? "" : args.substr(answers + 5) + "\n");
        args = args.substr(0, answers) + " <'" + input + "'";
        const pextest::CommandOutcome o = pextest::RunPexupdate(plat::paths::ToHost(program), *machine_, args);
        std::string out = std::regex_replace(o.out, std::regex("\\d{4}/\\d\\d/\\d\\d - [0-9:.]{12}"), "<time>");
        out = std::regex_replace(out, std::regex(Escaped(machine_->Root())), "<machine>");
        output_ += "#### " + line + "\n" + Normalised(out, false) + "exit " + std::to_string(o.exit) + "\n";
        KeepLog(line);  // `all` and `product` run the library, which writes its log
    }

    // Time stamps, the build's own folder and temporary names differ from machine to machine
    // (Wine's setup service stages a file in use as SET<hex>.tmp, with one to four digits).
    std::string Normalised(const std::string& text, bool log) const {
        std::string out = log ? std::regex_replace(text, std::regex("(^|\n)\\d{4}/\\d\\d/\\d\\d - [0-9:.]{12} - "),
                                                   "$1")
                              : text;
        out = std::regex_replace(out, std::regex("\r\n"), "\n");
        // The banner pads each module path to a width: the build folder's length varies.
        const std::string bin = Escaped(binFolder_);
        out = std::regex_replace(out, std::regex("\\[ *" + bin, std::regex::icase), "[<bin>\\");
        out = std::regex_replace(out, std::regex(bin, std::regex::icase), "<bin>\\");
        // The banner looks for pexupdate.exe beside the library (the build's and a scenario's
        // copy): the Windows build's is stamped with the suite's version; the Linux build's host
        // program is "pexupdate".
        out = std::regex_replace(out, std::regex("(\\\\pexupdate\\.exe\\]: ).*"), "$1(the build's own)");
        out = std::regex_replace(out, std::regex(Escaped(plat::files::TempFolder()), std::regex::icase), "<temp>\\");
        return std::regex_replace(out, std::regex("\\b(SET[0-9A-Fa-f]{1,4}|[A-Za-z$~]{0,3}[0-9A-Fa-f]{4})\\.tmp\\b"), "<unique>.tmp");
    }

    // Every file on drive C: below the folders that a fresh machine does not have.
    std::string Files() const {
        std::vector<std::string> lines;
        for (const std::string& top : Names("C:\\"))
            if (!std::binary_search(baseline_.begin(), baseline_.end(), top)) ListFiles("C:\\" + top, &lines);
        std::sort(lines.begin(), lines.end());
        return Normalised(Joined(lines), false);
    }

    void ListFiles(const std::string& path, std::vector<std::string>* lines) const {
        plat::files::FileStatus status;
        if (!plat::files::GetStatus(path, &status)) return;
        if (status.attributes & 0x10) {
            for (const std::string& name : Names(path + "\\")) ListFiles(path + "\\" + name, lines);
            return;
        }
        // The emulated machine writes a file durably through a copy beside it that it keeps
        // (".pex~NAME.prev"); Windows replaces the file in place and keeps none.
        if (path.find("\\.pex~") != std::string::npos) return;
        if (path.rfind(kLogFolder, 0) == 0) {  // its bytes are the trace log, compared above
            lines->push_back(path + " (trace log)");
            return;
        }
        if (EndsWith(path, "$jnl$")) {  // its records carry the file times of the targets it backs up
            lines->push_back(path + " " + std::to_string(status.size) + " (journal)");
            return;
        }
        std::string bytes;
        plat::files::ReadAll(path, &bytes);
        lines->push_back(path + " " + std::to_string(status.size) + " " + Sha256(bytes) +
                         ((status.attributes & 1) ? " readonly" : "") + " written " +
                         (status.lastWrite > clock_ ? "(clock)" : FormatTime(status.lastWrite)));
    }

    std::string Registry() const {
        std::string text;
        plat::reg::KeyPath key;
        plat::reg::ParseKeyPath("HKEY_LOCAL_MACHINE\\Software\\Vantric", &key);
        if (plat::reg::ExportRegText(key, &text) != 0) return "(no HKEY_LOCAL_MACHINE\\Software\\Vantric)\n";
        return SortedValues(Normalised(text, false));
    }

    // Wine enumerates a key's values in another order than they were written: the values of
    // each key are compared sorted by name.
    static std::string SortedValues(const std::string& text) {
        std::vector<std::string> lines = Lines(text);
        const auto isValue = [](const std::string& line) { return !line.empty() && line[0] == '"'; };
        for (auto run = lines.begin(); run != lines.end();) {
            run = std::find_if(run, lines.end(), isValue);
            const auto end = std::find_if_not(run, lines.end(), isValue);
            std::sort(run, end);
            run = end;
        }
        return Joined(lines);
    }

    // The temporary folder's files, but those that the restart queue moves (Wine stages the
    // files it queues there).
    static std::vector<std::string> LeftInTemp() {
        std::vector<plat::setup::PendingRename> queue;
        plat::setup::ReadPendingRenames(&queue);
        std::vector<std::string> names;
        for (const std::string& name : Names(plat::files::TempFolder())) {
            const std::string path = plat::files::TempFolder() + name;
            if (std::none_of(queue.begin(), queue.end(), [&](const auto& op) { return op.from == path; }))
                names.push_back(name);
        }
        return names;
    }

    std::string RestartQueue() const {
        std::vector<plat::setup::PendingRename> queue;
        if (!plat::setup::ReadPendingRenames(&queue)) return "(queue unreadable)\n";
        std::string out;
        for (const auto& op : queue)
            out += op.from + (op.to.empty() ? " deleted" : (op.replace ? " replaces " : " becomes ") + op.to) + "\n";
        return Normalised(out, false);
    }

    // The content files after the run (any file whose name has "content"), byte for byte.
    void CompareContentFiles() const {
        const fs::path kept = folder_ / "expected" / "content";
        if (std::getenv("PEX_ACCEPT") && !pextest::UnderWine()) fs::remove_all(kept);
        std::vector<std::string> names;
        for (const std::string& line : Lines(Files())) {
            const std::string path = line.substr(0, line.find(' ', line.rfind('\\')));
            const std::string name = path.substr(path.rfind('\\') + 1);
            if (!std::regex_search(name, std::regex("content", std::regex::icase)) || EndsWith(name, "$jnl$")) continue;
            std::string bytes;
            plat::files::ReadAll(path, &bytes);
            Compare("content/" + name, bytes);
            names.push_back(name);
        }
        if (!fs::exists(kept)) return;
        for (const auto& e : fs::directory_iterator(kept))
            if (std::find(names.begin(), names.end(), e.path().filename().string()) == names.end())
                ADD_FAILURE() << "content file " << e.path().filename() << " is no longer left";
    }

    // Where Wine does what Windows would not, a scenario keeps what Wine does in expected/wine/
    // (its scenario.txt says why); accepting under Wine writes only what differs.
    void Compare(const std::string& name, const std::string& actual) const {
        fs::path file = folder_ / "expected" / name;
        const fs::path wine = folder_ / "expected" / "wine" / name;
        if (pextest::UnderWine() && (fs::exists(wine) || (std::getenv("PEX_ACCEPT") && Slurp(file) != actual)))
            file = wine;
        if (std::getenv("PEX_ACCEPT")) {
            fs::create_directories(file.parent_path());
            std::ofstream(file, std::ios::binary) << actual;
            return;
        }
        const std::string expected = Slurp(file);
        if (expected == actual) return;
        ADD_FAILURE() << "expected/" << name << " of " << folder_.filename()
                      << " differs (PEX_ACCEPT=1 rewrites it after review):\n"
                      << ::testing::internal::edit_distance::CreateUnifiedDiff(Lines(expected), Lines(actual));
    }

    fs::path folder_;
    std::unique_ptr<pextest::TestMachine> machine_;
    std::vector<std::string> baseline_;
    std::string binFolder_;
    std::vector<std::string> modules_;
    plat::files::FileTime clock_ = 0;
    int crashAt_ = 0;
    int handles_ = -1;
    std::string trace_, progress_, output_, lastLog_;
};

}  // namespace

// The scenario's own process prints only what failed, so that the program's output keeps one
// summary (the Windows test runner reads its counts from it).
class FailurePrinter : public ::testing::EmptyTestEventListener {
    void OnTestPartResult(const ::testing::TestPartResult& result) override {
        if (result.failed())
            std::printf("%s:%d: Failure\n%s\n", result.file_name() ? result.file_name() : "?", result.line_number(),
                        result.message());
    }
};

int main(int argc, char** argv) {
    if (golden::IsChild()) return golden::ChildMain();
    ::testing::InitGoogleTest(&argc, argv);
    if (golden::IsScenarioProcess()) {
        ::testing::TestEventListeners& listeners = ::testing::UnitTest::GetInstance()->listeners();
        delete listeners.Release(listeners.default_result_printer());
        listeners.Append(new FailurePrinter);
    }
    std::vector<fs::path> folders;
    for (const auto& e : fs::directory_iterator(PEX_RUNS_DIR))
        if (fs::exists(e.path() / "scenario.txt")) folders.push_back(e.path());
    std::sort(folders.begin(), folders.end());
    for (const fs::path& folder : folders)
        ::testing::RegisterTest("golden", folder.filename().string().c_str(), nullptr, nullptr, __FILE__, __LINE__,
                                [folder]() -> ::testing::Test* { return new GoldenRun(folder); });
    return RUN_ALL_TESTS();
}
