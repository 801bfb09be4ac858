#!/usr/bin/env bash
# The COM server's script suite: every .vbs and .js file under tests/com, each run by
# scripts/wine-run.sh in one fresh Wine prefix. Exits non-zero when any script fails.
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
export WINEPREFIX="$(mktemp -d)/prefix"
trap 'WINEDEBUG=-all wineserver -k >/dev/null 2>&1 || true; rm -rf "$(dirname "$WINEPREFIX")"' EXIT

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
