#!/usr/bin/env bash
# The Linux end-to-end test with orv-cimhost run under the unit's capability bounding set and
# NoNewPrivileges (setpriv does what systemd would, also where systemd is not running), so
# the unit keeps the capabilities the hardware reads need and only those.
#   unit_capabilities_test.sh SOURCE_DIR BUILD_DIR
set -euo pipefail
src=$(realpath "${1:?SOURCE_DIR}")
build=$(realpath "${2:?BUILD_DIR}")
if [ "$(id -u)" -ne 0 ]; then
    echo "the host must start as root to lose capabilities: skipped"
    exit 77
fi
unit=$src/packaging/orv-cimhost.service.in
# CapabilityBoundingSet=CAP_A CAP_B -> -all,+a,+b
caps=$(sed -n 's/^CapabilityBoundingSet=//p' "$unit")
bounding=-all
for cap in $caps; do
    bounding="$bounding,+$(echo "${cap#CAP_}" | tr '[:upper:]' '[:lower:]')"
done
grep -q '^NoNewPrivileges=yes' "$unit" || { echo "the unit has no NoNewPrivileges=yes" >&2; exit 1; }
echo "running the host with the bounding set $bounding"
export ORV_HOST_WRAPPER="setpriv --bounding-set=$bounding --inh-caps=-all --no-new-privs"
export ORV_BUILD_DIR=$build ORV_SOURCE_DIR=$src
exec "$build/bin/linux_host_e2e_test"
