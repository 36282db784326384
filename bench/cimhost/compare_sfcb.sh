#!/usr/bin/env bash
# orv-cimhost against the stock sfcb: both brokers serve liborvprovider.so on the same
# generated simulated host (NICS ports, default 64), and the load client cimhost_load runs
# EnumerateInstances of Orvane_EthernetPort and GetInstance of vmnic0 with 1 and 8 clients
# against each broker in turn, ROUNDS times (the order of the two swaps every round). Prints,
# per row, the median requests per second of each broker, the ratio orv-cimhost / sfcb, and
# the CPU time each broker spent per request (every process of sfcb's session; the host's one
# process).
#
#   BUILD_DIR=build bench/cimhost/compare_sfcb.sh
#   ORV_SFCB_PREFIX=/path/to/prefix ROUNDS=5 SECONDS_EACH=5 NICS=64 bench/cimhost/compare_sfcb.sh
#
# sfcb comes from tests/e2e/sfcb/sfcb_broker.sh: ORV_SFCB_PREFIX (copied, never written), or
# built once into BUILD_DIR/sfcb/prefix from ../shared/sfcb. Needs orv-cimhost, orv-simgen,
# cimhost_load and liborvprovider.so in BUILD_DIR.
set -euo pipefail
cd "$(dirname "$0")/../.."
SRC=$(pwd)
BUILD_DIR=$(realpath "${BUILD_DIR:-build}")
NICS=${NICS:-64}
ROUNDS=${ROUNDS:-3}
SECONDS_EACH=${SECONDS_EACH:-5}
THREADS=${THREADS:-8}
CLASS=Orvane_EthernetPort
BROKER_SCRIPT=$SRC/tests/e2e/sfcb/sfcb_broker.sh
export ORV_SFCB_ROOT=${ORV_SFCB_ROOT:-$SRC/tests/e2e/data/root}

for tool in orv-cimhost orv-simgen cimhost_load; do
  [ -x "$BUILD_DIR/bin/$tool" ] || { echo "missing $BUILD_DIR/bin/$tool: build it first" >&2; exit 1; }
done

RUN=$(mktemp -d "${TMPDIR:-/tmp}/orv-compare-sfcb.XXXXXX")
HOST_PID=
cleanup() {
  [ -n "$HOST_PID" ] && { kill -TERM "$HOST_PID" 2>/dev/null; wait "$HOST_PID" 2>/dev/null || true; }
  "$BROKER_SCRIPT" stop "$BUILD_DIR" "$SRC" "$RUN/sfcb" >/dev/null 2>&1 || true
  rm -rf "$RUN"
}
trap cleanup EXIT

"$BUILD_DIR/bin/orv-simgen" --nics "$NICS" -o "$RUN/host.json"
SYSTEM=$(grep -o '"fqdn": *"[^"]*"' "$RUN/host.json" | head -1 | sed 's/.*"\([^"]*\)"$/\1/')
KEY="DeviceID=vmnic0,CreationClassName=$CLASS,SystemCreationClassName=OMC_UnitaryComputerSystem,SystemName=$SYSTEM"

# sfcb: built or found, staged with the library, started on a free port.
"$BROKER_SCRIPT" prepare "$BUILD_DIR" "$SRC"
"$BROKER_SCRIPT" start "$BUILD_DIR" "$SRC" "$RUN/sfcb" "$RUN/host.json" >/dev/null
if [ -f "$BUILD_DIR/sfcb/unavailable" ]; then
  echo "sfcb unavailable: $(cat "$BUILD_DIR/sfcb/unavailable")" >&2; exit 1
fi
SFCB_PORT=$(cat "$RUN/sfcb/port")
SFCB_PID=$(cat "$RUN/sfcb/prefix/log/sfcbd.pid")

# orv-cimhost on a free port, same fixture, same library.
: >"$RUN/host.log"
ORV_ROOT=$ORV_SFCB_ROOT "$BUILD_DIR/bin/orv-cimhost" --port 0 --threads "$THREADS" \
  --provider-dir "$BUILD_DIR/lib" --platform sim --fixture "$RUN/host.json" 2>"$RUN/host.log" &
