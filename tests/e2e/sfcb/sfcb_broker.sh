#!/usr/bin/env bash
# Runs the stock sfcb broker with the project's provider library, for the two-broker tests.
#   sfcb_broker.sh prepare BUILD_DIR SOURCE_DIR           make sure an sfcb prefix exists: the one
#                                                          ORV_SFCB_PREFIX names, else BUILD_DIR/sfcb/prefix,
#                                                          built there once with the sfcb build script
#   sfcb_broker.sh start BUILD_DIR SOURCE_DIR RUN_DIR [FIXTURE]
#                                                          copy the prefix to RUN_DIR/prefix (staging writes
#                                                          into it), stage liborvprovider.so with the
#                                                          library's own MOF files and registration file, and
#                                                          start sfcbd on a free port (RUN_DIR/port) on the
#                                                          simulated host FIXTURE (default: the shipped one),
#                                                          with ORV_ROOT=$ORV_SFCB_ROOT when that is set
#                                                          (default: tests/e2e/data/root)
#   sfcb_broker.sh stop BUILD_DIR SOURCE_DIR RUN_DIR      stop that sfcbd and everything it started
# start stages more beside the library when the tests name it (space-separated lists):
#   ORV_SFCB_EXTRA_LIBRARIES      further provider libraries (lib<location>.so)
#   ORV_SFCB_EXTRA_REGISTRATIONS  their registration files
#   ORV_SFCB_EXTRA_MOFS           their class files
#   ORV_SFCB_SCHEMA_MOFS          schema files (relative to the prefix's share/sfcb/CIM) of DMTF
#                                 classes a provider serves itself: sfcb keeps only the schema
#                                 classes that a staged file defines or derives from
# The sfcb sources and scripts are looked up in ORV_SFCB_SOURCE, else next to the repository
# (../shared/sfcb, ../../shared/sfcb for a worktree). When sfcb is not available, prepare and
# start write the reason to BUILD_DIR/sfcb/unavailable and exit 0, so that the tests can report
# it; with CI=true they fail instead (exit 1), since CI must run the two-broker tests.
set -euo pipefail
cmd=${1:?usage: sfcb_broker.sh prepare|start|stop BUILD_DIR SOURCE_DIR [RUN_DIR [FIXTURE]]}
build=$(realpath "${2:?BUILD_DIR}"); src=$(realpath "${3:?SOURCE_DIR}")
base=$build/sfcb
mkdir -p "$base"

sfcb_scripts() {
    local d
    for d in "${ORV_SFCB_SOURCE:-}" "$src/../shared/sfcb" "$src/../../shared/sfcb"; do
        if [ -n "$d" ] && [ -x "$d/build.sh" ] && [ -x "$d/sfcb-run.sh" ]; then realpath "$d"; return 0; fi
    done
    return 1
}

unavailable() {
    echo "$1" > "$base/unavailable"
    echo "sfcb unavailable: $1" >&2
    if [ "${CI:-}" = "true" ]; then exit 1; fi
    exit 0
}

# The prefix every run copies: ORV_SFCB_PREFIX, or one built into the build folder once.
pristine_prefix() {
    if [ -n "${ORV_SFCB_PREFIX:-}" ]; then
        [ -x "$ORV_SFCB_PREFIX/sbin/sfcbd" ] || unavailable "ORV_SFCB_PREFIX=$ORV_SFCB_PREFIX holds no sbin/sfcbd"
        realpath "$ORV_SFCB_PREFIX"; return 0
    fi
    if [ ! -x "$base/prefix/sbin/sfcbd" ]; then
        local scripts
        scripts=$(sfcb_scripts) || unavailable "no sfcb sources: set ORV_SFCB_SOURCE to the folder of build.sh"
        rm -rf "$base/prefix"
        if ! "$scripts/build.sh" "$base/prefix" "$base/prefix.build" > "$base/build.log" 2>&1; then
            rm -rf "$base/prefix"
            unavailable "building sfcb failed, see $base/build.log: $(tail -n 3 "$base/build.log" | tr '\n' ' ')"
        fi
        rm -rf "$base/prefix.build"
    fi
    echo "$base/prefix"
}

