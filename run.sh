#!/usr/bin/env bash
# Mendler's two set-up commands:
#   ./run.sh test   install what is missing, build, run every test; then the same with ASan and
#                   UBSan in build-asan/, with every fuzz corpus replayed through its target
#   ./run.sh demo   install what is missing, build, update the products of the demo machine
#   ./run.sh fuzz [SECONDS]   build the fuzz targets with clang and run each for SECONDS (not in CI)
#   ./run.sh bench  build with optimisation into build-bench/, run every benchmark, write
#                   docs/performance.md and its plots (not in CI; about 7 minutes on 2 cores)
#   ./run.sh windows   install mingw-w64 and Wine, cross-build for Windows x64 into build-win/,
#                      run every test program under Wine in a throw-away prefix, then the ZIP
#                      package of that build unpacked and run there
#   ./run.sh package   Release builds for Linux and Windows x64, their packages in dist/, each
#                      unpacked into an empty folder and run there (the ZIP under Wine)
# Both are idempotent and quick when nothing changed.
set -euo pipefail
cd "$(dirname "$0")"

PACKAGES=(cmake make g++ pkg-config libgtest-dev libgmock-dev libsqlite3-dev zlib1g-dev flex bison
          mscompress libmspack-dev libssl-dev nlohmann-json3-dev dpkg-dev)
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

# The suite again with AddressSanitizer and UndefinedBehaviorSanitizer, in a build folder of its
# own; there the fuzz targets are plain programs and ctest replays every corpus through them.
SANITIZE_BUILD=build-asan
# Tests too slow under the sanitizers to run there (README, "What ./run.sh test runs").
SANITIZE_SKIP_LABEL=sanitize_skip

# Prints how long a step took, for the figures in the README.
timed() {
  local what=$1 started=$SECONDS
  shift
  "$@"
  echo "$what: $((SECONDS - started))s"
}

test_sanitized() {
  [ -f "$SANITIZE_BUILD/CMakeCache.txt" ] ||
    cmake -S . -B "$SANITIZE_BUILD" -DCMAKE_BUILD_TYPE=Debug -DPEX_SANITIZE=ON >/dev/null
  cmake --build "$SANITIZE_BUILD" -j"$(nproc)"
  # Any report fails its test: UBSan would otherwise print and go on.
  ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1} \
  UBSAN_OPTIONS=${UBSAN_OPTIONS:-halt_on_error=1:print_stacktrace=1} \
    ctest --test-dir "$SANITIZE_BUILD" --output-on-failure -j"$(nproc)" -LE "$SANITIZE_SKIP_LABEL"
}

cmd_test() {
  timed "build" build
  timed "tests" ctest --test-dir "$BUILD" --output-on-failure -j"$(nproc)"
  timed "build and tests with ASan and UBSan" test_sanitized
}

cmd_demo() {
  build
  bash tools/demo/demo.sh "$BUILD"
}

# The Windows build: mingw-w64 (posix threads), zlib and GoogleTest's sources for it, and Wine.
WINDOWS_PACKAGES=(cmake make mingw-w64 g++-mingw-w64-x86-64-posix libz-mingw-w64-dev googletest
                  flex bison wine wine64 nlohmann-json3-dev)
WINDOWS_BUILD=build-win
# Seconds one test program may run under Wine before it counts as failed.
WINE_TEST_TIMEOUT=${PEX_WINE_TEST_TIMEOUT:-300}

