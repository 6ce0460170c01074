#!/usr/bin/env bash
# Fetches the 32-bit ARM (armhf) libraries the cross build links against and unpacks them into a
# sysroot folder:
#   scripts/armhf-sysroot.sh <dir>      (default: build-armhf/sysroot)
# libjpeg-turbo (runtime and headers) and nlohmann-json (headers and CMake package) come from
# Debian's armhf packages, fetched with apt-get through a private package index kept under
# <dir>/.apt, so the machine's own apt configuration and installed architectures are left alone.
# The C and C++ runtime come with the cross compiler itself (/usr/arm-linux-gnueabihf).
# jni.h and jni_md.h are linked from the host JDK: they are portable C and only declare types.
# Idempotent: once <dir>/.complete exists (written last) nothing is fetched again; the JDK
# headers are linked on every run (a JDK may have been installed since).
set -euo pipefail

dir="${1:-$(cd "$(dirname "$0")/.." && pwd)/build-armhf/sysroot}"
mkdir -p "$dir"
dir="$(cd "$dir" && pwd)"

link_jni_headers() {
  local javac home
  for javac in "${JAVA_HOME:-}/bin/javac" "$(command -v javac || true)"; do
    [ -x "$javac" ] || continue
    home="$(dirname "$(dirname "$(readlink -f "$javac")")")"
    if [ -f "$home/include/jni.h" ] && [ -f "$home/include/linux/jni_md.h" ]; then
      mkdir -p "$dir/usr/include"
      ln -sf "$home/include/jni.h" "$dir/usr/include/jni.h"
      ln -sf "$home/include/linux/jni_md.h" "$dir/usr/include/jni_md.h"
      return 0
    fi
  done
  echo "armhf-sysroot: no JDK found, the JNI library and its tests will be skipped"
}

if [ -f "$dir/.complete" ]; then
  link_jni_headers
  exit 0
fi

debs=(libjpeg62-turbo libjpeg62-turbo-dev nlohmann-json3-dev)
apt_dir="$dir/.apt"
mkdir -p "$apt_dir/lists/partial" "$apt_dir/cache/archives/partial" "$apt_dir/debs"
: >"$apt_dir/status"
apt_opts=(
  -o "APT::Architecture=armhf" -o "APT::Architectures::=armhf"
  -o "Dir::State::Lists=$apt_dir/lists" -o "Dir::State::status=$apt_dir/status"
  -o "Dir::Cache=$apt_dir/cache" -o "Debug::NoLocking=1"
  -o "APT::Sandbox::User=root"
)

echo "armhf-sysroot: fetching ${debs[*]} (armhf) into $dir"
# A partly failed update (one suite's armhf index caught mid-sync, say) is not fatal: the
# packages usually still resolve from the other suites. Only a failed download is.
apt-get "${apt_opts[@]}" -qq update >"$apt_dir/update.log" 2>&1 || true
rm -f "$apt_dir"/debs/*.deb
if ! (cd "$apt_dir/debs" && apt-get "${apt_opts[@]}" -qq download "${debs[@]}" 2>"$apt_dir/download.log"); then
  cat "$apt_dir/update.log" "$apt_dir/download.log" >&2
  echo "armhf-sysroot: could not download the armhf packages" >&2
  exit 1
fi
for deb in "$apt_dir"/debs/*.deb; do
  dpkg -x "$deb" "$dir"
done

link_jni_headers

# jpeglib.h includes jconfig.h, which Debian keeps in the multiarch folder: make it visible
# beside jpeglib.h so the plain include folder is all a compiler needs.
ln -sf arm-linux-gnueabihf/jconfig.h "$dir/usr/include/jconfig.h"
rm -rf "$apt_dir/lists" "$dir/usr/share/doc"

for f in usr/include/jconfig.h usr/include/jpeglib.h usr/lib/arm-linux-gnueabihf/libjpeg.so usr/include/nlohmann/json.hpp; do
  [ -e "$dir/$f" ] || { echo "armhf-sysroot: $f missing after unpacking" >&2; exit 1; }
done
touch "$dir/.complete"
echo "armhf-sysroot: done"
