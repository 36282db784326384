#!/usr/bin/env bash
# Starts orv-cimhost on a free loopback port and measures EnumerateInstances and
# GetInstance with 1 and 8 clients. Defaults serve the raw test provider; pass
# CLASS, KEY and HOST_ARGS to measure other classes, e.g. the Ethernet ports:
#   CLASS=Orvane_EthernetPort KEY=DeviceID=vmnic0 HOST_ARGS="--platform sim --fixture f.json" run_bench.sh
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
CLASS=${CLASS:-Raw_Element}
KEY=${KEY:-Name=bench}
SECONDS_EACH=${SECONDS_EACH:-5}
HOST_ARGS=${HOST_ARGS:---registration tests/e2e/data/rawhost.reg --mof tests/rawprovider/rawprovider.mof}
LOG=$(mktemp)
# shellcheck disable=SC2086
"$BUILD_DIR/bin/orv-cimhost" --port 0 --threads 8 $HOST_ARGS 2>"$LOG" &
HOST_PID=$!
trap 'kill -TERM $HOST_PID 2>/dev/null; wait $HOST_PID 2>/dev/null; rm -f "$LOG"' EXIT
for _ in $(seq 50); do grep -q "listening on" "$LOG" && break; sleep 0.1; done
PORT=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$LOG")
for clients in 1 8; do
  "$BUILD_DIR/bin/cimhost_load" --port "$PORT" --clients "$clients" --seconds "$SECONDS_EACH" --op ei --class "$CLASS"
  "$BUILD_DIR/bin/cimhost_load" --port "$PORT" --clients "$clients" --seconds "$SECONDS_EACH" --op gi --class "$CLASS" --key "$KEY"
done
