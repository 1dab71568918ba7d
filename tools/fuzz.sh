#!/usr/bin/env bash
# Runs the fuzz targets of a fuzz build (tools/dev.sh fuzz makes one and calls
# this script).
#
#   tools/fuzz.sh [SECONDS] [TARGET...]
#
# Each target (all of them, or the ones named) runs for SECONDS (default 45)
# of fuzzing with AddressSanitizer and UBSan, from its seeds (fuzz/corpus/,
# its regressions and any seed directory fuzz/CMakeLists.txt names) plus what
# earlier runs found (build-fuzz/fuzz-corpus/<target>/, kept between runs).
# A target that fails leaves the input that did it in
# build-fuzz/fuzz-artifacts/<target>/ and the run exits 1; its log is in
# build-fuzz/fuzz-logs/<target>.log.
#
# Environment: TVRN_FUZZ_BUILD_DIR (default build-fuzz at the repository root).
set -euo pipefail

root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
build=${TVRN_FUZZ_BUILD_DIR:-$root/build-fuzz}
seconds=45
if [[ ${1:-} =~ ^[0-9]+$ ]]; then
  seconds=$1
  shift
fi
list=$build/fuzz/targets.txt
[ -s "$list" ] || { echo "no fuzz targets in $build (build them with tools/dev.sh fuzz)" >&2; exit 2; }

failed=()
passed=0
while read -r name program dict seeds; do
  if [ $# -gt 0 ] && [[ " $* " != *" $name "* ]]; then
    continue
  fi
  work=$build/fuzz-corpus/$name
  artifacts=$build/fuzz-artifacts/$name
  log=$build/fuzz-logs/$name.log
  mkdir -p "$work" "$artifacts" "$(dirname "$log")"
  dirs=()
  for d in $seeds; do
    [ -d "$d" ] && dirs+=("$d")
  done
  options=(-max_total_time="$seconds" -timeout=25 -rss_limit_mb=2560 -print_final_stats=1
           -artifact_prefix="$artifacts/")
  [ -f "$dict" ] && options+=(-dict="$dict")
  start=$SECONDS
  if "$program" "${options[@]}" "$work" "${dirs[@]}" >"$log" 2>&1; then
    passed=$((passed + 1))
    runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
    cov=$(grep -o 'cov: [0-9]*' "$log" | tail -1)
    echo "fuzz $name: ${runs:-?} inputs in $((SECONDS - start)) s, ${cov:-cov: ?}, corpus $(ls "$work" | wc -l)"
  else
    failed+=("$name")
    echo "fuzz $name: FAILED after $((SECONDS - start)) s; input kept in $artifacts/; log $log"
    grep -E -A40 '^==[0-9]+==ERROR|runtime error|fuzz rule broken|^SUMMARY' "$log" | head -60 || tail -40 "$log"
  fi
done <"$list"

echo "fuzz: ${passed} passed, ${#failed[@]} failed${failed:+ (${failed[*]})}"
[ ${#failed[@]} -eq 0 ]
