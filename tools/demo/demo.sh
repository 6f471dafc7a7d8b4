#!/usr/bin/env bash
# The demo: a fresh emulated machine in BUILD/demo-machine with three products of the Vantric
# suite waiting for their downloaded updates; `pexupdate all` applies them, then the outcome of
# each product is shown.   usage: tools/demo/demo.sh BUILD
set -euo pipefail
build="${1:?usage: demo.sh BUILD-FOLDER}"
here="$(cd "$(dirname "$0")" && pwd)"
build="$(cd "$build" && pwd)"
machine="$build/demo-machine"
pex=("$build/bin/pexupdate" --machine "$machine")
c="$machine/drive_c"
apps="$c/Program Files/Vantric"
cache="$c/ProgramData/Vantric/Downloads"
pexdata="$c/ProgramData/Vantric/Pex"

rm -rf "$machine"
bash "$here/make_machine.sh" "$c" "${pex[@]}"

echo "== Demo machine: $machine"
echo "== pexupdate all"
"${pex[@]}" all | sed 's/^/   /'

log="$build/bin/log/pex_support_mendler.log"
# Products run in the registry's order of their names; each run ends with its result.
results=($(grep -a 'CManifestParser: ProcessUpdateInformation, returning' "$log" | sed 's/.*returning \([0-9-]*\).*/\1/'))
i=0
for product in Orlandel Pellow Zendor32; do
  echo
  echo "== $product: ${results[$i]:-?} failure(s)"
  i=$((i + 1))
  if [ -f "$pexdata/${product}_content.txt" ]; then
    echo "   content file kept, with the status of every row:"
    tr -d '\r' < "$pexdata/${product}_content.txt" | awk -F, '{ printf "     %-16s %s\n", $1, $2 }'
  else
    echo "   complete success: content file and its registry entries removed"
  fi
  echo "   installed files:"
  for f in "$apps/$product"/*; do printf '     %-16s %s\n' "$(basename "$f")" "$(head -1 "$f")"; done
done
echo
echo "== Registry written by the install commands and the schedule reset:"
"${pex[@]}" reg query 'HKLM\Software\Vantric\Zendor32' /s | sed 's/^/   /'
echo
echo "== Downloads left for the next run: $(ls "$cache" | tr '\n' ' ')"
echo "== Trace log: $log"
