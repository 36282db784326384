#!/usr/bin/env bash
# Configures and builds the project into build/ (or $BUILD_DIR).
# Extra arguments are passed to cmake's configure step, e.g. -DORV_SANITIZE=address.
set -euo pipefail
cd "$(dirname "$0")/.."
BUILD_DIR=${BUILD_DIR:-build}
JOBS=${JOBS:-$(nproc)}
cmake -S . -B "$BUILD_DIR" -G Ninja -DCMAKE_BUILD_TYPE=${BUILD_TYPE:-RelWithDebInfo} "$@" >/dev/null
cmake --build "$BUILD_DIR" -j "$JOBS"
