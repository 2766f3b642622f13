# Mouse gestures and window lookups for the end-to-end scripts (source after
# lib.sh); screen coordinates, which Wine's virtual desktop shares with X. A
# drag with capture follows X input reliably when each step has a short pause.
step() { sleep "${1:-0.05}"; }

# One round trip through the program, so what the input did has been handled.
settle() { sleep 0.2; ctl ping "$main" 5000 >/dev/null || fail "the program does not answer"; }

# A drag with mouse button $1 from ($2, $3) to ($4, $5) through a few points.
drag() {
    local button=$1 x1=$2 y1=$3 x2=$4 y2=$5 i
    xdotool mousemove "$x1" "$y1"
    step 0.1
    xdotool mousedown "$button"
    step
    for i in 1 2 3 4; do
        xdotool mousemove $((x1 + (x2 - x1) * i / 4)) $((y1 + (y2 - y1) * i / 4))
        step
    done
    step
    xdotool mouseup "$button"
    settle
}
ldrag() { drag 1 "$@"; }
rdrag() { drag 3 "$@"; }

# The separator gesture: a right press, a few pixels sideways, a release.
nudge() {
    local x=$1 y=$2 dx=$3
    xdotool mousemove "$x" "$y"
    step 0.1
    xdotool mousedown 3
    step
    xdotool mousemove $((x + dx)) "$y"
    step
    xdotool mouseup 3
    settle
}

# "visible left top right bottom" of one window of a toolbar of frame $1:
# $2 is pane or frame, $3 the title. Empty if there is no such window.
toolbar_rect() {
    ctl toolbars "$1" | awk -v k="$2" -v t="$3" '
        { title = $0; sub(/^[^ ]+ [^ ]+ [^ ]+ [^ ]+ [^ ]+ [^ ]+ /, "", title) }
        $1 == k && title == t { print $2, $3, $4, $5, $6 }'
}

# "visible left top right bottom" of the dock on side $2 of frame $1, by its
# place: the top dock highest; the bottom dock the lowest as wide as it; the
# side docks below it, the left one at its left edge.
dock_rect() {
    ctl docks "$1" | sort -n -k3 | awk -v side="$2" '
        { v[NR] = $0; l[NR] = $2; w[NR] = $4 - $2 }
        END {
            if (NR == 0) exit
            if (side == "top") { print v[1]; exit }
            if (side == "bottom") { for (i = NR; i > 1; i--) if (w[i] == w[1]) { print v[i]; exit }; exit }
            for (i = 2; i <= NR; i++)
                if (w[i] != w[1] && (side == "left") == (l[i] <= l[1] + 1)) { print v[i]; exit }
        }'
}

# Centre of button $3 (0 = first, before any separator) of a pane whose outer
# rectangle starts at ($1, $2): a one-pixel border, items 6 in and 3 down,
# neighbours sharing a pixel column.
button_centre() { # left top index [buttonWidth buttonHeight]
    local w=${4:-24} h=${5:-22}
    echo $(($1 + 1 + 6 + ($w - 1) * $3 + $w / 2)) $(($2 + 1 + 3 + $h / 2))
}

# Centre of a floating frame's caption band, away from the close box.
caption_point() { # left top right bottom
    echo $(($1 + 20)) $(($2 + 8))
}
