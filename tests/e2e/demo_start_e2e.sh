#!/usr/bin/env bash
# The demonstration program as a person starts it: default toolbars in their
# places, a menu command given with real X input, a clean close that writes
# the settings file. Leaves BUILD_DIR/e2e/*.png to look at.
set -u
. "$(dirname "$0")/lib.sh" "$1"
rm -f "$ini"
start_demo "first start"

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
shot demo-start

# View > Button Text with real keys, as a person without a mouse would.
read -r ml mt mr mb mv <<<"$(ctl rect 'Quaybar Demo')"
xdotool mousemove $((ml + 300)) $((mt + 300)) click 1 # the edit control: the window has the focus
sleep 0.3
[ "$(ctl status 'Quaybar Demo')" = "Welcome to the Quaybar Demo!" ] || fail "status line at start: $(ctl status 'Quaybar Demo')"
xdotool key alt+v
sleep 0.5
shot demo-menu
line=$(ctl status 'Quaybar Demo')
[ "$line" != "Welcome to the Quaybar Demo!" ] && [ -n "$line" ] || fail "the open menu did not change the status line"
xdotool key b
sleep 1
shot demo-button-text
read -r l t r b v <<<"$(ctl rect Align)"
[ $((b - t)) -gt 60 ] || fail "button text did not make Align taller: height $((b - t))"

# A press on the first button of "Standard" (New, 101) shows its line while
# the button is held, and the release takes it back.
read -r l t r b v <<<"$(ctl childrect 'Quaybar Demo' Standard)"
xdotool mousemove $((l + 20)) $((t + 15)) mousedown 1
sleep 0.4
line=$(ctl status 'Quaybar Demo')
xdotool mouseup 1
sleep 0.4
[ "$line" = "Display help text for identifier #101." ] || fail "status line during the press: '$line'"
line=$(ctl status 'Quaybar Demo')
[ "$line" = "Welcome to the Quaybar Demo!" ] || fail "status line after the release: '$line'"

# The About box, opened with the last button of "Standard", stays above the
# floating toolbars while it is open, also once the activation has settled;
# when it closes they are above the main window again.
above() { # above ORDER FIRST SECOND: FIRST is listed before SECOND
    local a b
    a=$(grep -n -m1 "^$2" <<<"$1" | cut -d: -f1)
    b=$(grep -n -m1 "^$3" <<<"$1" | cut -d: -f1)
    [ -n "$a" ] && [ -n "$b" ] && [ "$a" -lt "$b" ]
}
read -r l t r b v <<<"$(ctl childrect 'Quaybar Demo' Standard)"
xdotool mousemove $((r - 15)) $((t + 15)) click 1
ctl wait "About QBR" 5000 || fail "the About button opened no About box"
sleep 1.5
order=$(ctl zorder)
for title in Align Palette; do
    above "$order" "About QBR owned by" "$title owned by" || fail "$title covers the About box: $order"
done
shot demo-about
xdotool key Return
sleep 1.5
order=$(ctl zorder)
! grep -q "^About QBR" <<<"$order" || fail "the About box did not close"
for title in Align Palette; do
    above "$order" "$title owned by" "Quaybar Demo$" || fail "$title is not above the main window after the About box: $order"
done

stop_demo "after the first start"

grep -q '^\[Main Layout\]' "$ini" || fail "no [Main Layout] in $ini"
grep -q '^Top Dock=Standard,Style,Align,Palette' "$ini" || fail "dock line wrong: $(grep 'Top Dock' "$ini")"
grep -q '^\[Toolbar Globals\]' "$ini" || fail "no [Toolbar Globals]"
grep -q '^Quick Help=1' "$ini" || fail "Quick Help not written"
grep -q '^Button Text=1' "$ini" || fail "Button Text not written as switched on"
echo "1 passed, 0 failed"
