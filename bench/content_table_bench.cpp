// Load and save of content files from 100 to 100,000 rows of 14 columns: both should stay
// linear in the number of rows and well under a second at the top of the range.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>

#include "manifest/content_table.h"
#include "platform/files.h"
#include "platform/machine.h"

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

// A fresh emulated machine for the file benchmarks, removed at exit.
class BenchMachine {
public:
    BenchMachine() {
        std::string tmpl = (std::filesystem::temp_directory_path() / "pexbench-XXXXXX").string();
        if (!mkdtemp(tmpl.data())) throw std::runtime_error("cannot create a machine root");
        root_ = tmpl;
        plat::machine::SetRoot(root_);
        plat::machine::Ensure();
    }
    ~BenchMachine() {
        std::error_code ec;
        std::filesystem::remove_all(root_, ec);
    }

private:
    std::string root_;
};

BenchMachine& Machine() {
    static BenchMachine machine;
    return machine;
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
    Machine();
    const std::string text = MakeContentFile(static_cast<int>(state.range(0)));
    if (!plat::files::WriteAllDurably(kPath, text)) state.SkipWithError("cannot write the file");
    CContentTable table;
    for (auto _ : state) benchmark::DoNotOptimize(table.LoadFromFile(kPath));
    state.SetComplexityN(state.range(0));
}

void BM_ToFileText(benchmark::State& state) {
    CContentTable table;
    table.LoadFromText(MakeContentFile(static_cast<int>(state.range(0))));
    for (auto _ : state) benchmark::DoNotOptimize(table.ToFileText());
    state.SetComplexityN(state.range(0));
}

// Includes the flushes of the durable save, which dominate for small tables.
void BM_SaveToFile(benchmark::State& state) {
    Machine();
    CContentTable table;
    table.LoadFromText(MakeContentFile(static_cast<int>(state.range(0))));
    for (auto _ : state) benchmark::DoNotOptimize(table.SaveToFile(kPath));
    state.SetComplexityN(state.range(0));
}

}  // namespace

BENCHMARK(BM_LoadFromText)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_LoadFromFile)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_ToFileText)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);
BENCHMARK(BM_SaveToFile)->RangeMultiplier(10)->Range(100, 100000)->Unit(benchmark::kMillisecond)->Complexity(benchmark::oN);

BENCHMARK_MAIN();
