#!/usr/bin/env bash
# A day of use, as a person meets it: the keys of the search box act on its text and never on the
# drawings, a rename given up by a click elsewhere stays given up, a change of letter case alone renames,
# a rename of a drawing another program removed says why and shows the folder as it is, the drawing of the
# last run is chosen again only in its own folder, and a search hit never hides the drawings before it.
# Real input through devhost's script; the disk, the windows and the screenshots are looked at.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexday"
other="$WORK/orvexother"
names=(door-1.dwg door-2.dwg door-3.dwg Arc.dwg plan.dwg tower.dwg)
gen_dwg "$WORK/gen" ${#names[@]} --variant 4
mkdir -p "$folder" "$other"
i=0
for f in "$WORK/gen"/*; do
  mv "$f" "$folder/${names[$i]}"
  i=$((i + 1))
done
cp "$folder/plan.dwg" "$other/plan.dwg"
cp "$folder/plan.dwg" "$other/x.dwg"
[ "$(ls "$folder" | wc -l)" -eq 6 ] && pass "six drawings in the folder" || fail "the folder: $(ls "$folder")"

call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
frame='contains="orvexday" nth=0'
settings="$WORK/lib/Orvex1.ini"
# A frame of three columns and room for every row: Path and Name as given.
write_settings() {
  printf '[CurrentPath]\r\nPath=%s\r\nName=%s\r\n\r\n[Size]\r\nSplitterSize=150\r\nWindowWidth=760\r\nWindowHeight=720\r\n\r\n' \
    "$1" "$2" >"$settings"
}
run() { devhost --script "$(winpath "$WORK/script.txt")" "$@" --eval "$call"; }
texts() { sed -n 's/^\[script\] text //p' <<<"$OUT"; }
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1")"; }

# 1. Ctrl+A and Ctrl+C in the search box: its text is selected and copied; no drawing is selected, none
#    goes on the clipboard.
write_settings "" ""
script_with_host_checks "wait $frame timeout=30000" 'click id=32790' 'type "door"' 'key ctrl+a' 'type "pl"' \
  'text id=32790' 'key ctrl+a' 'key ctrl+c' 'clipboard-files' 'key shift+delete' 'text id=32790' \
  "$(shot search-keys.png)" 'key escape'
run
expect_line "Ctrl+A in the search box selects its text: what is typed next replaces it" "[script] text pl"
expect_line "Ctrl+C in the search box copies its text, no drawing" "[script] clipboard-files none"
expect_line "Shift+Delete in the search box cuts its text" "[script] text "
expect_line "Escape cancels" "=> nil"
expect_true "no drawing was touched" test "$(ls "$folder" | wc -l)" -eq 6

# 2. Ctrl+V, Shift+Insert and the box's own menu paste text into it; drawings on the clipboard are never
#    pasted into the folder from there.
script_with_host_checks "wait $frame timeout=30000" "clipboard-put ansi $(winpath "$other/x.dwg")" \
  'click id=32790' 'key ctrl+v' 'key shift+insert' 'sleep 500' 'text id=32790' \
  'type "door"' 'key ctrl+a' 'key ctrl+c' 'click id=32790' 'key ctrl+v' 'text id=32790' \
  'click id=32790' 'key shift+insert' 'text id=32790' \
  'click id=32790' 'right-click id=32790' 'wait class=#32768 timeout=5000' 'key p' 'sleep 300' 'text id=32790' \
  "$(shot search-paste.png)" 'key escape'
run
expect_true "Ctrl+V in the search box pastes no drawing into the folder" test ! -e "$folder/x.dwg"
got=$(texts | tr '\n' '|')
[ "$got" == "|door|door|door|" ] && pass "text pasted into the search box with Ctrl+V, Shift+Insert and its menu" ||
  fail "the search box's texts: $got"

# 3. A rename given up: double-click a label, type, click another drawing, press Enter. The file keeps its
#    name, the old name is shown again, and Enter takes the drawing clicked (it renames nothing).
script_with_host_checks "wait $frame timeout=30000" 'double-click class=Edit text="door-1.dwg"' 'sleep 300' \
  'type "yyy.dwg"' 'click class=Edit text="door-2.dwg" at=60,-60' 'sleep 800' \
  'exists class=Edit text="door-1.dwg"' 'exists class=Edit text="yyy.dwg"' "$(shot rename-given-up.png)" \
  'key enter' 'sleep 800'
run
expect_true "the file of a rename given up keeps its name" test -e "$folder/door-1.dwg"
expect_true "no file takes the name typed" test ! -e "$folder/yyy.dwg"
expect_line "the label shows the old name again" "[script] exists yes"
expect_line "no label shows the name typed" "[script] exists no"
expect_line "Enter then takes the drawing clicked" "=> (\"$(lisppath "$folder")\\\\door-2.dwg\" (\"\" \"\" \"\"))"

# 4. A change of letter case alone renames the file.
script_with_host_checks "wait $frame timeout=30000" 'double-click class=Edit text="arc.dwg"' 'sleep 300' \
  'type "ARC.DWG"' 'key enter' 'sleep 1500' 'key escape'
run
expect_true "Arc.dwg renamed to ARC.DWG on disk" grep -qx 'ARC.DWG' <(ls "$folder")
expect_true "no other file came or went" test "$(ls "$folder" | wc -l)" -eq 6

# 5. A rename of a drawing another program removed meanwhile: the user is told why, and the grid shows
#    the folder as it is.
script_with_host_checks "wait $frame timeout=30000" "remove $(winpath "$folder/tower.dwg")" \
  'double-click class=Edit text="tower.dwg"' 'sleep 300' 'type "tower-b.dwg"' 'key enter' \
  'wait class=#32770 text="Drawing explorer" timeout=10000' \
  'text class=#32770 text="Drawing explorer" > class=Static contains="exists"' "$(shot rename-removed.png)" \
  'key enter' 'sleep 800' 'exists class=Edit text="tower.dwg"' "$(shot rename-removed-after.png)" 'key escape'
run
expect_line "the file is removed meanwhile" "[script] removed yes"
expect_line "the rename of a removed drawing says why" \
  "[script] text Cannot rename \"tower.dwg\": tower.dwg no longer exists. The folder is shown as it is now."
expect_line "the grid no longer shows the removed drawing" "[script] exists no"
expect_true "nothing named tower-b.dwg appeared" test ! -e "$folder/tower-b.dwg"

# 6. The drawing of the last run, chosen in another folder, is not chosen here: the search box is empty,
#    nothing is chosen, accept returns nothing.
write_settings "$(winpath "$other")" "plan.dwg"
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'text id=32790' 'enabled text="Insert"' \
  'click text="Insert"' 'sleep 300' 'key escape'
run
expect_line "another folder's drawing name does not start the search" "[script] text "
expect_line "nothing is chosen: accept is disabled" "[script] enabled no"
expect_line "nothing is returned" "=> nil"
# In its own folder it is chosen again.
write_settings "$(winpath "$folder")" "plan.dwg"
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'text id=32790' 'click text="Insert"'
run
expect_line "the last run's drawing starts the search in its own folder" "[script] text plan"
expect_line "and accept returns it" "=> (\"$(lisppath "$folder")\\\\plan.dwg\" (\"\" \"\" \"\"))"

# 7. A search hit in a folder whose drawings all fit the window hides none of them.
write_settings "" ""
script_with_host_checks "wait $frame timeout=30000" 'click id=32790' 'type "plan"' 'sleep 500' \
  'exists class=Edit text="arc.dwg"' 'exists class=Edit text="door-1.dwg"' 'exists class=Edit text="plan.dwg"' \
  "$(shot search-hit.png)" 'key escape'
run
got=$(sed -n 's/^\[script\] exists //p' <<<"$OUT" | tr '\n' ' ')
[ "$got" == "yes yes yes " ] && pass "the search hit is shown with the drawings before it" ||
  fail "labels shown after the search: $got"

finish