HOST_PID=$!
for _ in $(seq 100); do grep -q "listening on" "$RUN/host.log" && break; sleep 0.1; done
HOST_PORT=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$RUN/host.log" | head -1)
[ -n "$HOST_PORT" ] || { cat "$RUN/host.log" >&2; exit 1; }

# CPU ticks (user + system, with reaped children) of a list of processes.
cpu_ticks() {
  local total=0 pid fields
  for pid in "$@"; do
    fields=$(sed 's/^.*) //' "/proc/$pid/stat" 2>/dev/null) || continue
    # After "pid (comm) ": field 12..15 are utime stime cutime cstime.
    total=$((total + $(echo "$fields" | awk '{print $12 + $13 + $14 + $15}')))
  done
  echo "$total"
}
sfcb_pids() { ps -o pid= -s "$(ps -o sid= -p "$SFCB_PID" | tr -d ' ')"; }
broker_pids() { if [ "$1" = sfcb ]; then sfcb_pids; else echo "$HOST_PID"; fi; }
broker_port() { if [ "$1" = sfcb ]; then echo "$SFCB_PORT"; else echo "$HOST_PORT"; fi; }

# One load run: prints "rps cpu_us_per_request".
load_run() {
  local broker=$1 op=$2 clients=$3 before after out requests
  local args=(--port "$(broker_port "$broker")" --clients "$clients" --seconds "$SECONDS_EACH" --op "$op" --class "$CLASS")
  [ "$op" = gi ] && args+=(--key "$KEY")
  # shellcheck disable=SC2046
  before=$(cpu_ticks $(broker_pids "$broker"))
  out=$("$BUILD_DIR/bin/cimhost_load" "${args[@]}") || { echo "load failed on $broker: $out" >&2; exit 1; }
  # shellcheck disable=SC2046
  after=$(cpu_ticks $(broker_pids "$broker"))
  requests=$(sed -n 's/.* requests=\([0-9]*\).*/\1/p' <<<"$out")
  awk -v out="$out" -v t=$((after - before)) -v n="$requests" -v hz="$(getconf CLK_TCK)" \
    'BEGIN { split(out, f, " "); for (i in f) if (f[i] ~ /^rps=/) rps = substr(f[i], 5);
             printf "%s %.0f\n", rps, n ? t * 1e6 / hz / n : 0 }'
}

median() { sort -n | awk '{ v[NR] = $1 } END { print (NR % 2) ? v[(NR + 1) / 2] : (v[NR / 2] + v[NR / 2 + 1]) / 2 }'; }

# Warm-up: the first request loads the providers.
SECONDS_EACH=1 load_run sfcb ei 1 >/dev/null
SECONDS_EACH=1 load_run orv ei 1 >/dev/null

printf "%-20s %7s %10s %10s %7s %14s %14s\n" request clients sfcb_rps orv_rps ratio sfcb_cpu_us orv_cpu_us
for row in "ei 1" "ei 8" "gi 1" "gi 8"; do
  read -r op clients <<<"$row"
  : >"$RUN/sfcb.txt"; : >"$RUN/orv.txt"
  for round in $(seq "$ROUNDS"); do
    order="sfcb orv"; [ $((round % 2)) -eq 0 ] && order="orv sfcb"
    for broker in $order; do load_run "$broker" "$op" "$clients" >>"$RUN/$broker.txt"; done
  done
  sfcb_rps=$(cut -d' ' -f1 "$RUN/sfcb.txt" | median); orv_rps=$(cut -d' ' -f1 "$RUN/orv.txt" | median)
  sfcb_cpu=$(cut -d' ' -f2 "$RUN/sfcb.txt" | median); orv_cpu=$(cut -d' ' -f2 "$RUN/orv.txt" | median)
  name=$([ "$op" = ei ] && echo "EnumerateInstances" || echo "GetInstance")
  printf "%-20s %7s %10s %10s %7.2f %14s %14s\n" "$name" "$clients" "$sfcb_rps" "$orv_rps" \
    "$(awk -v a="$orv_rps" -v b="$sfcb_rps" 'BEGIN { print b ? a / b : 0 }')" "$sfcb_cpu" "$orv_cpu"
done
