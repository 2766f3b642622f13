#!/usr/bin/env bash
# The stored arrangement as a user lives it: the first close writes the
# defaults, a restart brings every toolbar back and the next close writes the
# same file; an arrangement of the user's own survives; a view window writes
# its own section. Then damaged settings files: the program starts every time,
# keeps what is usable and leaves a valid file behind.
set -u
. "$(dirname "$0")/lib.sh" "$1"
passed=0
pass() { passed=$((passed + 1)); }

# The Main Layout section only, as text, for comparing two closes.
main_section() { tr -d '\r' <"$ini" | awk '/^\[/ { inside = ($0 == "[Main Layout]"); next } inside'; }

# The file's sections in name order, each with its lines in file order: a
# section erased and written again moves to the end of the file, and nothing
# depends on the order of sections.
by_section() { tr -d '\r' <"$1" | awk '/^\[/ { s = $0; next } { print s "\t" $0 }' | sort -s -t "$(printf '\t')" -k1,1; }

# ---- Defaults, restart, next close -------------------------------------------
rm -f "$ini"
start_demo "no settings file"
# A view window writes "View Layout" when it closes.
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
xdotool mousemove $((ml + 300)) $((mt + 300)) click 1
sleep 0.3
xdotool key alt+v o
ctl wait "View Window" 10000 || fail "no view window from View > Open Another Window"
sleep 0.5
ctl close "View Window"
sleep 0.5
stop_demo "defaults"
[ "$(ini_value 'Main Layout' 'Top Dock')" = "Standard,Style,Align,Palette" ] || fail "default dock line: $(cat "$ini")"
for key in Standard Style Align Palette; do
    [ -n "$(ini_value 'Main Layout' "$key")" ] || fail "no line for $key"
done
case "$(ini_value 'Main Layout' Align)" in 4,401,402,403,404,33,300,100,*) ;; *) fail "Align line: $(ini_value 'Main Layout' Align)" ;; esac
case "$(ini_value 'Main Layout' Palette)" in 15,201,202,203,0,204,205,206,0,207,208,209,0,210,211,212,33,300,200,*) ;;
*) fail "Palette line: $(ini_value 'Main Layout' Palette)" ;; esac
[ "$(ini_value 'View Layout' 'Top Dock')" = "Standard,Style" ] || fail "view dock line: $(ini_value 'View Layout' 'Top Dock')"
[ "$(ini_value 'View Layout' Standard)" = "$(ini_value 'Main Layout' Standard)" ] || fail "view Standard differs"
[ "$(ini_value 'Toolbar Globals' 'Quick Help')" = 1 ] || fail "Quick Help"
[ "$(ini_value 'Toolbar Globals' 'Button Text')" = 0 ] || fail "Button Text"
cp "$ini" "$out/first.ini"
pass

start_demo "restart"
read -r l t r b v <<<"$(ctl rect Align)"
[ "$l $t $v" = "300 100 1" ] || fail "Align not restored: $l $t $v"
stop_demo "restart"
[ "$(by_section "$ini")" = "$(by_section "$out/first.ini")" ] || fail "the next close wrote another file: $(diff "$out/first.ini" "$ini")"
pass

# ---- The user's own arrangement ------------------------------------------------
# Palette docked first, Standard floating with fewer buttons, Style and a
# hidden Align in a left dock, an empty right dock.
cat >"$ini" <<'INI'
[Main Layout]
Top Dock=Palette,Standard
Left Dock=Style,Align
Standard=6,101,102,0,151,106,107,33,500,420,690,466
Palette=15,201,202,203,0,204,205,206,0,207,208,209,0,210,211,212,17,300,200,390,311
Style=8,301,302,303,0,304,305,306,307,17,0,0,191,45
Align=4,401,402,403,404,18,300,100,413,145
[Toolbar Globals]
Quick Help=0
Button Text=0
INI
start_demo "own arrangement"
read -r l t r b v <<<"$(ctl rect Align)"
[ "$v" = 0 ] || fail "hidden Align shows its frame"
read -r l t r b v <<<"$(ctl childrect "$main" Align)"
[ "$v" = 0 ] || fail "hidden Align shows its pane"
read -r l t r b v <<<"$(ctl childrect "$main" Style)"
read -r ml mt mr mb mv <<<"$(ctl rect "$main")"
[ "$v" = 1 ] && [ $((l - ml)) -lt 40 ] && [ $((b - t)) -gt $((r - l)) ] || fail "Style not upright in the left dock: $l $t $r $b $v"
read -r l t r b v <<<"$(ctl rect Standard)"
[ "$l $t $v" = "500 420 1" ] || fail "Standard not floating at 500,420: $l $t $v"
shot layout-own
stop_demo "own arrangement"
main_section >"$out/own-1.txt"
grep -qx "Top Dock=Palette,Standard" "$out/own-1.txt" || fail "top dock: $(cat "$out/own-1.txt")"
grep -qx 'Left Dock=Style,Align' "$out/own-1.txt" || fail "left dock: $(cat "$out/own-1.txt")"
grep -q '^Standard=6,101,102,0,151,106,107,33,500,420,' "$out/own-1.txt" || fail "Standard: $(cat "$out/own-1.txt")"
grep -q '^Align=4,401,402,403,404,18,' "$out/own-1.txt" || fail "Align: $(cat "$out/own-1.txt")"
[ "$(ini_value 'Toolbar Globals' 'Quick Help')" = 0 ] || fail "Quick Help not kept off"
start_demo "own arrangement again"
stop_demo "own arrangement again"
main_section | cmp -s - "$out/own-1.txt" || fail "own arrangement changed on the second round: $(main_section | diff "$out/own-1.txt" -)"
pass

