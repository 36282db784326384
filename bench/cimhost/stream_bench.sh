#!/usr/bin/env bash
# Time to first byte, total time and the host's peak resident size for EnumerateInstances of
# Orvane_EthernetPort on a generated simulated host of NICS ports (default 1,024): first
# HTTP/1.1 requests, answered in pieces while the provider runs (chunked), then HTTP/1.0
# requests, whose answer the host builds whole before sending it. The peak resident size
# (VmHWM) only grows, so the streamed figure is read before any whole answer was built.
#   BUILD_DIR=build NICS=1024 REQUESTS=5 bench/cimhost/stream_bench.sh
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
NICS=${NICS:-1024}
REQUESTS=${REQUESTS:-5}
RUN=$(mktemp -d "${TMPDIR:-/tmp}/orv-stream-bench.XXXXXX")
HOST_PID=
cleanup() {
  [ -n "$HOST_PID" ] && { kill -TERM "$HOST_PID" 2>/dev/null; wait "$HOST_PID" 2>/dev/null || true; }
  rm -rf "$RUN"
}
trap cleanup EXIT

"$BUILD_DIR/bin/orv-simgen" --nics "$NICS" -o "$RUN/host.json"
: >"$RUN/host.log"
"$BUILD_DIR/bin/orv-cimhost" --port 0 --provider-dir "$BUILD_DIR/lib" --platform sim --fixture "$RUN/host.json" \
  2>"$RUN/host.log" &
HOST_PID=$!
for _ in $(seq 100); do grep -q "listening on" "$RUN/host.log" && break; sleep 0.1; done
PORT=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$RUN/host.log" | head -1)
cat >"$RUN/request.xml" <<'XML'
<?xml version="1.0" encoding="utf-8"?><CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="1" PROTOCOLVERSION="1.0"><SIMPLEREQ><IMETHODCALL NAME="EnumerateInstances"><LOCALNAMESPACEPATH><NAMESPACE NAME="root"/><NAMESPACE NAME="cimv2"/></LOCALNAMESPACEPATH><IPARAMVALUE NAME="ClassName"><CLASSNAME NAME="Orvane_EthernetPort"/></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>
XML

peak_kib() { sed -n 's/^VmHWM:[[:space:]]*\([0-9]*\).*/\1/p' "/proc/$HOST_PID/status"; }
rss_kib() { sed -n 's/^VmRSS:[[:space:]]*\([0-9]*\).*/\1/p' "/proc/$HOST_PID/status"; }
# Prints "ttfb_ms total_ms bytes" of one request; $1 is --http1.1 or --http1.0.
one() {
  curl -s -o /dev/null "$1" -w '%{time_starttransfer} %{time_total} %{size_download}\n' \
    -H 'CIMOperation: MethodCall' -H 'CIMMethod: EnumerateInstances' -H 'CIMObject: root%2Fcimv2' \
    -H 'Content-Type: application/xml; charset="utf-8"' --data-binary @"$RUN/request.xml" \
    "http://127.0.0.1:$PORT/cimom" | awk '{ printf "%.1f %.1f %d\n", $1 * 1000, $2 * 1000, $3 }'
}
median() { sort -n | awk '{ v[NR] = $1 } END { print (NR % 2) ? v[(NR + 1) / 2] : (v[NR / 2] + v[NR / 2 + 1]) / 2 }'; }

echo "EnumerateInstances Orvane_EthernetPort, $NICS NICs, $REQUESTS requests each (medians)"
printf "%-30s %10s %10s %12s %14s\n" answer ttfb_ms total_ms bytes peak_rss_kib
echo "before any request: resident $(rss_kib) KiB, peak $(peak_kib) KiB"
for mode in --http1.1 --http1.0; do
  : >"$RUN/times.txt"
  for _ in $(seq "$REQUESTS"); do one "$mode" >>"$RUN/times.txt"; done
  name=$([ "$mode" = --http1.1 ] && echo "HTTP/1.1 (streamed, chunked)" || echo "HTTP/1.0 (built whole)")
  printf "%-30s %10s %10s %12s %14s\n" "$name" "$(cut -d' ' -f1 "$RUN/times.txt" | median)" \
    "$(cut -d' ' -f2 "$RUN/times.txt" | median)" "$(cut -d' ' -f3 "$RUN/times.txt" | head -1)" "$(peak_kib)"
done