# The library's own class files: what orvprovider.mof includes, less the CIM parents (sfcb
# brings the DMTF schema itself).
library_mof_files() {
    sed -n 's/^#pragma include *( *"\([^"]*\)" *).*/\1/p' "$src/cim/mof/orvprovider.mof" |
        grep -v '^cim/' | sed "s|^|$src/cim/mof/|"
}

free_port() {
    python3 -c 'import socket; s = socket.socket(); s.bind(("127.0.0.1", 0)); print(s.getsockname()[1])'
}

case $cmd in
prepare)
    rm -f "$base/unavailable"
    pristine_prefix > /dev/null ;;
start)
    run=$(realpath -m "${4:?RUN_DIR}")
    fixture=$(realpath "${5:-$src/platform/sim/examples/host.json}")
    rm -f "$base/unavailable" "$run/port"
    scripts=$(sfcb_scripts) || unavailable "no sfcb scripts: set ORV_SFCB_SOURCE to the folder of sfcb-run.sh"
    prefix=$(pristine_prefix)
    # An unavailable sfcb outside CI: the reason is written, the tests skip.
    [ -f "$base/unavailable" ] && exit 0
    [ -f "$run/prefix/log/sfcbd.pid" ] && "$scripts/sfcb-run.sh" stop "$run/prefix"
    rm -rf "$run"; mkdir -p "$run/providers"
    cp -a "$prefix" "$run/prefix"
    read -ra libraries <<< "${ORV_SFCB_EXTRA_LIBRARIES:-}"
    read -ra registrations <<< "${ORV_SFCB_EXTRA_REGISTRATIONS:-}"
    read -ra extra_mofs <<< "${ORV_SFCB_EXTRA_MOFS:-}"
    read -ra schema_mofs <<< "${ORV_SFCB_SCHEMA_MOFS:-}"
    cp "$build/lib/liborvprovider.so" "${libraries[@]}" "$run/providers/"
    mapfile -t mofs < <(library_mof_files)
    mofs+=("${extra_mofs[@]}")
    for mof in "${schema_mofs[@]}"; do mofs+=("$run/prefix/share/sfcb/CIM/$mof"); done
    # One registration file: the library's blocks, then the further providers'.
    for reg in "$src/cim/mof/orvprovider.reg" "${registrations[@]}"; do cat "$reg"; echo; done \
        > "$run/providers.reg"
    port=$(free_port)
    SFCB_PORT=$port "$scripts/sfcb-run.sh" stage "$run/prefix" "$run/providers" \
        "$run/providers.reg" "${mofs[@]}" > "$run/stage.log" 2>&1 ||
        { cat "$run/stage.log" >&2; exit 1; }
    ORV_PLATFORM=sim ORV_SIM_FIXTURE=$fixture ORV_ROOT=${ORV_SFCB_ROOT:-$src/tests/e2e/data/root} SFCB_PORT=$port \
        "$scripts/sfcb-run.sh" start "$run/prefix"
    curl -s -o /dev/null "http://127.0.0.1:$port/" || { echo "sfcbd did not answer on port $port" >&2; exit 1; }
    echo "$port" > "$run/port" ;;
stop)
    run=$(realpath -m "${4:?RUN_DIR}")
    scripts=$(sfcb_scripts) || exit 0
    [ -f "$run/port" ] || exit 0
    # The suite must end with sfcb up: a broker that died on the way fails the clean-up.
    alive=true
    kill -0 "$(cat "$run/prefix/log/sfcbd.pid" 2>/dev/null)" 2>/dev/null || alive=false
    "$scripts/sfcb-run.sh" stop "$run/prefix"
    rm -f "$run/port"
    if [ "$alive" = false ]; then echo "sfcbd was no longer running at the end" >&2; exit 1; fi ;;
*) echo "unknown command $cmd" >&2; exit 2 ;;
esac
