#!/usr/bin/env bash
# Peak resident size of orv-cimhost serving the Ethernet ports of a simulated host
# of many NICs (orv-simgen), once with EnumerateInstances (the whole answer is
# built in memory) and once with OpenEnumerateInstances + PullInstancesWithPath
# (the provider streams into a bounded queue, each answer holds MAX objects).
# Each way runs on a fresh host; the figure is VmHWM of /proc/PID/status.
#   BUILD_DIR=build NICS=1024 MAX=100 bench/cimhost/run_pull_memory.sh
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
NICS=${NICS:-1024}
MAX=${MAX:-100}
WORK=$(mktemp -d)
HOST_PID=
cleanup() {
    if [ -n "$HOST_PID" ]; then kill "$HOST_PID" 2>/dev/null || true; wait "$HOST_PID" 2>/dev/null || true; fi
    rm -rf "$WORK"
}
trap cleanup EXIT
"$BUILD_DIR/bin/orv-simgen" --nics "$NICS" -o "$WORK/host.json"

start_host() {
    "$BUILD_DIR/bin/orv-cimhost" --port 0 --provider-dir "$BUILD_DIR/lib" --platform sim --fixture "$WORK/host.json" \
        --state-dir "$WORK/state" 2>"$WORK/host.log" &
    HOST_PID=$!
    for _ in $(seq 100); do
        PORT=$(grep -o 'listening on [0-9.]*:[0-9]*' "$WORK/host.log" | head -1 | sed 's/.*://') || true
        [ -n "${PORT:-}" ] && return 0
        sleep 0.1
    done
    echo "host did not start" >&2; cat "$WORK/host.log" >&2; exit 1
}

stop_host() {
    kill "$HOST_PID"; wait "$HOST_PID" || true; HOST_PID=
}

call() {  # METHOD PARAMS
    curl -s -H 'CIMOperation: MethodCall' -H "CIMMethod: $1" -H 'CIMObject: root%2Fcimv2' \
        -H 'Content-Type: application/xml; charset="utf-8"' --data-binary \
        "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"$1\"><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>$2</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>" \
        "http://127.0.0.1:$PORT/cimom"
}

peak_kb() { grep VmHWM "/proc/$HOST_PID/status" | awk '{print $2}'; }
CLASS='<IPARAMVALUE NAME="ClassName"><CLASSNAME NAME="Orvane_EthernetPort"/></IPARAMVALUE>'
count_objects() { grep -o "<$1>" | wc -l; }

start_host
call EnumerateInstanceNames "$CLASS" >/dev/null  # load the provider library first
BASE=$(peak_kb)
N=$(call EnumerateInstances "$CLASS" | count_objects VALUE.NAMEDINSTANCE)
echo "EnumerateInstances: $N instances, peak RSS $(peak_kb) kB (after start and a first request: $BASE kB)"
stop_host

start_host
call EnumerateInstanceNames "$CLASS" >/dev/null
BASE=$(peak_kb)
ANSWER=$(call OpenEnumerateInstances "$CLASS<IPARAMVALUE NAME=\"MaxObjectCount\"><VALUE>$MAX</VALUE></IPARAMVALUE>")
N=$(echo "$ANSWER" | count_objects VALUE.INSTANCEWITHPATH)
PULLS=0
while echo "$ANSWER" | grep -q '<PARAMVALUE NAME="EndOfSequence"><VALUE>FALSE'; do
    CONTEXT=$(echo "$ANSWER" | grep -o 'NAME="EnumerationContext"><VALUE>[0-9a-f]*' | sed 's/.*>//')
    ANSWER=$(call PullInstancesWithPath "<IPARAMVALUE NAME=\"EnumerationContext\"><VALUE>$CONTEXT</VALUE></IPARAMVALUE><IPARAMVALUE NAME=\"MaxObjectCount\"><VALUE>$MAX</VALUE></IPARAMVALUE>")
    N=$((N + $(echo "$ANSWER" | count_objects VALUE.INSTANCEWITHPATH)))
    PULLS=$((PULLS + 1))
done
echo "Open/Pull (MaxObjectCount $MAX): $N instances in $PULLS pulls, peak RSS $(peak_kb) kB (after start and a first request: $BASE kB)"
stop_host
