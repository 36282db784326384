#!/usr/bin/env bash
# Memory of orv-cimhost under each attack on its HTTP front end: for every attack a fresh
# host (the defaults, the raw test provider, the test credentials file) on a free loopback
# port, the attack run by cimhost_attack with the right login where one is needed (the worst
# case), then the host's resident size when it started, its peak (VmHWM) and its resident
# size after the attack (VmRSS), in MiB.
#   BUILD_DIR=build bench/cimhost/run_attack_memory.sh [attack ...]
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
ATTACKS=("$@")
if [ ${#ATTACKS[@]} -eq 0 ]; then
  ATTACKS=(slow-heads-8 idle-16 slow-heads-1000 chunked-100mb chunked-4x256mb headers-50000 pipelined
           content-length lower-case-basic password-guessing)
fi
LOG=$(mktemp)
HOST_PID=""
stop_host() {
  if [ -n "$HOST_PID" ]; then
    kill -TERM "$HOST_PID" 2>/dev/null || true
    wait "$HOST_PID" 2>/dev/null || true
    HOST_PID=""
  fi
}
trap 'stop_host; rm -f "$LOG"' EXIT

status_mib() {  # status_mib PID FIELD
  awk -v field="$2:" '$1 == field { printf "%.1f", $2 / 1024 }' "/proc/$1/status"
}

printf '%-18s %9s %9s %9s  %s\n' attack "start MiB" "peak MiB" "after MiB" "what happened"
for attack in "${ATTACKS[@]}"; do
  : >"$LOG"
  "$BUILD_DIR/bin/orv-cimhost" --port 0 --provider-dir "$BUILD_DIR/lib" \
    --registration tests/e2e/data/rawhost.reg --mof tests/rawprovider/rawprovider.mof \
    --credentials tests/e2e/data/credentials --state-dir "$(dirname "$LOG")/state-$$" 2>"$LOG" &
  HOST_PID=$!
  for _ in $(seq 100); do grep -q "listening on" "$LOG" && break; sleep 0.1; done
  PORT=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$LOG")
  START=$(status_mib "$HOST_PID" VmRSS)
  LOGIN=(--user user --password secret)
  RESULT=$("$BUILD_DIR/bin/cimhost_attack" --port "$PORT" --attack "$attack" "${LOGIN[@]}")
  sleep 1  # let the host close what the attack left
  printf '%-18s %9s %9s %9s  %s\n' "$attack" "$START" "$(status_mib "$HOST_PID" VmHWM)" \
    "$(status_mib "$HOST_PID" VmRSS)" "${RESULT#*: }"
  stop_host
done
rm -rf "$(dirname "$LOG")/state-$$"
