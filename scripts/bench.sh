#!/usr/bin/env bash
# Builds the benchmark program and runs it under Wine, printing its tables.
#   scripts/bench.sh [BUILD_DIR] [--quick]
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$here/build}
shift || true
cmake -S "$here" -B "$build" -DQBR_BUILD_BENCH=ON >/dev/null
cmake --build "$build" --target qbr_bench -j2 >/dev/null
"$here/scripts/wine-env.sh" start "$build"
. "$build/wine-env/exports.sh"
wine "$build/bin/qbr_bench.exe" "$@"
