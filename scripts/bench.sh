#!/usr/bin/env bash
# Runs the benchmarks: installs the optional peers (OpenCV, TurboJPEG), builds orzavs_bench in
# Release in build-bench/ and runs it, passing every argument on. Examples:
#   scripts/bench.sh                          every section on every frame
#   scripts/bench.sh fast                     the interest-point section only
#   scripts/bench.sh fast jpeg --frames 1280x720
#   scripts/bench.sh --list                   the section names
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh --bench

jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B build-bench -G Ninja -DCMAKE_BUILD_TYPE=Release -DORZAVS_BUILD_BENCH=ON \
  -DORZAVS_BUILD_TESTS=OFF >/dev/null
cmake --build build-bench -j "$jobs" --target orzavs_bench
exec build-bench/bench/orzavs_bench "$@"
