#!/usr/bin/env bash
# Mendler's two set-up commands:
#   ./run.sh test   install what is missing, build, run every test
#   ./run.sh demo   install what is missing, build, update the products of the demo machine
#   ./run.sh fuzz [SECONDS]   build the fuzz targets with clang and run each for SECONDS (not in CI)
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

case "${1:-}" in
  test) cmd_test ;;
  demo) cmd_demo ;;
  fuzz) shift; bash fuzz/run.sh "$@" ;;
  *) echo "usage: ./run.sh test | demo | fuzz [SECONDS]" >&2; exit 2 ;;
esac
