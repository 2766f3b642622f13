#!/usr/bin/env bash
# Runs one of the project's .exe files under Wine and passes its exit code through.
#   wine-run.sh [--dpi DPI] BUILD_DIR program.exe [arguments...]
# Brings the Wine environment of BUILD_DIR up first if it is not up yet (cheap
# when it is: the start only checks its process ids). With --dpi the program
# runs in the build folder's prefix for that display scale (see wine-env.sh).
set -u
dpi=96
if [ "${1:-}" = --dpi ]; then
    dpi=${2:-}
    shift 2
fi
build=$1
shift
here=$(cd "$(dirname "$0")" && pwd)
"$here/wine-env.sh" start "$build" "$dpi" || exit 1
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
# shellcheck disable=SC1091
. "$build/wine-env$suffix/exports.sh"
exec wine "$@"