# ---- Damaged files ---------------------------------------------------------------
# Each case: the program starts and closes cleanly, and what it wrote starts
# and closes again to the same section (or, if it stored nothing, to the
# defaults).
damaged() {
    local name=$1 check=$2
    start_demo "$name"
    stop_demo "$name"
    main_section >"$out/damaged-$name.txt"
    start_demo "$name, written file"
    stop_demo "$name, written file"
    if [ -s "$out/damaged-$name.txt" ]; then
        main_section | cmp -s - "$out/damaged-$name.txt" || fail "$name: the written file is not stable"
    else
        # A frame that came up without docks stores nothing, so the next
        # start builds the default toolbars.
        [ "$(ini_value 'Main Layout' 'Top Dock')" = "Standard,Style,Align,Palette" ] || fail "$name: no defaults after"
    fi
    [ -z "$check" ] || eval "$check" || fail "$name: $(cat "$out/damaged-$name.txt")"
    pass
}
good_top='Top Dock=Standard,Style,Align,Palette'
head_lines() { tr -d '\r' <"$out/first.ini" | sed -n '/^\[Main Layout\]/,/^Palette=/p'; }
has() { grep -qx "$1" "$out/damaged-$name.txt"; }

rm -f "$ini"
damaged missing-file 'has "$good_top"'
: >"$ini"
damaged empty-file 'has "$good_top"'
{ head_lines; echo 'Bogus=1,2,3'; echo '[Elsewhere]'; echo 'Key=1'; } >"$ini"
damaged unknown-keys 'has "$good_top" && ! grep -q Bogus "$out/damaged-$name.txt"'
{ head_lines | grep -v '^Top Dock'; } >"$ini"
damaged no-dock-lines '[ ! -s "$out/damaged-$name.txt" ]'
{ head_lines | sed 's/^Top Dock=.*/Top Dock=Standard,Ghost,Style/'; } >"$ini"
damaged absent-toolbar 'has "Top Dock=Standard,Style"'
{ head_lines | sed 's/^Standard=10,101,102,/Standard=12,101,9999,102,4242,/'; } >"$ini"
damaged unknown-ids 'grep -q "^Standard=10,101,102,104," "$out/damaged-$name.txt"'
{ head_lines | sed 's/^Align=.*/Align=four,4x01,402,,zz,-33,abc,1e9,--5,+7/'; } >"$ini"
damaged non-numeric 'has "$good_top"'
{ head_lines | sed 's/^Align=.*/Align=4,401,402,403,404,33,-60,-30,53,15/; s/^Palette=.*/Palette=99999999999999999999,201,202,4294967295,33,2147483647,-2147483648,99999999999,-99999999999/'; } >"$ini"
damaged huge-and-negative 'grep -q "^Align=4,401,402,403,404,33,-60,-30,53,15$" "$out/damaged-$name.txt"'
{ head_lines | sed "s/^Style=.*/Style=8,$(printf '301,%.0s' $(seq 1 6000))/"; } >"$ini"
damaged very-long-value 'has "$good_top"'
# A megabyte on one line, read as fast as a short one (the program must
# answer within start_demo's wait): a dock value of 100,000 titles that name
# nothing before the real ones, and a toolbar value of 60,000 ids of which
# all but its own eight are ids the catalog lacks.
long_line() { printf '%s=%s' "$1" "$2"; yes "$3" | head -n "$4" | tr -d '\n'; printf '%s\n' "$5"; }
{ head_lines | grep -v '^Top Dock='; long_line 'Top Dock' '' 'Nobody,' 100000 'Standard,Style,Align,Palette'; } >"$ini"
damaged megabyte-dock-line 'has "$good_top" && [ "$(grep -c . "$out/damaged-$name.txt")" = 5 ]'
style_line=$(head_lines | grep '^Style=')
style_tail=$(cut -d, -f10- <<<"$style_line") # flags and rectangle
{ head_lines | grep -v '^Style='; long_line Style '60000,301,302,303,0,304,305,306,307' ',0000000000009999' 59992 ",$style_tail"; } >"$ini"
damaged megabyte-toolbar-line 'has "$good_top" && has "$style_line"'
{ head_lines | sed 's/^Standard=.*/Standard=10,101,10/'; } >"$ini"
damaged truncated-line 'grep -q "^Standard=2,101,10," "$out/damaged-$name.txt" || grep -q "^Standard=" "$out/damaged-$name.txt"'
{ head_lines; printf 'Style=\001\002\377\376,,\033[0m\n'; printf '\000\000garbage\n'; } >"$ini"
damaged binary-bytes 'has "$good_top"'
{ head_lines | sed 's/^Top Dock=.*/Top Dock=Standard,Sty,le,Align/'; } >"$ini"
damaged comma-in-title 'has "Top Dock=Standard,Align"'
{ head_lines; echo 'Align=2,401,402,17,0,0,100,40'; echo 'Top Dock=Align'; } >"$ini"
damaged duplicate-keys 'true'
{
    echo '[Main Layout]'
    printf 'Top Dock='; seq -f "T%g" 1 1000 | paste -sd, -
    for i in $(seq 1 1000); do echo "T$i=2,101,102,17,0,0,80,40"; done
} >"$ini"
damaged many-toolbars '[ "$(grep -c "^T[0-9]*=" "$out/damaged-$name.txt")" = 1000 ]'

echo "$passed passed, 0 failed"
