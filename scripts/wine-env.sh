#!/usr/bin/env bash
# Starts (or stops) the environment that runs the project's .exe files under Wine:
# one Xvfb when there is no $DISPLAY, a private Wine prefix with a virtual desktop
# in the build folder, a persistent wineserver and one idle keeper process.
#
#   wine-env.sh start BUILD_DIR [DPI]   bring it up (idempotent); prints nothing on success
#   wine-env.sh stop  BUILD_DIR [DPI]   end the wineserver, the keeper and our Xvfb
#   wine-env.sh shell BUILD_DIR [DPI]   print the exports for `eval`
#
# DPI (96 when absent) is the display scale the prefix gives its programs, as
# LogPixels: 144 is 150 %, 192 is 200 %. Each DPI other than 96 has a prefix,
# a state folder and an Xvfb of its own beside the 96-DPI ones
# (BUILD_DIR/wineprefix-144, BUILD_DIR/wine-env-144), so one build folder can
# run the same programs at several scales.
#
# Everything that runs in the background is started detached, with all three
# standard streams redirected, so that a caller reading our output (CTest, a
# pipe) is never held open by it.
set -u

action=${1:-}
build=${2:-}
dpi=${3:-96}
if [ -z "$action" ] || [ -z "$build" ]; then
    echo "usage: wine-env.sh start|stop|shell BUILD_DIR [DPI]" >&2
    exit 2
fi
case "$dpi" in
'' | *[!0-9]*)
    echo "wine-env: DPI must be a number, such as 96, 144 or 192" >&2
    exit 2
    ;;
esac
mkdir -p "$build"
build=$(cd "$build" && pwd)
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
state="$build/wine-env$suffix"
mkdir -p "$state"
log="$state/log.txt"

export WINEPREFIX="$build/wineprefix$suffix"
export WINEDEBUG=-all
# WinHelp with a missing file would wait on a modal message box, and a
# program that crashes would wait in Wine's debugger until a timeout: with the
# debugger off it ends at once with the exception's code.
export WINEDLLOVERRIDES="winhlp32.exe=d;winedbg.exe=d;mscoree=d;mshtml=d"
export WINEARCH=win64

alive() { # pid: a live process that is not a zombie
    [ -n "${1:-}" ] && [ -r "/proc/$1/stat" ] && ! awk '{exit ($3=="Z")?0:1}' "/proc/$1/stat"
}

display_up() { # display number
    [ -S "/tmp/.X11-unix/X$1" ] && alive "$(cat "$state/xvfb.pid" 2>/dev/null)"
}

start_xvfb() {
    if [ -n "${DISPLAY:-}" ] && [ ! -f "$state/xvfb.pid" ]; then
        echo "$DISPLAY" >"$state/display"
        return 0
    fi
    local n
    n=$(cat "$state/xvfb.display" 2>/dev/null || true)
    if [ -n "$n" ] && display_up "$n"; then
        echo ":$n" >"$state/display"
        return 0
    fi
    rm -f "$state/xvfb.display"
    setsid Xvfb -displayfd 3 -screen 0 1024x768x24 -nolisten tcp -ac \
        3>"$state/xvfb.display" </dev/null >>"$log" 2>&1 &
    echo $! >"$state/xvfb.pid"
    for _ in $(seq 1 100); do
        n=$(cat "$state/xvfb.display" 2>/dev/null || true)
        [ -n "$n" ] && [ -S "/tmp/.X11-unix/X$n" ] && break
        sleep 0.1
    done
    if [ -z "$n" ]; then
        echo "wine-env: Xvfb did not start (see $log)" >&2
        exit 1
    fi
    echo "$n" >"$state/xvfb.display"
    echo ":$n" >"$state/display"
}

make_prefix() {
    [ -f "$WINEPREFIX/system.reg" ] && [ -f "$state/prefix.ok" ] && return 0
    rm -rf "$WINEPREFIX"
    wineboot -i </dev/null >>"$log" 2>&1
    # A virtual desktop makes Wine draw frames itself; without it, hiding a
    # window with a sizing border waits about two seconds.
    wine reg add 'HKCU\Software\Wine\Explorer' /v Desktop /d Default /f </dev/null >>"$log" 2>&1
    wine reg add 'HKCU\Software\Wine\Explorer\Desktops' /v Default /d 1024x768 /f </dev/null >>"$log" 2>&1
    # The display scale: Wine reads it when the wineserver starts, which the
    # restart below does.
    if [ "$dpi" != 96 ]; then
        wine reg add 'HKCU\Control Panel\Desktop' /v LogPixels /t REG_DWORD /d "$dpi" /f </dev/null >>"$log" 2>&1
    fi
    # The desktop process that wineboot left ignores the new values until restarted.
    wineserver -k </dev/null >>"$log" 2>&1
    wineserver -w </dev/null >>"$log" 2>&1
    touch "$state/prefix.ok"
}

start_server() {
    if alive "$(cat "$state/wineserver.pid" 2>/dev/null)"; then return 0; fi
    setsid wineserver -f -p </dev/null >>"$log" 2>&1 &
    echo $! >"$state/wineserver.pid"
    sleep 0.2
}

start_keeper() {
    local keeper="$build/bin/qbr_keeper.exe"
    [ -f "$keeper" ] || return 0
    if alive "$(cat "$state/keeper.pid" 2>/dev/null)" && [ -f "$state/keeper.ready" ]; then return 0; fi
    rm -f "$state/keeper.ready"
    setsid wine "$keeper" "$(winepath -w "$state/keeper.ready" 2>/dev/null)" </dev/null >>"$log" 2>&1 &
    echo $! >"$state/keeper.pid"
    for _ in $(seq 1 300); do
        [ -f "$state/keeper.ready" ] && return 0
        sleep 0.1
    done
    echo "wine-env: keeper did not start (see $log)" >&2
}

write_exports() {
    {
        echo "export DISPLAY=$(cat "$state/display")"
        echo "export WINEPREFIX='$WINEPREFIX'"
        echo "export WINEDEBUG=-all"
        echo "export WINEARCH=win64"
        echo "export WINEDLLOVERRIDES='$WINEDLLOVERRIDES'"
    } >"$state/exports.sh"
}

case "$action" in
start | stop)
    # flock -o keeps the lock in flock itself: the servers we start must not
    # inherit it, or the next start would wait for them forever.
    exec flock -o "$state/lock" "$0" "$action-locked" "$build" "$dpi"
    ;;
start-locked)
    start_xvfb
    export DISPLAY
    DISPLAY=$(cat "$state/display")
    make_prefix
    start_server
    start_keeper
    write_exports
    ;;
stop-locked)
    wineserver -k </dev/null >>"$log" 2>&1 || true
    for f in keeper wineserver; do
        pid=$(cat "$state/$f.pid" 2>/dev/null || true)
        alive "$pid" && kill "$pid" 2>/dev/null
        rm -f "$state/$f.pid"
    done
    pid=$(cat "$state/xvfb.pid" 2>/dev/null || true)
    if alive "$pid"; then kill "$pid" 2>/dev/null; fi
    rm -f "$state/xvfb.pid" "$state/xvfb.display" "$state/display" "$state/keeper.ready" "$state/exports.sh"
    ;;
shell)
    [ -f "$state/exports.sh" ] || "$0" start "$build" "$dpi"
    cat "$state/exports.sh"
    ;;
*)
    echo "usage: wine-env.sh start|stop|shell BUILD_DIR [DPI]" >&2
    exit 2
    ;;
esac
