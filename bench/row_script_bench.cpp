// One row's dynamic-field script, as row preparation runs it for every loaded row: parse,
// validate, execute against the row. Two scripts: the one-assignment script most rows carry,
// and a typical longer one that looks at the installed file. The trace log writes nowhere here
// (the language's own cost); "Logged" runs the whole script with the log writing its file as
// start-up configures it, which is what a real run pays per row.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

#include "bench/bench_machine.h"
#include "commands/update_services.h"
#include "diag/trace_log.h"
#include "diag/trace_startup.h"
#include "expr/execution_plan.h"
#include "expr/override_parser.h"
#include "manifest/content_table.h"
#include "platform/files.h"

namespace {

const char* const kSimple = "FORCED = TRUE";
const char* const kTypical =
    "FORCED = NOT FileVersionAtLeast(AddPathSep(HomeDir) & FileName, \"2.1.0.17\"); "
    "FORCED = IIFB(FileExists(AddPathSep(HomeDir) & FileName), FORCED, TRUE) OR NOT BVAR";

// One content-file row with an installed file for the script to look at.
struct Row {
    Row() {
        pexbench::Machine();
        plat::files::MakeDirectory("C:\\App");
        plat::files::WriteAllDurably("C:\\App\\a.dll", std::string(4096, 'x'));
        table.LoadFromText("FileName,UpgradeStatus,HomeDir,DynamicFieldInfo,Force Download,AVAR,BVAR\r\n"
                           "a.dll,Downloaded,C:\\App,,0,1,0\r\n");
    }
    CContentTable table;
    RowReference ref{table, 0};
    UpdateServices services{ref};
};

const char* ScriptOf(const benchmark::State& state) { return state.range(0) == 0 ? kSimple : kTypical; }

void BM_RowScriptParse(benchmark::State& state) {
    const std::string text = ScriptOf(state);
    for (auto _ : state) {
        ExecutionPlan plan;
        if (!plan.Parse(text)) state.SkipWithError("the script does not parse");
    }
}

// A script of state.range(0) bytes, at most the bound on a script's length: assignments in a
// row (shape 0), or one call with ever more arguments (shape 1), the two shapes whose parse
// once grew with the square of the text. The time must grow with the text.
std::string LongScript(std::size_t bytes, int shape) {
    const std::string start = shape == 0 ? "FORCED = AVAR AND TRUE OR FALSE" : "FORCED = AND(TRUE";
    const std::string more = shape == 0 ? "; FORCED = AVAR AND TRUE OR FALSE" : ", TRUE";
    std::string text = start;
    while (text.size() + more.size() + 1 <= bytes) text += more;
    return shape == 0 ? text : text + ")";
}

void BM_RowScriptParseLong(benchmark::State& state) {
    const std::string text = LongScript(static_cast<std::size_t>(state.range(0)), static_cast<int>(state.range(1)));
    for (auto _ : state) {
        ExecutionPlan plan;
        if (!plan.Parse(text)) state.SkipWithError("the script does not parse");
    }
    state.SetComplexityN(state.range(0));
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_RowScriptValidate(benchmark::State& state) {
    ExecutionPlan plan;
    plan.Parse(ScriptOf(state));
    for (auto _ : state) {
        if (!plan.Validate()) state.SkipWithError("the script is not valid");
    }
}

void BM_RowScriptExecute(benchmark::State& state) {
    Row row;
    ExecutionPlan plan;
    if (!plan.Parse(ScriptOf(state)) || !plan.Validate()) state.SkipWithError("the script is not valid");
    for (auto _ : state) benchmark::DoNotOptimize(plan.Execute(row.services));
}

void RunWhole(benchmark::State& state, Row& row) {
    const std::string text = ScriptOf(state);
    for (auto _ : state) {
        ExecutionPlan plan;
        if (!plan.Parse(text) || !plan.Validate() || plan.Execute(row.services) != 0)
            state.SkipWithError("the script failed");
    }
}

void BM_RowScriptWhole(benchmark::State& state) {
    Row row;
    RunWhole(state, row);
}

void BM_RowScriptWholeLogged(benchmark::State& state) {
    Row row;
    plat::files::MakeDirectory("C:\\log");
    g_TraceLog.SetFileName("C:\\log\\pex_support_mendler.log");
    g_TraceLog.SetSubstitution(kTraceHiddenWord, kTraceHiddenWordToken);
    RunWhole(state, row);
    g_TraceLog.Delete();
    g_TraceLog.fileOutput = false;
}

}  // namespace

BENCHMARK(BM_RowScriptParse)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RowScriptParseLong)
    ->ArgsProduct({benchmark::CreateRange(1 << 10, kMaxScriptLength, 4), {0, 1}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_RowScriptValidate)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RowScriptExecute)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RowScriptWhole)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_RowScriptWholeLogged)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond)->UseRealTime();

BENCHMARK_MAIN();
