#!/usr/bin/env bash
# One user's session with real X input: toolbars torn off and docked at the
# sides, a button moved by a right drag, button text on from the keyboard;
# the arrangement survives a restart (to the pixel but for side-docked shapes,
# measured anew) and the next close writes the same lines (journey-*.png).
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"

main_section() { tr -d '\r' <"$ini" | awk '/^\[/ { inside = ($0 == "[Main Layout]"); next } inside && NF'; }
# Every toolbar window and the top dock, sorted; side-docked panes are left
# out (a restart measures them anew; in_side_dock checks those), and hidden
# frames (placed only as they show; the stored lines keep their places).
arrangement() {
    { ctl toolbars "$main" | grep -v -e '^pane .* Standard$' -e '^pane .* Palette$' -e '^frame 0 '; dock_rect "$main" top | sed 's/^/top dock /'; } | sort
}
# Pane $1 is shown inside the dock on side $2.
in_side_dock() {
    local v l t r b dv dl dt dr db
    read -r v l t r b <<<"$(toolbar_rect "$main" pane "$1")"
    read -r dv dl dt dr db <<<"$(dock_rect "$main" "$2")"
    [ "$v$dv" = 11 ] && [ "$l" -ge $((dl - 1)) ] && [ "$r" -le $((dr + 1)) ] && [ "$t" -ge $((dt - 1)) ] ||
        fail "$1 is not shown in the $2 dock: $v $l $t $r $b in $dv $dl $dt $dr $db"
}

rm -f "$ini"
start_demo "first start"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"

# ---- Tear "Standard" off: a left drag on its empty space, out of the dock ----
read -r v l t r b <<<"$(toolbar_rect "$main" pane Standard)"
[ "$v" = 1 ] || fail "Standard does not start docked"
read -r sv sl st sr sb <<<"$(toolbar_rect "$main" pane Style)"
x=$((r - 4)) y=$(((t + b) / 2)) # the right margin, beside the last button
ldrag $x $y 600 400
read -r fv fl ft fr fb <<<"$(toolbar_rect "$main" frame Standard)"
read -r pv _ <<<"$(toolbar_rect "$main" pane Standard)"
[ "$fv $pv" = "1 0" ] || fail "Standard not torn off: frame visible $fv, pane visible $pv"
# The frame's corner moved as far as the cursor did.
[ "$fl $ft" = "$((l + 600 - x)) $((t + 400 - y))" ] || fail "Standard floats at $fl,$ft, not where it was let go"
read -r v l2 _ <<<"$(toolbar_rect "$main" pane Style)"
[ "$l2" = "$sl" ] || [ "$l2" -lt "$sl" ] || fail "Style did not close the gap: $sl -> $l2"
shot journey-1-torn-off

[ -z "$(dock_rect "$main" left)$(dock_rect "$main" right)" ] || fail "a side dock exists on a first start"
stop_demo "first close"
[ "$(ini_value 'Main Layout' 'Top Dock')" = "Standard,Style,Align,Palette" ] || fail "top dock line: $(ini_value 'Main Layout' 'Top Dock')"
case "$(ini_value 'Main Layout' Standard)" in 10,101,102,104,0,107,108,109,0,106,151,33,*) ;;
*) fail "Standard line after tearing off: $(ini_value 'Main Layout' Standard)" ;; esac

# A stored dock line naming no toolbar makes an empty, hidden side dock: a drop target.
awk '{ print } /^\[Main Layout\]/ { printf "Left Dock=none\r\nRight Dock=none\r\n" }' "$ini" >"$ini.new" && mv "$ini.new" "$ini"
start_demo "with side docks"
read -r lv ll lt lr lb <<<"$(dock_rect "$main" left)"
read -r rv rl rt rr rb <<<"$(dock_rect "$main" right)"
[ "$lv" = 0 ] && [ "$rv" = 0 ] || fail "empty side docks are not hidden: left '$lv' right '$rv'"

# Drags floating $1 by its caption onto side dock $2; sets the pane's
# (kl kt kr kb) and the dock's (dl dt dr db) rectangles after the drop.
dock_by_caption() {
    local v l t r b x y pv fv dv
    read -r v l t r b <<<"$(toolbar_rect "$main" frame "$1")"
    read -r x y <<<"$(caption_point $l $t $r $b)"
    read -r dv dl dt dr db <<<"$(dock_rect "$main" "$2")"
    ldrag $x $y $(((dl + dr) / 2)) $((dt + 150))
    read -r pv kl kt kr kb <<<"$(toolbar_rect "$main" pane "$1")"
    read -r fv _ <<<"$(toolbar_rect "$main" frame "$1")"
    read -r dv dl dt dr db <<<"$(dock_rect "$main" "$2")"
    [ "$pv $fv $dv" = "1 0 1" ] || fail "$1 not docked $2: pane $pv frame $fv dock $dv"
}

