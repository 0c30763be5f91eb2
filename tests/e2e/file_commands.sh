#!/usr/bin/env bash
# The file commands as a person uses them: drawings copied in one folder and pasted in another, a cut that
# moves, a delete that goes to the trash, renames in the label that are taken or refused; the clipboard's
# list read by the system as another program would, and a wide list from another program that is pasted
# (but for a name the code page cannot hold, which is said). Real input through devhost's script; after every call the host must take input again.
. "$(dirname "$0")/lib.sh"

# Wine's trash is the desktop's (XDG): this test's own. Wine's services read it when they start, so the
# test waits for the Wine of an earlier test to end before its first Windows program.
export XDG_DATA_HOME="$WORK/xdg"
mkdir -p "$XDG_DATA_HOME"
WINEPREFIX="${WINEPREFIX:-$ROOT/build/wineprefix}" "$(command -v wineserver || echo /usr/lib/wine/wineserver)" -w \
  2>/dev/null || true

root="$WORK/orvexfiles"
samples="$ROOT/../shared/dwg-samples"
mkdir -p "$root/a" "$root/b" "$root/c" "$root/d"
if [ -f "$samples/MANIFEST.csv" ]; then
  cp "$samples/2000/Arc.dwg" "$root/a/arc.dwg"
  cp "$samples/2004/Cone.dwg" "$root/a/cone.dwg" 2>/dev/null || cp "$samples/2000/Cone.dwg" "$root/a/cone.dwg"
  cp "$samples/2007/Donut.dwg" "$root/a/donut.dwg" 2>/dev/null || cp "$samples/2000/Donut.dwg" "$root/a/donut.dwg"
  cp "$samples/2010/Helix.dwg" "$root/b/helix.dwg" 2>/dev/null || cp "$samples/2000/Arc.dwg" "$root/b/helix.dwg"
