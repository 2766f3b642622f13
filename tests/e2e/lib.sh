# Shared by the end-to-end scripts: the Wine environment of a build folder,
# the control tool, starting and ending the demonstration program.
# Source it with the build folder as $1 and, for a script that runs at a
# display scale, the DPI as $2 (96 when absent): the program then runs in the
# build folder's prefix of that scale (wine-env.sh BUILD_DIR DPI).
build=$(cd "$1" && pwd)
dpi=${2:-96}
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
here=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
"$here/scripts/wine-env.sh" start "$build" "$dpi" || exit 1
. "$build/wine-env$suffix/exports.sh"
out="$build/e2e"
mkdir -p "$out"
# Each script runs the program from a folder of its own, BUILD/e2e/<script>/
# (BUILD/e2e/<script>-DPI/ at another scale), so the settings file it reads
# and writes ($ini) is that folder's and the user's own build/bin/qbrdemo.INI
# is never touched.
run="$out/$(basename "$0" .sh)$suffix"
mkdir -p "$run"
ini="$run/qbrdemo.INI"
main="Quaybar Demo"
demo_pid=""

ctl() { wine "$build/bin/qbr_ctl.exe" "$@" </dev/null 2>/dev/null | tr -d "\r"; return "${PIPESTATUS[0]}"; }
# A failure may leave a dialog open, whose modal loop would keep the main
# window from closing: the dialogs go first.
fail() {
    echo "FAIL: $*"
    if [ -n "$demo_pid" ]; then
        ctl close "New Toolbar"
        ctl close "Insert Toolbar Item"
        sleep 0.5
        ctl close "$main"
        sleep 1
        kill "$demo_pid" 2>/dev/null
    fi
    exit 1
}
# The screen reader's view from another process; the line of item "$2" of toolbar "$1".
reader() { wine "$build/bin/qbr_reader.exe" "$@" </dev/null 2>/dev/null | tr -d "\r"; }
item() { reader list "$main" | awk -v t="toolbar \"$1\"" -v n="\"$2\"" '
    /^toolbar/ { inside = ($0 == t); next }
    inside && index($0, n) { print; exit }'; }
shot() { /usr/bin/import -display "$DISPLAY" -window root "$out/$1$suffix.png"; }

# Starts the program and waits for its main window and its first paint.
start_demo() {
    cp "$build/bin/qbrdemo.exe" "$build/bin/QBRDEMO.TXT" "$run/" || fail "cannot copy the program to $run"
    wine "$run/qbrdemo.exe" </dev/null >>"$out/demo.log" 2>&1 &
    demo_pid=$!
    # Generous: a start under a loaded machine (Wine's process start-up, the
    # desktop) once took longer than 20 s; a program that hangs still fails.
    ctl wait "$main" 60000 || fail "the main window did not appear ($1)"
    sleep 1
}

# Closes the main window as a user does and waits for the program to end.
stop_demo() {
    ctl close "$main"
    for _ in $(seq 1 300); do kill -0 "$demo_pid" 2>/dev/null || break; sleep 0.1; done
    if kill -0 "$demo_pid" 2>/dev/null; then
        kill "$demo_pid"
        fail "the program did not end after WM_CLOSE ($1)"
    fi
    wait "$demo_pid"
    local code=$?
    demo_pid=""
    [ "$code" = 0 ] || fail "the program ended with code $code ($1)"
}

# The value of KEY in SECTION of the settings file (written with CR LF).
ini_value() {
    awk -v s="[$1]" -v k="$2" '
        { sub(/\r$/, "") }
        /^\[/ { inside = ($0 == s); next }
        inside { i = index($0, "="); if (i && substr($0, 1, i - 1) == k) { print substr($0, i + 1); exit } }
    ' "$ini"
}
