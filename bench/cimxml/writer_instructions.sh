#!/usr/bin/env bash
# Instructions per Ethernet port instance of the CIM-XML writer alone (cimxml_writer_bench
# --fixed, counted by callgrind): VALUE.NAMEDINSTANCE in all, what of it the broker core's
# accessors take (object path, property, key and array element reads, string characters),
# and the rest, the writer's own; without and with CLASSORIGIN.
#
#   BUILD_DIR=build bench/cimxml/writer_instructions.sh        (COUNT=1000 instances)
set -euo pipefail
cd "$(dirname "$0")/../.."
BUILD_DIR=${BUILD_DIR:-build}
COUNT=${COUNT:-1000}
BENCH="$BUILD_DIR/bin/cimxml_writer_bench"
[ -x "$BENCH" ] || { echo "missing $BENCH: build it first" >&2; exit 1; }
command -v valgrind >/dev/null || { echo "valgrind is needed" >&2; exit 1; }
RUN=$(mktemp -d "${TMPDIR:-/tmp}/orv-writer.XXXXXX")
trap 'rm -rf "$RUN"' EXIT

ACCESSORS="getObjectPath getPropertyAt getKeyAt getCharPtr getElementAt getClassName getStringFormat getSize getKeyCount getPropertyCount"
per() {  # per PATTERN: inclusive instructions per instance of the first function matching
  grep -E "$1" "$RUN/annotate.txt" | head -1 | awk -v n="$COUNT" '{ gsub(",", "", $1); printf "%.0f", $1 / n }' || true
}
for mode in "" --class-origin; do
  valgrind --tool=callgrind --collect-atstart=no --callgrind-out-file="$RUN/cg.out" \
    "$BENCH" --fixed="$COUNT" $mode >/dev/null 2>&1
  callgrind_annotate --inclusive=yes --threshold=100 "$RUN/cg.out" 2>/dev/null >"$RUN/annotate.txt"
  whole=$(per "cimxml::writeNamedInstance\(")
  core=0
  for accessor in $ACCESSORS; do
    count=$(per "core/src/.*[: ]$accessor\(")
    core=$((core + ${count:-0}))
  done
  echo "VALUE.NAMEDINSTANCE of one port${mode:+ ($mode)}: $whole instructions; core accessors $core; writer $((whole - core))"
done
