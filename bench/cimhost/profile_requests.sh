#!/usr/bin/env bash
# Instructions per request and per instance inside orv-cimhost, counted by callgrind:
# the host serves liborvprovider.so on a generated simulated host (NICS ports, default 64);
# callgrind counts nothing until the host listens, then REQUESTS EnumerateInstances of
# Orvane_EthernetPort and REQUESTS GetInstance of vmnic0 are sent one after the other (curl,
# one connection each), each kind in its own counting window. Prints the whole process's
# instructions per request and per delivered instance, and the inclusive share of the parts
# named below (the provider's fill, the binding's setProperty, the writer, request parsing;
# the handlers run on the HTTP workers, so no HTTP function stands for the front end alone).
#
#   BUILD_DIR=build bench/cimhost/profile_requests.sh
#   REQUESTS=20 NICS=64 KEEP=dir bench/cimhost/profile_requests.sh   (KEEP keeps the callgrind files)
set -euo pipefail
cd "$(dirname "$0")/../.."
SRC=$(pwd)
BUILD_DIR=$(realpath "${BUILD_DIR:-build}")
NICS=${NICS:-64}
REQUESTS=${REQUESTS:-20}
CLASS=Orvane_EthernetPort
for tool in orv-cimhost orv-simgen; do
  [ -x "$BUILD_DIR/bin/$tool" ] || { echo "missing $BUILD_DIR/bin/$tool: build it first" >&2; exit 1; }
done
command -v valgrind >/dev/null || { echo "valgrind is needed" >&2; exit 1; }

RUN=$(mktemp -d "${TMPDIR:-/tmp}/orv-profile.XXXXXX")
HOST_PID=
cleanup() {
  [ -n "$HOST_PID" ] && { kill -TERM "$HOST_PID" 2>/dev/null; wait "$HOST_PID" 2>/dev/null || true; }
  if [ -n "${KEEP:-}" ]; then mkdir -p "$KEEP" && cp "$RUN"/cg.* "$KEEP"/ 2>/dev/null || true; fi
  rm -rf "$RUN"
}
trap cleanup EXIT

"$BUILD_DIR/bin/orv-simgen" --nics "$NICS" -o "$RUN/host.json"
SYSTEM=$(grep -o '"fqdn": *"[^"]*"' "$RUN/host.json" | head -1 | sed 's/.*"\([^"]*\)"$/\1/')

: >"$RUN/host.log"
ORV_ROOT=$SRC/tests/e2e/data/root valgrind --tool=callgrind --instr-atstart=no \
  --callgrind-out-file="$RUN/cg.%p" "$BUILD_DIR/bin/orv-cimhost" --port 0 --threads 2 \
  --provider-dir "$BUILD_DIR/lib" --platform sim --fixture "$RUN/host.json" 2>"$RUN/host.log" &
HOST_PID=$!
for _ in $(seq 600); do grep -q "listening on" "$RUN/host.log" && break; sleep 0.1; done
PORT=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$RUN/host.log" | head -1)
[ -n "$PORT" ] || { cat "$RUN/host.log" >&2; exit 1; }

call() {  # call METHOD PARAMS: one intrinsic method call, the answer's size in bytes on stdout
  curl -s -o "$RUN/answer.xml" -w '%{size_download}\n' -X POST http://127.0.0.1:"$PORT"/cimom \
    -H 'Content-Type: application/xml; charset="utf-8"' -H 'CIMOperation: MethodCall' \
    -H "CIMMethod: $1" -H 'CIMObject: root%2Fcimv2' --data-binary @- <<EOF
<?xml version="1.0" encoding="utf-8"?><CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="1" PROTOCOLVERSION="1.0"><SIMPLEREQ><IMETHODCALL NAME="$1"><LOCALNAMESPACEPATH><NAMESPACE NAME="root"/><NAMESPACE NAME="cimv2"/></LOCALNAMESPACEPATH>$2</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>
EOF
}
kb() { printf '<KEYBINDING NAME="%s"><KEYVALUE VALUETYPE="string">%s</KEYVALUE></KEYBINDING>' "$1" "$2"; }
EI_PARAMS="<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"$CLASS\"/></IPARAMVALUE>"
GI_PARAMS="<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"$CLASS\">$(kb DeviceID vmnic0)$(kb CreationClassName $CLASS)$(kb SystemCreationClassName OMC_UnitaryComputerSystem)$(kb SystemName "$SYSTEM")</INSTANCENAME></IPARAMVALUE>"

