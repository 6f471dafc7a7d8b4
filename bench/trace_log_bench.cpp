// One trace line, as the library writes tens of them per update file: with the file opened and
// closed again for every line (the log's default, so that support staff and other programs can
// open it at any time), with keepOpen (how bursts such as the support snapshot are written), and
// without a file (formatting and time stamp alone). The per-line variant is run for log folders
// of several depths, because every open maps the Windows path to a host path again.
#include <benchmark/benchmark.h>

#include <string>

#include "bench/bench_machine.h"
#include "diag/trace_log.h"
#include "diag/trace_startup.h"
#include "platform/files.h"

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

}  // namespace

BENCHMARK(BM_TraceLineOpenClosePerLine)->Arg(1)->Arg(4)->Arg(8)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(BM_TraceLineKeepOpen)->Arg(4)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(BM_TraceLineNoFile)->Unit(benchmark::kMicrosecond)->UseRealTime();

BENCHMARK_MAIN();
