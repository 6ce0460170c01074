#!/usr/bin/env bash
# Weighs the FAST-9 detector's vector path against its scalar twin by instructions executed per
# call (detection with suppression at threshold 50, one call per frame), which, unlike times,
# do not depend on the machine, its load or an emulator:
#   - 32-bit ARM, NEON vs scalar: the armhf build run under qemu-arm with a small counting plugin
#     (scripts/insn-count/qemu_insn_plugin.c);
#   - x86-64, SSE2 vs scalar (only when valgrind is installed): callgrind's instruction count.
# Then, on 32-bit ARM, per 1280x720 frame (the benchmark frames and photographs from OpenCV's
# sample data, scaled and cropped to 1280x720), against the peers a user would otherwise pick:
#   - the engine's per-frame path (process() on a frame not taken: interest points and their
#     callback) against OpenCV's cv::FAST with non-maximum suppression, built for armv7-a with
#     NEON from Debian's OpenCV sources (core, imgproc, features2d only; built once under nice
#     into build-armhf-insn/opencv, which takes a while the first time);
#   - the worker's encoder (NV21 to JPEG, quality 50) against TurboJPEG's tjCompressFromYUV on
#     an I420 copy of the frame (Debian's armhf libturbojpeg), default and fast integer DCT.
# scripts/insn-count/peer_insn_driver.cpp runs each piece of work. Goals: per-frame path at most
# 0.8x OpenCV's instructions, encoder at most 1.05x TurboJPEG's.
# Instructions are not cycles: a NEON instruction does 16 lanes of work and may take more than
# one cycle on a phone's core. The figures say how much work each path asks for, not the speed.
#   scripts/insn-count.sh                every benchmark frame, then the peers
#   scripts/insn-count.sh 1280x720       frames whose name contains the text, then the peers
#   scripts/insn-count.sh --no-peers [FILTER]   the detector's paths only
set -euo pipefail
cd "$(dirname "$0")/.."

peers=1
if [ "${1:-}" = --no-peers ]; then peers=0; shift; fi
filter="${1:-}"
calls=4  # extra calls measured per figure (beyond a first call that also grows the buffers)
jobs=$(nproc 2>/dev/null || echo 2)

scripts/install-deps.sh
if [ "$peers" = 1 ]; then
  scripts/armhf-sysroot.sh build-armhf/sysroot --peers
else
  scripts/armhf-sysroot.sh build-armhf/sysroot
fi
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

[ "$peers" = 1 ] || exit 0

# --- Against the peers, on 32-bit ARM ------------------------------------------------------------
opencv=$PWD/$arm/opencv
if [ ! -f "$opencv/install/.complete" ]; then
  echo "insn-count: building OpenCV (core, imgproc, features2d) for armv7-a NEON in $opencv (once; see $arm/opencv.build.log)"
  flags="-march=armv7-a -mfpu=neon -mfloat-abi=hard"
  # Debian's sources leave out OpenCV's bundled third-party code: zlib comes from the sysroot,
  # and the Carotene NEON HAL (which has no FAST) is off.
  cmake -S build-armhf/opencv-src/opencv -B "$opencv" -G Ninja -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_SYSTEM_NAME=Linux -DCMAKE_SYSTEM_PROCESSOR=armv7-a \
    -DCMAKE_C_COMPILER=arm-linux-gnueabihf-gcc -DCMAKE_CXX_COMPILER=arm-linux-gnueabihf-g++ \
    "-DCMAKE_C_FLAGS=$flags" "-DCMAKE_CXX_FLAGS=$flags" \
    "-DCMAKE_FIND_ROOT_PATH=/usr/arm-linux-gnueabihf;$sysroot" -DCMAKE_FIND_ROOT_PATH_MODE_PROGRAM=NEVER \
    -DCMAKE_FIND_ROOT_PATH_MODE_LIBRARY=ONLY -DCMAKE_FIND_ROOT_PATH_MODE_INCLUDE=ONLY \
    -DCMAKE_FIND_ROOT_PATH_MODE_PACKAGE=ONLY -DZLIB_ROOT="$sysroot/usr" \
    -DBUILD_LIST=core,imgproc,features2d -DBUILD_SHARED_LIBS=OFF -DENABLE_NEON=ON -DCPU_BASELINE=NEON \
    -DCPU_DISPATCH= -DWITH_CAROTENE=OFF -DBUILD_ZLIB=OFF \
    -DBUILD_TESTS=OFF -DBUILD_PERF_TESTS=OFF -DBUILD_EXAMPLES=OFF -DBUILD_opencv_apps=OFF -DBUILD_DOCS=OFF \
    -DBUILD_JAVA=OFF -DBUILD_opencv_python3=OFF -DOPENCV_GENERATE_PKGCONFIG=OFF \
    -DWITH_IPP=OFF -DWITH_ITT=OFF -DWITH_OPENCL=OFF -DWITH_LAPACK=OFF -DWITH_EIGEN=OFF -DWITH_TBB=OFF \
    -DWITH_OPENMP=OFF -DWITH_PROTOBUF=OFF -DWITH_ADE=OFF -DWITH_QUIRC=OFF -DWITH_VA=OFF -DWITH_GTK=OFF \
    -DWITH_FFMPEG=OFF -DWITH_GSTREAMER=OFF -DWITH_V4L=OFF -DWITH_1394=OFF -DWITH_JPEG=OFF -DWITH_PNG=OFF \
    -DWITH_TIFF=OFF -DWITH_WEBP=OFF -DWITH_OPENJPEG=OFF -DWITH_JASPER=OFF -DWITH_OPENEXR=OFF \
    -DWITH_IMGCODEC_HDR=OFF -DCMAKE_INSTALL_PREFIX="$opencv/install" >"$arm/opencv.configure.log" 2>&1 ||
    { tail -30 "$arm/opencv.configure.log"; exit 1; }
  { nice cmake --build "$opencv" -j 2 && cmake --install "$opencv"; } >"$arm/opencv.build.log" 2>&1 ||
    { tail -30 "$arm/opencv.build.log"; exit 1; }
  touch "$opencv/install/.complete"
