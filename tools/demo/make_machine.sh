#!/usr/bin/env bash
# Makes the demo's machine: three products of the Vantric suite registered, installed and waiting
# for their downloaded updates. The demo and the tests of the release packages both start from it.
#   usage: make_machine.sh DRIVE-C PEXUPDATE-COMMAND...
# DRIVE-C is the host folder of drive C:; the command runs pexupdate on that machine, for example
# `build/bin/pexupdate --machine DIR` (DRIVE-C being DIR/drive_c) or `wine pexupdate.exe` (DRIVE-C
# being $WINEPREFIX/drive_c). pexupdate is given Windows paths only, which mean the same on both.
set -euo pipefail
c="${1:?usage: make_machine.sh DRIVE-C PEXUPDATE-COMMAND...}"
shift
pex=("$@")
here="$(cd "$(dirname "$0")" && pwd)"
apps="$c/Program Files/Vantric"
cache="$c/ProgramData/Vantric/Downloads"
pexdata="$c/ProgramData/Vantric/Pex"
columns="FileName,UpgradeStatus,HomeDir,DynamicFieldInfo,Force Download,Snoozable,InterestedParties,DownLoadCacheFile,FileGroup,DependancyOrder,NeedsDecompression,Command,UpdateDate"
D='C:\ProgramData\Vantric\Downloads'
P='C:\Program Files\Vantric'

# Drive Z: is the host's root folder on both machines.
"${pex[@]}" reg import "Z:${here//\//\\}\\demo.reg" >/dev/null
mkdir -p "$apps/Zendor32" "$apps/Orlandel" "$apps/Pellow" "$cache" "$pexdata"

# The installed versions.
for f in Zendor32.exe ZenCore.dll ZenMatrix.dll readme.txt; do echo "$f 2.0 (installed)" > "$apps/Zendor32/$f"; done
for f in Orlandel.dll OrlView.dll OrlHelp.chm OrlTips.txt; do echo "$f 1.4 (installed)" > "$apps/Orlandel/$f"; done
for f in Pellow.exe PellowHook.dll; do echo "$f 3.1 (installed)" > "$apps/Pellow/$f"; done

# The downloads: new versions, some compressed as they come from the update site.
new() { echo "$1 $2 (new version)"; for i in $(seq 1 200); do echo "  line $i of $1"; done; }
new ZenCore.dll 2.1 > "$cache/ZenCore.dll"
"${pex[@]}" compress "$D\\ZenCore.dll" "$D\\ZenCore.dl_" >/dev/null && rm "$cache/ZenCore.dll"
new ZenMatrix.dll 2.1 | gzip -9 > "$cache/ZenMatrix.dll.gz"
new readme.txt 2.1 > "$cache/readme.txt"
new Zendor32.exe 2.1 > "$cache/Zendor32.exe"
for f in Orlandel.dll OrlView.dll OrlHelp.chm OrlTips.txt; do new "$f" 1.5 > "$cache/$f"; done
for f in Pellow.exe PellowHook.dll; do new "$f" 3.2 > "$cache/$f"; done

# Zendor32: the group "App" depends on "Runtime", which sorts after it, so the first pass defers
# "App". Zendor32.exe is one of the host's own files, so its schedule dates are reset afterwards.
printf '%s\r\n' "$columns" \
  "ZenCore.dll,Downloaded,$P\\Zendor32,,1,0,Pellow,$D\\ZenCore.dl_,Runtime,,1,,2026-12-01 08:00:00" \
  "ZenMatrix.dll,Downloaded,$P\\Zendor32,,1,0,Fetchwell,$D\\ZenMatrix.dll.gz,Runtime,,1,,2026-12-01 08:00:00" \
  "readme.txt,Downloaded,$P\\Zendor32,,0,1,Orlandel,$D\\readme.txt,Runtime,,0,,2026-12-01 08:00:00" \
  "Zendor32.exe,Downloaded,$P\\Zendor32,,1,0,,$D\\Zendor32.exe,App,Runtime,0,[REGISTRY](STRING)HKLM\\Software\\Vantric\\Zendor32\\InstalledVersion=2.1;[TRY-RUN]pexupdate reg add HKLM\\Software\\Vantric\\Zendor32 /v PostInstall /d done /f,2026-12-01 08:00:00" \
  > "$pexdata/Zendor32_content.txt"
# Orlandel: mandatory updates only. The scripts decide: OrlView.dll is forced only where
# Orlandel.dll is installed, OrlTips.txt never; OrlHelp.chm is forced in the file but snoozable.
printf '%s\r\n' "$columns" \
  "Orlandel.dll,Downloaded,$P\\Orlandel,,1,0,Orlandel,$D\\Orlandel.dll,,,0,," \
  "OrlView.dll,Downloaded,$P\\Orlandel,FORCED = FileExists(\"C:\\\\Program Files\\\\Vantric\\\\Orlandel\\\\Orlandel.dll\"),0,0,Orlandel,$D\\OrlView.dll,,,0,," \
  "OrlHelp.chm,Downloaded,$P\\Orlandel,,1,1,Orlandel,$D\\OrlHelp.chm,,,0,," \
  "OrlTips.txt,Downloaded,$P\\Orlandel,FORCED = AND(FALSE&#x2C; TRUE),1,0,Orlandel,$D\\OrlTips.txt,,,0,," \
  > "$pexdata/Orlandel_content.txt"
# Pellow: PellowHook.dll's install command starts a program that is not there, so the group
# "Tray" is rolled back and both files keep their installed versions.
printf '%s\r\n' "$columns" \
  "Pellow.exe,Downloaded,$P\\Pellow,,1,0,Pellow,$D\\Pellow.exe,Tray,,0,," \
  "PellowHook.dll,Downloaded,$P\\Pellow,,1,0,Pellow,$D\\PellowHook.dll,Tray,,0,[RUN]pellowreg.exe /install," \
  > "$pexdata/Pellow_content.txt"
