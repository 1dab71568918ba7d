#!/usr/bin/env bash
# Integration tests against a real CIM server, on the adapter-library
# simulator's built-in host:
#
#   tests/integration/run.sh sfcb|pegasus
#
# As root, from a built tree (tools/dev.sh build). It installs the prebuilt
# server of the shared directory afresh, then installs, registers and starts
# with the README's own commands (each is looked up in README.md before it
# runs), and compares what wbemcli gets from the server with what tvrncli
# gives (check.py): every class of `classes`, gi of every path returned,
# the requests of `requests` (associations, methods, bad requests, after
# which the provider process must be the same), then the module without
# libdtfaj.so on the loader path, and unloading and loading it again. It
# stops the server whatever happens. See README.md in this directory.
set -euo pipefail

server=${1:-}
case $server in sfcb | pegasus) ;; *) echo "usage: $0 sfcb|pegasus" >&2; exit 2 ;; esac
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
cd "$root"
here=tests/integration
server_url=http://localhost:5988
url=$server_url/root/tavrin
# OpenPegasus's interop namespace, where the module asks for the server's
# object manager (SFCB answers there too) and OpenPegasus keeps registrations.
interop=root/PG_InterOp
scratch=$(mktemp -d)
failures=0
unset TVRN_SIM_FIXTURE # the built-in host, for the server and tvrncli alike

started=$SECONDS
say() { printf '\n== %s [%d s]: %s\n' "$server" $((SECONDS - started)) "$*"; }
fail() {
  echo "FAILED: $*" >&2
  failures=$((failures + 1))
}

# Runs a command that README.md shows on a line of its own (blanks and a
# trailing "# comment" aside), so the README is what the tests prove.
readme() {
  awk -v want="$1" '{ sub(/^[ \t]+/, ""); sub(/[ \t]+#.*$/, ""); if ($0 == want) found = 1 }
                    END { exit !found }' README.md ||
    { echo "not in README.md: $1" >&2; exit 1; }
  echo "+ $1"
  eval "$1"
}

# check.py with tvrncli on the loader path the server was given.
# The module names its object manager after the server's own, which tvrncli
# is given as a seed.
check() {
  LD_LIBRARY_PATH=${loader_path:-} python3 "$here/check.py" \
    --seed-from "$interop:CIM_ObjectManager" "$@"
}

stop_server() {
  case $server in
    sfcb) /opt/sfcb/bin/sfcb-stop >/dev/null || true ;;
    pegasus) /opt/pegasus/bin/pegasus-stop >/dev/null || true ;;
  esac
}
trap 'stop_server; rm -rf "$scratch"' EXIT

# The pid of the process that has the server's copy of the module loaded,
# waiting a little for it to appear or (with "gone") to go.
module_pid() {
  local i
  for i in $(seq 1 ${2:-10}); do
    if [ "${1:-}" = gone ]; then
      check pid "$server_module" >/dev/null 2>&1 || return 0
    else
      check pid "$server_module" 2>/dev/null && return 0
    fi
    sleep 1
  done
  return 1
}

# Enumerations, gets, requests; the provider process is the same at the end.
compare_all() {
  say "enumerations and gets, property by property"
  check classes "$here/classes" --gi || fail "classes differ"
  local pid
  pid=$(module_pid) || { fail "no process has the module loaded"; return; }
  say "associations, methods, bad requests (provider pid $pid)"
  check requests "$here/requests" || fail "requests differ"
  [ "$(module_pid)" = "$pid" ] || fail "the provider process did not survive (pid $pid)"
  check classes <(printf 'TAVRIN_AlarmDevice\nTAVRIN_AdapterSoftwareIdentity\n') ||
    fail "a method left a change behind"
  indication_registered
}

# Alert indications: the class is known and the module registered as its
# indication provider (no subscription through the server here).
indication_registered() {
  say "alert indications registered"
  wbemcli gc "$url:TAVRIN_AlertIndication" >/dev/null || fail "no class TAVRIN_AlertIndication"
  local registration
  case $server in
    sfcb)
      registration=$(awk '/^\[/ { on = ($0 == "[TAVRIN_AlertIndication]") } on' \
        /opt/sfcb/var/lib/sfcb/registration/providerRegister) ;;
    pegasus)
      registration=$(wbemcli gi -nl "$server_url/$interop:"'PG_ProviderCapabilities.ProviderModuleName="tvrnprovider_Module",ProviderName="TAVRIN_AlertIndication_Provider",CapabilityID="TAVRIN_AlertIndication"' 2>&1 |
        sed -n 's/^-ProviderType=/type: /p' | tr , ' ') ;;
  esac
  grep -qE '^ *type:.* (indication|4)( |$)' <<<"$registration" ||
    fail "TAVRIN_AlertIndication has no indication provider: $registration"
}

