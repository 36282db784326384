#!/usr/bin/env bash
# Builds the project and runs every test with ctest.
#   BUILD_DIR=build-asan CMAKE_ARGS=-DORV_SANITIZE=address scripts/test.sh
# Extra arguments go to ctest (e.g. -R Abi).
set -euo pipefail
cd "$(dirname "$0")/.."
export BUILD_DIR=${BUILD_DIR:-build}
# shellcheck disable=SC2086
scripts/build.sh ${CMAKE_ARGS:-}
cd "$BUILD_DIR"
ctest --output-on-failure -j "${JOBS:-$(nproc)}" "$@"
