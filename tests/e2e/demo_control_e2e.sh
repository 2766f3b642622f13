#!/usr/bin/env bash
# A user locks the toolbars from the menu bar, and every gesture that moves a
# toolbar or its buttons does nothing: drags, double clicks, right drags, the
# nudge, sizing by the edge, Ctrl+arrows and Delete, Insert Item... (greyed);
# the windows stay and the file differs from a first run's by the lock alone.
# Unlocked, the user moves things, makes a toolbar and resets: the next close
# writes a first run's file byte for byte. Leaves BUILD_DIR/e2e/control-*.png.
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"
rm -f "$ini"

keys() { for k in "$@"; do xdotool key "$k"; sleep 0.3; done; settle; }
dclick() { xdotool mousemove "$1" "$2"; sleep 0.1; xdotool click --repeat 2 --delay 80 1; settle; }
# The toolbar menu's items from the menu bar, as a keyboard user reaches them.
toolbars_menu() { keys alt+v t "$1"; }

start_demo "first run"
stop_demo "first run"
cp "$ini" "$run/first.ini"
grep -q '^Locked=0' "$ini" || fail "the lock is not kept with the global settings"

start_demo "locked gestures"
before=$(ctl toolbars "$main")
toolbars_menu l
read -r v l t r b <<<"$(toolbar_rect "$main" frame Align)"
read -r cx cy <<<"$(caption_point "$l" "$t" "$r" "$b")"
read -r dv dl dt dr db <<<"$(dock_rect "$main" top)"
read -r sv sl st sr sb <<<"$(toolbar_rect "$main" pane Standard)"
read -r pv pl pt pr pb <<<"$(toolbar_rect "$main" frame Palette)"
read -r bx by <<<"$(button_centre "$sl" "$st" 0)"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
ldrag "$cx" "$cy" $((cx + 150)) $((cy + 150))          # a floating toolbar moved
ldrag "$cx" "$cy" $((dl + 300)) $(((dt + db) / 2))      # and dropped into the dock
dclick "$cx" "$cy"                                      # docked by a double click
dclick $((sl + 80)) $(((st + sb) / 2))                  # floated by one on the separator
rdrag "$bx" "$by" $((ml + 200)) $((mb - 80))            # a button dragged off every toolbar
nudge "$bx" "$by" 6                                     # a separator opened beside it
ldrag $((pr - 2)) $(((pt + pb) / 2)) $((pr + 80)) $(((pt + pb) / 2))   # the frame sized by its edge
keys F6 ctrl+Right Delete Escape                        # the keyboard's move and removal
toolbars_menu i                                         # Insert Item... is greyed
ctl wait "Insert Toolbar Item" 1000 && fail "the Insert dialog opened while locked"
keys Escape Escape Escape
after=$(ctl toolbars "$main")
[ "$before" = "$after" ] || fail "a locked toolbar moved: $(diff <(echo "$before") <(echo "$after"))"
shot control-1-locked
stop_demo "locked gestures"
grep -q '^Locked=1' "$ini" || fail "the lock was not turned on from the menu bar"
sed 's/^Locked=1/Locked=0/' "$ini" | cmp -s - "$run/first.ini" || fail "the locked gestures changed the file: $(diff "$run/first.ini" "$ini")"

start_demo "reset"
toolbars_menu l                                         # unlocked
read -r v l t r b <<<"$(toolbar_rect "$main" frame Align)"
read -r cx cy <<<"$(caption_point "$l" "$t" "$r" "$b")"
dclick "$cx" "$cy"                                      # Align docks
read -r sv sl st sr sb <<<"$(toolbar_rect "$main" pane Standard)"
read -r bx by <<<"$(button_centre "$sl" "$st" 0)"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
rdrag "$bx" "$by" $((ml + 200)) $((mb - 80))            # New leaves Standard
toolbars_menu n
ctl wait "New Toolbar" 5000 || fail "New Toolbar... did not open from the menu bar"
xdotool type Mine
keys Return
[ -n "$(toolbar_rect "$main" frame Mine)" ] || fail "the user's toolbar was not made"
[ "$before" != "$(ctl toolbars "$main")" ] || fail "nothing changed before the reset"
shot control-2-changed
toolbars_menu r
ctl wait Toolbar 5000 || fail "the reset asked nothing"
keys Return                                             # Yes
[ -z "$(toolbar_rect "$main" frame Mine)" ] || fail "the reset kept the user's toolbar"
# (Sorted: the window system lists new windows in an order of its own.)
[ "$(sort <<<"$before")" = "$(ctl toolbars "$main" | sort)" ] ||
    fail "the reset did not bring the first arrangement back: $(diff <(sort <<<"$before") <(ctl toolbars "$main" | sort))"
shot control-3-reset
stop_demo "reset"
cmp -s "$ini" "$run/first.ini" || fail "the file after the reset is not a first run's: $(diff "$run/first.ini" "$ini")"
echo "PASS: locked gestures change nothing; the reset writes a first run's file"
