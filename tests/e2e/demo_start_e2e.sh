#!/usr/bin/env bash
# The demonstration program as a person starts it: default toolbars in their
# places, a menu command given with real X input, a clean close that writes
# the settings file. Leaves BUILD_DIR/e2e/*.png to look at.
set -u
build=$(cd "$1" && pwd)
here=$(cd "$(dirname "$0")/../.." && pwd)
"$here/scripts/wine-env.sh" start "$build" || exit 1
. "$build/wine-env/exports.sh"
out="$build/e2e"
mkdir -p "$out"
ctl() { wine "$build/bin/qbr_ctl.exe" "$@" </dev/null 2>/dev/null | tr -d "\r"; return "${PIPESTATUS[0]}"; }
fail() { echo "FAIL: $*"; ctl close "Quaybar Demo"; exit 1; }
ini="$build/bin/qbrdemo.INI"
rm -f "$ini"

wine "$build/bin/qbrdemo.exe" </dev/null >>"$out/demo.log" 2>&1 &
pid=$!
ctl wait "Quaybar Demo" 20000 || fail "the main window did not appear"
sleep 1

# Floating frames: "Align" at (300, 100); "Palette" at (300, 200), made 100
# wide, wrapped into rows and then narrowed by the refit.
read -r l t r b v <<<"$(ctl rect Align)"
[ "$l $t $v" = "300 100 1" ] || fail "Align frame at $l,$t visible=$v"
read -r l t r b v <<<"$(ctl rect Palette)"
[ "$l $t $v" = "300 200 1" ] || fail "Palette frame at $l,$t visible=$v"
[ "$r" -lt 400 ] || fail "Palette frame not narrowed: right $r"
[ $((b - t)) -gt 80 ] || fail "Palette not wrapped into rows: height $((b - t))"
read -r l t r b v <<<"$(ctl rect Standard)"
[ "$v" = "0" ] || fail "Standard starts docked, its floating frame hidden"
# A person must see them: each floating frame above the main window.
order=$(ctl zorder)
main_at=$(grep -n '^Quaybar Demo$' <<<"$order" | cut -d: -f1)
for title in Align Palette; do
    at=$(grep -n "^$title owned by" <<<"$order" | cut -d: -f1)
    [ -n "$at" ] && [ "$at" -lt "$main_at" ] || fail "$title is not above the main window: $order"
done
/usr/bin/import -display "$DISPLAY" -window root "$out/demo-start.png"

# View > Button Text with real keys, as a person without a mouse would.
read -r ml mt mr mb mv <<<"$(ctl rect 'Quaybar Demo')"
xdotool mousemove $((ml + 300)) $((mt + 300)) click 1 # the edit control: the window has the focus
sleep 0.3
xdotool key alt+v
sleep 0.5
/usr/bin/import -display "$DISPLAY" -window root "$out/demo-menu.png"
xdotool key b
sleep 1
/usr/bin/import -display "$DISPLAY" -window root "$out/demo-button-text.png"
read -r l t r b v <<<"$(ctl rect Align)"
[ $((b - t)) -gt 60 ] || fail "button text did not make Align taller: height $((b - t))"

ctl close "Quaybar Demo"
for _ in $(seq 1 100); do kill -0 $pid 2>/dev/null || break; sleep 0.1; done
kill -0 $pid 2>/dev/null && { kill $pid; fail "the program did not end after WM_CLOSE"; }

grep -q '^\[Main Layout\]' "$ini" || fail "no [Main Layout] in $ini"
grep -q '^Top Dock=Standard,Style,Align,Palette' "$ini" || fail "dock line wrong: $(grep 'Top Dock' "$ini")"
grep -q '^\[Toolbar Globals\]' "$ini" || fail "no [Toolbar Globals]"
grep -q '^Quick Help=1' "$ini" || fail "Quick Help not written"
grep -q '^Button Text=1' "$ini" || fail "Button Text not written as switched on"
echo "1 passed, 0 failed"
