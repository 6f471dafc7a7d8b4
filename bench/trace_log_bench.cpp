// One trace line, as the library writes tens of them per update file: with the file opened and
// closed again for every line (the log's default, so that support staff and other programs can
// open it at any time), with keepOpen (how bursts such as the support snapshot are written), and
// without a file (formatting and time stamp alone). The per-line variant is run for log folders
// of several depths, to show that an open no longer depends on the path's length (the log maps
// its path once). Beside them the operating system's least cost of such a line: a C loop that
// opens the same file for appending, writes the line's bytes once and closes it.
#include <benchmark/benchmark.h>

#include <fcntl.h>
#include <unistd.h>

#include <string>

#include "bench/bench_machine.h"
#include "diag/trace_log.h"
#include "diag/trace_startup.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace {

// A log folder `depth` folders below C:\ (depth 4 is where an installed suite keeps it:
// C:\Program Files\Vantric\Suite\log).
std::string LogFolder(int depth) {
    static const char* const kNames[] = {"Program Files", "Vantric", "Suite", "log"};
    std::string folder = "C:";
    for (int i = 0; i < depth; ++i) {
        folder += "\\";
        folder += i < 4 ? kNames[i] : "level" + std::to_string(i);
        plat::files::MakeDirectory(folder);
    }
    return folder;
}

// A log as start-up leaves it: its file, its substitution pair, a fresh file.
void Prepare(TraceLog& log, int depth) {
    pexbench::Machine();
    log.SetFileName(LogFolder(depth) + "\\pex_support_mendler.log");
    log.SetSubstitution(kTraceHiddenWord, kTraceHiddenWordToken);
    log.Delete();
}

void Lines(benchmark::State& state, TraceLog& log) {
    int group = 0;
    for (auto _ : state) {
        TRACE(log, "CManifestParser: Applying group '%s%04d'...", "GROUP", group);
        group = (group + 1) % 10000;
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()));
}

void BM_TraceLineOpenClosePerLine(benchmark::State& state) {
    TraceLog log;
    Prepare(log, static_cast<int>(state.range(0)));
    Lines(state, log);
    log.Delete();
}

void BM_TraceLineKeepOpen(benchmark::State& state) {
    TraceLog log;
    Prepare(log, static_cast<int>(state.range(0)));
    log.keepOpen = true;
    Lines(state, log);
    log.keepOpen = false;
    log.Delete();
}

void BM_TraceLineNoFile(benchmark::State& state) {
    TraceLog log;
    Prepare(log, 4);
    log.fileOutput = false;
    Lines(state, log);
}

// The same file, the same bytes per line (a stamp, the message, CR LF), through bare calls.
void BM_TraceLineCLoop(benchmark::State& state) {
    TraceLog log;
    Prepare(log, 4);
    const std::string host = plat::paths::ToHost(log.FileName());
    const std::string line = "2026/12/06 - 19:36:08.123 - CManifestParser: Applying group 'GROUP0001'...\r\n";
    bool ok = true;
    for (auto _ : state) {
        const int fd = ::open(host.c_str(), O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
        ok = fd >= 0 && ::write(fd, line.data(), line.size()) == static_cast<ssize_t>(line.size()) && ok;
        if (fd >= 0) ::close(fd);
    }
    if (!ok) state.SkipWithError("cannot append to the log's file");
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()));
    log.Delete();
}

}  // namespace

BENCHMARK(BM_TraceLineCLoop)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(BM_TraceLineOpenClosePerLine)->Arg(1)->Arg(4)->Arg(8)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(BM_TraceLineKeepOpen)->Arg(4)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(BM_TraceLineNoFile)->Unit(benchmark::kMicrosecond)->UseRealTime();

BENCHMARK_MAIN();
