#!/usr/bin/env bash
# The folder tree as a person uses it: a tree of drawing folders on the Z: drive, browsed with clicks and
# keys; the grid and the title follow the selected folder, and the explorer reopens where it was left.
. "$(dirname "$0")/lib.sh"

root="$WORK/orvextree"
# folder COUNT NAME: COUNT drawings named NAME-1.dwg ... in a new folder.
folder() {
  local dir=$1 count=$2 name=$3 i=1
  gen_dwg "$dir" "$count" --variant "$count"
  for f in "$dir"/*; do mv "$f" "$dir/$name-$i.dwg"; i=$((i + 1)); done
}
folder "$root/a" 2 alpha
folder "$root/a/b" 3 bravo
folder "$root/a/b/c" 4 charlie
folder "$root/a/side" 1 side
[ "$(find "$root" -name '*.dwg' | wc -l)" -eq 10 ] && pass "a tree of 10 drawings in 4 folders" ||
  fail "generator: $(cat "$WORK/gen.err")"

tree='class=SysTreeView32'
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$1"; }
# The label path of a folder of this test, as the tree shows it: found from the tree's own items.
call_at() { printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$1")"; }
nocall='(Orvex 1 2 "" "Insert" "Close")'
# The thumbnails' labels: the edit windows whose text holds ".dwg" (a tooltip shown where the pointer
# happens to rest, or devhost's own drawing window, hold the name too).
counts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | tr '\n' ' ' | sed 's/ $//'; }
titles() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] text //p' | sed 's/.*\\//' | tr '\n' ' ' | sed 's/ $//'; }
selected() { printf '%s\n' "$OUT" | sed 's/ highlighted$//' |
             sed -n 's/^\[script\] tree-item [0-9]* \(.*\) selected$/\1/p' |
             sed 's/ expanded$//' | tr '\n' ' ' | sed 's/ $//'; }
# The items highlighted but not selected: the highlight must follow the selection (none).
stray_highlights() { printf '%s\n' "$OUT" | grep '^\[script\] tree-item .* highlighted$' | grep -v ' selected highlighted$'; }
ini_value() { tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n "s/^$1=//p"; }
frame='contains="orvextree" nth=0'
has() { grep -q -- "$2" <<<"$1"; } # has TEXT PATTERN

# 1. The start path opens the tree down to c, selects it and shows its drawings; then keys and clicks.
# After each step: the drawings of the grid (labels), and the title's last folder.
look=('sleep 300' 'count class=Edit contains=".dwg" visible=any' "text $frame")
script 'wait contains="charlie-1.dwg" timeout=30000' "${look[@]}" "tree-items $tree" \
       "screenshot $frame $(winpath "$WORK/tree-start.png")" \
       'key up' "${look[@]}" \
       'key up' "${look[@]}" \
       'key down' 'key down' 'key down' "${look[@]}" \
       'key left' "${look[@]}" \
       'key right' "${look[@]}" \
       "tree-items $tree" \
       'key tab' 'focus' 'key shift+tab' 'focus' \
       'key escape'
run "$(call_at "$root/a/b/c")"
expect_line "Escape in the tree cancels" "=> nil"
expect_true "the grid follows the selection: c 4, Up b 3, Up a 2, Down x3 side 1, Left a 2, Right b 3 (got $(counts))" \
  [ "$(counts)" == "4 3 2 1 2 3" ]
expect_true "the title names the selected folder (got $(titles))" [ "$(titles)" == "c b a side a b" ]
sel=$(selected)
expect_true "the start folder and then b are the selected tree items (got $sel)" [ "$sel" == "c b" ]
expect_true "c is selected in the tree, opened from the start path" has "$OUT" ' tree-item [0-9]* c \(expanded \)\?selected highlighted$'
expect_true "only the selected item is highlighted after keys ($(stray_highlights | tr '\n' ' '))" [ -z "$(stray_highlights)" ]
foci=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] focus //p' | tr '\n' '|')
expect_true "Tab moves from the tree to the grid, the right pane (got $foci)" has "${foci%%|*}" ' id=59649$'
expect_true "Shift+Tab in the grid moves back to the tree (got $foci)" [ "${foci#*|}" == "SysTreeView32 id=59648|" ]
expect_true "the settings keep the last folder (Path)" [ "$(ini_value Path)" == "$(winpath "$root/a/b")" ]
shellpath=$(ini_value ShellPath)
expect_true "the settings keep the tree's label path ($shellpath)" [ "${shellpath##*\\}" == "b" ]

# 2. No start path: the explorer reopens the folder of the last call, selected in the tree.
script 'wait contains="bravo-1.dwg" timeout=30000' "${look[@]}" "tree-items $tree" 'key escape'
run "$nocall"
expect_true "without a start path the last folder is shown again (got $(counts) $(titles))" \
  [ "$(counts) $(titles)" == "3 b" ]
expect_true "and selected in the tree (got $(selected))" [ "$(selected)" == "b" ]
expect_true "the folder opened is shown open, its sub-folder listed, once its drawings are up" \
  has "$OUT" ' tree-item [0-9]* b expanded selected\( highlighted\)\?$'
expect_true "  c among them" has "$OUT" ' tree-item [0-9]* c$'

# 3. A click on a folder's button closes and opens it, a click on its label selects it.
a_path=${shellpath%\\*}
script 'wait contains="bravo-1.dwg" timeout=30000' \
       "tree-collapse $tree path=\"$a_path\"" 'echo collapsed' "tree-items $tree" 'echo end' \
       "tree-expand $tree path=\"$a_path\"" \
       "tree-select $tree path=\"$a_path\\side\"" "${look[@]}" \
       "tree-select $tree path=\"$shellpath\\c\"" "${look[@]}" "tree-items $tree" \
       "screenshot $frame $(winpath "$WORK/tree-clicked.png")" 'key escape'
run "$nocall"
expect_true "clicks select side and then c (got $(counts) / $(titles))" \
  [ "$(counts) / $(titles)" == "1 4 / side c" ]
collapsed=$(printf '%s\n' "$OUT" | sed -n '/^\[script\] collapsed$/,/^\[script\] end$/p')
expect_true "a click on a's button hides its sub-folders" \
  [ "$(printf '%s\n' "$collapsed" | grep -c ' tree-item [0-9]* \(b\|side\)\( \|$\)')" -eq 0 ]
expect_true "and a is selected then" has "$collapsed" ' tree-item [0-9]* a selected\( highlighted\)\?$'
expect_true "only the selected item is highlighted after clicks ($(stray_highlights | tr '\n' ' '))" [ -z "$(stray_highlights)" ]

# 4. A start path whose middle folder is missing: the walk stops there and the explorer still opens.
script "wait $frame timeout=30000" 'count class=Edit contains=".dwg" visible=any' "tree-items $tree" 'key escape'
run "$(call_at "$root/a/missing/c")"
expect_line "a start path with a missing middle folder still opens the explorer, and Escape cancels" "=> nil"
expect_true "nothing of it is selected and no drawing shown (got $(counts), '$(selected)')" \
  [ "$(counts)|$(selected)" == "0|" ]
expect_true "the tree opened the path as far as it exists" has "$OUT" 'tree-item [0-9]* orvextree expanded$'

# 5. Desktop: an empty grid, and the current folder stays what it was.
script 'wait contains="charlie-1.dwg" timeout=30000' \
       "tree-select $tree path=\"Desktop\"" 'sleep 300' 'count class=Edit contains=".dwg" visible=any' \
       'text contains="Desktop" nth=0' "screenshot contains=\"Desktop\" nth=0 $(winpath "$WORK/tree-desktop.png")" \
       'key escape'
run "$(call_at "$root/a/b/c")"
expect_true "selecting Desktop empties the grid (got $(counts))" [ "$(counts)" == "0" ]
expect_line "the title names the Desktop" "[script] text Desktop"
expect_true "the current folder stays the last real one" [ "$(ini_value Path)" == "$(winpath "$root/a/b/c")" ]
expect_true "the label path is the Desktop's" [ "$(ini_value ShellPath)" == "Desktop" ]

finish
