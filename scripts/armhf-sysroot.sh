#!/usr/bin/env bash
# Fetches the 32-bit ARM (armhf) libraries the cross build links against and unpacks them into a
# sysroot folder, and a 32-bit ARM Java runtime into <dir>/jvm:
#   scripts/armhf-sysroot.sh [<dir>]          (default: build-armhf/sysroot)
#   scripts/armhf-sysroot.sh <dir> --peers    also the benchmark peers: the armhf TurboJPEG
#                                             library and headers into <dir>, and Debian's OpenCV
#                                             sources into <dir>/../opencv-src
# libjpeg-turbo (runtime and headers) and nlohmann-json (headers and CMake package) come from
# Debian's armhf packages, fetched with apt-get through a private package index kept under
# <dir>/.apt, so the machine's own apt configuration and installed architectures are left alone.
# The C and C++ runtime come with the cross compiler itself (/usr/arm-linux-gnueabihf).
# jni.h and jni_md.h are linked from the host JDK: they are portable C and only declare types.
# <dir>/jvm is one root holding Debian's armhf OpenJDK 17 and the armhf runtime it and the
# library need (C and C++ runtime, zlib, libjpeg-turbo); <dir>/java runs that JVM under qemu-arm
# with the root as the emulator's file-system prefix. Java programs that start processes get the
# fork launch mechanism (the default one execs a helper that the emulator cannot follow).
# Idempotent: once <dir>/.complete exists (written last) nothing is fetched again; the JDK
# headers are linked on every run (a JDK may have been installed since).
set -euo pipefail

dir="$(cd "$(dirname "$0")/.." && pwd)/build-armhf/sysroot"
peers=0
for arg in "$@"; do
  case "$arg" in
    --peers) peers=1 ;;
    -*) echo "armhf-sysroot: unknown option $arg" >&2; exit 2 ;;
    *) dir="$arg" ;;
  esac
done
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

apt_dir="$dir/.apt"
apt_opts=(
  -o "APT::Architecture=armhf" -o "APT::Architectures::=armhf"
  -o "Dir::State::Lists=$apt_dir/lists" -o "Dir::State::status=$apt_dir/status"
  -o "Dir::Cache=$apt_dir/cache" -o "Debug::NoLocking=1"
  -o "APT::Sandbox::User=root"
)
updated=0
apt_update() {
  [ "$updated" = 1 ] && return 0
  mkdir -p "$apt_dir/lists/partial" "$apt_dir/cache/archives/partial"
  : >"$apt_dir/status"
  # A partly failed update (one suite's armhf index caught mid-sync, say) is not fatal: the
  # packages usually still resolve from the other suites. Only a failed download is.
  apt-get "${apt_opts[@]}" -qq update >"$apt_dir/update.log" 2>&1 || true
  updated=1
}

