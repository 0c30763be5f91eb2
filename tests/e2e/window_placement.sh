#!/usr/bin/env bash
# Where the explorer opens. A frame closed maximised opens maximised again (before, it opened at its created
# size and saved that); a tree pane width saved in a maximised frame (SplitterSize=1347) leaves the grid
# some room in a smaller frame, with the bar in reach (before, the grid was 0 pixels wide).
. "$(dirname "$0")/lib.sh"

ini="$WORK/lib/Orvex1.ini"
folder="$WORK/placement"
gen_dwg "$folder" 6 --variant 3
[ "$(ls "$folder" | wc -l)" -eq 6 ] && pass "a folder of six drawings" || fail "generator: $(cat "$WORK/gen.err")"
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
shot() { winpath "$WORK/$1"; }
ini_value() { tr -d '\r' <"$ini" 2>/dev/null | sed -n "s/^$1=//p"; }
rect_of() { printf '%s\n' "$OUT" | sed -n "/^\[script\] echo-$1\$/,\$p" | sed -n 's/^\[script\] rect //p' | head -1; }
frame='contains="placement" nth=0' # the title shows the folder
grid='id=59649'
call=$(printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$folder")")
first=$(ls "$folder" | head -1 | tr A-Z a-z) # labels are lower-cased

# 1. Maximise the frame (a double click on its caption), close it with its close box.
rm -f "$ini"
script "wait text=\"$first\" timeout=30000" 'sleep 300' \
       "double-click $frame window-at=300,10" 'sleep 800' \
       'echo echo-maximised' "rect $frame" "screenshot id=59648 nth=0 $(shot maximised.png)" \
       "click $frame window-at=-12,12"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
maximised=$(rect_of maximised)
read -r _ _ mw mh <<<"$maximised"
expect_true "the frame was maximised ($maximised) and its size saved ($(ini_value WindowWidth) x $(ini_value WindowHeight))" \
  [ -n "$mw" -a "$(ini_value WindowWidth)" == "$mw" -a "$(ini_value WindowHeight)" == "$mh" ]

# 2. Reopen: maximised again; closed, it saves the same size.
script "wait text=\"$first\" timeout=30000" 'sleep 300' \
       'echo echo-reopened' "rect $frame" "screenshot id=59648 nth=0 $(shot reopened.png)" \
       "click $frame window-at=-12,12"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_true "the frame reopens maximised (got $(rect_of reopened), maximised was $maximised)" \
  [ -n "$maximised" -a "$(rect_of reopened)" == "$maximised" ]
expect_true "and saves the maximised size again ($(ini_value WindowWidth) x $(ini_value WindowHeight))" \
  [ -n "$mw" -a "$(ini_value WindowWidth)" == "$mw" -a "$(ini_value WindowHeight)" == "$mh" ]

# 3. A tree pane of 1347 pixels, saved while maximised, in a frame of 1200 x 750: the grid keeps some room
#    and its drawings show; the bar can be dragged back.
printf '[CurrentPath]\r\nPath=%s\r\nName=\r\nShellPath=\r\n\r\n[Size]\r\nSplitterSize=1347\r\nWindowWidth=1200\r\nWindowHeight=750\r\n\r\n' \
  "$(winpath "$folder")" >"$ini"
script "wait text=\"$first\" timeout=30000" 'sleep 500' \
       'echo echo-frame' "rect $frame" 'echo echo-grid' "rect $grid" \
       "screenshot $frame $(shot wide-tree-pane.png)" \
       "count class=Edit contains=\".dwg\"" \
       "click $frame window-at=-12,12"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
read -r fx _ fw _ <<<"$(rect_of frame)"
read -r gx _ gw _ <<<"$(rect_of grid)"
expect_true "the frame opens at 1200 x 750 ($(rect_of frame))" [ "$fw" == 1200 ]
expect_true "the grid is at least 200 pixels wide and inside the frame (grid $(rect_of grid))" \
  [ "${gw:-0}" -ge 200 -a "$((${gx:-0} + ${gw:-0}))" -le "$((${fx:-0} + ${fw:-0}))" ]
expect_true "its drawings have their cells ($(printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p'))" \
  [ "$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p')" -ge 1 ]
split=$(ini_value SplitterSize)
expect_true "the tree pane saved leaves the grid its room ($split)" [ "${split:-9999}" -le "$((1200 - 200))" ]

finish
