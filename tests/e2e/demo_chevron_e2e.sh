#!/usr/bin/env bash
# The chevron with real X input: the main window narrowed to 330 pixels by a
# drag of its right border cuts "Style" off; a click on the chevron at the
# cut opens the menu of the buttons that cannot be seen, and one chosen from
# it is pressed as a click would (a screen reader in another process reads
# the new state); the keyboard reaches the chevron as Style's last stop; and
# the chevron goes when the window grows again. Leaves
# BUILD_DIR/e2e/chevron-*.png to look at.
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"

reader() { wine "$build/bin/qbr_reader.exe" "$@" </dev/null 2>/dev/null | tr -d "\r"; }
keys() { xdotool key --delay 60 "$@"; sleep 0.4; }
item() { reader list "$main" | awk -v t="toolbar \"$1\"" -v n="\"$2\"" '
    /^toolbar/ { inside = ($0 == t); next }
    inside && index($0, n) { print; exit }'; }
checked() { case "$(item Style "$1")" in *checked*) return 0 ;; esac; return 1; }

rm -f "$ini"
start_demo "chevron"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
[ -z "$(item Style 'More buttons')" ] || fail "a chevron at the full width"

# Narrow the window by its right border, as a hand does.
ldrag $((mr - 2)) $(((mt + mb) / 2)) $((ml + 330 - 2)) $(((mt + mb) / 2))
read -r nl nt nr nb nv <<<"$(ctl rect "$main")"
[ $((nr - nl)) = 330 ] || fail "the window is $((nr - nl)) pixels wide, not 330"
line=$(item Style 'More buttons')
case "$line" in *buttonmenu*) ;; *) fail "no chevron on Style at 330 pixels: '$line'" ;; esac
shot chevron-1-narrow

# The chevron stands at the client area's right edge, on Style's row; the
# top dock starts at the client area's left edge, so the border is known.
read -r dv dl _ <<<"$(dock_rect "$main" top)"
border=$((dl - nl))
read -r v l t r b <<<"$(toolbar_rect "$main" pane Style)"
checked Justified && fail "Justify starts checked"
xdotool mousemove $((nr - border - 7)) $(((t + b) / 2))
sleep 0.2
xdotool click 1
sleep 0.6
shot chevron-2-menu
# The menu lists Left, Centered, Right, Justified; the fourth is chosen.
keys Down Down Down Down Return
settle
checked Justified || fail "Justify was not pressed from the chevron's menu: $(item Style Justified)"
checked Left && fail "Left stayed checked beside Justify"

# The keyboard: F6, Tab to Style, End to the chevron, Enter, the first line.
keys F6 Tab End
[ "$(reader focus "$main")" = "Style: More buttons" ] || fail "End did not reach the chevron: $(reader focus "$main")"
keys Return
keys Down Return
settle
checked Left || fail "Left was not pressed from the keyboard's chevron menu: $(item Style Left)"
keys Escape

# Grown again: no chevron.
# Low on the border: the floating Palette lies over its middle now.
ldrag $((nr - 2)) $((nb - 60)) $((mr - 2)) $((nb - 60))
[ -z "$(item Style "More buttons")" ] || fail "the chevron stayed after the window grew: $(ctl rect "$main") $(item Style "More buttons")"
shot chevron-3-grown
stop_demo "chevron"
echo "PASS"
