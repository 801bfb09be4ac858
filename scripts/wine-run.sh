#!/usr/bin/env bash
# Runs one VBScript (.vbs) or JScript (.js) file with Wine's cscript against the component's
# COM server: builds the DLL when it is missing (make com), keeps a Wine prefix under
# build/wine-prefix with the server registered, passes through what the script prints, and
# exits non-zero when the script fails or does not print its closing line "SCRIPT DONE"
# (Wine 8's cscript exits 0 even on a script error).
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
script="${1:?usage: wine-run.sh FILE.vbs|FILE.js}"
[ -f "$script" ] || { echo "wine-run: no such script: $script" >&2; exit 2; }

dll="$root/build/windows/DroQbXml.dll"
[ -f "$dll" ] || make -C "$root" com >&2

export WINEPREFIX="${WINEPREFIX:-$root/build/wine-prefix}"
export WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
unset DISPLAY
if [ ! -f "$WINEPREFIX/system.reg" ]; then
  mkdir -p "$WINEPREFIX"
  wineboot -i >/dev/null 2>&1
fi
# Registering is quick and keeps the prefix pointing at the DLL just built.
(cd "$(dirname "$dll")" && wine regsvr32 /s "$(basename "$dll")")

# cscript takes Windows paths; an absolute Unix path reads as a switch.
windowsPath="$(winepath -w "$(cd "$(dirname "$script")" && pwd)/$(basename "$script")")"
set +e
output="$(wine cscript //nologo "$windowsPath" 2>&1)"
code=$?
set -e
output="${output//$'\r'/}"
printf '%s\n' "$output"
if [ $code -ne 0 ]; then
  echo "wine-run: $script exited with $code" >&2; exit 1
fi
if ! grep -qx 'SCRIPT DONE' <<<"$output"; then
  echo "wine-run: $script ended without its closing line (a script error?)" >&2; exit 1
fi