else
  echo "note: ../shared/dwg-samples is absent; synthetic drawings stand in for the real ones"
  gen_dwg "$WORK/gen" 4 --variant 3
  set -- "$WORK/gen"/*
  mv "$1" "$root/a/arc.dwg"; mv "$2" "$root/a/cone.dwg"; mv "$3" "$root/a/donut.dwg"; mv "$4" "$root/b/helix.dwg"
fi
echo "notes" >"$root/a/notes.txt"

tree='class=SysTreeView32'
frame='contains="orvexfiles" nth=0'
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$1"; }
call_at() { printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$1")"; }
labels() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | tr '\n' ' ' | sed 's/ $//'; }
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1.png")"; }
ini_value() { tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n "s/^$1=//p"; }
has() { grep -q -- "$2" <<<"$1"; }
on_disk() { (cd "$1" && ls | tr '\n' ' ' | sed 's/ $//'); }

# 0. Where the tree shows the two folders: the label path of a, from the explorer's own settings.
script 'wait contains="arc.dwg" timeout=30000' 'key escape'
run "$(call_at "$root/a")"
a_path=$(ini_value ShellPath)
b_path="${a_path%\\*}\\b"
c_path="${a_path%\\*}\\c"
expect_true "the explorer opened folder a (label path $a_path)" [ "${a_path##*\\}" == "a" ]

# 1. Copy two drawings of a (click, Ctrl+click, Ctrl+C), select b in the tree, Ctrl+V.
script 'wait contains="arc.dwg" timeout=30000' \
       'click class=Edit text="arc.dwg" at=60,-50' 'click class=Edit text="donut.dwg" at=60,-50 with=ctrl' \
       'key ctrl+c' 'clipboard-files' \
       "tree-select $tree path=\"$b_path\"" 'wait contains="helix.dwg" timeout=10000' \
       'click class=Edit text="helix.dwg" at=60,-50' 'key ctrl+v' \
       'wait class=Edit text="arc.dwg" timeout=10000' 'sleep 300' \
       'count class=Edit contains=".dwg"' "$(shot pasted)" 'key escape'
run "$(call_at "$root/a")"
expect_line "Ctrl+C put the two selected drawings on the clipboard, ANSI" "[script] clipboard-files 2 ansi"
expect_true "as full paths, in the grid's order" has "$OUT" \
  "clipboard-file $(winpath "$root/a/arc.dwg" | sed 's/\\/\\\\\\\\/g')$"
expect_true "the second one too" has "$OUT" "clipboard-file $(winpath "$root/a/donut.dwg" | sed 's/\\/\\\\\\\\/g')$"
expect_true "Ctrl+V in b copied both there (b holds: $(on_disk "$root/b"))" [ "$(on_disk "$root/b")" == "arc.dwg donut.dwg helix.dwg" ]
expect_true "and left a as it was ($(on_disk "$root/a"))" [ "$(on_disk "$root/a")" == "arc.dwg cone.dwg donut.dwg notes.txt" ]
expect_true "the copies are the same files" cmp -s "$root/a/arc.dwg" "$root/b/arc.dwg"
expect_line "the grid of b shows the three drawings" "[script] count 3"

# 2. Cut and paste moves: helix from b to a (Ctrl+X, then Ctrl+V in a); b's grid follows too.
script 'wait contains="helix.dwg" timeout=30000' \
       'click class=Edit text="helix.dwg" at=60,-50' 'key ctrl+x' 'clipboard-files' \
       "tree-select $tree path=\"$a_path\"" 'wait contains="cone.dwg" timeout=10000' \
       'click class=Edit text="cone.dwg" at=60,-50' 'key ctrl+v' \
       'wait class=Edit text="helix.dwg" timeout=10000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       'clipboard-files' \
       "tree-select $tree path=\"$b_path\"" 'wait contains="arc.dwg" timeout=10000' 'sleep 300' \
       'count class=Edit contains=".dwg"' 'key escape'
run "$(call_at "$root/b")"
expect_true "Ctrl+X put helix on the clipboard" has "$OUT" 'clipboard-file .*\\\\b\\\\helix.dwg$'
expect_true "Ctrl+V in a moved it: gone from b ($(on_disk "$root/b"))" [ "$(on_disk "$root/b")" == "arc.dwg donut.dwg" ]
expect_true "and in a ($(on_disk "$root/a"))" [ "$(on_disk "$root/a")" == "arc.dwg cone.dwg donut.dwg helix.dwg notes.txt" ]
expect_true "the grids show it: a 4, then b 2 (got $(labels))" [ "$(labels)" == "4 2" ]
expect_line "after the move the clipboard's list is gone" "[script] clipboard-files none"

# 3. Delete from the thumbnail's menu: the shell asks, the file goes to the trash and leaves the grid.
cp "$root/a/cone.dwg" "$WORK/cone.orig"
script 'wait contains="cone.dwg" timeout=30000' \
       'right-click class=Edit text="cone.dwg" at=60,-50' 'sleep 300' 'key d' \
       'wait class=#32770 text="Confirm file deletion" timeout=10000' \
       "screenshot class=#32770 text=\"Confirm file deletion\" $(winpath "$WORK/delete-confirm.png")" \
       'click class=#32770 text="Confirm file deletion" > class=Button text="&Yes"' \
       'gone class=Edit text="cone.dwg" timeout=10000' 'sleep 300' 'count class=Edit contains=".dwg"' 'key escape'
run "$(call_at "$root/a")"
expect_true "the delete is gone from a ($(on_disk "$root/a"))" [ "$(on_disk "$root/a")" == "arc.dwg donut.dwg helix.dwg notes.txt" ]
expect_line "and from the grid" "[script] count 3"
trashed="$XDG_DATA_HOME/Trash/files/cone.dwg"
expect_true "it is in the trash" [ -f "$trashed" ]
expect_true "the trash knows where it came from" grep -q "^Path=.*orvexfiles/a/cone.dwg$" "$XDG_DATA_HOME/Trash/info/cone.dwg.trashinfo"
mv "$trashed" "$root/a/cone.dwg" 2>/dev/null
expect_true "brought back, it is the same file" cmp -s "$WORK/cone.orig" "$root/a/cone.dwg"

box='class=#32770 text="Drawing explorer"'
# 4. Rename in the label: from the menu to a new name; by a double click on the label to a name that is
# taken (refused with a message, the old name back, both files intact); to ..\x.dwg (refused).
script 'wait contains="cone.dwg" timeout=30000' \
       'right-click class=Edit text="cone.dwg" at=60,-50' 'sleep 300' "$(shot thumb-menu)" 'key r' \
       'type "cylinder.dwg"' 'key enter' 'wait class=Edit text="cylinder.dwg" timeout=10000' 'sleep 300' \
       'double-click class=Edit text="donut.dwg"' 'type "arc.dwg"' 'key enter' \
       "wait $box timeout=10000" "text $box > class=Static contains=\"Cannot\"" \
       "screenshot $box $(winpath "$WORK/rename-refused.png")" \
       "click $box > class=Button text=OK" 'sleep 300' 'exists class=Edit text="donut.dwg"' \
       'double-click class=Edit text="helix.dwg"' 'type "..\\x.dwg"' 'key enter' \
       "wait $box timeout=10000" "text $box > class=Static contains=\"Cannot\"" \
       "click $box > class=Button text=OK" 'sleep 300' 'exists class=Edit text="helix.dwg"' \
       'count class=Edit contains=".dwg"' 'key escape'
run "$(call_at "$root/a")"
expect_true "the rename to a new name renamed the file ($(on_disk "$root/a"))" \
  [ "$(on_disk "$root/a")" == "arc.dwg cylinder.dwg donut.dwg helix.dwg notes.txt" ]
expect_line "a taken name is refused with a message" \
  '[script] text Cannot rename to "arc.dwg": a file of that name already exists.'
expect_true "both files intact" cmp -s "$root/b/arc.dwg" "$root/a/arc.dwg"
expect_true "the donut too" cmp -s "$root/b/donut.dwg" "$root/a/donut.dwg"
expect_true "..\\x.dwg is refused" has "$OUT" '^\[script\] text Cannot rename to "\.\.\\\\x\.dwg": a name cannot contain'
expect_true "nothing left the folder" [ ! -e "$root/x.dwg" ]
expect_true "the old labels came back (got $(printf '%s\n' "$OUT" | grep -c '^\[script\] exists yes'))" \
  [ "$(printf '%s\n' "$OUT" | grep -c '^\[script\] exists yes')" -eq 2 ]
expect_line "the grid still shows four drawings" "[script] count 4"

# 5. The grid's own menu: in the empty folder c a right click on the background offers Paste (the
# clipboard holds a drawing); "p" pastes. Rename is always greyed there (see the screenshot).
grid='id=59649'
script 'wait contains="arc.dwg" timeout=30000' \
       'click class=Edit text="arc.dwg" at=60,-50' 'key ctrl+c' \
       "tree-select $tree path=\"$c_path\"" 'sleep 500' 'count class=Edit contains=".dwg"' \
       "right-click $grid at=300,200" 'sleep 300' "screenshot class=#32768 $(winpath "$WORK/grid-menu.png")" \
       "$(shot grid-menu-frame)" 'key p' \
       'wait class=Edit text="arc.dwg" timeout=10000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       'click class=Edit text="arc.dwg" at=60,-50' 'key shift+delete' 'clipboard-files' 'key escape'
run "$(call_at "$root/a")"
expect_true "the background menu's Paste put arc in c ($(on_disk "$root/c"))" [ "$(on_disk "$root/c")" == "arc.dwg" ]
expect_true "the grid of c: empty, then one drawing (got $(labels))" [ "$(labels)" == "0 1" ]
expect_true "Shift+Delete cuts: c's arc is on the clipboard" has "$OUT" 'clipboard-file .*\\\\c\\\\arc.dwg$'
expect_true "and stays in c until it is pasted ($(on_disk "$root/c"))" [ "$(on_disk "$root/c")" == "arc.dwg" ]

# 6. Another program reads the list the explorer left on the clipboard, after the library is unloaded:
# through the system's DragQueryFileA and DragQueryFileW, and pastes it with the system's file operation.
probe() { "$WINE_RUN" "$CLIPBOARD_PROBE" "$@" 2>/dev/null | tr -d '\r'; }
arc_win=$(winpath "$root/c/arc.dwg")
expect_true "DragQueryFileA and W in another process read the explorer's list" \
  [ "$(probe read)" == "$(printf 'count-a 1\na %s\ncount-w 1\nw %s' "$arc_win" "$arc_win")" ]
expect_true "the clipboard holds the file list and nothing of the library (formats: $(probe formats | tr '\n' ' '))" \
  has "$(probe formats)" '^format 15$'
probe paste "$(winpath "$root/d")" >/dev/null
expect_true "the system's file operation pastes it ($(on_disk "$root/d"))" cmp -s "$root/a/arc.dwg" "$root/d/arc.dwg"

# 7. A wide list, as the system's file manager puts it there: Paste is offered in the thumbnail's menu (the
# screenshot) and pastes. A name the code page cannot hold is said in a message box and pasted under no other
# name.
rm -f "$root/c/arc.dwg"; cp "$root/a/donut.dwg" "$root/c/donut.dwg"
script 'wait contains="donut.dwg" timeout=30000' \
       "clipboard-put wide \"$(winpath "$root/a/helix.dwg")\"" 'clipboard-files' \
       'right-click class=Edit text="donut.dwg" at=60,-50' 'sleep 300' \
       "screenshot class=#32768 $(winpath "$WORK/thumb-menu-wide.png")" 'key p' \
       'wait class=Edit text="helix.dwg" timeout=10000' 'sleep 300' \
       'count class=Edit contains=".dwg"' "$(shot pasted-wide)" 'key escape'
run "$(call_at "$root/c")"
expect_line "the other program's list is wide" "[script] clipboard-files 1 wide"
expect_true "Paste in the thumbnail's menu pasted it ($(on_disk "$root/c"))" [ "$(on_disk "$root/c")" == "donut.dwg helix.dwg" ]
expect_line "the grid shows the pasted drawing" "[script] count 2"
rm -f "$root/c/helix.dwg"
unheld="$root/b/中文.dwg"
cp "$root/a/donut.dwg" "$unheld"
box_paste='class=#32770 text="Paste"'
script 'wait contains="donut.dwg" timeout=30000' \
       "clipboard-put wide \"$(winpath "$unheld")\"" \
       'click class=Edit text="donut.dwg" at=60,-50' 'key ctrl+v' \
       "wait $box_paste timeout=10000" "screenshot $box_paste $(winpath "$WORK/paste-refused.png")" \
       "text $box_paste > contains=\"code page\"" \
       "click $box_paste > class=Button text=OK" "gone $box_paste timeout=5000" 'sleep 500' \
       'count class=Edit contains=".dwg"' 'key escape'
run "$(call_at "$root/c")"
expect_true "a name the code page cannot hold is said, with the name" \
  has "$OUT" "^\[script\] text This file was not pasted: .*code page.*\\\\n$(winpath "$unheld" | sed 's/\\/\\\\\\\\/g')\$"
expect_true "and pasted under no other name ($(on_disk "$root/c"))" [ "$(on_disk "$root/c")" == "donut.dwg" ]
expect_line "the grid still shows the one drawing" "[script] count 1"

# 8. The host's timer still ends a call while a menu or a message box runs its own loop.
script 'wait contains="donut.dwg" timeout=30000' 'right-click class=Edit text="donut.dwg" at=60,-50' 'sleep 300' \
       'exists class=#32768' 'sleep 6000' 'exists class=#32768'
devhost --after-ms 4000 --post cancel --script "$(winpath "$WORK/script.txt")" --eval "$(call_at "$root/c")"
expect_line "--after-ms ends the call while the thumbnail's menu is open" "=> nil"
expect_true "the menu was open, then gone" [ "$(printf '%s\n' "$OUT" | grep '^\[script\] exists' | tr '\n' ' ')" == "[script] exists yes [script] exists no " ]
script 'wait contains="donut.dwg" timeout=30000' 'double-click class=Edit text="donut.dwg"' 'type "notes.txt"' 'key enter' \
       "wait $box timeout=10000" 'sleep 6000' "exists $box"
devhost --after-ms 4000 --post cancel --script "$(winpath "$WORK/script.txt")" --eval "$(call_at "$root/c")"
expect_line "--after-ms ends the call while a message box is open" "=> nil"
expect_line "and the box is gone" "[script] exists no"
script 'wait contains="donut.dwg" timeout=30000' 'right-click class=Edit text="donut.dwg" at=60,-50' 'sleep 300' \
       'key d' 'wait class=#32770 text="Confirm file deletion" timeout=10000' 'sleep 6000' \
       'exists class=#32770 text="Confirm file deletion"'
devhost --after-ms 4000 --post cancel --script "$(winpath "$WORK/script.txt")" --eval "$(call_at "$root/c")"
expect_line "--after-ms ends the call while the shell asks about a delete" "=> nil"
expect_true "answered No: the drawing stays ($(on_disk "$root/c"))" [ "$(on_disk "$root/c")" == "donut.dwg" ]

# 9. Property: the shell's property sheet of the drawing, for its full path; the explorer goes on.
sheet='class=#32770 text="Properties for donut.dwg"'
script 'wait contains="donut.dwg" timeout=30000' 'right-click class=Edit text="donut.dwg" at=60,-50' 'sleep 300' \
       'key up' 'key enter' "wait $sheet timeout=10000" "screenshot $sheet $(winpath "$WORK/properties.png")" \
       "text $sheet > contains=\"orvexfiles\"" "click $sheet > class=Button text=Cancel" "gone $sheet" \
       'click class=Edit text="donut.dwg" at=60,-50' 'sleep 300' "text $frame" 'key escape'
run "$(call_at "$root/c")"
expect_true "the sheet names the drawing's folder" has "$OUT" '^\[script\] text .*orvexfiles..c$'
expect_true "and the explorer goes on: the drawing is chosen" has "$OUT" '^\[script\] text .*\\\\c\\\\donut.dwg$'

finish
