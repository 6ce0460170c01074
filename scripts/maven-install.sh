#!/usr/bin/env bash
# Installs the Java binding into a local Maven repository: the jar, its sources, its Javadoc
# and its POM, as com.orza.vs:orzavs-mobile:<version>. Builds them first (build/, or --build).
#   scripts/maven-install.sh                          into ~/.m2/repository
#   scripts/maven-install.sh --repo DIR               into another local repository
#   scripts/maven-install.sh --build DIR --no-build   artifacts already built in DIR
# A Maven project then depends on it with
#   <dependency><groupId>com.orza.vs</groupId><artifactId>orzavs-mobile</artifactId><version>1.0.0</version></dependency>
# The native library is not in the jar: point the JVM at it with -Dorzavs.library.path=FILE
# (build/jni/libOrzaVSMobile.so), or put it on java.library.path.
set -euo pipefail
cd "$(dirname "$0")/.."

repo="$HOME/.m2/repository"
build=build
compile=1
while [ $# -gt 0 ]; do
  case "$1" in
    --repo) repo="${2:?--repo DIR}"; shift 2 ;;
    --build) build="${2:?--build DIR}"; shift 2 ;;
    --no-build) compile=0; shift ;;
    *) echo "maven-install: unknown option $1 (--repo DIR, --build DIR, --no-build)" >&2; exit 2 ;;
  esac
done

if [ "$compile" = 1 ]; then
  scripts/install-deps.sh
  [ -f "$build/CMakeCache.txt" ] || cmake -S . -B "$build" -G Ninja >/dev/null
  cmake --build "$build" -j "$(nproc 2>/dev/null || echo 2)" --target OrzaVSMobile orzavs_java orzavs_javadoc
fi

pom=$(ls "$build"/java/orzavs-mobile-*.pom 2>/dev/null | head -1)
if [ -z "$pom" ] || [ ! -f "$build/java/orzavs-mobile.jar" ]; then
  echo "maven-install: no built jar and POM in $build/java (run without --no-build)" >&2
  exit 1
fi
stem=${pom%.pom}
version=${stem##*/orzavs-mobile-}
group=$(sed -n 's|.*<groupId>\(.*\)</groupId>.*|\1|p' "$pom" | head -1)
artifact=orzavs-mobile
dir="$repo/${group//.//}/$artifact/$version"
mkdir -p "$dir"
cp "$build/java/orzavs-mobile.jar" "$dir/$artifact-$version.jar"
cp "$pom" "$dir/$artifact-$version.pom"
cp "$stem-sources.jar" "$dir/$artifact-$version-sources.jar"
cp "$stem-javadoc.jar" "$dir/$artifact-$version-javadoc.jar"
for f in "$dir"/*.jar "$dir"/*.pom; do sha1sum "$f" | cut -d' ' -f1 >"$f.sha1"; done
cat >"$repo/${group//.//}/$artifact/maven-metadata-local.xml" <<XML
<?xml version="1.0" encoding="UTF-8"?>
<metadata>
  <groupId>$group</groupId>
  <artifactId>$artifact</artifactId>
  <versioning>
    <release>$version</release>
    <versions><version>$version</version></versions>
    <lastUpdated>$(date -u +%Y%m%d%H%M%S)</lastUpdated>
  </versioning>
</metadata>
XML
echo "maven-install: $group:$artifact:$version (jar, sources, javadoc, pom) in $dir"
