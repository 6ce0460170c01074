#!/usr/bin/env bash
# Java benchmarks (1280x720 NV21 by default), built in Release in build-bench-java/:
#   native:  process() driven from Java against the same loop in native code (JavaBench);
#   session: the session API against the low-level loop, and camera planes handed to the
#            session against packing them into NV21 in Java first (SessionBench).
# Both by default; every further argument is passed on. Examples:
#   scripts/bench-java.sh
#   scripts/bench-java.sh session --size 640x480 --frames 600 --rounds 7
set -euo pipefail
cd "$(dirname "$0")/.."
which=all
case "${1:-}" in native|session|all) which=$1; shift ;; esac

scripts/install-deps.sh

jdk=$(ls -d /usr/lib/jvm/java-17-openjdk-* 2>/dev/null | head -1 || true)
java_bin=${jdk:+$jdk/bin/}java
jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B build-bench-java -G Ninja -DCMAKE_BUILD_TYPE=Release -DORZAVS_BUILD_BENCH=ON \
  -DORZAVS_BUILD_TESTS=OFF >/dev/null
cmake --build build-bench-java -j "$jobs" \
  --target OrzaVSMobile orzavs_java orzavs_javabench orzavs_javabench_native
b=build-bench-java
run() {
  "$java_bin" -Dorzavs.library.path="$PWD/$b/jni/libOrzaVSMobile.so" \
    -Dorzavs.javabench.native="$PWD/$b/bench/JavaBench/liborzavs_javabench_native.so" \
    -cp "$b/bench/JavaBench/orzavs-javabench.jar:$b/java/orzavs-mobile.jar" \
    "com.orza.vs.mobile.library.bench.$1" "${@:2}"
}
if [ "$which" != session ]; then run JavaBench "$@"; fi
if [ "$which" = all ]; then echo; fi
if [ "$which" != native ]; then run SessionBench "$@"; fi
