#!/usr/bin/env bash
# Toolbar titles that a settings file cannot carry as plain keys: with the New
# Toolbar dialog a user makes toolbars titled with blanks only, with "=", with
# a leading ";" or "[", with blanks around and like a built-in toolbar in
# another case. The file holds them under escaped keys; every one comes back
# unchanged after a restart, no other toolbar is lost, and the next close
# writes the same file. A title with a comma is written as it stands and read
# back as two titles: that toolbar alone does not come back.
set -u
. "$(dirname "$0")/lib.sh" "$1"
titles=('   ' 'a=b' ';semi' '[brack' ' both ' 'standard' 'x,y')
click_child() { # WINDOW CHILD-TEXT
    local l t r b v
    read -r l t r b v <<<"$(ctl childrect "$1" "$2")"
    [ "${v:-0}" = 1 ] || fail "no \"$2\" in \"$1\""
    xdotool mousemove $(((l + r) / 2)) $(((t + b) / 2)) click 1
}
# The titles of the shown floating toolbars, one a line, sorted.
shown_titles() { ctl toolbars "$main" | sed -nE 's/^frame 1 -?[0-9]+ -?[0-9]+ -?[0-9]+ -?[0-9]+ //p' | sort; }
main_section() { tr -d '\r' <"$ini" | awk '/^\[/ { inside = ($0 == "[Main Layout]"); next } inside && NF'; }
expected=$(printf '%s\n' Align Palette "${titles[@]}" | sort)
kept=$(printf '%s\n' Align Palette "${titles[@]}" | grep -vx 'x,y' | sort)

rm -f "$ini"
start_demo "first start"
read -r l t r b v <<<"$(ctl childrect "$main" Standard)"
[ "$v" = 1 ] || fail "no Standard pane"
xdotool mousemove $((l + 2)) $(((t + b) / 2)) click 3 # the toolbar menu
sleep 0.6
xdotool key Up Up Up Return # "Insert Item...", above "Lock the Toolbars" and "Reset Toolbars..."
ctl wait "Insert Toolbar Item" 5000 || fail "no Insert Toolbar Item dialog"
sleep 0.5
for title in "${titles[@]}"; do
    ctl raise "Insert Toolbar Item"
    click_child "Insert Toolbar Item" "&New..."
    ctl wait "New Toolbar" 5000 || fail "New... did not open the New Toolbar dialog"
    sleep 0.3
    xdotool type --delay 60 "$title"
    sleep 0.2
    xdotool key Return
    for _ in $(seq 1 25); do ctl rect "New Toolbar" >/dev/null || break; sleep 0.2; done
    sleep 0.3
done
ctl raise "Insert Toolbar Item"
click_child "Insert Toolbar Item" Close
sleep 0.5
[ "$(shown_titles)" = "$expected" ] || fail "the dialog did not make every toolbar: $(shown_titles | sed 's/.*/[&]/')"
stop_demo "first close"
cp "$ini" "$out/titles-first.ini"
dock='Standard,Style,Align,Palette,%%20%20%20,%a%3Db,%%3Bsemi,%%5Bbrack,%%20both%20,%standard,x,y'
[ "$(ini_value 'Main Layout' 'Top Dock')" = "$dock" ] || fail "dock line: $(ini_value 'Main Layout' 'Top Dock')"
for key in '%%20%20%20' '%a%3Db' '%%3Bsemi' '%%5Bbrack' '%%20both%20' '%standard' 'x,y'; do
    case "$(ini_value 'Main Layout' "$key")" in 0,32801,*) ;; *) fail "no line \"$key\": $(main_section)" ;; esac
done
[ "$(main_section | grep -c .)" = $((5 + ${#titles[@]})) ] || fail "not one line a toolbar: $(main_section)"
case "$(ini_value 'Main Layout' Standard)" in 10,101,102,104,0,107,108,109,0,106,151,17,*) ;;
*) fail "Standard lost: $(ini_value 'Main Layout' Standard)" ;; esac
for key in Style Align Palette; do [ -n "$(ini_value 'Main Layout' "$key")" ] || fail "$key lost"; done

start_demo "restart"
got=$(shown_titles)
[ "$got" = "$kept" ] || fail "titles after a restart: $(sed 's/.*/[&]/' <<<"$got" | paste -sd' ')"
read -r l t r b v <<<"$(ctl childrect "$main" Standard)"
[ "$v" = 1 ] || fail "Standard is not docked after the restart"
stop_demo "second close"
# The same section but for the toolbar titled "x,y", which did not come back.
main_section | cmp -s - <(tr -d '\r' <"$out/titles-first.ini" | awk '/^\[/ { inside = ($0 == "[Main Layout]"); next } inside && NF' |
    grep -v '^x,y=' | sed 's/^\(Top Dock=.*\),x,y$/\1/') ||
    fail "the next close wrote another section: $(main_section)"
echo "every title but the one with a comma survived a restart, and that one cost no other toolbar"
