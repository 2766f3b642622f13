#!/usr/bin/env bash
# Configures and builds everything into BUILD_DIR (default: build).
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$here/build}
cmake -S "$here" -B "$build" >/dev/null
cmake --build "$build" -j"$(nproc)"
