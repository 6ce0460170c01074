#!/usr/bin/env bash
# Runs the C++ test suite on 32-bit ARM (armv7-a, hard-float, NEON): installs what is missing,
# fetches the armhf libraries into build-armhf/sysroot, cross-builds with
# cmake/toolchains/armhf.cmake and runs every test binary under qemu-arm through CTest, which
# prints the summary and fails when any test fails. The Java tests are not part of it: they need
# a JVM of the target's architecture.
#   scripts/test-armhf.sh            build-armhf/, every C++ test
#   scripts/test-armhf.sh --bench    also build the benchmarks and run them once under qemu
#                                    (emulated timings: not those of a phone)
set -euo pipefail
cd "$(dirname "$0")/.."

bench=OFF
for arg in "$@"; do
  case "$arg" in
    --bench) bench=ON ;;
    *) echo "test-armhf.sh: unknown option $arg" >&2; exit 2 ;;
  esac
done

scripts/install-deps.sh

dir=build-armhf
scripts/armhf-sysroot.sh "$dir/sysroot"

jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B "$dir" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/armhf.cmake" \
  -DORZAVS_ARMHF_SYSROOT="$PWD/$dir/sysroot" -DORZAVS_WERROR=ON -DORZAVS_GTEST_FROM_SOURCE=ON \
  -DORZAVS_BUILD_BENCH="$bench" >/dev/null
cmake --build "$dir" -j "$jobs"
ctest --test-dir "$dir" --output-on-failure --no-tests=error -j "$jobs"

if [ "$bench" = ON ]; then
  echo "=== benchmarks under qemu-arm (emulated: instruction mix matters, wall times do not transfer to a device)"
  emulator=(qemu-arm -L /usr/arm-linux-gnueabihf -E "LD_LIBRARY_PATH=$PWD/$dir/sysroot/usr/lib/arm-linux-gnueabihf")
  found=0
  while IFS= read -r exe; do
    found=1
    echo "--- $exe"
    "${emulator[@]}" "$exe"
  done < <(find "$dir/bench" -maxdepth 2 -type f -perm -u+x -name '*bench*' 2>/dev/null | sort)
  [ "$found" = 1 ] || echo "no benchmark executables were built"
fi
