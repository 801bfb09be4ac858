#!/usr/bin/env bash
# Runs one VBScript (.vbs) or JScript (.js) file with Wine's cscript against the component's
# COM server: builds the DLLs when they are missing (make com), keeps a Wine prefix under
# build/wine-prefix with the component and the request processor relay registered, starts
# `droqbxml relay` (the embedded stand-in, reached from the Windows side as QuickBooks'
# "QBXMLRP.RequestProcessor.1") unless one is listening, passes through what the script
# prints, and exits non-zero when the script exits non-zero, prints a line starting "FAIL",
# or does not print its closing line "SCRIPT DONE" (Wine 8's cscript exits 0 even on a
# script error). Scripts end by running off their end rather than with WScript.Quit, which
# under Wine leaves the script's objects unreleased. Company files are Unix
# paths seen from Windows on drive Z: (/srv/books/x.qbw is Z:\srv\books\x.qbw).
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
script="${1:?usage: wine-run.sh FILE.vbs|FILE.js}"
[ -f "$script" ] || { echo "wine-run: no such script: $script" >&2; exit 2; }

dll="$root/build/windows/DroQbXml.dll"
relayDll="$root/build/windows/StandInRelay.dll"
[ -f "$dll" ] && [ -f "$relayDll" ] || make -C "$root" com >&2
command="$root/build/release/cli/droqbxml"
[ -f "$root/build/release/CMakeCache.txt" ] || (cd "$root" && cmake --preset release >/dev/null)
(cd "$root" && cmake --build --preset release --target droqbxml_command >/dev/null)

export DROQBXML_RELAY_PORT="${DROQBXML_RELAY_PORT:-7371}"
relayPid=""
if ! (exec 3<>"/dev/tcp/127.0.0.1/$DROQBXML_RELAY_PORT") 2>/dev/null; then
  "$command" relay --port "$DROQBXML_RELAY_PORT" >/dev/null &
  relayPid=$!
  for _ in $(seq 50); do
    (exec 3<>"/dev/tcp/127.0.0.1/$DROQBXML_RELAY_PORT") 2>/dev/null && break
    sleep 0.1
  done
fi
trap '[ -n "$relayPid" ] && kill "$relayPid" 2>/dev/null || true' EXIT

export WINEPREFIX="${WINEPREFIX:-$root/build/wine-prefix}"
export WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
unset DISPLAY
if [ ! -f "$WINEPREFIX/system.reg" ]; then
  mkdir -p "$WINEPREFIX"
  wineboot -i >/dev/null 2>&1
fi
# Registering is quick and keeps the prefix pointing at the DLL just built.
(cd "$(dirname "$dll")" && wine regsvr32 /s "$(basename "$dll")" &&
  wine regsvr32 /s "$(basename "$relayDll")")

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
if grep -q '^FAIL' <<<"$output"; then
  echo "wine-run: $script reported failures" >&2; exit 1
fi
if ! grep -qx 'SCRIPT DONE' <<<"$output"; then
  echo "wine-run: $script ended without its closing line (a script error?)" >&2; exit 1
fi
