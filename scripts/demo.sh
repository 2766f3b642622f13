#!/usr/bin/env bash
# Installs what is missing, builds, and runs the demonstration program: on your
# display when $DISPLAY is set, else under Xvfb, where it takes a screenshot
# (BUILD_DIR/demo.png) a few seconds after start-up and closes the program.
#   scripts/demo.sh [--dpi DPI] [BUILD_DIR]
# --dpi runs it at a display scale (144 is 150 %, 192 is 200 %) in a Wine
# prefix of its own; the screenshot is then BUILD_DIR/demo-DPI.png.
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
dpi=96
if [ "${1:-}" = --dpi ]; then
    dpi=${2:?usage: demo.sh [--dpi DPI] [BUILD_DIR]}
    shift 2
fi
build=${1:-$here/build}
"$here/scripts/setup.sh"
"$here/scripts/build.sh" "$build"
if [ -n "${DISPLAY:-}" ]; then
    exec "$here/scripts/wine-run.sh" --dpi "$dpi" "$build" "$build/bin/qbrdemo.exe"
fi
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
"$here/scripts/wine-env.sh" start "$build" "$dpi"
# shellcheck disable=SC1091
. "$build/wine-env$suffix/exports.sh"
wine "$build/bin/qbrdemo.exe" </dev/null >>"$build/wine-env$suffix/log.txt" 2>&1 &
pid=$!
ctl="$build/bin/qbr_ctl.exe"
wine "$ctl" wait "Quaybar Demo" 15000 </dev/null || echo "demo: the main window did not appear" >&2
sleep 2
/usr/bin/import -display "$DISPLAY" -window root "$build/demo$suffix.png"
echo "screenshot: $build/demo$suffix.png"
# Close it as a user would, so that it writes its settings on the way out.
wine "$ctl" close "Quaybar Demo" </dev/null || true
for _ in $(seq 1 100); do kill -0 $pid 2>/dev/null || break; sleep 0.1; done
kill $pid 2>/dev/null || true
wait $pid 2>/dev/null || true
"$here/scripts/wine-env.sh" stop "$build" "$dpi"
