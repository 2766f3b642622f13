#!/usr/bin/env bash
# A person narrows the window by its border to 330 pixels: "Style" is cut off,
# its chevron offers the hidden buttons and the one chosen is pressed (a reader
# in another process reads it); the chevron goes when the window grows. Then
# "Style" dragged to the bottom edge docks above the status bar and comes back
# there after a restart. Leaves BUILD_DIR/e2e/narrow-*.png to look at.
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"

keys() { xdotool key --delay 60 "$@"; sleep 0.4; }
checked() { case "$(item Style "$1")" in *checked*) return 0 ;; esac; return 1; }
in_bottom_dock() {
    local v l t r b dv dl dt dr db
    read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
    read -r dv dl dt dr db <<<"$(dock_rect "$main" bottom)"
    [ "$v$dv" = 11 ] && [ "$t" -ge $((dt - 1)) ] && [ "$b" -le $((db + 1)) ] && [ "$l" -ge $((dl - 1)) ] ||
        fail "Style is not shown in the bottom dock: $v $l $t $r $b in $dv $dl $dt $dr $db"
}

# A settings file of a release without the bottom dock: the dock is made anyway.
rm -f "$ini"
start_demo "first start"
stop_demo "first start"
sed -i '/^Bottom Dock=/d' "$ini"
start_demo "a file without the bottom dock"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
[ -z "$(item Style 'More buttons')" ] || fail "a chevron at the full width"
ldrag $((mr - 2)) $(((mt + mb) / 2)) $((ml + 330 - 2)) $(((mt + mb) / 2))
read -r nl nt nr nb nv <<<"$(ctl rect "$main")"
[ $((nr - nl)) = 330 ] || fail "the window is $((nr - nl)) pixels wide, not 330"
case "$(item Style 'More buttons')" in *buttonmenu*) ;; *) fail "no chevron on Style at 330 pixels" ;; esac
# The chevron stands at the client area's right edge, on Style's row.
read -r _ dl _ <<<"$(dock_rect "$main" top)"
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
checked Justified && fail "Justify starts checked"
xdotool mousemove $((nr - (dl - nl) - 7)) $(((t + b) / 2))
sleep 0.2
xdotool click 1
sleep 0.6
shot narrow-1-menu
keys Down Down Down Down Return # Left, Centered, Right, Justified
settle
checked Justified || fail "Justify was not pressed from the chevron's menu: $(item Style Justified)"
checked Left && fail "Left stayed checked beside Justify"
keys F6 Tab End # the keyboard: Style's last stop is its chevron
[ "$(reader focus "$main")" = "Style: More buttons" ] || fail "End did not reach the chevron: $(reader focus "$main")"
keys Return
keys Down Return
settle
checked Left || fail "Left was not pressed from the keyboard's chevron menu: $(item Style Left)"
keys Escape
ldrag $((nr - 2)) $((nb - 60)) $((mr - 2)) $((nb - 60))
[ -z "$(item Style "More buttons")" ] || fail "the chevron stayed after the window grew"
shot narrow-2-grown
read -r dv dl dt dr db <<<"$(dock_rect "$main" bottom)"
read -r sl st sr sb sv <<<"$(ctl statusrect "$main")"
[ "$dv $sv $db" = "0 1 $st" ] || fail "the hidden bottom dock does not stand on the status bar: $dv $db, bar $sv $st"
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
ldrag $((r - 4)) $(((t + b) / 2)) $(((ml + mr) / 2)) $(((dt + db) / 2))
in_bottom_dock
read -r _ _ _ _ db2 <<<"$(dock_rect "$main" bottom)"
[ "$db2" = "$db" ] || fail "the bottom dock did not grow upwards from its edge: $db -> $db2"
before="$(toolbar_rect "$main" pane Style)"
shot narrow-3-bottom
stop_demo "close with Style at the bottom"
[ "$(ini_value 'Main Layout' 'Bottom Dock')" = "Style" ] || fail "bottom dock line: $(ini_value 'Main Layout' 'Bottom Dock')"

start_demo "restart"
in_bottom_dock
[ "$(toolbar_rect "$main" pane Style)" = "$before" ] || fail "Style came back elsewhere: $before -> $(toolbar_rect "$main" pane Style)"
stop_demo "last close"
echo "PASS"
