#!/usr/bin/env bash
# See the library work: installs what is missing (scripts/install-deps.sh), builds the library and
# the scanning tool (the same CMake build as scripts/test.sh, in build/), then scans the built-in
# scene -- photographed products held in turn before a hand-held camera -- through the engine,
# with the built-in reference server recognising them on loopback, and writes an HTML report
# with the recognition figures.
#   scripts/scan.sh                   built-in scene, report in ./scan-report/index.html
#   scripts/scan.sh DIR|FILE [opts]   any vsscan arguments (scripts/scan.sh --help lists them)
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh

jobs=$(nproc 2>/dev/null || echo 2)
cmake -S . -B build -G Ninja -DORZAVS_WERROR=ON >/dev/null
cmake --build build -j "$jobs" --target vsscan_tool
echo
exec build/bin/vsscan "$@"
