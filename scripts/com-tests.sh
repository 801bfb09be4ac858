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
for script in "$root"/tests/com/*.vbs "$root"/tests/com/*.js; do
  [ -f "$script" ] || continue
  count=$((count + 1))
  echo "== ${script#$root/}"
  if ! bash "$root/scripts/wine-run.sh" "$script"; then failed+=("${script#$root/}"); fi
done
if [ ${#failed[@]} -ne 0 ]; then
  echo "com-tests: ${#failed[@]} of $count scripts failed: ${failed[*]}" >&2
  exit 1
fi
echo "com-tests: $count scripts passed"
