#!/usr/bin/env bash
# Mendler's two set-up commands:
#   ./run.sh test   install what is missing, build, run every test
#   ./run.sh demo   install what is missing, build, update the products of the demo machine
#   ./run.sh fuzz [SECONDS]   build the fuzz targets with clang and run each for SECONDS (not in CI)
#   ./run.sh bench  build with optimisation into build-bench/, run every benchmark, write
#                   docs/performance.md and its plots (not in CI; about ten minutes)
# Both are idempotent and quick when nothing changed.
set -euo pipefail
cd "$(dirname "$0")"

PACKAGES=(cmake make g++ pkg-config libgtest-dev libgmock-dev libsqlite3-dev zlib1g-dev flex bison
          mscompress libmspack-dev)
BUILD=build

install_missing() {
  local missing=()
  for p in "$@"; do dpkg -s "$p" >/dev/null 2>&1 || missing+=("$p"); done
  if ((${#missing[@]})); then
    echo "Installing: ${missing[*]}"
    apt-get update -qq
    DEBIAN_FRONTEND=noninteractive apt-get install -y -qq "${missing[@]}" >/dev/null
  fi
}

build() {
  install_missing "${PACKAGES[@]}"
  [ -f "$BUILD/CMakeCache.txt" ] || cmake -S . -B "$BUILD" -DCMAKE_BUILD_TYPE=Debug >/dev/null
  cmake --build "$BUILD" -j"$(nproc)"
}

cmd_test() {
  build
  ctest --test-dir "$BUILD" --output-on-failure -j"$(nproc)"
}

cmd_demo() {
  build
  bash tools/demo/demo.sh "$BUILD"
}

# The benchmarks build apart from the tests, optimised; the report needs gnuplot and python3.
BENCH_PACKAGES=(libbenchmark-dev gnuplot-nox python3)
BENCH_BUILD=build-bench

cmd_bench() {
  install_missing "${PACKAGES[@]}" "${BENCH_PACKAGES[@]}"
  [ -f "$BENCH_BUILD/CMakeCache.txt" ] ||
    cmake -S . -B "$BENCH_BUILD" -DCMAKE_BUILD_TYPE=Release -DPEX_BENCH=ON -DPEX_TESTS=OFF >/dev/null
  cmake --build "$BENCH_BUILD" -j"$(nproc)"
  bash bench/run_benchmarks.sh "$BENCH_BUILD"
}

case "${1:-}" in
  test) cmd_test ;;
  demo) cmd_demo ;;
  fuzz) shift; bash fuzz/run.sh "$@" ;;
  bench) cmd_bench ;;
  *) echo "usage: ./run.sh test | demo | fuzz [SECONDS] | bench" >&2; exit 2 ;;
esac
