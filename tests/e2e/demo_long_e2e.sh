#!/usr/bin/env bash
# A long session of random but valid gestures with real X input: clicks,
# toolbar drags between the dock and floating, double clicks, right drags of
# buttons, separator nudges, button text switched on and off, view windows
# opened and closed. After every few gestures the program must still answer,
# every toolbar must exist exactly once with one window on show, and the dock
# must hug its toolbars; after each view window and each button-text round
# trip the library must hold as many memory blocks and GDI objects as before.
#   QBR_LONG_SEED     repeat a session (the seed is printed at the start; CI uses 1)
#   QBR_LONG_SECONDS  how long to keep making gestures (default 20)
#   QBR_LONG_BATCH    gestures between two checks (default 4)
set -u
. "$(dirname "$0")/lib.sh" "$1"
. "$(dirname "$0")/gestures.sh"

# CI replays one known session so that its verdict does not depend on the
# day; local runs draw a new seed each time to find new faults.
if [ "${CI:-}" = true ]; then seed=${QBR_LONG_SEED:-1}; else seed=${QBR_LONG_SEED:-$(($(date +%s) % 32768))}; fi
seconds=${QBR_LONG_SECONDS:-20}
batch=${QBR_LONG_BATCH:-4} # gestures between two checks; 1 finds the one that broke something
echo "seed $seed, $seconds s of gestures (QBR_LONG_SEED=$seed to repeat)"
RANDOM=$seed
titles=(Standard Style Align Palette)
buttonText=0
gestures=0
log() { echo "[$gestures] $*" >>"$out/long.log"; }
: >"$out/long.log"

rm -f "$ini"
start_demo "long session"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"

# Floating toolbars are let go below the main window, so that they never
# cover the window's caption or the points the gestures aim at inside it.
# $1 is the width of the window, so that its corner lands on the screen.
# Sets fx, fy. RANDOM is drawn in this shell only: a command substitution
# would draw from a reseeded copy, and the session would not repeat.
float_corner() {
    local room=$((1000 - ${1:-100}))
    [ "$room" -gt 10 ] || room=11
    fx=$((10 + RANDOM % (room - 10))) fy=$((mb + 20 + RANDOM % (740 - mb - 60)))
}
# A gesture only starts on a point of the screen; a toolbar that grew past
# the screen's edge is passed over this time.
on_screen() { [ "$1" -ge 0 ] && [ "$1" -lt 1024 ] && [ "$2" -ge 0 ] && [ "$2" -lt 768 ]; }
clamp_x() { local x=$1; [ "$x" -lt 0 ] && x=0; [ "$x" -gt 1023 ] && x=1023; echo "$x"; }

# The shown window of a toolbar: "pane|frame left top right bottom".
shown() {
    ctl toolbars "$main" | awk -v t="$1" '
        { title = $0; sub(/^[^ ]+ [^ ]+ [^ ]+ [^ ]+ [^ ]+ [^ ]+ /, "", title) }
        title == t && $2 == 1 { print $1, $3, $4, $5, $6; exit }'
}

# Centre of button $6 (0 = first) of a shown window "kind l t r b". A
# floating frame has a 4-pixel sizing border and a caption band above its
# items.
button_at() {
    local kind=$1 l=$2 t=$3 i=$6 w=24 h=22
    [ "$buttonText" = 1 ] && w=48 h=44
    if [ "$kind" = pane ]; then button_centre "$l" "$t" "$i" $w $h
    else echo $((l + 4 + 6 + (w - 1) * i + w / 2)) $((t + 4 + 10 + 3 + h / 2)); fi
}

# Any modal loop a gesture may have opened (the About box behind button 151,
# a toolbar menu from a right press that found no button) is closed again.
dismiss() { xdotool key Escape; settle; }

focus_main() { xdotool mousemove $((ml + 150)) $((mt + 10)) click 1; settle; }

counters() { ctl counters "$main" || fail "no answer to the counters message"; }

check_invariants() {
    ctl ping "$main" 5000 || fail "the program does not answer (seed $seed)"
    local list title panes frames shownCount
    list=$(ctl toolbars "$main")
    [ "$(wc -l <<<"$list")" = 8 ] || fail "not 8 toolbar windows (seed $seed): $list"
    for title in "${titles[@]}"; do
        panes=$(grep -c "^pane .* $title\$" <<<"$list")
        frames=$(grep -c "^frame .* $title\$" <<<"$list")
        shownCount=$(grep -c "^[a-z]* 1 .* $title\$" <<<"$list")
        [ "$panes $frames $shownCount" = "1 1 1" ] ||
            fail "$title: $panes panes, $frames frames, $shownCount shown (seed $seed): $list"
    done
    # A floating toolbar is never lost behind its frame window.
    local order at mainAt
    order=$(ctl zorder)
    mainAt=$(grep -n "^$main\$" <<<"$order" | cut -d: -f1)
    for title in "${titles[@]}"; do
        at=$(grep -n "^$title owned by $main\$" <<<"$order" | cut -d: -f1)
        [ -z "$at" ] || [ "$at" -lt "$mainAt" ] || fail "$title floats behind the main window (seed $seed): $order"
    done
    # The top dock hugs its shown panes: visible exactly when one is shown,
    # its bottom at the lowest pane's bottom (panes overlap its edge by one).
    local dv dl dt dr db lowest
    read -r dv dl dt dr db <<<"$(dock_rect "$main" top)"
    lowest=$(awk '$1 == "pane" && $2 == 1 { if ($6 > m) m = $6 } END { print m + 0 }' <<<"$list")
    if [ "$lowest" = 0 ]; then
        [ "$dv" = 0 ] || fail "the top dock shows with no toolbar in it (seed $seed)"
    else
        [ "$dv" = 1 ] && [ $((db - lowest)) -ge -1 ] && [ $((db - lowest)) -le 1 ] ||
            fail "the top dock ($dv $dl $dt $dr $db) does not hug its panes (lowest bottom $lowest, seed $seed)"
    fi
}

