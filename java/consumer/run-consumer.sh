#!/usr/bin/env bash
# Installs the built jar into a Maven repository inside BUILD, copies this consumer project
# there and builds and runs it with Maven offline: one scan through the session API.
#   java/consumer/run-consumer.sh BUILD LIBRARY     (CTest: java_maven_consumer)
set -euo pipefail
build=$(cd "${1:?build folder}" && pwd)
library=${2:?path of libOrzaVSMobile.so}
here=$(cd "$(dirname "$0")" && pwd)
repo="$build/maven-repo"
work="$build/maven-consumer"

"$here/../../scripts/maven-install.sh" --no-build --build "$build" --repo "$repo"
rm -rf "$work"
mkdir -p "$work"
cp -r "$here/pom.xml" "$here/settings.xml" "$here/src" "$work/"
cd "$work"
status=0
out=$(mvn -B -q -o -s settings.xml -Daether.offline.protocols=file -Dmaven.repo.local="$repo" \
  -Dorzavs.library.path="$library" compile exec:exec 2>&1) || status=$?
echo "$out"
# The scan runs under -Xcheck:jni: any report of it fails the test too.
if grep -q "WARNING in native method\|FATAL ERROR in native method" <<<"$out"; then exit 1; fi
exit "$status"
