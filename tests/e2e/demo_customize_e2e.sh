#!/usr/bin/env bash
# A user customises with mouse and keys: the toolbar menu opens Insert Toolbar
# Item, a new toolbar "Mine" is made there and three buttons dragged onto it
# from the list; a restart brings it back and the next close writes the same
# lines. Leaves BUILD_DIR/e2e/customize-*.png to look at.
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"
rm -f "$ini"

# A line of the dialog's item list is a button's height (22) plus 6.
line_h=28
ids_of() { cut -d, -f2-$(($(cut -d, -f1 <<<"$1") + 1)) <<<"$1"; }
flags_of() { cut -d, -f$(($(cut -d, -f1 <<<"$1") + 2)) <<<"$1"; }

start_demo "first start"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
# The frame narrowed by its corner, clear of the Insert dialog in the middle
# of the screen (under Wine the main window may come above that dialog).
ldrag $((mr - 3)) $((mb - 3)) $((ml + 300)) $((mt + 420))
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
[ "$mr" -le $((ml + 320)) ] || fail "the main window was not narrowed: $ml $mt $mr $mb"
xdotool mousemove $((ml + 150)) $((mt + 300)) click 1 # the edit control: the window has the focus
sleep 0.3

# ---- The toolbar menu, from the empty margin left of Standard's first button -------
read -r l t r b v <<<"$(ctl childrect "$main" Standard)"
[ "$v" = 1 ] || fail "no Standard pane"
xdotool mousemove $((l + 2)) $(((t + b) / 2)) click 3
sleep 0.6
shot customize-menu
# "Insert Item..." stands above "Lock the Toolbars" and "Reset Toolbars..." (customising is on unless a host turns it off).
xdotool key Up Up Up Return
ctl wait "Insert Toolbar Item" 5000 || fail "the toolbar menu did not open the Insert Toolbar Item dialog"
sleep 0.5

# ---- The dialog: category "Align" (the fifth), then a new toolbar ------------------
# The combo box has the focus; each Down picks the next category at once.
xdotool key Down Down Down Down
sleep 0.4
read -r nl nt nr nb nv <<<"$(ctl childrect "Insert Toolbar Item" "&New...")"
[ "$nv" = 1 ] || fail "no New button in the dialog"
shot customize-insert
xdotool mousemove $(((nl + nr) / 2)) $(((nt + nb) / 2)) click 1
ctl wait "New Toolbar" 5000 || fail "New... did not open the New Toolbar dialog"
sleep 0.4
xdotool type --delay 80 Mine
sleep 0.2
shot customize-new-toolbar
read -r il it ir ib iv <<<"$(ctl rect "Insert Toolbar Item")"
xdotool key Return
ctl wait Mine 5000 || fail "no toolbar Mine after OK"
sleep 0.5
read -r l t r b v <<<"$(ctl rect Mine)"
[ "$v" = 1 ] || fail "Mine is not shown"
[ "$l $t" = "$il $ib" ] || fail "Mine floats at $l,$t, not below the Insert dialog ($il $it $ir $ib)"

# The list box, from the dialog-unit geometry of the New button (194, 25,
# 44 by 14): the list stands at (5, 51), 48 wide, with a one-pixel border.
list_x=$(( nl + ((5 - 194) * (nr - nl) + 48 / 2 * (nr - nl)) / 44 ))
list_top=$(( nt + (51 - 25) * (nb - nt) / 14 + 1 ))
for n in 0 1 2; do
    read -r l t r b v <<<"$(ctl rect Mine)"
    # Each drop behind the last item, at the right end of the row.
    ldrag "$list_x" $((list_top + n * line_h + line_h / 2)) $((r - 5)) $((b - 6))
done
shot customize-mine
read -r cl ct cr cb cv <<<"$(ctl childrect "Insert Toolbar Item" Close)"
xdotool mousemove $(((cl + cr) / 2)) $(((ct + cb) / 2)) click 1
for _ in $(seq 1 20); do ctl wait "Insert Toolbar Item" 0 || break; sleep 0.2; done
ctl wait "Insert Toolbar Item" 0 && fail "Close did not close the Insert dialog"

stop_demo "after customising"
cp "$ini" "$out/customize-first.ini"
mine=$(ini_value 'Main Layout' Mine)
[ -n "$mine" ] || fail "no Mine line: $(cat "$ini")"
[ "$(ids_of "$mine" | tr , '\n' | sort | paste -sd,)" = "401,402,403" ] || fail "Mine's buttons: $mine"
[ $(($(flags_of "$mine") & 0x8000)) != 0 ] || fail "Mine not marked as the user's: $mine"
[ $(($(flags_of "$mine") & 0x21)) = 33 ] || fail "Mine not shown floating: $mine"
case "$(ini_value 'Main Layout' 'Top Dock')" in *Mine*) ;; *) fail "Mine not in the dock line: $(ini_value 'Main Layout' 'Top Dock')" ;; esac

# ---- Restart: Mine is back, and the next close writes the same lines --------------
start_demo "restart"
read -r l t r b v <<<"$(ctl rect Mine)"
[ "$v" = 1 ] || fail "Mine did not come back"
[ "$l,$t" = "$(cut -d, -f$(($(cut -d, -f1 <<<"$mine") + 3))-$(($(cut -d, -f1 <<<"$mine") + 4)) <<<"$mine")" ] ||
    fail "Mine came back at $l,$t, stored: $mine"
shot customize-restart
stop_demo "restart"
for key in Mine 'Top Dock'; do
    before=$(tr -d '\r' <"$out/customize-first.ini" | awk -v k="$key=" 'index($0, k) == 1')
    after=$(tr -d '\r' <"$ini" | awk -v k="$key=" 'index($0, k) == 1')
    [ "$before" = "$after" ] || fail "$key changed at the next close: '$before' -> '$after'"
done
echo "customising survived a restart"
