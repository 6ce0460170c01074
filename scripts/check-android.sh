#!/usr/bin/env bash
# Checks the project's Android configuration without the NDK: configures and builds it with
# cmake/toolchains/android-emulated.cmake (CMAKE_SYSTEM_NAME Android, ANDROID set, armeabi-v7a
# flags, clang for 32-bit ARM, a sysroot that has jni.h and liblog and no libjpeg) passing libjpeg and
# nlohmann-json the way README.md's "Android" section tells an app developer to, then checks
# that no test or benchmark was configured and that the JNI library exports only JNI symbols.
#   scripts/check-android.sh          build-android/
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh
scripts/armhf-sysroot.sh build-armhf/sysroot
deps="$PWD/build-armhf/sysroot"

# The NDK's sysroot has jni.h (and the C library); libjpeg and nlohmann-json are the app
# developer's, in folders of their own, laid out as README.md shows. The armhf packages stand in
# for a libjpeg-turbo built with the NDK.
dir=build-android
ndk_sysroot="$PWD/$dir/ndk-sysroot"
jpeg="$PWD/$dir/jpeg-armeabi-v7a"
json="$PWD/$dir/json"
mkdir -p "$ndk_sysroot/usr/include" "$jpeg/include" "$jpeg/lib" "$json/include"
for h in jni.h jni_md.h; do
  [ -e "$deps/usr/include/$h" ] && ln -sf "$(readlink -f "$deps/usr/include/$h")" "$ndk_sysroot/usr/include/$h"
done
for h in jpeglib.h jconfig.h jmorecfg.h jerror.h; do
  ln -sf "$(readlink -f "$deps/usr/include/$h")" "$jpeg/include/$h"
done
ln -sf "$deps/usr/lib/arm-linux-gnueabihf/libjpeg.so" "$jpeg/lib/libjpeg.so"
# The NDK's log interface (android/log.h, liblog.so): a declaration-compatible stand-in, enough to
# compile and link the default diagnostic sink; nothing here runs it.
mkdir -p "$ndk_sysroot/usr/include/android" "$ndk_sysroot/usr/lib"
cat >"$ndk_sysroot/usr/include/android/log.h" <<'EOF'
#pragma once
typedef enum android_LogPriority {
  ANDROID_LOG_UNKNOWN = 0, ANDROID_LOG_DEFAULT, ANDROID_LOG_VERBOSE, ANDROID_LOG_DEBUG,
  ANDROID_LOG_INFO, ANDROID_LOG_WARN, ANDROID_LOG_ERROR, ANDROID_LOG_FATAL, ANDROID_LOG_SILENT
} android_LogPriority;
#ifdef __cplusplus
extern "C" {
#endif
int __android_log_write(int prio, const char* tag, const char* text);
#ifdef __cplusplus
}
#endif
EOF
echo 'int __android_log_write(int p, const char* t, const char* s) { return p + (t != s); }' \
  >"$dir/log-stub.c"
clang --target=arm-linux-gnueabihf -shared -nostdlib -fPIC -o "$ndk_sysroot/usr/lib/liblog.so" \
  "$dir/log-stub.c"
ln -sfn "$deps/usr/include/nlohmann" "$json/include/nlohmann"

jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B "$dir" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$PWD/cmake/toolchains/android-emulated.cmake" \
  -DORZAVS_ANDROID_SYSROOT="$ndk_sysroot" -DCMAKE_BUILD_TYPE=Release -DORZAVS_WERROR=ON \
  -DJPEG_INCLUDE_DIR="$jpeg/include" -DJPEG_LIBRARY="$jpeg/lib/libjpeg.so" \
  -DORZAVS_NLOHMANN_INCLUDE="$json/include" >"$dir/configure.log" \
  || { cat "$dir/configure.log"; exit 1; }
cmake --build "$dir" -j "$jobs"

fail=0
if [ -d "$dir/tests" ] || [ -d "$dir/bench" ]; then
  echo "check-android: tests or benchmarks were configured for an Android build"
  fail=1
fi
so="$dir/jni/libOrzaVSMobile.so"
if [ -f "$so" ]; then
  exported=$(arm-linux-gnueabihf-nm -D --defined-only "$so" | awk '{print $3}')
  total=$(printf '%s\n' "$exported" | grep -c . || true)
  other=$(printf '%s\n' "$exported" | grep -v -E '^(Java_|JNI_OnLoad$|JNI_OnUnload$)' | grep . || true)
  echo "check-android: $so exports $total symbols"
  if [ -n "$other" ]; then
    echo "check-android: exports other than JNI entry points:"
    printf '%s\n' "$other" | head -20
    fail=1
  fi
else
  echo "check-android: no JNI library was built (jni/ not present yet)"
fi
[ "$fail" = 0 ] && echo "check-android: Android configuration OK"
exit "$fail"