# ---- Dock "Standard" on the left ----
dock_by_caption Standard left
pl=$kl pt=$kt pr=$kr pb=$kb
[ "$pl" -ge $((dl - 1)) ] && [ "$pr" -le $((dr + 1)) ] && [ "$pt" -ge $((dt - 1)) ] ||
    fail "Standard is not inside the left dock: $pl $pt $pr $pb in $dl $dt $dr $db"

# ---- Dock "Palette" on the right ----
dock_by_caption Palette right
[ "$dr" -le "$mr" ] && [ "$kl" -ge $((dl - 1)) ] && [ "$kr" -le $((dr + 1)) ] ||
    fail "Palette is not inside the right dock at the frame's edge: $kl $kt $kr $kb in $dl $dt $dr $db"
shot journey-3-sides

# ---- Move "New" (101) from Standard to the end of Style: a right drag ----
read -r v sl st sr sb <<<"$(toolbar_rect "$main" pane Style)"
read -r x y <<<"$(button_centre $pl $pt 0)"
rdrag $x $y $((sr - 4)) $(((st + sb) / 2))
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
[ $((r - l)) = $((sr - sl + 23)) ] || fail "Style did not grow by one button: $((sr - sl)) -> $((r - l)) (is customising off?)"
read -r v l2 t2 r2 b2 <<<"$(toolbar_rect "$main" pane Standard)"
[ $((r2 - l2)) = $((pr - pl - 23)) ] || [ $((b2 - t2)) -lt $((pb - pt)) ] || fail "Standard did not lose a button: $pl $pt $pr $pb -> $l2 $t2 $r2 $b2"

# ---- Align's frame narrowed by its right edge: its buttons take more rows ----
read -r v l t r b <<<"$(toolbar_rect "$main" frame Align)"
ldrag $((r - 2)) $(((t + b) / 2)) $((r - 50)) $(((t + b) / 2))
read -r v l2 t2 r2 b2 <<<"$(toolbar_rect "$main" frame Align)"
[ "$r2" -lt "$r" ] && [ $((b2 - t2)) -gt $((b - t)) ] || fail "Align was not sized by its edge: $l $t $r $b -> $l2 $t2 $r2 $b2"

# ---- Button text on, from the keyboard: View > Button Text ----
xdotool mousemove $((ml + 300)) $((mb - 100)) click 1 # the edit control takes the focus
settle
read -r v l t r b <<<"$(toolbar_rect "$main" pane Standard)"
xdotool key alt+v; sleep 0.4; xdotool key b; settle
read -r v l2 t2 r2 b2 <<<"$(toolbar_rect "$main" pane Standard)"
[ $((r2 - l2)) -gt $((r - l + 20)) ] && [ $((b2 - t2)) -gt $((b - t)) ] || fail "button text did not enlarge Standard: $l $t $r $b -> $l2 $t2 $r2 $b2"
shot journey-5-button-text
arrangement >"$out/journey-before.txt"
in_side_dock Standard left
in_side_dock Palette right
stop_demo "customised close"

# ---- What the file says ----
expect() { [ "$(ini_value "$1" "$2")" = "$3" ] || fail "[$1] $2 is '$(ini_value "$1" "$2")', expected '$3'"; }
expect_start() { case "$(ini_value 'Main Layout' "$1")" in "$2"*) ;; *) fail "$1 line '$(ini_value 'Main Layout' "$1")' does not start with '$2'" ;; esac; }
expect 'Main Layout' 'Top Dock' 'Style,Align'
expect 'Main Layout' 'Left Dock' 'Standard'
expect 'Main Layout' 'Right Dock' 'Palette'
expect_start Standard '9,102,104,0,107,108,109,0,106,151,17,'
expect_start Style '9,301,302,303,0,304,305,306,307,101,17,'
expect_start Palette '15,201,202,203,0,204,205,206,0,207,208,209,0,210,211,212,17,'
expect_start Align '4,401,402,403,404,33,300,100,'
expect 'Toolbar Globals' 'Button Text' 1
expect 'Toolbar Globals' 'Quick Help' 1
main_section >"$out/journey-1.txt"

# ---- Restart: every window where it was ----
start_demo "restart"
arrangement >"$out/journey-after.txt"
in_side_dock Standard left
in_side_dock Palette right
cmp -s "$out/journey-before.txt" "$out/journey-after.txt" ||
    fail "the restart did not bring the arrangement back: $(diff "$out/journey-before.txt" "$out/journey-after.txt")"
shot journey-6-restarted
stop_demo "second close"
main_section | cmp -s - "$out/journey-1.txt" || fail "the second close wrote other lines: $(main_section | diff "$out/journey-1.txt" -)"
expect 'Toolbar Globals' 'Button Text' 1
echo "1 passed, 0 failed"
