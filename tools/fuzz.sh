#!/usr/bin/env bash
# Runs the fuzz targets of a fuzz build (tools/dev.sh fuzz makes one and calls
# this script).
#
#   tools/fuzz.sh [-j JOBS] [SECONDS] [TARGET...]
#
# Each target (all of them, or the ones named) runs for SECONDS (default 45)
# of fuzzing with AddressSanitizer and UBSan, from its seeds (fuzz/corpus/,
# its regressions and any seed directory fuzz/CMakeLists.txt names) plus what
# earlier runs found (build-fuzz/fuzz-corpus/<target>/, kept between runs).
# JOBS targets run at once (default 1; each is one process on one core), so
# the whole run takes about SECONDS x targets / JOBS.
# A target that fails leaves the input that did it in
# build-fuzz/fuzz-artifacts/<target>/ and the run exits 1; its log is in
# build-fuzz/fuzz-logs/<target>.log.
#
# Environment: TVRN_FUZZ_BUILD_DIR (default build-fuzz at the repository root),
# TVRN_FUZZ_JOBS (the default of -j).
set -euo pipefail

root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
build=${TVRN_FUZZ_BUILD_DIR:-$root/build-fuzz}
jobs=${TVRN_FUZZ_JOBS:-1}
seconds=45
if [ "${1:-}" = -j ]; then
  jobs=${2:?-j needs a number}
  shift 2
fi
if [[ ${1:-} =~ ^[0-9]+$ ]]; then
  seconds=$1
  shift
fi
[[ $jobs =~ ^[1-9][0-9]*$ ]] || { echo "JOBS must be a positive number" >&2; exit 2; }
list=$build/fuzz/targets.txt
[ -s "$list" ] || { echo "no fuzz targets in $build (build them with tools/dev.sh fuzz)" >&2; exit 2; }

# One target's run; its outcome goes to <log>.status ("passed ..." or "failed").
fuzz_one() {
  local name=$1 program=$2 dict=$3 seeds=$4
  local work=$build/fuzz-corpus/$name artifacts=$build/fuzz-artifacts/$name
  local log=$build/fuzz-logs/$name.log d start=$SECONDS
  mkdir -p "$work" "$artifacts" "$(dirname "$log")"
  local dirs=()
  for d in $seeds; do
    [ -d "$d" ] && dirs+=("$d")
  done
  local options=(-max_total_time="$seconds" -timeout=25 -rss_limit_mb=2560 -print_final_stats=1
                 -artifact_prefix="$artifacts/")
  [ -f "$dict" ] && options+=(-dict="$dict")
  if "$program" "${options[@]}" "$work" "${dirs[@]}" >"$log" 2>&1; then
    local runs cov
    runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
    cov=$(grep -o 'cov: [0-9]*' "$log" | tail -1 || true)
    echo "passed fuzz $name: ${runs:-?} inputs in $((SECONDS - start)) s, ${cov:-cov: ?}," \
         "corpus $(ls "$work" | wc -l)" >"$log.status"
  else
    echo "failed after $((SECONDS - start)) s" >"$log.status"
  fi
}

# The outcome of a finished target, printed as it comes in.
report() {
  local name=$1 log=$build/fuzz-logs/$1.log status
  status=$(cat "$log.status" 2>/dev/null || echo "failed without a status")
  if [[ $status == passed* ]]; then
    passed=$((passed + 1))
    echo "${status#passed }"
  else
    failed+=("$name")
    echo "fuzz $name: FAILED ${status#failed }; input kept in $build/fuzz-artifacts/$name/; log $log"
    grep -E -A40 '^==[0-9]+==ERROR|runtime error|fuzz rule broken|^SUMMARY' "$log" | head -60 ||
      tail -40 "$log"
  fi
}

failed=()
passed=0
declare -A running=()  # pid -> target
while read -r name program dict seeds; do
  if [ $# -gt 0 ] && [[ " $* " != *" $name "* ]]; then
    continue
  fi
  while [ ${#running[@]} -ge "$jobs" ]; do
    wait -n || true
    for pid in "${!running[@]}"; do
      if ! kill -0 "$pid" 2>/dev/null; then
        report "${running[$pid]}"
        unset "running[$pid]"
      fi
    done
  done
  rm -f "$build/fuzz-logs/$name.log.status"
  fuzz_one "$name" "$program" "$dict" "$seeds" &
  running[$!]=$name
done <"$list"
for pid in "${!running[@]}"; do
  wait "$pid" || true
  report "${running[$pid]}"
done

echo "fuzz: ${passed} passed, ${#failed[@]} failed${failed:+ (${failed[*]})}"
[ ${#failed[@]} -eq 0 ]
