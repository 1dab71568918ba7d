#!/usr/bin/env bash
# Registers the installed provider module with a CIM server: copies the module
# into the server's provider directory, loads the class files into the
# module's namespace and the registrations where the server keeps them, and
# says what to do next.
#
#   tools/register.sh sfcb    [--prefix DIR]   SFCB under /opt/sfcb
#   tools/register.sh pegasus [--prefix DIR]   OpenPegasus under /opt/pegasus;
#                                              the server must be running
#
# DIR is where `cmake --install` put the module (default /usr/local, CMake's
# default prefix): the module in DIR/lib/cmpi, the class files and the
# registrations in DIR/share/tvrnprovider (CMake options TVRN_INSTALL_*_DIR).
# Running it again replaces the module and the registration.
set -euo pipefail

usage() {
  { echo "usage:"; sed -n '7,9s/^#//p' "$0"; } >&2
  exit 2
}
die() {
  echo "register: $*" >&2
  exit 1
}

server=${1:-}
[ $# -gt 0 ] && shift
prefix=/usr/local
while [ $# -gt 0 ]; do
  case $1 in
    --prefix) [ $# -ge 2 ] || usage; prefix=$2; shift 2 ;;
    *) usage ;;
  esac
done
case $server in sfcb | pegasus) ;; *) usage ;; esac

module=$prefix/lib/cmpi/libtvrnprovider.so
data=$prefix/share/tvrnprovider
[ -f "$module" ] || die "no module at $module; run 'cmake --install build' first (or give --prefix)"
for f in dmtf_qualifiers.mof dmtf_classes.mof tavrin.mof tvrnprovider.reg tvrnprovider-registration.mof; do
  [ -f "$data/$f" ] || die "missing $data/$f; run 'cmake --install build' again"
done

# The namespace and the module's name are those of the generated registrations.
namespace=$(sed -n 's/^ *namespace: *\([^ ]*\) *$/\1/p' "$data/tvrnprovider.reg" | sort -u)
[ "$(printf '%s\n' "$namespace" | wc -l)" -eq 1 ] || die "$data/tvrnprovider.reg names more than one namespace"
module_name=$(awk '/^instance of PG_ProviderModule/ { m = 1 }
                   m && /^ *Name = "/ { split($0, q, "\""); print q[2]; exit }' \
  "$data/tvrnprovider-registration.mof")
[ -n "$module_name" ] || die "no provider module in $data/tvrnprovider-registration.mof"

# Copies the module beside the server's providers. A rename, so that a
# process that still has the old library mapped keeps its copy intact.
place_module() {
  local dir=$1
  [ -d "$dir" ] || die "no provider directory $dir"
  install -m 0755 "$module" "$dir/.libtvrnprovider.so.new"
  mv -f "$dir/.libtvrnprovider.so.new" "$dir/libtvrnprovider.so"
  echo "Module: $dir/libtvrnprovider.so"
}

# The module opens libdtfaj.so by its plain name, with the server daemon's
# loader path; a copy in the provider directory is not found there.
loader_note() {
  local var=$1
  if ! /sbin/ldconfig -p 2>/dev/null | grep -q 'libdtfaj\.so '; then
    echo "libdtfaj.so is not in the loader cache: the server must be started with"
    echo "$var=<directory of libdtfaj.so>, or every inventory class enumerates empty."
  fi
}

register_sfcb() {
  local S=/opt/sfcb
  [ -x $S/bin/sfcbstage ] || die "no SFCB under $S"
  place_module $S/lib/cmpi
  # The compiler reads its own qualifier declarations and CIM schema first
  # and the staged files in name order: the DMTF classes before tavrin.mof.
  $S/bin/sfcbstage -n "$namespace" -r "$data/tvrnprovider.reg" \
    "$data/dmtf_classes.mof" "$data/tavrin.mof"
  $S/bin/sfcbrepos -f
  echo "Registered with SFCB in $namespace. Restart SFCB to load classes and registrations:"
  echo "  $S/bin/sfcb-stop; SFCB_LD_LIBRARY_PATH=<directory of libdtfaj.so> $S/bin/sfcb-start"
  loader_note SFCB_LD_LIBRARY_PATH
}

register_pegasus() {
  local P=/opt/pegasus
  [ -x $P/bin/cimmof ] || die "no OpenPegasus under $P"
  local modules
  modules=$($P/bin/cimprovider -l -s 2>&1) ||
    die "OpenPegasus is not running (start it first: $P/bin/pegasus-start): $modules"
  place_module $P/providers
  if printf '%s\n' "$modules" | awk '{ print $1 }' | grep -qx "$module_name"; then
    $P/bin/cimprovider -r -m "$module_name" >/dev/null
  fi
  # A new namespace is empty: qualifiers, then the DMTF classes, then the
  # module's own (one of them Experimental, hence -aE). Classes there already
  # are kept as they are (-w: without a warning for each).
  $P/bin/cimmof -w -n "$namespace" "$data/dmtf_qualifiers.mof"
  $P/bin/cimmof -w -aE -n "$namespace" "$data/dmtf_classes.mof" "$data/tavrin.mof"
  $P/bin/cimmof -n root/PG_InterOp "$data/tvrnprovider-registration.mof"
  echo "Registered with OpenPegasus in $namespace and root/PG_InterOp ($module_name);"
  echo "in force at once, no restart needed."
  loader_note PEGASUS_LD_LIBRARY_PATH
}

register_"$server"
