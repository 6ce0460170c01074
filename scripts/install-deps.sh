#!/usr/bin/env bash
# Installs everything the build, the tests and the tools need, from Debian's packages.
# Idempotent: when every package is already there it prints nothing and exits 0.
#   scripts/install-deps.sh            core build, C++ and Java tests, sanitizers, fuzzers, armhf cross build
#   scripts/install-deps.sh --bench    also the optional benchmark peers (OpenCV, TurboJPEG)
#   scripts/install-deps.sh --browser  also headless Chromium (to look at the scan report)
set -euo pipefail

packages=(
  build-essential cmake ninja-build pkg-config g++ clang libclang-rt-14-dev
  libjpeg62-turbo-dev nlohmann-json3-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  openjdk-17-jdk-headless junit5
  maven libmaven-compiler-plugin-java libmaven-resources-plugin-java libexec-maven-plugin-java
  g++-arm-linux-gnueabihf qemu-user
  python3 curl
)
for arg in "$@"; do
  case "$arg" in
    --bench) packages+=(libopencv-dev libturbojpeg0-dev valgrind) ;;
    --browser) packages+=(chromium) ;;
    *) echo "install-deps: unknown option $arg" >&2; exit 2 ;;
  esac
done

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

SUDO=""
[ "$(id -u)" -eq 0 ] || SUDO="sudo"
echo "install-deps: installing ${missing[*]}"
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq >/dev/null
$SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
echo "install-deps: done"
