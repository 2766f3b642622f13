#!/usr/bin/env bash
# Runs one of the project's .exe files under Wine and passes its exit code through.
#   wine-run.sh BUILD_DIR program.exe [arguments...]
# Brings the Wine environment of BUILD_DIR up first if it is not up yet (cheap
# when it is: the start only checks its process ids).
set -u
build=$1
shift
here=$(cd "$(dirname "$0")" && pwd)
"$here/wine-env.sh" start "$build" || exit 1
# shellcheck disable=SC1091
. "$build/wine-env/exports.sh"
exec wine "$@"