click_button() {
    local title=${titles[RANDOM % 4]} index=$((RANDOM % 2)) x y
    read -r x y <<<"$(button_at $(shown "$title") $index)"
    on_screen "$x" "$y" || return
    log "click $title at $x,$y"
    xdotool mousemove "$x" "$y" click 1
    dismiss
}

drag_toolbar() {
    local title=${titles[RANDOM % 4]} kind l t r b x y tx ty
    read -r kind l t r b <<<"$(shown "$title")"
    if [ "$kind" = pane ]; then x=$((r - 3)) y=$(((t + b) / 2)); else read -r x y <<<"$(caption_point "$l" "$t" "$r" "$b")"; fi
    on_screen "$x" "$y" || return
    local toDock=$((RANDOM % 2)) along=$((RANDOM % 400)) fx fy
    float_corner $((r - l))
    if [ "$toDock" = 0 ]; then
        read -r tx ty <<<"$(dock_rect "$main" top | awk -v r=$along '{ print $2 + 5 + r, $3 + 5 }')"
    else
        tx=$(clamp_x $((x + fx - l))) ty=$((y + fy - t))
    fi
    log "drag $title ($kind) from $x,$y to $tx,$ty"
    ldrag "$x" "$y" "$tx" "$ty"
}

double_click() {
    local title=${titles[RANDOM % 4]} kind l t r b x y
    read -r kind l t r b <<<"$(shown "$title")"
    if [ "$kind" = pane ]; then
        x=$((r - 3)) y=$(((t + b) / 2))
    else
        read -r x y <<<"$(caption_point "$l" "$t" "$r" "$b")"
    fi
    on_screen "$x" "$y" || return
    log "double click $title ($kind) at $x,$y"
    xdotool mousemove "$x" "$y" click --repeat 2 --delay 80 1
    settle
    # A docked toolbar torn off by the double click floats where its frame
    # was last, which may be over the main window: bring it below.
    read -r kind l t r b <<<"$(shown "$title")"
    if [ "$kind" = frame ] && [ "$t" -lt "$mb" ]; then
        read -r x y <<<"$(caption_point "$l" "$t" "$r" "$b")"
        local fx fy
        float_corner $((r - l))
        on_screen "$x" "$y" && ldrag "$x" "$y" "$(clamp_x $((x + fx - l)))" $((y + fy - t))
    fi
}

move_button() {
    local from=${titles[RANDOM % 4]} to=${titles[RANDOM % 4]} index=$((RANDOM % 2)) x y kind l t r b
    [ "$from" = "$to" ] && return
    read -r x y <<<"$(button_at $(shown "$from") $index)"
    read -r kind l t r b <<<"$(shown "$to")"
    on_screen "$x" "$y" || return
    log "right drag from $from $x,$y to the end of $to"
    rdrag "$x" "$y" "$(clamp_x $((r - 5)))" $((b - 8))
    dismiss
}

nudge_button() {
    local title=${titles[RANDOM % 4]} x y dx=$(((RANDOM % 2) * 10 - 5))
    read -r x y <<<"$(button_at $(shown "$title") 1)"
    on_screen "$x" "$y" || return
    log "nudge $title at $x,$y by $dx"
    nudge "$x" "$y" "$dx"
    dismiss
}

button_text_round_trip() {
    local before after
    focus_main
    before=$(counters)
    log "button text on and off, counters $before"
    xdotool key alt+v; sleep 0.3; xdotool key b; settle
    xdotool key alt+v; sleep 0.3; xdotool key b; settle
    after=$(counters)
    [ "$before" = "$after" ] || fail "button text round trip: blocks and GDI objects $before -> $after (seed $seed)"
}

view_window() {
    local before after
    focus_main
    before=$(counters)
    log "view window, counters $before"
    xdotool key alt+v o
    ctl wait "View Window" 10000 || fail "no view window (seed $seed)"
    settle
    ctl close "View Window"
    for _ in $(seq 1 50); do ctl wait "View Window" 0 || break; sleep 0.1; done
    settle
    # The window system may hand the activation to a floating toolbar; the
    # library passes it on, so the keys reach the main window's menu again.
    [ "$(ctl foreground)" = "$main" ] || fail "after a view window closed, $(ctl foreground) is active (seed $seed)"
    after=$(counters)
    [ "$before" = "$after" ] || fail "view window open and close: blocks and GDI objects $before -> $after (seed $seed)"
}

check_invariants
first=$(counters)
echo "counters at start: $first"
end=$(($(date +%s) + seconds))
while [ "$(date +%s)" -lt "$end" ]; do
    for _ in $(seq 1 "$batch"); do
        case $((RANDOM % 10)) in
        0 | 1) click_button ;;
        2 | 3) drag_toolbar ;;
        4) double_click ;;
        5 | 6) move_button ;;
        7) nudge_button ;;
        8) button_text_round_trip ;;
        9) view_window ;;
        esac
        gestures=$((gestures + 1))
    done
    check_invariants
done
shot long-end
echo "$gestures gestures; counters at the end: $(counters)"
stop_demo "end of the long session"
[ -n "$(ini_value 'Main Layout' 'Top Dock')" ] || fail "no layout written at the end (seed $seed)"
echo "1 passed, 0 failed"
