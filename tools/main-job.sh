#!/usr/bin/env bash
# The main job: show what the built module offers a CIM server, through the
# embedded host's client tvrncli. The module finds the adapter library (here
# the simulator) on the loader's search path.
set -euo pipefail
build=${1:?usage: main-job.sh BUILD_DIR}
cli="$build/bin/tvrncli"
module="$build/lib/libtvrnprovider.so"
for f in "$cli" "$module"; do
  [ -f "$f" ] || { echo "not built: $f" >&2; exit 1; }
done
export LD_LIBRARY_PATH="$build/lib/sim${LD_LIBRARY_PATH:+:$LD_LIBRARY_PATH}"

run() {
  echo
  echo "\$ tvrncli $*"
  local out
  out=$("$cli" --module "$module" "$@")
  if [ -n "$out" ]; then
    printf '%s\n' "$out"
  else
    echo "(none)"
  fi
}

classes=$("$cli" classes | wc -l)
echo "Module: $module"
echo "Classes in its schema: $classes"
run gc TAVRIN_FCPort
run ei TAVRIN_ComputerSystem
run ei TAVRIN_FCPort
