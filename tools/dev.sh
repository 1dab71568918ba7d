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

# tftpd-hpa: the TFTP download tests start its in.tftpd on loopback themselves.
# clang-format-14: the suite checks that every hand-written source is formatted.
packages=(build-essential cmake pkg-config python3 libjsoncpp-dev
          libgtest-dev libgmock-dev libbenchmark-dev tftpd-hpa clang-format-14)

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
  case " ${missing[*]} " in *" tftpd-hpa "*) quiet_tftpd_service ;; esac
}

# The package installs a system-wide TFTP service on port 69; the tests need
# only the program, so the service is stopped and kept from starting at boot.
quiet_tftpd_service() {
  if command -v systemctl >/dev/null 2>&1 && [ -d /run/systemd/system ]; then
    systemctl disable --now tftpd-hpa >/dev/null 2>&1 || true
  else
    invoke-rc.d tftpd-hpa stop >/dev/null 2>&1 || true
    update-rc.d tftpd-hpa disable >/dev/null 2>&1 || true
  fi
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
