#!/usr/bin/env bash
# The bottom dock with real X input: a first close writes no line for the
# empty bottom dock; "Style" dragged to the bottom edge of the main window
# docks there above the status bar, is stored under "Bottom Dock" and comes
# back there after a restart; dragged out again it floats, the dock hides,
# and the floating toolbar keeps the bottom dock as its own. Leaves BUILD_DIR/e2e/bottom-*.png to look at.
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"

bottom_dock() { dock_rect "$main" bottom; }
# Pane $1 is shown inside the bottom dock.
in_bottom_dock() {
    local v l t r b dv dl dt dr db
    read -r v l t r b <<<"$(toolbar_rect "$main" pane "$1")"
    read -r dv dl dt dr db <<<"$(bottom_dock)"
    [ "$v$dv" = 11 ] && [ "$t" -ge $((dt - 1)) ] && [ "$b" -le $((db + 1)) ] && [ "$l" -ge $((dl - 1)) ] ||
        fail "$1 is not shown in the bottom dock: $v $l $t $r $b in $dv $dl $dt $dr $db"
}

rm -f "$ini"
start_demo "first start"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
read -r dv dl dt dr db <<<"$(bottom_dock)"
[ "$dv" = 0 ] || fail "the bottom dock shows on a first start"
# Its placeholder stands on the status bar, which stays below everything.
read -r sl st sr sb sv <<<"$(ctl statusrect "$main")"
[ "$sv" = 1 ] && [ "$db" = "$st" ] || fail "the bottom dock does not stand on the status bar: $db, bar at $st"
stop_demo "first close"
tr -d '\r' <"$ini" | grep -q '^Bottom Dock=' && fail "an empty bottom dock was written"
[ "$(ini_value 'Main Layout' 'Top Dock')" = "Standard,Style,Align,Palette" ] || fail "top dock line changed"

start_demo "second start"
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
[ "$v" = 1 ] || fail "Style does not start docked"
ldrag $((r - 4)) $(((t + b) / 2)) $(((ml + mr) / 2)) $(((dt + db) / 2))
in_bottom_dock Style
read -r dv2 dl2 dt2 dr2 db2 <<<"$(bottom_dock)"
[ "$db2" = "$db" ] || fail "the bottom dock did not grow upwards from its edge: $db -> $db2"
read -r sl2 st2 _ <<<"$(ctl statusrect "$main")"
[ "$st2" = "$st" ] || fail "the status bar moved: $st -> $st2"
before="$(toolbar_rect "$main" pane Style)"
shot bottom-1-docked
stop_demo "close with Style at the bottom"
[ "$(ini_value 'Main Layout' 'Bottom Dock')" = "Style" ] || fail "bottom dock line: $(ini_value 'Main Layout' 'Bottom Dock')"

start_demo "restart"
in_bottom_dock Style
[ "$(toolbar_rect "$main" pane Style)" = "$before" ] || fail "Style came back elsewhere: $before -> $(toolbar_rect "$main" pane Style)"
shot bottom-2-restarted
# Out again onto the client area: it floats and the dock hides.
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
ldrag $((r - 4)) $(((t + b) / 2)) $(((ml + mr) / 2)) $(((mt + mb) / 2))
read -r fv _ <<<"$(toolbar_rect "$main" frame Style)"
read -r dv _ <<<"$(bottom_dock)"
[ "$fv $dv" = "1 0" ] || fail "Style did not float out of the bottom dock: frame $fv, dock $dv"
stop_demo "last close"
# A floating toolbar stays in the list of the dock it came from, to go back
# there on a double click; so the line stays.
[ "$(ini_value 'Main Layout' 'Bottom Dock')" = "Style" ] || fail "the floating Style lost its dock"
echo "PASS"
