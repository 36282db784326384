#!/usr/bin/env bash
# The Debian packages end to end:
#   package_test.sh SOURCE_DIR BUILD_DIR
# builds them (scripts/build-packages.sh; ORV_PACKAGE_DIR=DIR takes them from DIR), runs lintian, installs them with dpkg -i, runs the
# installed orv-cimhost on a free port and queries it with wbemcli, verifies the unit with
# systemd-analyze, registers the installed library into a copy of the test sfcb with the
# installed orv-sfcb-register and queries it there, unregisters it, then purges the packages
# and checks that none of their files is left. Needs root (exit 77, skipped, otherwise).
set -euo pipefail
src=$(realpath "${1:?SOURCE_DIR}")
build=$(realpath "${2:?BUILD_DIR}")
work=$build/package-test
packages=(orvprovider orv-cimhost)

if [ "$(id -u)" -ne 0 ]; then
    echo "installing packages needs root: skipped"
    exit 77
fi

fail() {
    echo "FAILED: $*" >&2
    exit 1
}

free_port() {
    python3 -c 'import socket; s = socket.socket(); s.bind(("127.0.0.1", 0)); print(s.getsockname()[1])'
}

host_pid=""
sfcb_prefix=""
sfcb_scripts=""
cleanup() {
    [ -n "$host_pid" ] && kill -KILL "$host_pid" 2>/dev/null
    [ -n "$sfcb_prefix" ] && "$sfcb_scripts/sfcb-run.sh" stop "$sfcb_prefix" >/dev/null 2>&1
    dpkg --purge "${packages[@]}" >/dev/null 2>&1 || true
}
trap cleanup EXIT

rm -rf "$work"
mkdir -p "$work"
version=$(sed -n 's/^project([^)]*VERSION \([0-9.]*\).*/\1/p' "$src/CMakeLists.txt")

# ORV_PACKAGE_DIR takes the packages scripts/build-packages.sh put there instead of building
# them again (when working on the steps after the build).
debs_dir=${ORV_PACKAGE_DIR:-$work/debs}
if [ -z "${ORV_PACKAGE_DIR:-}" ]; then
    echo "== building the packages"
    "$src/scripts/build-packages.sh" "$debs_dir" >"$work/build.log" 2>&1 ||
        { tail -n 40 "$work/build.log"; fail "package build"; }
fi
debs=()
for package in "${packages[@]}"; do
    debs+=("$debs_dir/${package}_${version}_$(dpkg --print-architecture).deb")
done

echo "== lintian"
lintian --fail-on error,warning --suppress-tags debug-file-with-no-debug-symbols "${debs[@]}" ||
    fail "lintian reports errors or warnings"

echo "== installing"
for package in "${packages[@]}"; do
    dpkg -s "$package" >/dev/null 2>&1 && fail "$package is installed already; remove it first"
done
dpkg -i "${debs[@]}"
installed=$(dpkg -L "${packages[@]}" | sort -u)

echo "== the installed orv-cimhost"
[ "$(/usr/sbin/orv-cimhost --version)" = "orv-cimhost $version" ] || fail "orv-cimhost --version"
[ -f /usr/share/man/man8/orv-cimhost.8.gz ] || fail "no man page of orv-cimhost"
: >"$work/host.log"
/usr/sbin/orv-cimhost --port 0 --platform sim --fixture /usr/share/doc/orv-cimhost/examples/host.json \
    2>"$work/host.log" &
host_pid=$!
for _ in $(seq 100); do grep -q "listening on" "$work/host.log" && break; sleep 0.1; done
port=$(sed -n 's/.*listening on [^ ]*:\([0-9]*\).*/\1/p' "$work/host.log")
[ -n "$port" ] || { cat "$work/host.log"; fail "the installed host did not start"; }
answer=$(wbemcli ein "http://localhost:$port/root/cimv2:Orvane_EthernetPort")
grep -q 'Orvane_EthernetPort.*DeviceID="vmnic0"' <<<"$answer" || fail "wbemcli through the installed host: $answer"
# The companion library is served by default: the computer system every path names.
answer=$(wbemcli ein "http://localhost:$port/root/cimv2:OMC_UnitaryComputerSystem")
grep -q 'OMC_UnitaryComputerSystem.*CreationClassName="OMC_UnitaryComputerSystem"' <<<"$answer" ||
    fail "no computer system through the installed host: $answer"
