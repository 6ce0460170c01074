#!/usr/bin/env bash
# Installs everything the build, the tests and the tools need, from Debian's packages.
# Idempotent: when every package is already there it prints nothing and exits 0.
#   scripts/install-deps.sh            core build, C++ and Java tests, sanitizers, fuzzers, armhf cross build
#   scripts/install-deps.sh --bench    also the optional benchmark peers (OpenCV, TurboJPEG)
#   scripts/install-deps.sh --browser  also headless Chromium (to look at the scan report)
# The scanning tool's built-in products are photographs from Debian's python3-skimage; only its
# .deb is fetched (none of its Python dependencies) and the few photographs used, with the
# package's copyright file, are copied to $ORZAVS_PHOTOS (default /usr/local/share/orzavs/photos).
set -euo pipefail

packages=(
  build-essential cmake ninja-build pkg-config g++ clang libclang-rt-14-dev
  libjpeg62-turbo-dev nlohmann-json3-dev
  libgtest-dev libgmock-dev libbenchmark-dev
  openjdk-17-jdk-headless junit5 libopencv-java libopencv406-jni
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

photos_dir=${ORZAVS_PHOTOS:-/usr/local/share/orzavs/photos}
photos=(astronaut.png chelsea.png coffee.png rocket.jpg camera.png ihc.png
        gravel.png brick.png grass.png text.png coins.png retina.jpg cell.png hubble_deep_field.jpg)

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed' || missing+=("$p")
done
have_photos=1
for f in "${photos[@]}"; do [ -s "$photos_dir/$f" ] || have_photos=0; done
[ ${#missing[@]} -eq 0 ] && [ $have_photos -eq 1 ] && exit 0

SUDO=""
[ "$(id -u)" -eq 0 ] || SUDO="sudo"
export DEBIAN_FRONTEND=noninteractive
$SUDO apt-get update -qq >/dev/null
if [ ${#missing[@]} -gt 0 ]; then
  echo "install-deps: installing ${missing[*]}"
  $SUDO apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
fi
if [ $have_photos -eq 0 ]; then
  echo "install-deps: photographs from python3-skimage into $photos_dir"
  tmp=$(mktemp -d) && chmod 755 "$tmp"
  trap 'rm -rf "$tmp"' EXIT
  (cd "$tmp" && apt-get download -qq python3-skimage >/dev/null && dpkg-deb -x python3-skimage_*.deb x)
  data="$tmp/x/usr/lib/python3/dist-packages/skimage/data"
  $SUDO mkdir -p "$photos_dir"
  for f in "${photos[@]}"; do $SUDO cp "$data/$f" "$photos_dir/$f"; done
  $SUDO cp "$tmp/x/usr/share/doc/python3-skimage/copyright" "$photos_dir/copyright"
  $SUDO cp "$tmp/x/usr/lib/python3/dist-packages/skimage/data/_fetchers.py" "$photos_dir/sources-and-licences.py"
fi
echo "install-deps: done"
