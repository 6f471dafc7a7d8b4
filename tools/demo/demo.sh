#!/usr/bin/env bash
# The demo: a fresh emulated machine in BUILD/demo-machine with the Vantric suite's registry,
# printed as `reg query` shows it.   usage: tools/demo/demo.sh BUILD
set -euo pipefail
build="${1:?usage: demo.sh BUILD-FOLDER}"
here="$(cd "$(dirname "$0")" && pwd)"
build="$(cd "$build" && pwd)"
machine="$build/demo-machine"
pexupdate=("$build/bin/pexupdate" --machine "$machine")

rm -rf "$machine"
"${pexupdate[@]}" reg import "$here/demo.reg" >/dev/null
echo "Demo machine: $machine"
"${pexupdate[@]}" reg query 'HKLM\Software\Vantric' /s
