#!/usr/bin/env bash
# A second Orvex call made while the explorer is open: the host runs it from inside the first call's loop
# (devhost's script command `call` posts it to the host's frame, which the explorer's loop dispatches), as a
# host running LISP from a timer or another document would. It is refused with a message and returns nil;
# the open explorer stays, keeps its captions, and the user's pick in it is the first call's value.
. "$(dirname "$0")/lib.sh"

folder="$WORK/seconddrawings"
gen_dwg "$folder" 3 --variant 1
names=$(ls "$folder" | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
second=$(printf '%s\n' "$names" | sed -n 2p)
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="seconddrawings" nth=0'
shot() { winpath "$WORK/$1"; }

script_with_host_checks 'wait contains=".dwg" timeout=20000' \
  "click text=\"$first\" at=60,-50" \
  'call "(Orvex 1 2 \"\" \"Take\" \"Leave\")"' \
  'sleep 500' \
  'echo after' "count $frame" "enabled $frame" 'exists text="Insert"' 'exists text="Take"' \
  "screenshot $frame $(shot second-call-refused.png)" \
  "double-click text=\"$second\" at=60,-50"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "a second call while the explorer is open"
expect_line "the second call is refused on the command line" \
  "Orvex: the explorer is already open; this call returns nil"
expect_line "and in an alert" "[alert] \\nOrvex: the explorer is already open; this call returns nil\\n"
results=$(printf '%s\n' "$OUT" | grep '^=>' | tr '\n' '|')
expect_true "the second call returns nil, then the first the user's pick (got $results)" \
  [ "$results" == "=> nil|=> (\"$prefix$second\" (\"\" \"\" \"\"))|" ]
after=$(printf '%s\n' "$OUT" | sed -n '/^\[script\] after$/,$p' | sed -n '2,5p' | tr '\n' '|')
expect_true "one explorer, taking input, with the first call's captions (got $after)" \
  [ "$after" == "[script] count 1|[script] enabled yes|[script] exists yes|[script] exists no|" ]

finish
