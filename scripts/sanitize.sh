#!/usr/bin/env bash
# Builds the whole tree with AddressSanitizer+UBSan (build-asan) and with
# ThreadSanitizer (build-tsan), and runs every ctest test in each.
# Arguments go to ctest (e.g. -R binding_). Any sanitizer report fails the run.
set -euo pipefail
cd "$(dirname "$0")/.."
export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1}
export UBSAN_OPTIONS=${UBSAN_OPTIONS:-print_stacktrace=1:halt_on_error=1}
export TSAN_OPTIONS=${TSAN_OPTIONS:-halt_on_error=1:second_deadlock_stack=1}
for kind in address thread; do
  dir=build-${kind:0:1}san
  BUILD_DIR=$dir CMAKE_ARGS=-DORV_SANITIZE=$kind scripts/test.sh "$@"
done