# fetch <root> <package>...: downloads the armhf packages and unpacks them into <root>.
fetch() {
  local root="$1" deb
  shift
  apt_update
  echo "armhf-sysroot: fetching $* (armhf) into $root"
  rm -rf "$apt_dir/debs" && mkdir -p "$apt_dir/debs" "$root"
  if ! (cd "$apt_dir/debs" && apt-get "${apt_opts[@]}" -qq download "$@" 2>"$apt_dir/download.log"); then
    cat "$apt_dir/update.log" "$apt_dir/download.log" >&2
    echo "armhf-sysroot: could not download the armhf packages" >&2
    exit 1
  fi
  for deb in "$apt_dir"/debs/*.deb; do
    dpkg -x "$deb" "$root"
  done
  rm -rf "$apt_dir/debs" "$root/usr/share/doc" "$root/usr/share/man"
}

require() {  # <file>...: each must exist after unpacking
  local f
  for f in "$@"; do
    [ -e "$f" ] || { echo "armhf-sysroot: $f missing after unpacking" >&2; exit 1; }
  done
}

if [ ! -f "$dir/.complete" ]; then
  fetch "$dir" libjpeg62-turbo libjpeg62-turbo-dev nlohmann-json3-dev
  # jpeglib.h includes jconfig.h, which Debian keeps in the multiarch folder: make it visible
  # beside jpeglib.h so the plain include folder is all a compiler needs.
  ln -sf arm-linux-gnueabihf/jconfig.h "$dir/usr/include/jconfig.h"
  require "$dir"/usr/include/{jconfig.h,jpeglib.h,nlohmann/json.hpp} "$dir/usr/lib/arm-linux-gnueabihf/libjpeg.so"
  touch "$dir/.complete"
fi

jvm="$dir/jvm"
java_home="$jvm/usr/lib/jvm/java-17-openjdk-armhf"
if [ ! -f "$jvm/.complete" ]; then
  rm -rf "$jvm"
  fetch "$jvm" openjdk-17-jre-headless libc6 libstdc++6 libgcc-s1 zlib1g libjpeg62-turbo
  require "$java_home/bin/java" "$jvm/lib/ld-linux-armhf.so.3"
  touch "$jvm/.complete"
fi
# The launcher: the ARM JVM under qemu-arm, arguments passed on. A 32-bit program cannot list a
# folder of a 64-bit ext4 file system through the emulator (its directory offsets do not fit:
# EOVERFLOW), while a tmpfs lists fine: temporary files (JUnit's temporary folders, say) go to
# /dev/shm when it is a writable tmpfs. ORZAVS_ARM_TMPDIR names another folder.
cat >"$dir/java" <<LAUNCHER
#!/bin/sh
# Generated by scripts/armhf-sysroot.sh: Debian's armhf OpenJDK 17 under qemu-arm.
tmp="\${ORZAVS_ARM_TMPDIR:-}"
if [ -z "\$tmp" ] && [ "\$(stat -f -c %T /dev/shm 2>/dev/null)" = tmpfs ] && [ -w /dev/shm ]; then tmp=/dev/shm; fi
QEMU_LD_PREFIX="$jvm" exec qemu-arm "$java_home/bin/java" -Djdk.lang.Process.launchMechanism=FORK \\
  \${tmp:+"-Djava.io.tmpdir=\$tmp"} "\$@"
LAUNCHER
chmod +x "$dir/java"

if [ "$peers" = 1 ] && [ ! -f "$dir/.peers" ]; then
  fetch "$dir" libturbojpeg0 libturbojpeg0-dev zlib1g zlib1g-dev
  ln -sf arm-linux-gnueabihf/jconfig.h "$dir/usr/include/jconfig.h"
  require "$dir/usr/include/turbojpeg.h" "$dir/usr/lib/arm-linux-gnueabihf/libturbojpeg.so"
  # OpenCV's sources, from a private source index beside the binary one.
  src="$(dirname "$dir")/opencv-src"
  sources="$apt_dir/sources.list"
  grep -h -v '^#' /etc/apt/sources.list.d/*.sources 2>/dev/null |
    sed 's/^Types: deb$/Types: deb-src/' >"$apt_dir/sources.sources" || true
  mkdir -p "$apt_dir/sources.d"
  mv "$apt_dir/sources.sources" "$apt_dir/sources.d/debian.sources"
  grep -h '^deb ' /etc/apt/sources.list 2>/dev/null | sed 's/^deb /deb-src /' >"$sources" || : >"$sources"
  src_opts=("${apt_opts[@]}" -o "Dir::Etc::sourcelist=$sources" -o "Dir::Etc::SourceParts=$apt_dir/sources.d"
            -o "Dir::State::Lists=$apt_dir/src-lists")
  mkdir -p "$apt_dir/src-lists/partial" "$src"
  apt-get "${src_opts[@]}" -qq update >"$apt_dir/src-update.log" 2>&1 || true
  echo "armhf-sysroot: fetching OpenCV's sources into $src"
  (cd "$src" && apt-get "${src_opts[@]}" -qq --download-only source opencv >"$apt_dir/src.log" 2>&1) ||
    { cat "$apt_dir/src-update.log" "$apt_dir/src.log" >&2; echo "armhf-sysroot: could not fetch OpenCV's sources" >&2; exit 1; }
  tarball="$(cd "$src" && ls opencv_*.orig.tar.* | grep -v contrib | head -n 1)"
  (cd "$src" && rm -rf opencv && mkdir opencv && tar -xf "$tarball" -C opencv --strip-components=1)
  require "$src/opencv/modules/features2d/src/fast.cpp"
  touch "$dir/.peers"
fi

rm -rf "$apt_dir/lists" "$apt_dir/src-lists"
link_jni_headers
echo "armhf-sysroot: ready"
