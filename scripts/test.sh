#!/usr/bin/env bash
# Builds the project and runs every test with ctest.
#   BUILD_DIR=build-asan CMAKE_ARGS=-DORV_SANITIZE=address scripts/test.sh
# Extra arguments go to ctest (e.g. -R Abi). Tests labelled `soak` (a minute
# each) run only with ORV_TEST_SOAK=1.
set -euo pipefail
cd "$(dirname "$0")/.."
export BUILD_DIR=${BUILD_DIR:-build}
# shellcheck disable=SC2086
scripts/build.sh ${CMAKE_ARGS:-}
cd "$BUILD_DIR"
soak=(-LE soak)
if [ "${ORV_TEST_SOAK:-0}" = 1 ]; then soak=(); fi
ctest --output-on-failure -j "${JOBS:-$(nproc)}" "${soak[@]}" "$@"
