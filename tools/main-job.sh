#!/usr/bin/env bash
# The main job: show what the built module offers a CIM server, through the
# embedded host's client tvrncli: the inventory of the host that the
# adapter-library simulator plays (its built-in host unless TVRN_SIM_FIXTURE
# names another), a few properties per instance, then one instance whole.
# The module finds the simulator on the loader's search path.
set -euo pipefail
build=${1:?usage: main-job.sh BUILD_DIR}
cli="$build/bin/tvrncli"
module="$build/lib/libtvrnprovider.so"
for f in "$cli" "$module"; do
  [ -f "$f" ] || { echo "not built: $f" >&2; exit 1; }
done
export LD_LIBRARY_PATH="$build/lib/sim${LD_LIBRARY_PATH:+:$LD_LIBRARY_PATH}"

tvrncli() { "$cli" --module "$module" "$@"; }

# table CLASS PROPERTY... : one row per instance of CLASS with the values of
# the given properties (MOF quotes dropped), in aligned columns.
table() {
  local class=$1
  shift
  echo
  echo "$class"
  tvrncli ei "$class" | awk -v props="$*" '
    BEGIN { n = split(props, col, " "); for (i = 1; i <= n; i++) { w[i] = length(col[i]); head[i] = col[i] } }
    /^instance of / { rows++; next }
    /^    [A-Za-z_]+ = / {
      name = $1
      value = substr($0, index($0, " = ") + 3)
      sub(/;$/, "", value)
      gsub(/"/, "", value)
      for (i = 1; i <= n; i++)
        if (col[i] == name) { cell[rows, i] = value; if (length(value) > w[i]) w[i] = length(value) }
    }
    END {
      if (rows == 0) { print "  (none)"; exit }
      row(head)
      for (r = 1; r <= rows; r++) { for (i = 1; i <= n; i++) c[i] = cell[r, i]; row(c) }
    }
    function row(v,    i, line) {
      line = "  "; for (i = 1; i <= n; i++) line = line sprintf("%-" w[i] "s  ", v[i])
      sub(/ +$/, "", line); print line
    }'
}

echo "Module: $module"
echo "Classes in its schema: $("$cli" classes | wc -l)"
echo "Host played by the simulator: ${TVRN_SIM_FIXTURE:-its built-in host}"

table TAVRIN_ComputerSystem Name NameFormat OperationalStatus
table TAVRIN_PortController DeviceID Name Caption OperationalStatus
table TAVRIN_AdapterSoftwareIdentity InstanceID ElementName VersionString
table TAVRIN_FCPort DeviceID Caption Speed MaxSpeed OperationalStatus
table TAVRIN_SCSIProtocolEndpoint Name Role
table TAVRIN_EthernetPort DeviceID ElementName PortType OperationalStatus
table TAVRIN_PhysicalConnector Tag Manufacturer Description
table TAVRIN_StorageExtent DeviceID Name NameFormat
table TAVRIN_TapeDrive DeviceID Name

echo
echo "\$ tvrncli ei TAVRIN_FCPort   (the first instance)"
tvrncli ei TAVRIN_FCPort | sed -n '1,/^};$/p'
