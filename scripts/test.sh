#!/usr/bin/env bash
# Installs what is missing, builds, prints the size of the suite against the
# code, and runs every test under Wine with CTest.
#   scripts/test.sh [BUILD_DIR]
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$here/build}
"$here/scripts/setup.sh"
"$here/scripts/build.sh" "$build"
"$here/scripts/test-ratio.sh"
cd "$build"
# Two at a time: the tests on the desktop run one after the other (they share
# its lock), and the portable builds run beside them.
ctest --output-on-failure --timeout 900 -j2
