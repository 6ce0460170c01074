#!/usr/bin/env bash
# Runs every test of the project on this machine: installs what is missing, builds, and runs the
# C++ and Java suites through CTest, which prints the summary and fails when any test fails.
#   scripts/test.sh                       normal build (build/)
#   scripts/test.sh --sanitize asan       whole suite under AddressSanitizer + UBSan (build-asan/)
#   scripts/test.sh --sanitize tsan       concurrency tests under ThreadSanitizer (build-tsan/)
#                                         built with clang, which also proves the locking
#                                         annotations (-Wthread-safety, as an error)
set -euo pipefail
cd "$(dirname "$0")/.."

mode=""
if [ "${1:-}" = "--sanitize" ]; then mode="${2:?asan or tsan}"; fi

scripts/install-deps.sh

jobs=$(nproc 2>/dev/null || echo 2)
case "$mode" in
  "")   dir=build;      args=(); labels=() ;;
  asan) dir=build-asan; args=(-DORZAVS_SANITIZE=address,undefined -DCMAKE_BUILD_TYPE=Debug); labels=() ;;
  tsan) dir=build-tsan; labels=(-L concurrency)
        args=(-DORZAVS_SANITIZE=thread -DCMAKE_BUILD_TYPE=RelWithDebInfo
              -DCMAKE_C_COMPILER=clang -DCMAKE_CXX_COMPILER=clang++) ;;
  *) echo "test.sh: unknown sanitizer '$mode' (asan or tsan)" >&2; exit 2 ;;
esac

cmake -S . -B "$dir" -G Ninja -DORZAVS_WERROR=ON "${args[@]}" >/dev/null
if [ "$mode" = tsan ]; then
  # Only what runs under ThreadSanitizer (the binaries of the concurrency tests, named as their
  # tests) and the JNI library: all the library's code, compiled by clang with -Wthread-safety.
  mapfile -t targets < <(ctest --test-dir "$dir" -N "${labels[@]}" | sed -n 's/^ *Test *#[0-9]*: //p')
  cmake --build "$dir" -j "$jobs" --target "${targets[@]}" OrzaVSMobile
else
  cmake --build "$dir" -j "$jobs"
fi
export ASAN_OPTIONS="detect_leaks=1:abort_on_error=0:${ASAN_OPTIONS:-}"
export UBSAN_OPTIONS="print_stacktrace=1:halt_on_error=1:${UBSAN_OPTIONS:-}"
export TSAN_OPTIONS="halt_on_error=1:second_deadlock_stack=1:${TSAN_OPTIONS:-}"
ctest --test-dir "$dir" --output-on-failure -j "$jobs" "${labels[@]}"
