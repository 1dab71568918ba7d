#!/usr/bin/env bash
# The main job: show what the built module offers a CIM server.
set -euo pipefail
build=${1:?usage: main-job.sh BUILD_DIR}
module="$build/lib/libtvrnprovider.so"
[ -f "$module" ] || { echo "module not built: $module" >&2; exit 1; }
echo "Module: $module"
echo "Exported entry points:"
nm -D --defined-only "$module" | awk '$2 == "T" { print "  " $3 }' | sort
echo "$(nm -D --defined-only "$module" | awk '$2 == "T"' | wc -l) entry points"