kill -TERM "$host_pid"
wait "$host_pid" || fail "the installed host did not stop cleanly"
host_pid=""

echo "== systemd-analyze verify"
verify=$(systemd-analyze verify /lib/systemd/system/orv-cimhost.service 2>&1) || fail "systemd-analyze: $verify"
[ -z "$verify" ] || fail "systemd-analyze: $verify"

echo "== registering with sfcb"
read -r pristine sfcb_scripts < <("$src/tests/e2e/sfcb/sfcb_broker.sh" paths "$build" "$src")
[ -n "${sfcb_scripts:-}" ] || fail "no sfcb to register with: $(cat "$build/sfcb/unavailable" 2>/dev/null)"
sfcb_port=$(free_port)
cp -a "$pristine" "$work/sfcb"
sfcb_prefix=$work/sfcb
# sfcb.cfg as an administrator keeps it: loopback, no authentication, sfcb's own provider folders.
cat >"$sfcb_prefix/etc/sfcb/sfcb.cfg" <<CFG
enableHttp: true
httpPort: $sfcb_port
httpLocalOnly: true
doBasicAuth: false
enableHttps: false
enableInterOp: true
registrationDir: $sfcb_prefix/var/lib/sfcb/registration
providerDirs: $sfcb_prefix/lib/sfcb $sfcb_prefix/lib $sfcb_prefix/lib/cmpi
CFG
/usr/sbin/orv-sfcb-register --prefix "$sfcb_prefix" register
grep -Eq '^providerDirs:.* /usr/lib/[^ ]+/cmpi$' "$sfcb_prefix/etc/sfcb/sfcb.cfg" ||
    fail "providerDirs does not name the library's folder: $(grep providerDirs "$sfcb_prefix/etc/sfcb/sfcb.cfg")"
ORV_PLATFORM=sim ORV_SIM_FIXTURE=/usr/share/doc/orv-cimhost/examples/host.json SFCB_PORT=$sfcb_port \
    "$sfcb_scripts/sfcb-run.sh" start "$sfcb_prefix"
answer=$(wbemcli ein "http://localhost:$sfcb_port/root/cimv2:Orvane_EthernetPort" 2>&1 || true)
system=$(wbemcli ein "http://localhost:$sfcb_port/root/cimv2:OMC_UnitaryComputerSystem" 2>&1 || true)
"$sfcb_scripts/sfcb-run.sh" stop "$sfcb_prefix"
grep -q 'Orvane_EthernetPort.*DeviceID="vmnic0"' <<<"$answer" || fail "wbemcli through sfcb: $answer"
grep -q 'OMC_UnitaryComputerSystem.*CreationClassName="OMC_UnitaryComputerSystem"' <<<"$system" ||
    fail "no computer system through sfcb: $system"

echo "== unregistering"
/usr/sbin/orv-sfcb-register --prefix "$sfcb_prefix" unregister
# sfcbrepos keeps the previous repository beside the new one (*.previous): only the new counts.
for file in registration/providerRegister registration/repository/root/cimv2/classSchemas; do
    for class in Orvane_EthernetPort Orvane_DiskDrive; do
        [ -f "$sfcb_prefix/var/lib/sfcb/$file" ] && grep -q "$class" "$sfcb_prefix/var/lib/sfcb/$file" &&
            fail "$class is still in $file"
    done
done
[ -e "$sfcb_prefix/var/lib/sfcb/stage/mofs/root/cimv2/EthernetPort.mof" ] && fail "the class files are still staged"
sfcb_prefix=""

echo "== purging"
dpkg --purge "${packages[@]}"
left=""
while read -r path; do
    # Folders other packages share (/usr/bin, /usr/share/man/man1, ...) stay.
    [ -d "$path" ] && continue
    [ -e "$path" ] && left="$left $path"
done <<<"$installed"
for dir in /etc/orv-cimhost /var/lib/orv-cimhost /usr/share/orvprovider /usr/share/doc/orv-cimhost; do
    [ -e "$dir" ] && left="$left $dir"
done
[ -z "$left" ] || fail "left after the purge:$left"
echo "== passed"
