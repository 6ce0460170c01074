#!/usr/bin/env bash
# Runs the C++ test suite on 32-bit ARM (armv7-a, hard-float, NEON): installs what is missing,
# fetches the armhf libraries into build-armhf/sysroot, cross-builds with
# cmake/toolchains/armhf.cmake and runs every test binary under qemu-arm through CTest, which
# prints the summary and fails when any test fails; then checks the Android configuration
# (scripts/check-android.sh). The Java tests are not part of it: they need a JVM of the target's
# architecture.
#   scripts/test-armhf.sh                      build-armhf/, every C++ test
#   scripts/test-armhf.sh --bench [ARGS...]    then also the benchmark program under qemu-arm,
#                                              ARGS passed on (e.g. --bench fast --frames 640x480)
# Benchmark times under qemu are those of an emulator on this machine, not of a phone: compare
# the NEON and scalar columns with each other, never with a device (scripts/insn-count.sh counts
# instructions instead).
set -euo pipefail
cd "$(dirname "$0")/.."

bench=OFF
bench_args=()
if [ $# -gt 0 ]; then
  case "$1" in
    --bench) bench=ON; shift; bench_args=("$@") ;;
    *) echo "test-armhf.sh: unknown option $1" >&2; exit 2 ;;
  esac
fi

scripts/install-deps.sh

dir=build-armhf
scripts/armhf-sysroot.sh "$dir/sysroot"

jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B "$dir" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/armhf.cmake" \
  -DORZAVS_ARMHF_SYSROOT="$PWD/$dir/sysroot" -DORZAVS_WERROR=ON -DORZAVS_GTEST_FROM_SOURCE=ON \
  -DORZAVS_BUILD_BENCH="$bench" >/dev/null
cmake --build "$dir" -j "$jobs"
ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs"

scripts/check-android.sh

if [ "$bench" = ON ]; then
  echo "=== orzavs_bench under qemu-arm (emulated times: not a device's)"
  qemu-arm -L /usr/arm-linux-gnueabihf -E "LD_LIBRARY_PATH=$PWD/$dir/sysroot/usr/lib/arm-linux-gnueabihf" \
    "$dir/bench/orzavs_bench" "${bench_args[@]}"
fi
