#!/usr/bin/env bash
# Builds the libFuzzer targets with clang (ASan + UBSan) in build-fuzz and runs each of them.
#   fuzz/run.sh [SECONDS] [TARGET...]    SECONDS per target (default 60), every target when none
#                                        is named; PEX_FUZZ_JOBS=2 runs two targets at a time
# Seeds come from fuzz/corpus/<target>/; what the fuzzer adds stays in build-fuzz/corpus/<target>/
# so the repository's seeds stay small. Crashes, time-outs, leaks and sanitizer reports are
# written to build-fuzz/artifacts/<target>/ and make the script fail; the last lines of each
# run's log are shown. Logs: build-fuzz/logs/<target>.log.
set -euo pipefail
cd "$(dirname "$0")/.."

SECONDS_EACH=${1:-60}
shift || true
JOBS=${PEX_FUZZ_JOBS:-1}
BUILD=build-fuzz
PACKAGES=(cmake make clang libclang-rt-dev pkg-config libsqlite3-dev zlib1g-dev flex bison)

install_missing() {
  local missing=()
  for p in "$@"; do dpkg -s "$p" >/dev/null 2>&1 || missing+=("$p"); done
  if ((${#missing[@]})); then
    echo "Installing: ${missing[*]}"
    apt-get update -qq
    DEBIAN_FRONTEND=noninteractive apt-get install -y -qq "${missing[@]}" >/dev/null
  fi
}

install_missing "${PACKAGES[@]}"
if [ ! -f "$BUILD/CMakeCache.txt" ]; then
  # Optimised with debug information: the fuzzer needs speed, the reports need lines.
  CC=clang CXX=clang++ cmake -S . -B "$BUILD" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DPEX_FUZZ=ON -DPEX_TESTS=OFF >/dev/null
fi
cmake --build "$BUILD" -j"$(nproc)" --target pex_fuzzers

if (($#)); then TARGETS=("$@"); else mapfile -t TARGETS <"$BUILD/fuzz/targets.txt"; fi

# The targets whose input is a whole content file or a row's script get inputs up to 1 MiB, the
# sizes at which a long script or a big cell once exhausted the stack or grew without bound; the
# others keep libFuzzer's default, sized from their seeds.
LARGE_INPUTS=" content_table execution_plan "
MAX_LEN=1048576
# Every target runs under a 1 MiB stack, the main thread's stack on Windows.
STACK_KB=1024

# Leaks are reported as findings; a stuck input counts after 10 s.
export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1}
export UBSAN_OPTIONS=${UBSAN_OPTIONS:-halt_on_error=1:print_stacktrace=1}

run_one() {
  local t=$1 corpus="$BUILD/corpus/$1" artifacts="$BUILD/artifacts/$1" log="$BUILD/logs/$1.log"
  mkdir -p "$corpus" "$artifacts" "$BUILD/logs"
  local extra=()
  # A dictionary of the input's words, where the format has them.
  [ -f "fuzz/dict/$t.dict" ] && extra+=(-dict="fuzz/dict/$t.dict")
  [[ "$LARGE_INPUTS" == *" $t "* ]] && extra+=(-max_len="$MAX_LEN")
  # This function runs in a subshell of its own, so the limit holds for this target only.
  ulimit -s "$STACK_KB"
  # The parsers print their messages on standard output; -close_fd_mask=1 keeps the log readable.
  # -rss_limit_mb also bounds a single allocation (-malloc_limit_mb defaults to it).
  if "$BUILD/fuzz/${t}_fuzz" "$corpus" "fuzz/corpus/$t" -max_total_time="$SECONDS_EACH" \
      -timeout=10 -rss_limit_mb=2048 -close_fd_mask=1 -print_final_stats=1 "${extra[@]}" \
      -artifact_prefix="$artifacts/" >"$log" 2>&1; then
    echo "ok"
  else
    echo "FOUND"
  fi >"$BUILD/logs/$t.result"
}

running=0
for t in "${TARGETS[@]}"; do
  [ -x "$BUILD/fuzz/${t}_fuzz" ] || { echo "no such fuzz target: $t" >&2; exit 2; }
  echo "fuzzing $t for ${SECONDS_EACH}s"
  run_one "$t" &
  running=$((running + 1))
  if ((running >= JOBS)); then wait -n || true; running=$((running - 1)); fi
done
wait

failed=0
printf '\n%-20s %-8s %14s %10s  %s\n' target result executions corpus artifacts
for t in "${TARGETS[@]}"; do
  log="$BUILD/logs/$t.log"
  result=$(cat "$BUILD/logs/$t.result")
  execs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  files=$(find "$BUILD/corpus/$t" -type f | wc -l)
  found=$(find "$BUILD/artifacts/$t" -type f | wc -l)
  printf '%-20s %-8s %14s %10s  %s\n' "$t" "$result" "${execs:-?}" "$files" "$found"
  if [ "$result" != ok ]; then
    failed=1
    echo "--- $t: end of $log" >&2
    grep -E 'ERROR|SUMMARY|Test unit written|#[0-9]+ 0x' "$log" | head -20 >&2 || true
  fi
done
exit $failed
