#!/usr/bin/env bash
# The explorer with the keyboard alone, as a person uses it: Enter takes the chosen drawing (in the grid
# and in the search box), Tab reaches the accept and cancel buttons, F6 moves between the tree and the
# grid, F5 reads the folder again. Real keys through devhost's script; the screenshots are looked at.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexkeys"
names=(alpha.dwg bravo.dwg charlie.dwg delta.dwg)
gen_dwg "$WORK/gen" ${#names[@]} --variant 2
mkdir -p "$folder"
i=0
for f in "$WORK/gen"/*; do
  mv "$f" "$folder/${names[$i]}"
  i=$((i + 1))
done

call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
frame='contains="orvexkeys" nth=0'
settings="$WORK/lib/Orvex1.ini"
printf '[Size]\r\nSplitterSize=150\r\nWindowWidth=760\r\nWindowHeight=560\r\n\r\n' >"$settings"
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"; }
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1")"; }
picked() { printf '=> ("%s\\\\%s" ("" "" ""))' "$(lisppath "$folder")" "$1"; }

# 1. Enter in the grid takes the drawing chosen with a click.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click class=Edit text="charlie.dwg" at=60,-60' \
  'sleep 300' "$(shot enter-grid.png)" 'key enter' 'sleep 500'
run
expect_line "Enter in the grid takes the chosen drawing" "$(picked charlie.dwg)"

# 2. Enter in the search box takes the drawing the search chose.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click id=32790' 'type "del"' 'sleep 300' \
  "$(shot enter-search.png)" 'key enter' 'sleep 500'
run
expect_line "Enter in the search box takes the drawing it chose" "$(picked delta.dwg)"

# 3. Enter in the search box with nothing chosen does nothing: the explorer stays open.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click id=32790' 'type "zz"' 'key enter' \
  'sleep 500' "exists $frame" 'key escape'
run
expect_line "Enter with nothing chosen leaves the explorer open" "[script] exists yes"
expect_line "and Escape then cancels" "=> nil"

# 4. Tab from the grid reaches the accept button, Enter presses it.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click class=Edit text="bravo.dwg" at=60,-60' \
  'sleep 300' 'key tab' 'focus' "$(shot tab-accept.png)" 'key enter' 'sleep 500'
run
expect_line "Tab from the grid goes to the accept and cancel buttons" "[script] focus ToolbarWindow32 id=59396"
expect_line "Enter on the accept button takes the drawing" "$(picked bravo.dwg)"

# 5. Tab twice reaches cancel; Space presses it.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click class=Edit text="bravo.dwg" at=60,-60' \
  'sleep 300' 'key tab' 'key tab' 'focus' "$(shot tab-cancel.png)" 'key space' 'sleep 500'
run
expect_line "Tab again stays on the buttons (cancel)" "[script] focus ToolbarWindow32 id=59396"
expect_line "Space on the cancel button cancels" "=> nil"

# 6. Tab once more goes on to the tree, then to the grid; Shift+Tab in the grid goes back to the tree.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click class=Edit text="bravo.dwg" at=60,-60' \
  'sleep 300' 'key tab' 'key tab' 'key tab' 'focus' 'key tab' 'focus' 'key shift+tab' 'focus' 'key escape'
run
foci=$(sed -n 's/^\[script\] focus //p' <<<"$OUT" | head -3 | tr '\n' '|')
[[ "$foci" == "SysTreeView32 id=59648|"*" id=59649|SysTreeView32 id=59648|" ]] &&
  pass "Tab goes round: the buttons, the tree, the grid; Shift+Tab goes back to the tree" ||
  fail "the focus after Tab, Tab, Tab, Tab, Shift+Tab: $foci"

# 7. Refresh: another program adds a drawing (when the first screenshot is taken) and removes one; F5 in
#    the grid reads the folder again: the new one shows, the removed one is gone.
gen_dwg "$WORK/extra" 2 --variant 3
extra=("$WORK/extra"/*)
# Another program: waits for the screenshot that marks the explorer as shown, then adds a drawing.
add_when() { # SHOT SOURCE TARGET
  (for _ in $(seq 300); do [ -e "$WORK/$1" ] && { cp "$2" "$3"; exit 0; }; sleep 0.1; done) &
}
add_when refresh-before.png "${extra[0]}" "$folder/echo.dwg"
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' "$(shot refresh-before.png)" 'sleep 1500' \
  "remove $(winpath "$folder/alpha.dwg")" 'exists class=Edit text="echo.dwg"' \
  'click class=Edit text="bravo.dwg" at=60,-60' 'key f5' 'sleep 800' \
  'exists class=Edit text="echo.dwg"' 'exists class=Edit text="alpha.dwg"' "$(shot refresh-after.png)" \
  'key escape'
run
wait
got=$(sed -n 's/^\[script\] exists //p' <<<"$OUT" | tr '\n' ' ')
[ "$got" == "no yes no " ] && pass "F5 reads the folder again: the added drawing shows, the removed one is gone" ||
  fail "labels of echo.dwg before F5, echo.dwg and alpha.dwg after: $got"

# 8. A click on the folder already selected in the tree reads it again too.
script 'wait contains="bravo.dwg" timeout=30000' 'key escape'
run
shell_path=$(tr -d '\r' <"$settings" | sed -n 's/^ShellPath=//p')
add_when click-before.png "${extra[1]}" "$folder/foxtrot.dwg"
script_with_host_checks "wait $frame timeout=30000" 'sleep 800' "$(shot click-before.png)" 'sleep 1500' \
  'exists class=Edit text="foxtrot.dwg"' "tree-select class=SysTreeView32 path=\"$shell_path\"" 'sleep 800' \
  'exists class=Edit text="foxtrot.dwg"' "$(shot click-after.png)" 'key escape'
run
wait
got=$(sed -n 's/^\[script\] exists //p' <<<"$OUT" | tr '\n' ' ')
[ "$got" == "no yes " ] && pass "a click on the selected folder reads it again ($shell_path)" ||
  fail "labels of foxtrot.dwg before and after the click on the selected folder: $got"

# 9. F6 and Shift+F6 take the keyboard between the tree and the grid; Ctrl+O takes the chosen drawing.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'click class=Edit text="delta.dwg" at=60,-60' \
  'focus' 'key f6' 'focus' 'key shift+f6' 'focus' "$(shot f6.png)" 'key ctrl+o' 'sleep 500'
run
foci=$(sed -n 's/^\[script\] focus //p' <<<"$OUT" | head -3 | tr '\n' '|')
[[ "$foci" == *" id=59649|SysTreeView32 id=59648|"*" id=59649|" ]] &&
  pass "F6 goes from the grid to the tree, Shift+F6 back" || fail "the focus before and after F6, Shift+F6: $foci"
expect_line "Ctrl+O takes the chosen drawing" "$(picked delta.dwg)"

finish
