#!/usr/bin/env bash
# Instructions the Ethernet port provider and the simulated platform spend per
# port instance, apart from what the broker core charges for storing the
# properties (setProperty) and taking the instance (returnData).
#
#   BUILD_DIR=build NICS=64 bench/providers/ethernet/provider_cost.sh
#
# Runs ethernet_provider_bench --callgrind under callgrind for an enumeration
# of Orvane_EthernetPort (ENUMS requests) and for getInstance of vmnic0 (GETS
# requests) on a simulated host of NICS NICs, then prints, from the calling
# tree, per instance or per request:
#   fill            fillEPInstance, inclusive
#   setProperty     its setProperty calls (the binding and the core)
#   fill - set      the rest: the provider, the platform's NIC calls and the
#                   arrays and strings the provider makes through the binding
# and for the whole provider call the same split of deliverPort or
# getInstance with returnData taken out too.
# The time per instance through the broker core (ns) is the per_instance
# counter of: ethernet_provider_bench --benchmark_filter='BM_Enumerate/0/64|BM_GetOnePort/64/0'
set -euo pipefail
cd "$(dirname "$0")/../../.."
BUILD_DIR=${BUILD_DIR:-build}
NICS=${NICS:-64}
ENUMS=${ENUMS:-10}
GETS=${GETS:-100}
BENCH="$BUILD_DIR/bin/ethernet_provider_bench"
WORK=$(mktemp -d)
trap 'rm -rf "$WORK"' EXIT

# The calling tree of one run: every function with its callees.
tree() {
    valgrind --tool=callgrind --collect-atstart=no --callgrind-out-file="$WORK/$1.out" "$BENCH" --callgrind "$2" "$NICS" "$3" \
        >"$WORK/$1.log" 2>&1
    callgrind_annotate --inclusive=yes --tree=calling --threshold=100 "$WORK/$1.out" 2>/dev/null >"$WORK/$1.tree"
}

# The inclusive cost of the function whose name matches $2 (the first such
# block of the tree), and the summed costs of its callees matching $3 ... ;
# printed as "total callee1 callee2 ...".
costs() {
    local file=$1 function=$2
    shift 2
    awk -v function_re="$function" -v callees="$*" '
        function number(text) { gsub(",", "", text); return text + 0 }
        BEGIN { n = split(callees, pattern, " ") }
        /^ *[0-9,]+ \([ 0-9.%]+\)  \*  / {
            inside = 0
            if (!done && $0 ~ function_re) { total = number($1); inside = 1; done = 1 }
            next
        }
        /^$/ { inside = 0; next }
        inside && /^ *[0-9,]+ \([ 0-9.%]+\)  >   / {
            for (i = 1; i <= n; i++) if ($0 ~ pattern[i]) sum[i] += number($1)
        }
        END {
            line = total
            for (i = 1; i <= n; i++) line = line " " (sum[i] + 0)
            print line
        }' "$file"
}

report() {
    local label=$1 count=$2 total=$3 set=$4 returned=${5:-0}
    awk -v label="$label" -v count="$count" -v total="$total" -v set="$set" -v returned="$returned" 'BEGIN {
        printf "  %-34s %9.0f   setProperty %7.0f   returnData %7.0f   the rest %7.0f\n",
            label, total / count, set / count, returned / count, (total - set - returned) / count }'
}

tree enum Orvane_EthernetPort "$ENUMS"
tree get get:vmnic0 "$GETS"
INSTANCES=$((NICS * ENUMS))

echo "Orvane_EthernetPort on $NICS NICs: instructions per instance ($ENUMS enumerations, $INSTANCES instances)"
read -r fill fillSet < <(costs "$WORK/enum.tree" 'fillEPInstance.*lambda' 'CmpiInstance::setProperty')
report "fillEPInstance" "$INSTANCES" "$fill" "$fillSet"
read -r port portSet portReturned < <(costs "$WORK/enum.tree" 'EthernetPortProvider::deliverPort' \
    'CmpiInstance::setProperty|fillEPInstance' 'returnData')
# fillEPInstance was taken out whole above; put back its share that is not setProperty.
report "deliverPort (one port, all of it)" "$INSTANCES" "$port" "$((portSet - fill + fillSet))" "$portReturned"

echo "getInstance of vmnic0 on $NICS NICs: instructions per request ($GETS requests)"
read -r gfill gfillSet < <(costs "$WORK/get.tree" 'fillEPInstance.*lambda' 'CmpiInstance::setProperty')
report "fillEPInstance" "$GETS" "$gfill" "$gfillSet"
read -r get < <(costs "$WORK/get.tree" 'EthernetPortProvider::getInstance\(CmpiContext')
read -r port portSet portReturned < <(costs "$WORK/get.tree" 'EthernetPortProvider::deliverPort' \
    'CmpiInstance::setProperty|fillEPInstance' 'returnData')
report "getInstance (the provider call)" "$GETS" "$get" "$((portSet - gfill + gfillSet))" "$portReturned"
