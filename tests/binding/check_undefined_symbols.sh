#!/usr/bin/env bash
# Checks that a provider library depends at load time only on the C library,
# the C++ runtime and the sanitizer runtimes of a sanitizer build: every
# undefined dynamic symbol must carry a GLIBC, GLIBCXX, CXXABI or GCC version,
# be weak, or belong to a sanitizer runtime. Prints offenders and fails.
set -euo pipefail
lib=$1
symbols=$(nm -D --undefined-only "$lib")
# A sanitizer runtime the library needs interposes C library and C++ runtime
# functions (memcpy, operator new, ...); the linker binds those unversioned.
interposed=$(ldd "$lib" | awk '$1 ~ /^lib(asan|tsan|ubsan|lsan)\.so/ { print $3 }' |
  xargs -r nm -D --defined-only | awk '{ sub(/@.*/, "", $NF); print $NF }' | sort -u)
offenders=$(echo "$symbols" |
  awk '$1 != "w" && $1 != "v" { print $NF }' |
  grep -Ev '@(GLIBC|GLIBCXX|CXXABI|GCC)_[0-9.]+$' |
  grep -Ev '^__(asan|ubsan|tsan|lsan|sanitizer)_' |
  grep -vxF -f <(echo "$interposed") || true)
if [ -n "$offenders" ]; then
  echo "undefined symbols outside the C library and the C++ runtime in $lib:"
  echo "$offenders"
  exit 1
fi
echo "$lib: no undefined symbols beyond the C library and the C++ runtime"
