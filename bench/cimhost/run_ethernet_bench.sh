#!/usr/bin/env bash
# The Ethernet port figures: a simulated host of 64 NICs (orv-simgen), served by the
# project's provider library; EnumerateInstances of Orvane_EthernetPort and GetInstance
# of vmnic0 with 1 and 8 clients.
#   BUILD_DIR=build bench/cimhost/run_ethernet_bench.sh
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
NICS=${NICS:-64}
FIXTURE=$(mktemp --suffix=.json)
trap 'rm -f "$FIXTURE"' EXIT
"$BUILD_DIR/bin/orv-simgen" --nics "$NICS" -o "$FIXTURE"
SYSTEM=$(grep -o '"fqdn": *"[^"]*"' "$FIXTURE" | head -1 | sed 's/.*"\([^"]*\)"$/\1/')
export BUILD_DIR
CLASS=Orvane_EthernetPort \
KEY="DeviceID=vmnic0,CreationClassName=Orvane_EthernetPort,SystemCreationClassName=OMC_UnitaryComputerSystem,SystemName=$SYSTEM" \
HOST_ARGS="--provider-dir $BUILD_DIR/lib --platform sim --fixture $FIXTURE" \
  bench/cimhost/run_bench.sh
