# Shared by the end-to-end scripts: the Wine environment, the control tool,
# starting and ending the demo. $1 is the build folder, $2 the DPI (96 when
# absent; the build folder's prefix of that scale, wine-env.sh BUILD_DIR DPI).
build=$(cd "$1" && pwd)
dpi=${2:-96}
suffix=""
[ "$dpi" != 96 ] && suffix="-$dpi"
here=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
"$here/scripts/wine-env.sh" start "$build" "$dpi" || exit 1
. "$build/wine-env$suffix/exports.sh"
out="$build/e2e"
mkdir -p "$out"
# Each script runs the program from BUILD/e2e/<script>[-DPI]/, so its settings
# file ($ini) is its own and the user's build/bin/qbrdemo.INI is never touched.
run="$out/$(basename "$0" .sh)$suffix"
mkdir -p "$run"
ini="$run/qbrdemo.INI"
main="Quaybar Demo"
demo_pid=""

ctl() { wine "$build/bin/qbr_ctl.exe" "$@" </dev/null 2>/dev/null | tr -d "\r"; return "${PIPESTATUS[0]}"; }
# A dialog left open by a failure would keep the main window open: it goes first.
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
    # Generous: a start on a loaded machine once took over 20 s.
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
