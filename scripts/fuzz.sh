#!/usr/bin/env bash
# Runs the libFuzzer targets of build/fuzz (cmake --preset fuzz) for SECONDS each, two at a
# time (FUZZ_JOBS), at the lowest priority. Each target starts from its corpus in
# build/fuzz/corpus/TARGET, kept between runs, and from seeds copied afresh from the
# project's golden files and the real QuickBooks responses beside the project
# (../shared/qbxml/responses, or DROQBXML_SHARED_DIR). Prints per target the executions,
# coverage (cov) and features (ft) libFuzzer reached; exits 1 when a target found
# something (the input is in build/fuzz/artifacts/TARGET, the report in build/fuzz/logs).
#
#   scripts/fuzz.sh [SECONDS] [TARGET...]      SECONDS defaults to 60; TARGET to all
#   FUZZ_RUNS=10000000 scripts/fuzz.sh 7200     stop each after ten million executions
#   FUZZ_ARGS="-max_len=1024" scripts/fuzz.sh   more libFuzzer options for every target
set -euo pipefail
cd "$(dirname "$0")/.."
root=$(pwd)
build=$root/build/fuzz
seconds=${1:-60}
shift || true
targets=("$@")
[ ${#targets[@]} -gt 0 ] || targets=(element_value escaping records wrapper_status request_reader stand_in soap)
jobs=${FUZZ_JOBS:-2}
shared=${DROQBXML_SHARED_DIR:-$root/../shared}
testdata=$root/tests/testdata

# Seed files: response documents for the readers of responses, request documents for the
# stand-in's reader and the stand-in.
seed_files() {
  case "$1" in
    soap)
      ls "$root"/tests/testdata/webconnector/*.xml 2>/dev/null || true
      ;;
    request_reader | stand_in)
      ls "$testdata"/requests/*.xml "$testdata"/simulator/reader/*.xml \
        "$testdata"/simulator/schema-samples/*.xml "$testdata"/cli/two_adds.xml \
        "$testdata"/cli/misordered.xml
      ;;
    *)
      ls "$testdata"/records/*.xml "$testdata"/simulator/*.xml "$testdata"/cli/*_rs.xml
      if [ -d "$shared/qbxml/responses" ]; then ls "$shared"/qbxml/responses/*.xml; fi
      ;;
  esac
}

# The run at the lowest priority can be held up long enough for an input to pass libFuzzer's
# one-second limit on a busy machine: a timeout whose input runs within the limit at normal
# priority is noted and fuzzing goes on for the time left; one that does not is a finding.
run_target() {
  local target=$1
  local corpus=$build/corpus/$target seeds=$build/seeds/$target
  local artifacts=$build/artifacts/$target log=$build/logs/$target.log
  local fuzzer=$build/fuzz/fuzz_$target
  rm -rf "$seeds" "$log".*
  mkdir -p "$corpus" "$seeds" "$artifacts" "$build/logs"
  seed_files "$target" | xargs -I{} cp {} "$seeds"/
  : >"$log"
  local deadline=$((SECONDS + seconds)) runs=${FUZZ_RUNS:--1} status=0 spurious=0
  export ASAN_OPTIONS=detect_leaks=1:abort_on_error=1
  export UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1
  while :; do
    local left=$((deadline - SECONDS)) segment=$log.segment
    [ "$left" -gt 0 ] || break
    status=0
    timeout $((left + 300)) nice -n 19 "$fuzzer" -max_total_time="$left" -runs="$runs" \
      ${FUZZ_ARGS:-} -timeout=1 -rss_limit_mb=2048 -print_final_stats=1 -dict="$root/fuzz/qbxml.dict" \
      -artifact_prefix="$artifacts/" "$corpus" "$seeds" >"$segment" 2>&1 || status=$?
    cat "$segment" >>"$log"
    local done_runs
    done_runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$segment" | tail -1)
    echo "${done_runs:-0}" >>"$log.executions"
    local input
    input=$(sed -n 's/.*Test unit written to \(.*timeout-[0-9a-f]*\)$/\1/p' "$segment" | tail -1)
    [ "$status" -ne 0 ] && [ -n "$input" ] || break
    if "$fuzzer" -timeout=1 "$input" >/dev/null 2>&1 || "$fuzzer" -timeout=1 "$input" >/dev/null 2>&1; then
      rm -f "$input"
      spurious=$((spurious + 1))
      status=0
      if [ "$runs" -gt 0 ]; then
        runs=$((runs - ${done_runs:-0}))
        [ "$runs" -gt 0 ] || break
      fi
    else
      break
    fi
  done
  echo "$spurious" >"$log.spurious"
  echo "$status" >"$log.status"
}

summary() {
  local target=$1 status=$2 log=$build/logs/$1.log
  local execs cov ft
  execs=$(awk '{ n += $1 } END { print n }' "$log.executions")
  cov=$( (grep -o 'cov: [0-9]*' "$log" || true) | tail -1 | cut -d' ' -f2)
  ft=$( (grep -o 'ft: [0-9]*' "$log" || true) | tail -1 | cut -d' ' -f2)
  printf '%-16s %-5s executions %-11s cov %-6s ft %-7s slow-machine timeouts %s\n' "$target" \
    "$([ "$status" -eq 0 ] && echo ok || echo FOUND)" "${execs:-?}" "${cov:-?}" "${ft:-?}" \
    "$(cat "$log.spurious")"
}

for target in "${targets[@]}"; do
  [ -x "$build/fuzz/fuzz_$target" ] || {
    echo "fuzz.sh: no $build/fuzz/fuzz_$target (cmake --preset fuzz && cmake --build --preset fuzz)" >&2
    exit 2
  }
done

echo "fuzz.sh: ${#targets[@]} targets, ${seconds} s each, $jobs at a time"
failed=()
for target in "${targets[@]}"; do
  while [ "$(jobs -rp | wc -l)" -ge "$jobs" ]; do wait -n || true; done
  run_target "$target" &
done
wait
for target in "${targets[@]}"; do
  status=$(cat "$build/logs/$target.log.status")
  summary "$target" "$status"
  [ "$status" -eq 0 ] || failed+=("$target")
done
for target in "${failed[@]}"; do
  echo "--- $target ($build/logs/$target.log, input in $build/artifacts/$target):"
  grep -v '^#[0-9]' "$build/logs/$target.log" | tail -40
done
[ ${#failed[@]} -eq 0 ]
