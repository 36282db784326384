#!/usr/bin/env bash
# Sets up a fresh Debian 12 machine (packages, build) and starts the embedded CIM host
# serving liborvprovider.so on 127.0.0.1:5988. Arguments are passed to orv-cimhost.
set -euo pipefail
cd "$(dirname "$0")/.."
scripts/install-deps.sh
scripts/build.sh
exec build/bin/orv-cimhost "$@"