# The output of the tests that failed, and whatever a program printed after its last test.
failed_test_output() {
  awk '/^\[ RUN      \]/ { buf = $0; next }
       /^\[       OK \]|^\[  SKIPPED \]/ { buf = ""; next }
       /^\[  FAILED  \] .*\(/ { print buf; print; buf = ""; next }
       /^$|^Running main|^\[  FAILED  \]|^\[==========\]|^\[----------\]|^\[  PASSED  \]/ { next }
       { buf = buf "\n" $0 }
       END { if (buf != "") print buf }'
}

# Runs one test program under Wine from its own folder; prints its GoogleTest summary and adds
# its counts to the totals. Returns non-zero when it failed or did not finish.
run_wine_test() {
  local program=$1 name out rc passed skipped failed
  name=$(basename "$program" .exe)
  rc=0
  out=$(cd "$(dirname "$program")" && timeout -k 10 "$WINE_TEST_TIMEOUT" wine "$program" </dev/null 2>&1 | tr -d '\r') || rc=$?
  passed=$(sed -n 's/^\[  PASSED  \] \([0-9]*\) tests\{0,1\}\..*/\1/p' <<<"$out")
  skipped=$(sed -n 's/^\[  SKIPPED \] \([0-9]*\) tests\{0,1\}, listed below:/\1/p' <<<"$out")
  failed=$(sed -n 's/^\[  FAILED  \] \([0-9]*\) tests\{0,1\}, listed below:/\1/p' <<<"$out")
  WINE_PASSED=$((WINE_PASSED + ${passed:-0}))
  WINE_SKIPPED=$((WINE_SKIPPED + ${skipped:-0}))
  WINE_FAILED=$((WINE_FAILED + ${failed:-0}))
  printf '%-40s %4s passed %4s skipped %4s failed\n' "$name" "${passed:-0}" "${skipped:-0}" "${failed:-0}"
  if ((rc != 0)) || [ -z "$passed" ]; then
    ((rc == 124)) && echo "  $name did not finish within ${WINE_TEST_TIMEOUT}s"
    failed_test_output <<<"$out" | head -80 | sed 's/^/  /'
    return 1
  fi
}

# A throw-away Wine prefix for the rest of the script, removed when it ends.
start_wine_prefix() {
  WINEPREFIX=$(mktemp -d /tmp/pex-wine.XXXXXX)
  export WINEPREFIX WINEDEBUG=-all
  trap 'wineserver -k >/dev/null 2>&1 || true; rm -rf "$WINEPREFIX"' EXIT
  echo "Preparing a Wine prefix in $WINEPREFIX"
  # One server for the whole run: a new one for each program would start the prefix again. The
  # prefix's services start here, apart from the tests, whose output pipes they would keep open.
  wineserver -p </dev/null >/dev/null 2>&1
  wine wineboot -i </dev/null >/dev/null 2>&1
}

# Makes the packages of a build folder in FOLDER/packages.
make_packages() {
  rm -rf "$1/packages"
  cpack --config "$1/CPackConfig.cmake" -B "$1/packages" >/dev/null
}

# Unpacks each package into an empty folder and runs it there, with the C host program of docs/:
#   bash $PACKAGE_TEST HOST-PROGRAM PACKAGE...
PACKAGE_TEST=tests/package/unpacked_package_test.sh

cmd_windows() {
  install_missing "${WINDOWS_PACKAGES[@]}"
  [ -f "$WINDOWS_BUILD/CMakeCache.txt" ] ||
    cmake -S . -B "$WINDOWS_BUILD" -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake \
          -DCMAKE_BUILD_TYPE=Debug >/dev/null
  cmake --build "$WINDOWS_BUILD" -j"$(nproc)"

  start_wine_prefix
  WINE_PASSED=0 WINE_SKIPPED=0 WINE_FAILED=0
  local program failures=0 started=$SECONDS
  while read -r program; do
    [ -n "$program" ] || continue
    run_wine_test "$program" || failures=$((failures + 1))
  done <"$WINDOWS_BUILD/wine-tests.txt"
  # Last, as it leaves the demo's products on the prefix's machine.
  make_packages "$WINDOWS_BUILD" &&
    bash "$PACKAGE_TEST" "$WINDOWS_BUILD/bin/host_example.exe" "$WINDOWS_BUILD"/packages/*.zip ||
    failures=$((failures + 1))
  echo "Total under Wine: $WINE_PASSED passed, $WINE_SKIPPED skipped, $WINE_FAILED failed;" \
       "$failures program(s) with failures; $((SECONDS - started))s under Wine"
  ((failures == 0))
}

# The release packages: Release builds without the tests, for Linux and for Windows x64, packed by
# CPack and copied to dist/; then each is unpacked into an empty folder and run there (the ZIP
# under Wine).
PACKAGE_BUILD=build-release
WINDOWS_PACKAGE_BUILD=build-win-release
DIST=dist

release_build() {
  local folder=$1
  shift
  [ -f "$folder/CMakeCache.txt" ] ||
    cmake -S . -B "$folder" -DCMAKE_BUILD_TYPE=Release -DPEX_TESTS=OFF "$@" >/dev/null
  cmake --build "$folder" -j"$(nproc)"
  make_packages "$folder"
}

cmd_package() {
  install_missing "${PACKAGES[@]}" "${WINDOWS_PACKAGES[@]}"
  timed "Linux release build and packages" release_build "$PACKAGE_BUILD"
  timed "Windows release build and package" release_build "$WINDOWS_PACKAGE_BUILD" \
    -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64-x86_64.cmake
  rm -rf "$DIST"
  mkdir "$DIST"
  cp "$PACKAGE_BUILD"/packages/*.tar.gz "$PACKAGE_BUILD"/packages/*.deb \
     "$WINDOWS_PACKAGE_BUILD"/packages/*.zip "$DIST/"
  bash "$PACKAGE_TEST" "$PACKAGE_BUILD/bin/host_example" "$DIST"/*.tar.gz "$DIST"/*.deb
  start_wine_prefix
  bash "$PACKAGE_TEST" "$WINDOWS_PACKAGE_BUILD/bin/host_example.exe" "$DIST"/*.zip
  echo "Packages in $DIST/:"
  ls -l "$DIST"
}

# The benchmarks build apart from the tests, optimised; the report needs gnuplot and python3.
BENCH_PACKAGES=(libbenchmark-dev gnuplot-nox python3)
BENCH_BUILD=build-bench

cmd_bench() {
  install_missing "${PACKAGES[@]}" "${BENCH_PACKAGES[@]}"
  local started=$SECONDS
  [ -f "$BENCH_BUILD/CMakeCache.txt" ] ||
    cmake -S . -B "$BENCH_BUILD" -DCMAKE_BUILD_TYPE=Release -DPEX_BENCH=ON -DPEX_TESTS=OFF >/dev/null
  cmake --build "$BENCH_BUILD" -j"$(nproc)"
  # The report states how long the build took beside the benchmarks' own time.
  PEX_BENCH_BUILD_SECONDS=$((SECONDS - started)) bash bench/run_benchmarks.sh "$BENCH_BUILD"
}

case "${1:-}" in
  test) cmd_test ;;
  windows) cmd_windows ;;
  demo) cmd_demo ;;
  fuzz) shift; bash fuzz/run.sh "$@" ;;
  bench) cmd_bench ;;
  package) cmd_package ;;
  *) echo "usage: ./run.sh test | demo | windows | package | fuzz [SECONDS] | bench" >&2; exit 2 ;;
esac