# Without libdtfaj.so the providers answer: the computer system and the
# profile registration as with it, every adapter class with nothing.
compare_without_library() {
  say "without libdtfaj.so on the loader path"
  check classes "$here/classes" || fail "classes differ without the library"
  [ "$(wbemcli ein "$url:TAVRIN_ComputerSystem" | wc -l)" -eq 1 ] ||
    fail "no computer system without the library"
}

# A module unloaded answers again, from a new process, once loaded again.
reloaded_from_new_process() {
  local before=$1
  check classes <(printf 'TAVRIN_ComputerSystem\nTAVRIN_FCPort\n') || fail "classes differ after reloading"
  local after
  after=$(module_pid) || { fail "the module was not loaded again"; return; }
  [ "$after" != "$before" ] || fail "the module was not unloaded (pid $before)"
}

run_sfcb() {
  server_module=/opt/sfcb/lib/cmpi/libtvrnprovider.so
  readme 'tools/dev.sh server sfcb'
  readme 'tools/dev.sh build'
  readme 'cmake --install build'
  readme 'DTFAJ_DIR=$PWD/build/lib/sim'
  readme 'tools/register.sh sfcb'
  readme '/opt/sfcb/bin/sfcb-stop'
  readme 'SFCB_LD_LIBRARY_PATH=$DTFAJ_DIR /opt/sfcb/bin/sfcb-start'
  loader_path=$DTFAJ_DIR
  compare_all
  readme '/opt/sfcb/bin/sfcb-stop'

  # Idle providers are unloaded after providerTimeoutInterval; shortened here,
  # though not below what a busy machine needs between a request and finding
  # the process that answered it.
  sed '/^providerTimeoutInterval:/d; /^providerSampleInterval:/d' /opt/sfcb/etc/sfcb/sfcb.cfg \
    >"$scratch/sfcb.cfg"
  printf 'providerTimeoutInterval: 10\nproviderSampleInterval: 2\n' >>"$scratch/sfcb.cfg"
  loader_path=
  SFCB_CONFIG=$scratch/sfcb.cfg /opt/sfcb/bin/sfcb-start
  compare_without_library
  local pid
  wbemcli ein "$url:TAVRIN_ComputerSystem" >/dev/null # idle from now on
  pid=$(module_pid) || { fail "no process has the module loaded"; return; }
  say "idle unload (pid $pid) and load again"
  module_pid gone 40 || fail "the module stayed loaded while idle (pid $pid)"
  reloaded_from_new_process "$pid"
}

run_pegasus() {
  server_module=/opt/pegasus/providers/libtvrnprovider.so
  readme 'tools/dev.sh server pegasus'
  readme 'tools/dev.sh build'
  readme 'cmake --install build'
  readme 'DTFAJ_DIR=$PWD/build/lib/sim'
  readme 'PEGASUS_LD_LIBRARY_PATH=$DTFAJ_DIR /opt/pegasus/bin/pegasus-start'
  readme 'tools/register.sh pegasus'
  loader_path=$DTFAJ_DIR
  compare_all

  local pid
  pid=$(module_pid) || { fail "no process has the module loaded"; return; }
  say "unload by disabling the module (pid $pid), load again by enabling it"
  readme '/opt/pegasus/bin/cimprovider -d -m tvrnprovider_Module'
  module_pid gone || fail "disabling did not unload the module (pid $pid)"
  local answer
  answer=$(wbemcli ein "$url:TAVRIN_FCPort" 2>&1 || true)
  grep -q 'CIM_ERR_NOT_SUPPORTED' <<<"$answer" || fail "a disabled module still answers: $answer"
  readme '/opt/pegasus/bin/cimprovider -e -m tvrnprovider_Module'
  reloaded_from_new_process "$pid"
  readme '/opt/pegasus/bin/pegasus-stop'

  loader_path=
  /opt/pegasus/bin/pegasus-start
  compare_without_library
}

run_"$server"
say "done in $((SECONDS - started)) s, $failures failure(s)"
[ "$failures" -eq 0 ]
