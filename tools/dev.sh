#!/usr/bin/env bash
# One-stop developer entry point.
#
#   tools/dev.sh run    install missing packages, build, and run the main job
#   tools/dev.sh test   install missing packages, build, and run the whole test suite
#   tools/dev.sh build  install missing packages and build only
#
# Environment:
#   TVRN_BUILD_DIR    build directory (default: build at the repository root)
#   TVRN_CMAKE_ARGS   extra arguments for the CMake configure step
#                     (for example -DTVRN_SANITIZE=ON)
#   TVRN_JOBS         parallel build jobs (default: 2)
set -euo pipefail

mode=${1:-run}
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
build=${TVRN_BUILD_DIR:-$root/build}
jobs=${TVRN_JOBS:-2}

packages=(build-essential cmake pkg-config python3 libjsoncpp-dev
          libgtest-dev libgmock-dev libbenchmark-dev)

install_missing() {
  local missing=() p
  for p in "${packages[@]}"; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
  done
  [ ${#missing[@]} -eq 0 ] && return 0
  local cmd="apt-get install -y --no-install-recommends ${missing[*]}"
  if [ "$(id -u)" -ne 0 ]; then
    echo "Missing packages: ${missing[*]}" >&2
    echo "Run as root:  apt-get update && $cmd" >&2
    exit 1
  fi
  echo "Installing: ${missing[*]}"
  DEBIAN_FRONTEND=noninteractive apt-get update -qq
  DEBIAN_FRONTEND=noninteractive $cmd
}

configure_and_build() {
  # shellcheck disable=SC2086
  cmake -S "$root" -B "$build" ${TVRN_CMAKE_ARGS:-} >/dev/null
  cmake --build "$build" -j "$jobs"
}

main_job() {
  "$root/tools/main-job.sh" "$build"
}

case "$mode" in
  run)   install_missing; configure_and_build; main_job ;;
  test)  install_missing; configure_and_build
         ctest --test-dir "$build" --output-on-failure -j "$jobs" ;;
  build) install_missing; configure_and_build ;;
  *) echo "usage: $0 run|test|build" >&2; exit 2 ;;
esac