# Warm-up: the first request loads the providers and fills the caches.
call EnumerateInstances "$EI_PARAMS" >/dev/null
call GetInstance "$GI_PARAMS" >/dev/null
INSTANCES=$(grep -o '<VALUE.NAMEDINSTANCE>' <(call EnumerateInstances "$EI_PARAMS" >/dev/null; cat "$RUN/answer.xml") | wc -l)
grep -q '<INSTANCE ' <(call GetInstance "$GI_PARAMS" >/dev/null; cat "$RUN/answer.xml") \
  || { echo "GetInstance failed: $(head -c 400 "$RUN/answer.xml")" >&2; exit 1; }

# One counting window per kind of request: instrumentation on, the requests, a dump, off.
window() {  # window NAME METHOD PARAMS
  callgrind_control -i on "$HOST_PID" >/dev/null 2>&1
  callgrind_control -z "$HOST_PID" >/dev/null 2>&1
  for _ in $(seq "$REQUESTS"); do call "$2" "$3" >/dev/null; done
  callgrind_control -d "$1" "$HOST_PID" >/dev/null 2>&1
  callgrind_control -i off "$HOST_PID" >/dev/null 2>&1
}
window enumerate EnumerateInstances "$EI_PARAMS"
window getinstance GetInstance "$GI_PARAMS"

# The parts: inclusive instructions of the first function matching each pattern.
PARTS=(
  "provider fill (incl. setProperty)|fillEPInstance"
  "binding+core setProperty|CmpiInstance::setProperty"
  "writer: instance|orv::cimxml::writeInstance\\("
  "writer: instance name|orv::cimxml::writeInstanceName"
  "request parsing|orv::cimxml::parseRequest"
)
report() {  # report FILE PER LABEL
  local file=$1 per=$2 label=$3 total
  callgrind_annotate --inclusive=yes --threshold=100 "$file" 2>/dev/null >"$RUN/annotate.txt"
  total=$(awk '/PROGRAM TOTALS/ { gsub(",", "", $1); print $1 }' "$RUN/annotate.txt")
  printf "%-34s %12.0f\n" "whole process per $label" "$(awk -v t="$total" -v n="$per" 'BEGIN { print t / n }')"
  for part in "${PARTS[@]}"; do
    local name=${part%%|*} pattern=${part#*|} count
    count=$(grep -E "$pattern" "$RUN/annotate.txt" | head -1 | awk '{ gsub(",", "", $1); print $1 }' || true)
    [ -n "$count" ] && printf "  %-32s %12.0f\n" "$name" "$(awk -v t="$count" -v n="$per" 'BEGIN { print t / n }')"
  done
  return 0
}
kill -TERM "$HOST_PID"; wait "$HOST_PID" 2>/dev/null || true; HOST_PID=
# Dumps are numbered in order: .1 the enumerations, .2 the GetInstance requests.
ENUM_FILE=$(ls "$RUN"/cg.*.1)
GI_FILE=$(ls "$RUN"/cg.*.2)
echo "instructions ($REQUESTS requests each, $INSTANCES ports per enumeration)"
echo "EnumerateInstances $CLASS:"
report "$ENUM_FILE" $((REQUESTS * INSTANCES)) "instance"
echo "GetInstance $CLASS vmnic0:"
report "$GI_FILE" "$REQUESTS" "request"
