#!/usr/bin/env bash
# Runs the library on 32-bit ARM (armv7-a, hard-float, NEON) under qemu-arm: installs what is
# missing, fetches the armhf libraries and Debian's armhf OpenJDK 17 into build-armhf/sysroot,
# cross-builds with cmake/toolchains/armhf.cmake (the Java classes are compiled on this machine,
# the same jars as the x86-64 build) and then, all under qemu-arm:
#   - every C++ test binary and every JUnit suite of the build through CTest (the Java suites on
#     the ARM JVM against the armhf libOrzaVSMobile.so, with -Xcheck:jni; any JNI warning fails);
#   - the scanning tool on its built-in scene with the built-in reference server, when the
#     tools are built: the reference server needs OpenCV's JNI library, which Debian ships for
#     the host only, so the ARM build has no vsserver/vsscan today;
#   - with --soak, the soak through the Java binding (the same accounting as scripts/soak.sh)
#     for 2 minutes (not in CI yet: under emulation its bookkeeping can count a stale reply that
#     arrives while the next request is being sent, and report that request as lost);
# and checks the Android configuration (scripts/check-android.sh).
#   scripts/test-armhf.sh                      all of the above in build-armhf/
#   scripts/test-armhf.sh --cpp                the C++ tests only
#   scripts/test-armhf.sh --soak               also the 2-minute soak on the ARM JVM
#   scripts/test-armhf.sh --bench [ARGS...]    then also the benchmark program under qemu-arm,
#                                              ARGS passed on (e.g. --bench fast --frames 640x480)
# The ARM JVM runs 3 to 10 times slower than the host's: the Java part takes a few minutes.
# Benchmark times under qemu are those of an emulator on this machine, not of a phone: compare
# the NEON and scalar columns with each other, never with a device (scripts/insn-count.sh counts
# instructions instead).
set -euo pipefail
cd "$(dirname "$0")/.."

bench=OFF
bench_args=()
java=1
soak=0
soak_seconds=120
if [ $# -gt 0 ]; then
  case "$1" in
    --bench) bench=ON; shift; bench_args=("$@") ;;
    --cpp) java=0 ;;
    --soak) soak=1 ;;
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
start=$SECONDS
if [ "$java" = 1 ]; then
  # The soak runs below, longer than its CTest default.
  ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs" -LE soak
  ctest --test-dir "$dir" -N -L java | grep -q "Total Tests: [1-9]" ||
    { echo "test-armhf.sh: no Java suite in the ARM build (is junit5 installed?)" >&2; exit 1; }
else
  ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs" -LE "java|soak"
fi

if [ "$java" = 1 ]; then
  if [ -x "$dir/bin/vsscan" ]; then
    echo "=== the scanning tool's built-in scene on the ARM JVM"
    t=$SECONDS
    "$dir/bin/vsscan" --quiet --no-progress --out "$dir/scan-report"
    echo "test-armhf.sh: scan passed in $((SECONDS - t)) s (report: $dir/scan-report)"
  else
    echo "test-armhf.sh: no scan on ARM (the reference server needs OpenCV's JNI library, host-only in Debian)"
  fi
  if [ "$soak" = 1 ]; then
    echo "=== the soak on the ARM JVM, $soak_seconds s"
    "$dir/bin/soak" "$soak_seconds"
  fi
  echo "test-armhf.sh: the ARM part took $(((SECONDS - start) / 60)) min $(((SECONDS - start) % 60)) s"
fi

scripts/check-android.sh

if [ "$bench" = ON ]; then
  echo "=== orzavs_bench under qemu-arm (emulated times: not a device's)"
  qemu-arm -L /usr/arm-linux-gnueabihf -E "LD_LIBRARY_PATH=$PWD/$dir/sysroot/usr/lib/arm-linux-gnueabihf" \
    "$dir/bench/orzavs_bench" "${bench_args[@]}"
fi