fi
cvlibs="$opencv/install/lib"
cvinc="$opencv/install/include/opencv4"
arm-linux-gnueabihf-g++ -std=c++17 -O3 -DNDEBUG -march=armv7-a -mfpu=neon -mfloat-abi=hard -Wno-psabi -I. \
  -I"$cvinc" -I"$sysroot/usr/include" scripts/insn-count/peer_insn_driver.cpp bench/BenchFrames.cpp \
  "$arm/liborzavs.a" "$cvlibs/libopencv_features2d.a" "$cvlibs/libopencv_imgproc.a" "$cvlibs/libopencv_core.a" \
  "$sysroot/usr/lib/arm-linux-gnueabihf/libz.a" -L"$sysroot/usr/lib/arm-linux-gnueabihf" -lturbojpeg -ljpeg \
  -pthread -ldl -o "$arm/peer_insn_driver"

photos=build-armhf/opencv-src/opencv/samples/data
sources=("1280x720 smooth" "1280x720 texture" "$photos/aloeL.jpg" "$photos/building.jpg" "$photos/leuvenA.jpg"
         "$photos/ela_original.jpg")
per_call_peer() {  # source work -> instructions of one call (and the driver's line on stderr)
  local a b
  a=$("${qemu[@]}" "$arm/peer_insn_driver" "$1" "$2" 1 2>&1 | sed -n 's/^guest instructions: //p')
  b=$("${qemu[@]}" "$arm/peer_insn_driver" "$1" "$2" $((1 + calls)) 2>&1 |
      tee >(grep -v '^guest instructions' >&2) | sed -n 's/^guest instructions: //p')
  echo $(((b - a) / calls))
}
ratio() { awk -v a="$1" -v b="$2" 'BEGIN { printf "%.2fx", a / b }'; }
name() { case "$1" in *.jpg) basename "$1" .jpg | sed 's/^/photo /' ;; *) echo "$1" ;; esac; }

echo
echo "armv7-a (qemu), instructions per 1280x720 frame; ratio = ours / peer (goal: process <= 0.80x, encode <= 1.05x)"
printf '%-20s %12s %12s %7s | %12s %12s %7s %12s %7s\n' "frame" "process()" "cv::FAST" "ratio" \
  "encode" "tjYUV" "ratio" "tjYUV fast" "ratio"
worst_p=0 worst_e=0
for src in "${sources[@]}"; do
  p=$(per_call_peer "$src" process 2>/dev/null)
  c=$(per_call_peer "$src" cvfast 2>/dev/null)
  e=$(per_call_peer "$src" encode 2>/dev/null)
  t=$(per_call_peer "$src" tjencode 2>/dev/null)
  tf=$(per_call_peer "$src" tjencode-fastdct 2>/dev/null)
  printf '%-20s %12d %12d %7s | %12d %12d %7s %12d %7s\n' "$(name "$src")" "$p" "$c" "$(ratio "$p" "$c")" \
    "$e" "$t" "$(ratio "$e" "$t")" "$tf" "$(ratio "$e" "$tf")"
  worst_p=$(awk -v w="$worst_p" -v r="$p / $c" -v p="$p" -v c="$c" 'BEGIN { r = p / c; print (r > w ? r : w) }')
  worst_e=$(awk -v w="$worst_e" -v e="$e" -v t="$t" 'BEGIN { r = e / t; print (r > w ? r : w) }')
done
printf 'worst: process() / cv::FAST %.2fx (goal 0.80x), encode / tjCompressFromYUV %.2fx (goal 1.05x)\n' \
  "$worst_p" "$worst_e"
