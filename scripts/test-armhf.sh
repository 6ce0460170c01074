#!/usr/bin/env bash
# Runs the library on 32-bit ARM (armv7-a, hard-float, NEON) under qemu-arm: installs what is
# missing, fetches the armhf libraries and Debian's armhf OpenJDK 17 into build-armhf/sysroot,
# cross-builds with cmake/toolchains/armhf.cmake (the Java classes are compiled on this machine,
# the same jars as the x86-64 build) and then, all under qemu-arm:
#   - every C++ test binary and every JUnit suite of the build through CTest: the binding's
#     (with its native-thread hook library cross-built) and the scanning tool's, on the ARM JVM
#     against the armhf libOrzaVSMobile.so, with -Xcheck:jni; any JNI warning fails;
#   - the scanning tool on its built-in scene on the ARM JVM, against the reference server on
#     this machine's JVM (vsscan --server): every request must come back with results;
#   - the soak through the Java binding on the ARM JVM for 2 minutes, with the accounting of
#     scripts/soak.sh (nothing lost or duplicated, flat memory, threads and global references);
# and checks the Android configuration (scripts/check-android.sh).
# The split is a phone's: the reference server recognises products with OpenCV's Java binding,
# whose JNI library Debian ships for this machine only, so it runs here (and its own suite in the
# x86-64 build); the servers that the scanning tool's suite starts inside the ARM JVM send their
# product search to one here (tools/with-reference-server.sh).
#   scripts/test-armhf.sh                      all of the above in build-armhf/
#   scripts/test-armhf.sh --cpp                the C++ tests only
#   scripts/test-armhf.sh --bench [ARGS...]    then also the benchmark program under qemu-arm,
#                                              ARGS passed on (e.g. --bench fast --frames 640x480)
# The ARM JVM runs 3 to 10 times slower than the host's: the Java part takes several minutes.
# Benchmark times under qemu are those of an emulator on this machine, not of a phone: compare
# the NEON and scalar columns with each other, never with a device (scripts/insn-count.sh counts
# instructions instead).
set -euo pipefail
cd "$(dirname "$0")/.."

bench=OFF
bench_args=()
java=1
soak_seconds=120
if [ $# -gt 0 ]; then
  case "$1" in
    --bench) bench=ON; shift; bench_args=("$@") ;;
    --cpp) java=0 ;;
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
  for suite in java_binding_tests vsscan_java_tests; do
    ctest --test-dir "$dir" -N -L java -R "^$suite\$" | grep -q "Total Tests: 1" ||
      { echo "test-armhf.sh: no $suite in the ARM build (is junit5 installed?)" >&2; exit 1; }
  done
  # The soak runs below, longer than its CTest default.
  ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs" -LE soak
else
  ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs" -LE "java|soak"
fi

if [ "$java" = 1 ]; then
  [ -x "$dir/bin/vsscan" ] && [ -x "$dir/bin/soak" ] ||
    { echo "test-armhf.sh: the ARM build has no scanning tool or soak (OpenCV's Java binding missing?)" >&2; exit 1; }
  echo "=== the scanning tool's built-in scene on the ARM JVM, the reference server on this machine's"
  t=$SECONDS
  tools/with-reference-server.sh "$dir/bin/vsserver" \
    sh -c 'exec "$0" --server "$ORZAVS_SERVER" --quiet --out "$1"' "$dir/bin/vsscan" "$dir/scan-report"
  echo "test-armhf.sh: scan passed in $((SECONDS - t)) s (report: $dir/scan-report)"
  echo "=== the soak on the ARM JVM, $soak_seconds s"
  t=$SECONDS
  "$dir/bin/soak" "$soak_seconds"
  echo "test-armhf.sh: soak passed in $((SECONDS - t)) s"
  echo "test-armhf.sh: the ARM part took $(((SECONDS - start) / 60)) min $(((SECONDS - start) % 60)) s"
fi

scripts/check-android.sh

if [ "$bench" = ON ]; then
  echo "=== orzavs_bench under qemu-arm (emulated times: not a device's)"
  qemu-arm -L /usr/arm-linux-gnueabihf -E "LD_LIBRARY_PATH=$PWD/$dir/sysroot/usr/lib/arm-linux-gnueabihf" \
    "$dir/bench/orzavs_bench" "${bench_args[@]}"
fi
