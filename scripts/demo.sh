#!/usr/bin/env bash
# Installs what is missing, builds, and runs the demonstration program: on your
# display when $DISPLAY is set, else under Xvfb, where it takes a screenshot
# (BUILD_DIR/demo.png) a few seconds after start-up and closes the program.
#   scripts/demo.sh [--dpi DPI] [--scheme follow|system|dark|high-contrast] [BUILD_DIR]
# --dpi runs it at a display scale (144 is 150 %, 192 is 200 %) in a Wine
# prefix of its own; the screenshot is then BUILD_DIR/demo-DPI.png.
# --scheme runs a copy of it in BUILD_DIR/demo-SCHEME/ whose settings file
# chooses that colour scheme (your own BUILD_DIR/bin/qbrdemo.INI is left
# alone); the screenshot is then BUILD_DIR/demo-SCHEME.png.
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
usage="usage: demo.sh [--dpi DPI] [--scheme follow|system|dark|high-contrast] [BUILD_DIR]"
dpi=96
scheme=""
while [ $# -gt 0 ]; do
    case "$1" in
    --dpi) dpi=${2:?$usage}; shift 2 ;;
    --scheme) scheme=${2:?$usage}; shift 2 ;;
    -*) echo "$usage" >&2; exit 2 ;;
    *) break ;;
    esac
done
case "$scheme" in
"" | follow | system | dark | high-contrast) ;;
*) echo "$usage" >&2; exit 2 ;;
esac
build=${1:-$here/build}
"$here/scripts/setup.sh"
"$here/scripts/build.sh" "$build"
program="$build/bin/qbrdemo.exe"
shot="demo"
[ "$dpi" != 96 ] && shot="$shot-$dpi"
if [ -n "$scheme" ]; then
    shot="$shot-$scheme"
    copy="$build/demo-$scheme"
    mkdir -p "$copy"
    cp "$build/bin/qbrdemo.exe" "$here/demo/QBRDEMO.TXT" "$copy/"
    printf '[Toolbar Globals]\r\nColour Scheme=%s\r\n' "${scheme/-/ }" >"$copy/qbrdemo.INI"
    program="$copy/qbrdemo.exe"
fi
if [ -n "${DISPLAY:-}" ]; then
    exec "$here/scripts/wine-run.sh" --dpi "$dpi" "$build" "$program"
fi
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
"$here/scripts/wine-env.sh" start "$build" "$dpi"
# shellcheck disable=SC1091
. "$build/wine-env$suffix/exports.sh"
wine "$program" </dev/null >>"$build/wine-env$suffix/log.txt" 2>&1 &
pid=$!
ctl="$build/bin/qbr_ctl.exe"
wine "$ctl" wait "Quaybar Demo" 15000 </dev/null || echo "demo: the main window did not appear" >&2
sleep 2
/usr/bin/import -display "$DISPLAY" -window root "$build/$shot.png"
echo "screenshot: $build/$shot.png"
# Close it as a user would, so that it writes its settings on the way out.
wine "$ctl" close "Quaybar Demo" </dev/null || true
for _ in $(seq 1 100); do kill -0 $pid 2>/dev/null || break; sleep 0.1; done
kill $pid 2>/dev/null || true
wait $pid 2>/dev/null || true
"$here/scripts/wine-env.sh" stop "$build" "$dpi"
