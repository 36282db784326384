#!/usr/bin/env bash
# Builds the Debian packages (orvprovider, orv-cimhost) from a copy of the source tree.
#   scripts/build-packages.sh OUTDIR
# The version is the one of project() in the top CMakeLists.txt: debian/changelog is written
# from it. The .deb files (and the .changes and .buildinfo) land in OUTDIR.
set -euo pipefail
src=$(cd "$(dirname "$0")/.." && pwd)
out=$(mkdir -p "${1:?usage: build-packages.sh OUTDIR}" && cd "$1" && pwd)
version=$(sed -n 's/^project([^)]*VERSION \([0-9.]*\).*/\1/p' "$src/CMakeLists.txt")
[ -n "$version" ] || { echo "build-packages.sh: no version in project() of CMakeLists.txt" >&2; exit 1; }

# dpkg-buildpackage writes into debian/ and puts the packages beside the source folder.
tree=$out/orvprovider-$version
rm -rf "$tree"
mkdir -p "$tree"
tar -C "$src" --exclude='./build*' --exclude=./.git --exclude='./obj-*' -cf - . | tar -C "$tree" -xf -
cat >"$tree/debian/changelog" <<CHANGELOG
orvprovider ($version) unstable; urgency=medium

  * Release $version.

 -- orvprovider developers <orvprovider-dev@orvane.example.org>  $(date -R -d @"${SOURCE_DATE_EPOCH:-$(date +%s)}")
CHANGELOG
# A compiler cache keeps its folder although debhelper gives the build a HOME of its own.
if [ -n "${CMAKE_CXX_COMPILER_LAUNCHER:-}" ] && command -v ccache >/dev/null; then
    export CCACHE_DIR=${CCACHE_DIR:-$(ccache -k cache_dir)}
fi
(cd "$tree" && dpkg-buildpackage -b -us -uc -j"${JOBS:-$(nproc)}")
rm -rf "$tree"
ls "$out"/*.deb
