#!/usr/bin/env bash
# Installs every Debian package the build, the tests and the benchmarks need.
# Safe to run again; needs root (or sudo) on a Debian 12 machine.
set -euo pipefail

PACKAGES=(
  # toolchain and build
  build-essential cmake ninja-build pkg-config clang libclang-rt-14-dev
  # test and measurement tools
  libgtest-dev libgmock-dev googletest libbenchmark-dev valgrind
  # libraries the project links against
  libboost-dev nlohmann-json3-dev libcpp-httplib-dev libssl-dev libexpat1-dev libmnl-dev libpam0g-dev
  libjemalloc-dev
  # tools the end-to-end and Linux tests drive
  sblim-wbemcli ethtool iproute2 curl procps openssl
  # xmllint: the CIM-XML requests and answers of the tests are checked against the DTD
  libxml2-utils
  # the PAM login test's throwaway account (useradd, chpasswd, userdel)
  passwd
  # the Debian packages and their test (label package): build, lintian, the unit's check
  # (systemd-analyze, which looks the unit's man page up with man)
  debhelper dpkg-dev fakeroot lintian systemd man-db
  # the stock sfcb broker of the two-broker tests (label sfcb), built from source by
  # ../shared/sfcb/build.sh, and its run script (syslog collector, private mount namespace)
  autoconf automake libtool flex bison make gcc libcurl4-openssl-dev zlib1g-dev
  python3 util-linux
)

SUDO=""
if [ "$(id -u)" -ne 0 ]; then SUDO="sudo"; fi
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq
$SUDO apt-get install -y -qq --no-install-recommends "${PACKAGES[@]}"
