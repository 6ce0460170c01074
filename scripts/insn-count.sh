#!/usr/bin/env bash
# Weighs the FAST-9 detector's vector path against its scalar twin by instructions executed per
# call (detection with suppression at threshold 50, one call per frame), which, unlike times,
# do not depend on the machine, its load or an emulator:
#   - 32-bit ARM, NEON vs scalar: the armhf build run under qemu-arm with a small counting plugin
#     (scripts/insn-count/qemu_insn_plugin.c);
#   - x86-64, SSE2 vs scalar (only when valgrind is installed): callgrind's instruction count.
# Instructions are not cycles: a NEON instruction does 16 lanes of work and may take more than
# one cycle on a phone's core. The figures say how much work each path asks for, not the speed.
#   scripts/insn-count.sh                every benchmark frame
#   scripts/insn-count.sh 1280x720       frames whose name contains the text
set -euo pipefail
cd "$(dirname "$0")/.."

filter="${1:-}"
calls=4  # extra calls measured per figure (beyond a first call that also grows the buffers)
jobs=$(nproc 2>/dev/null || echo 2)

scripts/install-deps.sh
scripts/armhf-sysroot.sh build-armhf/sysroot
sysroot="$PWD/build-armhf/sysroot"

arm=build-armhf-insn
cmake -S . -B "$arm" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/armhf.cmake" \
  -DORZAVS_ARMHF_SYSROOT="$sysroot" -DCMAKE_BUILD_TYPE=Release -DORZAVS_BUILD_TESTS=OFF >/dev/null
cmake --build "$arm" -j "$jobs" --target orzavs >"$arm/build.log" || { cat "$arm/build.log"; exit 1; }
# Release flags of the library, and the target flags of the toolchain.
arm-linux-gnueabihf-g++ -std=c++17 -O3 -DNDEBUG -march=armv7-a -mfpu=neon -mfloat-abi=hard -Wno-psabi -I. \
  scripts/insn-count/fast9_insn_driver.cpp bench/BenchFrames.cpp "$arm/liborzavs.a" \
  -L"$sysroot/usr/lib/arm-linux-gnueabihf" -ljpeg -pthread -o "$arm/fast9_insn_driver"
gcc -shared -fPIC -O2 -o "$arm/libqemu_insn_plugin.so" scripts/insn-count/qemu_insn_plugin.c

qemu=(qemu-arm -L /usr/arm-linux-gnueabihf -E "LD_LIBRARY_PATH=$sysroot/usr/lib/arm-linux-gnueabihf"
      -plugin "$PWD/$arm/libqemu_insn_plugin.so" -d plugin)
arm_count() {  # frame path calls -> guest instructions of the whole run
  "${qemu[@]}" "$arm/fast9_insn_driver" "$1" "$2" "$3" 2>&1 | sed -n 's/^guest instructions: //p'
}

x86=""
if command -v valgrind >/dev/null; then
  x86=build-x86-insn
  cmake -S . -B "$x86" -G Ninja -DCMAKE_BUILD_TYPE=Release -DORZAVS_BUILD_TESTS=OFF >/dev/null
  cmake --build "$x86" -j "$jobs" --target orzavs >"$x86/build.log" || { cat "$x86/build.log"; exit 1; }
  g++ -std=c++17 -O3 -DNDEBUG -I. scripts/insn-count/fast9_insn_driver.cpp bench/BenchFrames.cpp \
    "$x86/liborzavs.a" -ljpeg -pthread -o "$x86/fast9_insn_driver"
fi
per_call_arm() {  # frame path -> instructions of one call
  local a b
  a=$(arm_count "$1" "$2" 1)
  b=$(arm_count "$1" "$2" $((1 + calls)))
  echo $(((b - a) / calls))
}
# callgrind counts only inside the detector's calls (inclusive), so one run per figure.
per_call_x86() {
  local n
  n=$(valgrind --tool=callgrind --callgrind-out-file=/dev/null --collect-atstart=no \
        "--toggle-collect=OrzaVSMobile::fast9DetectNonmax*" "$x86/fast9_insn_driver" "$1" "$2" "$calls" 2>&1 |
      sed -n 's/^==[0-9]*== Collected : //p')
  echo $((n / calls))
}

mapfile -t frames < <(printf '%s\n' "640x480 smooth" "640x480 texture" "1280x720 smooth" "1280x720 texture" \
                        "1920x1080 smooth" "1920x1080 texture" | grep -F -- "$filter")
[ ${#frames[@]} -gt 0 ] || { echo "insn-count: no frame matches '$filter'"; exit 2; }

echo "FAST-9 detection with suppression, threshold 50: instructions per call"
printf '%-20s %14s %14s %8s\n' "armv7-a (qemu)" "NEON" "scalar" "ratio"
for f in "${frames[@]}"; do
  v=$(per_call_arm "$f" best)
  s=$(per_call_arm "$f" scalar)
  printf '%-20s %14d %14d %7.2fx\n' "$f" "$v" "$s" "$(awk -v s="$s" -v v="$v" 'BEGIN { print s / v }')"
done
if [ -n "$x86" ]; then
  printf '%-20s %14s %14s %8s\n' "x86-64 (callgrind)" "SSE2" "scalar" "ratio"
  for f in "${frames[@]}"; do
    v=$(per_call_x86 "$f" best)
    s=$(per_call_x86 "$f" scalar)
    printf '%-20s %14d %14d %7.2fx\n' "$f" "$v" "$s" "$(awk -v s="$s" -v v="$v" 'BEGIN { print s / v }')"
  done
fi
echo "ratio = scalar / vector instructions (higher: the vector path does less work per frame)"
