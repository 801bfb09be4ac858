#!/usr/bin/env bash
# The COM server's script suite: every .vbs and .js file under tests/com, each run by
# scripts/wine-run.sh in one fresh Wine prefix, on a fresh company file of the stand-in at
# /tmp/droqbxml-com/books.qbw (Z:\tmp\droqbxml-com\books.qbw from the Windows side).
# Exits non-zero when any script fails.
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
export WINEPREFIX="$(mktemp -d)/prefix"
trap 'WINEDEBUG=-all wineserver -k >/dev/null 2>&1 || true; rm -rf "$(dirname "$WINEPREFIX")"' EXIT

make -C "$root" com >/dev/null
[ -f "$root/build/release/CMakeCache.txt" ] || (cd "$root" && cmake --preset release >/dev/null)
(cd "$root" && cmake --build --preset release --target droqbxml_command >/dev/null)
rm -rf /tmp/droqbxml-com && mkdir -p /tmp/droqbxml-com
"$root/build/release/cli/droqbxml" company create /tmp/droqbxml-com/books.qbw >/dev/null

failed=()
count=0
live="$(dirname "$WINEPREFIX")/live.txt"
for script in "$root"/tests/com/*.vbs "$root"/tests/com/*.js; do
  [ -f "$script" ] || continue
  count=$((count + 1))
  echo "== ${script#$root/}"
  rm -f "$live"
  # The server writes how many of its objects were alive when the script's process let it go.
  if ! DROQBXML_COM_LIVE_FILE="$(winepath -w "$live" 2>/dev/null)" \
    bash "$root/scripts/wine-run.sh" "$script"; then
    failed+=("${script#$root/}")
  elif [ "$(cat "$live" 2>/dev/null)" != 0 ]; then
    echo "objects left alive: $(cat "$live" 2>/dev/null || echo 'not reported')"
    failed+=("${script#$root/} (objects left)")
  fi
done
# C++ clients: the server's lifetime, and early binding through the dual interfaces.
for client in com-lifetime.exe com-dual.exe; do
  count=$((count + 1))
  echo "== $client"
  said="$(cd "$root/build/windows" && WINEDEBUG=-all timeout 60 wine "$client" 2>&1 | tr -d '\r')" || true
  echo "$said"
  grep -qx 'ALL PASS' <<<"$said" || failed+=("$client")
done

# The embedded type library, read back on Windows, describes what the member tables hold.
count=$((count + 1))
echo "== com-typelib.exe against the member tables"
if ! (cd "$root/build/windows" && WINEDEBUG=-all wine com-typelib.exe | tr -d '\r' |
  diff -u typelib-listing.txt - >"$(dirname "$WINEPREFIX")/typelib.diff"); then
  head -40 "$(dirname "$WINEPREFIX")/typelib.diff"
  failed+=(com-typelib.exe)
fi

# Unregistering removes every class; registering again brings them back.
count=$((count + 1))
echo "== regsvr32 /u, then regsvr32"
(cd "$root/build/windows" && WINEDEBUG=-all wine regsvr32 /u /s DroQbXml.dll)
library="$(grep -m1 -o 'uuid([^)]*)' "$root/build/windows/DroQbXml.idl" | tr -d 'uid()')"
for key in 'HKCR\DroQbXml.DroEstimate' "HKCR\\TypeLib\\{$library}"; do
  if WINEDEBUG=-all wine reg query "$key" >/dev/null 2>&1; then failed+=("regsvr32 /u: $key"); fi
done
if ! bash "$root/scripts/wine-run.sh" "$root/tests/com/smoke.vbs" >/dev/null; then
  failed+=("regsvr32 again")
fi

if [ ${#failed[@]} -ne 0 ]; then
  echo "com-tests: ${#failed[@]} of $count scripts failed: ${failed[*]}" >&2
  exit 1
fi
echo "com-tests: $count scripts passed"
