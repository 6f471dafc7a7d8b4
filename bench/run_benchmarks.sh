#!/usr/bin/env bash
# Runs every benchmark of an optimised build and writes docs/performance.md with its plots.
#   bash bench/run_benchmarks.sh BUILD_DIR
# Each program writes Google Benchmark's JSON into BUILD_DIR/bench-results; the machines the
# benchmarks make live in BUILD_DIR/bench-tmp (the same disk as a real machine root would be)
# and are removed as they finish. Numbers on a shared machine are noisy: the programs repeat
# their measurements and the report takes medians.
set -euo pipefail
cd "$(dirname "$0")/.."

BUILD=${1:?usage: bench/run_benchmarks.sh BUILD_DIR}
BIN=$BUILD/bin
RESULTS=$BUILD/bench-results
export PEX_BENCH_TMP=$PWD/$BUILD/bench-tmp
rm -rf "$RESULTS" "$PEX_BENCH_TMP"
mkdir -p "$RESULTS" "$PEX_BENCH_TMP"

started=$(date +%s)
timings=()

# run NAME [FLAGS...]: one program, its JSON kept, its console output shown.
run() {
  local name=$1
  shift
  local t0
  t0=$(date +%s)
  echo "== $name"
  "$BIN/$name" --benchmark_out="$RESULTS/$name.json" --benchmark_out_format=json "$@"
  timings+=("\"$name\": $(($(date +%s) - t0))")
}

# The short CPU-bound programs first, the disk-bound whole runs last.
run content_table_bench --benchmark_repetitions=3 --benchmark_min_time=0.2
run row_script_bench --benchmark_repetitions=3 --benchmark_min_time=0.2
run trace_log_bench --benchmark_repetitions=3 --benchmark_min_time=0.3
# The contenders take turns, so that a slow moment of the disk does not fall on one of them.
run decompress_bench --benchmark_repetitions=5 --benchmark_enable_random_interleaving=true
run update_all_bench

finished=$(date +%s)
{
  echo "{"
  echo "  \"seconds\": $((finished - started)),"
  echo "  \"build_seconds\": ${PEX_BENCH_BUILD_SECONDS:-0},"
  echo "  \"date\": \"$(date -u +%Y-%m-%dT%H:%MZ)\","
  echo "  \"load\": \"$(cut -d' ' -f1-3 /proc/loadavg)\","
  echo "  \"cpus\": $(nproc),"
  echo "  \"programs\": {$(IFS=,; echo "${timings[*]}")}"
  echo "}"
} > "$RESULTS/run.json"
rm -rf "$PEX_BENCH_TMP"

python3 bench/report.py "$RESULTS" docs
echo "Benchmarks ran for $((finished - started)) s; report: docs/performance.md"
