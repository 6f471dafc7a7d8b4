// Load and save of content files from 100 to 100,000 rows of 14 columns: both should stay
// linear in the number of rows and well under a second at the top of the range. The file
// variants are timed on the wall clock, since their flushes wait for the disk, not the CPU.
#include <benchmark/benchmark.h>

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <string>

#include "bench/bench_machine.h"
#include "manifest/content_table.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace {

// A content file shaped like the real ones: short flags, statuses, paths and commands.
std::string MakeContentFile(int rows) {
    std::string text =
        "FileName,UpgradeStatus,HomeDir,DynamicFieldInfo,Force Download,Snoozable,"
        "InterestedParties,DownLoadCacheFile,FileGroup,DependancyOrder,NeedsDecompression,"
        "Command,UpdateDate,Comment\r\n";
    for (int i = 0; i < rows; ++i) {
        const std::string n = std::to_string(i);
        text += "module" + n + ".dll,Downloaded,C:\\Program Files\\Vantric\\Suite\\,"
                "\"FORCED = TRUE\",1,0,VantricSuite;Matrix,C:\\windows\\temp\\dl" + n +
                ".tmp,Group" + std::to_string(i % 50) + ",Group" + std::to_string(i % 7) +
                ",1,[REGISTER]module" + n + ".dll,12/31/2003 10:30:00 PM, note \r\n";
    }
    return text;
}

const char* const kPath = "C:\\content.csv";

void BM_LoadFromText(benchmark::State& state) {
    const std::string text = MakeContentFile(static_cast<int>(state.range(0)));
    CContentTable table;
    for (auto _ : state) benchmark::DoNotOptimize(table.LoadFromText(text));
    state.SetComplexityN(state.range(0));
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
}

void BM_LoadFromFile(benchmark::State& state) {
    pexbench::Machine();
    const std::string text = MakeContentFile(static_cast<int>(state.range(0)));
    if (!plat::files::WriteAllDurably(kPath, text)) state.SkipWithError("cannot write the file");
    CContentTable table;
    for (auto _ : state) benchmark::DoNotOptimize(table.LoadFromFile(kPath));
    state.SetComplexityN(state.range(0));
}

// The table keeps each row's text until a cell of it changes. A full render is timed on a fresh
// copy of the loaded table (copied outside the timing); the pipeline's own case, a save after a
// group changed its rows, is the render after one row changed.
// Times what fn does with a fresh copy of a loaded table of state.range(0) rows, every row
// still to be rendered.
template <typename Fn>
void OnFreshTable(benchmark::State& state, Fn fn) {
    CContentTable loaded, table;
    loaded.LoadFromText(MakeContentFile(static_cast<int>(state.range(0))));
    for (auto _ : state) {
        state.PauseTiming();
        table = loaded;
        state.ResumeTiming();
        fn(table);
    }
    state.SetComplexityN(state.range(0));
}

void BM_ToFileText(benchmark::State& state) {
    OnFreshTable(state, [](CContentTable& table) { benchmark::DoNotOptimize(table.ToFileText()); });
}

void BM_ToFileTextOneRowChanged(benchmark::State& state) {
    CContentTable table;
    table.LoadFromText(MakeContentFile(static_cast<int>(state.range(0))));
    table.ToFileText();
    std::uint32_t row = 0;
    for (auto _ : state) {
        table.SetField(row, "UpgradeStatus", row % 2 ? "AppliedSuccessfully" : "Downloaded");
        row = (row + 7919) % table.RowCount();
        benchmark::DoNotOptimize(table.ToFileText());
    }
    state.SetComplexityN(state.range(0));
}

// Includes the flush of the durable save, which dominates for small tables; every row rendered.
void BM_SaveToFile(benchmark::State& state) {
    pexbench::Machine();
    OnFreshTable(state, [](CContentTable& table) { benchmark::DoNotOptimize(table.SaveToFile(kPath)); });
}

// The same bytes replaced the same way (temporary file beside, rename) without the flush, every
// row rendered: what the durable save costs beyond this is the flush.
void BM_SaveWithoutFlush(benchmark::State& state) {
    pexbench::Machine();
    const std::string host = plat::paths::ToHost(kPath), temp = host + ".tmp";
    OnFreshTable(state, [&](CContentTable& table) {
        const std::string bytes = table.ToFileText();
        const int fd = ::open(temp.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
        const bool ok = fd >= 0 && ::write(fd, bytes.data(), bytes.size()) == static_cast<ssize_t>(bytes.size());
        if (fd >= 0) ::close(fd);
        if (!ok || std::rename(temp.c_str(), host.c_str()) != 0) state.SkipWithError("cannot write the file");
    });
}

}  // namespace

BENCHMARK(BM_LoadFromText)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_LoadFromFile)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN)->UseRealTime();
BENCHMARK(BM_ToFileText)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_ToFileTextOneRowChanged)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_SaveToFile)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN)->UseRealTime();
BENCHMARK(BM_SaveWithoutFlush)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN)->UseRealTime();

BENCHMARK_MAIN();
