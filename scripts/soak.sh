#!/usr/bin/env bash
# The soak through the Java binding: two threads stream frames while the engine is paused,
# resumed, stopped and restarted and a transport answers slowly, wrongly (500, not JSON, wrong
# id) or never; runs under -Xcheck:jni and fails on a lost or duplicated callback, on growth of
# memory, threads or JNI global references, or on any JNI warning. Prints the figures.
#   scripts/soak.sh          10 minutes
#   scripts/soak.sh 30       30 minutes
# CI runs the same soak for 60 s as the CTest test "soak" (part of scripts/test.sh).
# Builds in build/ like scripts/test.sh; build/bin/soak SECONDS runs it without building; the
# whole output is kept in build/tools/soak.log.
set -euo pipefail
cd "$(dirname "$0")/.."

minutes="${1:-10}"
case "$minutes" in ''|*[!0-9]*) echo "soak.sh: minutes must be a whole number" >&2; exit 2 ;; esac

scripts/install-deps.sh
cmake -S . -B build -G Ninja -DORZAVS_WERROR=ON >/dev/null
cmake --build build -j 2 --target orzavs_soak
build/bin/soak $((minutes * 60))
