#!/usr/bin/env bash
# Without a mouse: real X keys move through the toolbars, press buttons and
# open the toolbar menu, and a screen reader in another process (qbr_reader)
# reads what a person would hear; the settings file keeps what the keys
# changed. The DPI is the optional second argument (BUILD_DIR 192).
set -u
. "$(dirname "$0")/lib.sh" "$1" "${2:-96}"
rm -f "$ini"
start_demo "keyboard"

keys() { xdotool key --delay 60 "$@"; sleep 0.4; }
expect_focus() { local got; got=$(reader focus "$main"); [ "$got" = "$1" ] || fail "focus: '$got', expected '$1' ($2)"; }
expect_item() { local got; got=$(item "$1" "$2"); [ "$got" = "$3" ] || fail "$1/$2 reads '$got', expected '$3'"; }

# A screen reader finds every toolbar and every item, with its state.
list=$(reader list "$main") || fail "the reader could not read the toolbars"
echo "$list" >"$out/keyboard-reader$suffix.txt"
for t in Standard Style Align Palette; do grep -qx "toolbar \"$t\"" <<<"$list" || fail "no toolbar $t: $list"; done
expect_item Standard New '  1 push "New" focusable "Press"'
expect_item Standard Cut '  5 push "Cut" unavailable "Press"'
expect_item Style Bold '  1 check "Bold" mixed,focusable "Check"'
expect_item Style Left '  5 radio "Left" checked,focusable ""'
# (A toolbar cut off at this scale has its chevron, "More buttons", besides.)
[ "$(grep '^  ' <<<"$list" | grep -vc ' buttonmenu ')" = 37 ] || fail "37 items in all: $list"
expect_focus none "a mouse user sees nothing new"

# F6 into the toolbars; Right passes over the disabled Cut.
keys F6
expect_focus "Standard: New" "F6"
keys Right Right
expect_focus "Standard: Save" "F6 Right Right"
keys Right
expect_focus "Standard: Copy" "Right over the disabled Cut"
shot keyboard-focus

# Tab to Style; Space and Enter press as the mouse does; the radio group moves.
keys Tab
expect_focus "Style: Bold" "Tab"
keys Right space
expect_item Style Italic '  2 check "Italic" checked,focusable,focused "Uncheck"'
# End: the last button of Style, or, where the frame cuts Style off at this
# scale, its chevron, whose menu ends with Justified.
keys End
if [ "$(reader focus "$main")" = "Style: More buttons" ]; then
    keys Return Up Return
    expect_focus "Style: More buttons" "the chevron again after its menu"
    expect_item Style Justified '  8 radio "Justified" checked,focusable,offscreen ""'
else
    keys Return
    expect_focus "Style: Justified" "End"
    expect_item Style Justified '  8 radio "Justified" checked,focusable,focused ""'
fi
expect_item Style Left '  5 radio "Left" focusable "Check"'

# Tab on to the floating toolbars in the manager's order; Down in the Palette
# goes to the button below.
keys Tab
expect_focus "Align: Align top" "Tab to the first floating toolbar"
keys Tab Down
expect_focus "Palette: Brush" "Down in Palette"
keys shift+Tab shift+Tab
expect_focus "Style: Bold" "Shift+Tab back over Align to Style"
keys Escape
expect_focus none "Esc"

# A screen reader's default action is a completed click.
reader do "$main" Style 3 || fail "the default action of Underline"
sleep 0.5
expect_item Style Underline '  3 check "Underline" checked,focusable "Uncheck"'

# Shift+F10 opens the toolbar menu; its third toolbar entry hides Align.
keys F6 shift+F10
keys Down Down Down Return
read -r l t r b v <<<"$(ctl rect Align)"
[ "$v" = 0 ] || fail "Align still shown after the keyboard's menu"
reader list "$main" | grep -q '^toolbar "Align"' && fail "the reader still finds Align"
expect_focus "Standard: New" "the keyboard stays in the toolbars after the menu"
keys Escape
shot keyboard-menu

stop_demo "keyboard"
case "$(ini_value 'Main Layout' Align)" in 4,401,402,403,404,34,*) ;; *) fail "Align not stored hidden: $(ini_value 'Main Layout' Align)" ;; esac

# Started again, the hidden Align is passed over by Tab.
start_demo "keyboard again"
keys F6 Tab Tab
expect_focus "Palette: Eraser" "Tab skips the hidden Align"
keys Escape

# A view window has toolbars of its own.
keys alt+v o
ctl wait "View Window" 10000 || fail "no view window"
sleep 1
keys F6 Right Right
expect_focus "Standard: Save [View Window]" "F6 in the view window"
shot keyboard-view
keys Escape
ctl close "View Window"
stop_demo "keyboard again"
echo "demo_keyboard_e2e: passed"
