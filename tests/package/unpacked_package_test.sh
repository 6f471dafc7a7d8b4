#!/usr/bin/env bash
# Unpacks each release package into an empty folder and runs it there: `pexupdate all` over the
# demo's machine, then the C host program (copied beside the library, as a host is installed)
# over a fresh one. Each run must leave the products as the demo describes them.
#   usage: unpacked_package_test.sh HOST-PROGRAM PACKAGE...   (.tar.gz, .deb or .zip)
# A .zip holds the Windows build: it runs under Wine, on the machine of $WINEPREFIX.
set -euo pipefail
host="$(realpath "${1:?usage: unpacked_package_test.sh HOST-PROGRAM PACKAGE...}")"
shift
here="$(cd "$(dirname "$0")" && pwd)"
make_machine="$here/../../tools/demo/make_machine.sh"
work="$(mktemp -d "${TMPDIR:-/tmp}/pex-package.XXXXXX")"
trap 'rm -rf "$work"' EXIT
failures=0

fail() { echo "FAIL ($package): $*"; failures=$((failures + 1)); }

unpack() {
  case "$1" in
    *.deb) dpkg-deb -x "$1" "$2" ;;
    *) (cd "$2" && cmake -E tar xf "$1") ;;
  esac
}

# The machine the unpacked programs run on, emptied of the demo's products: an emulated machine
# of our own, or the Wine prefix's.
fresh_machine() {
  if [ "$wine" ]; then
    c="$WINEPREFIX/drive_c"
    rm -rf "$c/Program Files/Vantric" "$c/ProgramData/Vantric"
    wine "$dir/pexupdate.exe" reg delete 'HKLM\Software\Vantric' /f >/dev/null 2>&1 || true
    pex=(wine "$dir/pexupdate.exe")
  else
    rm -rf "$work/machine"
    c="$work/machine/drive_c"
    pex=("$dir/pexupdate" --machine "$work/machine")
  fi
  bash "$make_machine" "$c" "${pex[@]}"
}

# The host program, beside the library, on the machine.
run_host() {
  local name
  name="./$(basename "$host")"
  if [ "$wine" ]; then
    (cd "$dir" && wine "$name" "$@" 2>&1 | tr -d '\r'; exit "${PIPESTATUS[0]}")
  else
    (cd "$dir" && PEX_MACHINE="$work/machine" "$name" "$@" 2>&1)
  fi
}

first_line() { head -1 "$c/Program Files/Vantric/$1" 2>/dev/null | tr -d '\r'; }

# What `pexupdate all` leaves on the demo's machine (see the README's demo).
check_products() {
  local what=$1 pexdata="$c/ProgramData/Vantric/Pex"
  [ ! -e "$pexdata/Zendor32_content.txt" ] || fail "$what: Zendor32's content file is still there"
  [ "$(first_line Zendor32/ZenCore.dll)" = "ZenCore.dll 2.1 (new version)" ] || fail "$what: SZDD download not installed"
  [ "$(first_line Zendor32/ZenMatrix.dll)" = "ZenMatrix.dll 2.1 (new version)" ] || fail "$what: zlib download not installed"
  [ "$(first_line Orlandel/OrlView.dll)" = "OrlView.dll 1.5 (new version)" ] || fail "$what: Orlandel not updated"
  [ "$(first_line Pellow/PellowHook.dll)" = "PellowHook.dll 3.1 (installed)" ] || fail "$what: Pellow not rolled back"
  grep -q 'PellowHook.dll,ApplicationFailed' "$pexdata/Pellow_content.txt" 2>/dev/null ||
    fail "$what: Pellow's failure not recorded"
  "${pex[@]}" reg query 'HKLM\Software\Vantric\Zendor32' /v PostInstall 2>/dev/null | grep -q done ||
    fail "$what: the install command running pexupdate did not run"
  [ -s "$dir/log/pex_support_mendler.log" ] || fail "$what: no trace log beside the library"
}

for package in "$@"; do
  package="$(realpath "$package")"
  echo "== $(basename "$package")"
  rm -rf "$work/unpacked" && mkdir "$work/unpacked"
  unpack "$package" "$work/unpacked"
  program="$(find "$work/unpacked" -name pexupdate -o -name pexupdate.exe | head -1)"
  [ -n "$program" ] || { fail "no pexupdate in the package"; continue; }
  dir="$(dirname "$program")"
  wine=""
  [[ "$program" == *.exe ]] && wine=1
  for f in Mendler.dll Rivzip.dll README.md SHA256SUMS; do [ -f "$dir/$f" ] || fail "$f missing"; done
  (cd "$dir" && sha256sum --quiet -c SHA256SUMS) || fail "SHA256SUMS does not match"

  fresh_machine
  if out=$("${pex[@]}" all --quiet 2>&1); then check_products "pexupdate all"; else fail "pexupdate all: $out"; fi

  fresh_machine
  cp "$host" "$dir/"
  rm -f "$dir/log/pex_support_mendler.log"
  out=$(run_host) || fail "host program: $out"
  check_products "host program"
  for line in "3 product(s) registered" "product 3 of 3, step 7 of 7: Finished." "UpdateAll returned false"; do
    grep -qxF "$line" <<<"$out" || fail "host program did not print \"$line\""
  done
  # A library without the export: the host says so and fails.
  if out=$(run_host ./Rivzip.dll) || ! grep -q "does not export UpdateAll" <<<"$out"; then
    fail "host program given Rivzip.dll: $out"
  fi
done
((failures == 0)) && echo "every package runs unpacked"
((failures == 0))
