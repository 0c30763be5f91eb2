#!/usr/bin/env bash
# WM_APP is every program's first private message. Other programs (or other threads of the host) that post
# it to the explorer's windows with meanings of their own must not end the call, pick a drawing or
# crash: the explorer stays open and takes input, and the pick that follows is the user's own. The
# explorer's own two results (1 accept, 2 cancel, lParam 0) still end it from any thread.
. "$(dirname "$0")/lib.sh"

folder="$WORK/straydrawings"
gen_dwg "$folder" 4 --variant 2
names=$(ls "$folder" | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
second=$(printf '%s\n' "$names" | sed -n 2p)
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="straydrawings" nth=0'
run_dialog='class=#32770 visible=any' # the run dialog: the only dialog while nothing else is open
shot() { winpath "$WORK/$1"; }

# 1. A drawing selected (an accept would return it), then stray WM_APP messages from the script's thread:
#    to the run dialog with parameters the explorer never posts, to the frame and to the grid with the
#    explorer's own values. None ends the call; the user then picks the second drawing.
script_with_host_checks 'wait contains=".dwg" timeout=20000' \
  "click text=\"$first\" at=60,-50" \
  "screenshot $frame $(shot stray-selected.png)" \
  "post $run_dialog 32768 1 7" \
  "post $run_dialog 32768 5 0" \
  "post $run_dialog 32768 0 0" \
  "post $run_dialog 32768 2 -1" \
  "post $frame 32768 1 0" \
  "post $frame 32768 2 0" \
  "post text=\"$first\" 32768 2 0" \
  'sleep 500' \
  'echo after' "exists $frame" "enabled $frame" \
  "screenshot $frame $(shot stray-after.png)" \
  "double-click text=\"$second\" at=60,-50"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
posted=$(printf '%s\n' "$OUT" | grep -c '^\[script\] post 1$')
expect_host_usable "stray messages"
expect_true "each stray message was posted to one window (got $posted of 7)" [ "$posted" -eq 7 ]
expect_true "the explorer is still open after the stray messages" \
  grep -qx '\[script\] exists yes' <(printf '%s\n' "$OUT" | sed -n '/^\[script\] after$/,$p')
expect_true "and takes input" \
  grep -qx '\[script\] enabled yes' <(printf '%s\n' "$OUT" | sed -n '/^\[script\] after$/,$p')
expect_line "the pick is the user's own: the second drawing" "=> (\"$prefix$second\" (\"\" \"\" \"\"))"
n=$(printf '%s\n' "$OUT" | grep -c '^=>')
expect_true "one result for the one call (got $n)" [ "$n" -eq 1 ]

# 2. The explorer's own accept, posted from another thread while a drawing is selected, ends the call with
#    that drawing, as the accept button would.
script_with_host_checks 'wait contains=".dwg" timeout=20000' \
  "click text=\"$first\" at=60,-50" \
  "post $run_dialog 32768 1 0"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "the explorer's own accept from another thread"
expect_line "the explorer's own accept from another thread returns the selected drawing" \
  "=> (\"$prefix$first\" (\"\" \"\" \"\"))"

finish
