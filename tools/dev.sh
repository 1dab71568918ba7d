#!/usr/bin/env bash
# One-stop developer entry point.
#
#   tools/dev.sh run    install missing packages, build, and run the main job
#   tools/dev.sh test   install missing packages, build, and run the whole test suite
#   tools/dev.sh build  install missing packages and build only
#   tools/dev.sh tsan   install missing packages, build the suites that run
#                       threads (label "threads") with ThreadSanitizer in
#                       build-tsan/ and run them
#   tools/dev.sh fuzz [-j JOBS] [SECONDS] [TARGET...]
#                       install clang and libFuzzer, build the fuzz targets in
#                       build-fuzz/ and run each (or the ones named) for
#                       SECONDS (default 45) with the sanitizers on, JOBS
#                       targets at once (default 1)
#   tools/dev.sh server sfcb|pegasus
#                       install the prebuilt CIM server of the shared directory
#                       beside the repository (../shared, else /work/shared)
#                       afresh under /opt, with its run-time packages and the
#                       client wbemcli (for the integration tests, as root)
#
# Environment:
#   TVRN_BUILD_DIR    build directory (default: build at the repository root;
#                     build-fuzz for the fuzz mode)
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
  for p in "$@"; do
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

# A CIM server package of the shared directory: its directory there, the
# directory it unpacks to, the PID file of its running daemon, its run-time
# packages (and the client the integration tests use).
server_sfcb=(sfcb /opt/sfcb var/run/sfcbd.pid libcurl4 zlib1g sblim-wbemcli)
server_pegasus=(pegasus /opt/pegasus var/run/cimserver.pid libstdc++6 libgcc-s1 libcrypt1 sblim-wbemcli)

install_server() {
  local package
  case ${1:-} in
    sfcb) package=("${server_sfcb[@]}") ;;
    pegasus) package=("${server_pegasus[@]}") ;;
    *) echo "usage: $0 server sfcb|pegasus" >&2; exit 2 ;;
  esac
  local name=${package[0]} dir=${package[1]} pidfile=${package[1]}/${package[2]} shared="" d
  for d in "$root/../shared" /work/shared; do
    [ -d "$d/$name" ] && { shared=$(cd "$d/$name" && pwd); break; }
  done
  [ -n "$shared" ] || { echo "no $name package: neither $root/../shared/$name nor /work/shared/$name exists" >&2; exit 1; }
  local tarballs=("$shared"/*.tar.xz)
  [ ${#tarballs[@]} -eq 1 ] && [ -f "${tarballs[0]}" ] ||
    { echo "expected one $name package (*.tar.xz) in $shared" >&2; exit 1; }
  [ "$(id -u)" -eq 0 ] || { echo "installing under $dir needs root" >&2; exit 1; }
  if [ -s "$pidfile" ] && kill -0 "$(cat "$pidfile")" 2>/dev/null; then
    echo "$name is running (pid $(cat "$pidfile")); stop it first" >&2
    exit 1
  fi
  install_missing "${package[@]:3}"
  rm -rf "$dir"
  tar -xJf "${tarballs[0]}" -C /
  echo "Installed ${tarballs[0]##*/} under $dir"
}

# The fuzz build: clang with libFuzzer, AddressSanitizer and UBSan.
fuzz_packages=(clang-14 libfuzzer-14-dev)

fuzz() {
  local dir=${TVRN_BUILD_DIR:-$root/build-fuzz}
  install_missing "${packages[@]}" "${fuzz_packages[@]}"
  # shellcheck disable=SC2086
  cmake -S "$root" -B "$dir" -DTVRN_FUZZ=ON -DCMAKE_C_COMPILER=clang-14 \
        -DCMAKE_CXX_COMPILER=clang++-14 ${TVRN_CMAKE_ARGS:-} >/dev/null
  cmake --build "$dir" -j "$jobs" --target fuzzers
  TVRN_FUZZ_BUILD_DIR=$dir "$root/tools/fuzz.sh" "$@"
}

# The suites that run threads, under ThreadSanitizer: only they are built,
# at -O1 with line tables only (a third less compile time than -O2 -g; the
# reports keep their file and line).
tsan() {
  local dir=${TVRN_BUILD_DIR:-$root/build-tsan} flags="-O1 -g1 -DNDEBUG"
  install_missing "${packages[@]}"
  # shellcheck disable=SC2086
  cmake -S "$root" -B "$dir" -DTVRN_TSAN=ON -DTVRN_BUILD_BENCH=OFF \
        -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCMAKE_CXX_FLAGS_RELWITHDEBINFO="$flags" \
        -DCMAKE_C_FLAGS_RELWITHDEBINFO="$flags" ${TVRN_CMAKE_ARGS:-} >/dev/null
  cmake --build "$dir" -j "$jobs" --target threaded_tests
  TSAN_OPTIONS=${TSAN_OPTIONS:-second_deadlock_stack=1} \
    ctest --test-dir "$dir" --output-on-failure -j "$jobs" -L threads
}

main_job() {
  "$root/tools/main-job.sh" "$build"
}

case "$mode" in
  run)   install_missing "${packages[@]}"; configure_and_build; main_job ;;
  test)  install_missing "${packages[@]}"; configure_and_build
         ctest --test-dir "$build" --output-on-failure -j "$jobs" ;;
  build) install_missing "${packages[@]}"; configure_and_build ;;
  tsan)  tsan ;;
  fuzz)  shift; fuzz "$@" ;;
  server) install_server "${2:-}" ;;
  *) echo "usage: $0 run|test|build|tsan|fuzz [-j JOBS] [SECONDS] [TARGET...]|server sfcb|pegasus" >&2; exit 2 ;;
esac
