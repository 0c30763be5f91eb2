#!/usr/bin/env bash
# The host takes input again after every way a call can end: its main frame enabled as before, the keyboard
# back in its drawing view, the desktop's double-click time the user's own. Accept means a drawing.
. "$(dirname "$0")/lib.sh"

folder="$WORK/safetydrawings"
gen_dwg "$folder" 6 --variant 3
names=$(ls "$folder" | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
second=$(printf '%s\n' "$names" | sed -n 2p)
start="$(lisppath "$folder")\\\\"
call="(Orvex 1 2 \"$start\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="safetydrawings" nth=0'
ready='wait contains=".dwg" timeout=20000'

# run NAME LINE...: one call driven by the script lines, then the host checks.
run() {
  local name=$1; shift
  script_with_host_checks "$@"
  devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
  expect_host_usable "$name"
}

run "a pick by double-click" "$ready" "double-click text=\"$first\" at=60,-50"
expect_line "a pick by double-click returns the drawing" "=> (\"$prefix$first\" (\"\" \"\" \"\"))"

run "the accept button" "$ready" "click text=\"$second\" at=60,-50" 'click text="Insert"'
expect_line "the accept button returns the selected drawing" "=> (\"$prefix$second\" (\"\" \"\" \"\"))"

run "the cancel button" "$ready" 'click text="Close"'
expect_line "the cancel button gives nil" "=> nil"

run "Escape in the grid" "$ready" "click text=\"$first\" at=60,-50" 'key escape'
expect_line "Escape gives nil" "=> nil"

run "the close box" "$ready" "click $frame window-at=-12,12"
expect_line "the close box gives nil" "=> nil"

run "Alt+F4" "$ready" "click text=\"$first\" at=60,-50" 'key alt+f4'
expect_line "Alt+F4 gives nil" "=> nil"

run "File > Exit" "$ready" "click text=\"$first\" at=60,-50" 'key alt+f' 'key x'
expect_line "File > Exit gives nil" "=> nil"

# A frame that cannot be created: the call ends at once with nil instead of an invisible loop.
script_with_host_checks
devhost --refuse-window 'Orvex1:' --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "a frame that cannot be created"
expect_line "the refused frame was asked for" "[host] refused to create a window of class $(
  printf '%s\n' "$OUT" | sed -n 's/^\[host\] refused to create a window of class //p' | head -1)"
expect_line "a frame that cannot be created is said on the command line" "Orvex: the explorer window could not be created"
expect_line "a frame that cannot be created gives nil" "=> nil"

# An accept message while nothing is chosen ends the call with nil: never the folder as a drawing.
rm -f "$WORK/lib/Orvex1.ini"
script_with_host_checks "$ready"
devhost --after-ms 2500 --post accept --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "an accept with nothing chosen"
expect_line "an accept with nothing chosen gives nil" "=> nil"

# A drawing deleted while the window is open is not returned: the user is told, the window stays open and
# another drawing can be picked.
cp "$folder/$(ls "$folder" | head -1)" "$folder/zz-going.dwg"
script_with_host_checks "$ready" 'click text="zz-going.dwg" at=60,-50' "echo deleting" \
  'sleep 800' 'click text="Insert"' 'wait class=#32770 text="Orvex1" timeout=5000' \
  'text class=#32770 text="Orvex1" > class=Static contains="no longer exists"' \
  'key enter' 'gone class=#32770 text="Orvex1" timeout=5000' \
  "exists $frame" "double-click text=\"$first\" at=60,-50"
# The script cannot delete files; a watcher removes the file as soon as the script says so.
( for _ in $(seq 1 300); do
    grep -q 'deleting' "$WORK/script.log" 2>/dev/null && { rm -f "$folder/zz-going.dwg"; break; }
    sleep 0.1
  done ) &
watcher=$!
OUT=$("$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --script "$(winpath "$WORK/script.txt")" --eval "$call" \
      2>"$WORK/stderr" | tee "$WORK/script.log" | tr -d '\r')
RC=${PIPESTATUS[0]}
wait "$watcher" 2>/dev/null
expect_host_usable "a drawing deleted while shown"
expect_true "the user is told that the drawing no longer exists" \
  grep -q '^\[script\] text .*zz-going.dwg.*no longer exists' <(printf '%s\n' "$OUT")
expect_line "the window stays open after the message" "[script] exists yes"
expect_line "another drawing is picked afterwards" "=> (\"$prefix$first\" (\"\" \"\" \"\"))"

# The explorer runs with a 300 ms double-click time; the user's own comes back when the call ends.
script_with_host_checks "$ready" 'double-click-time' 'click text="Close"' 'returned timeout=30000' 'double-click-time'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
times=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] double-click-time //p' | tr '\n' ' ')
before=$(printf '%s' "$times" | cut -d' ' -f1); after=$(printf '%s' "$times" | cut -d' ' -f2)
[ "$before" == 300 ] && pass "the explorer runs with a 300 ms double-click time" || fail "double-click time during the call: '$before'"
[ -n "$after" ] && [ "$after" != 300 ] && pass "the user's double-click time ($after ms) is back after the call" ||
  fail "double-click time after the call: '$after'"

# Closing the frame from inside its own handlers (close box, Alt+F4, File > Exit) under Wine's heap checks:
# nothing may be written into the frame object after it deleted itself.
for way in close alt-f4 exit; do
  case $way in
    close) lines=("$ready" "click $frame window-at=-12,12") ;;
    alt-f4) lines=("$ready" "click text=\"$first\" at=60,-50" 'key alt+f4') ;;
    exit) lines=("$ready" "click text=\"$first\" at=60,-50" 'key alt+f' 'key x') ;;
  esac
  script_with_host_checks "${lines[@]}"
  # Freed blocks are filled and the filling checked when devhost validates every heap after the call.
  OUT=$(WINEDEBUG=warn+heap "$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --check-heaps \
        --script "$(winpath "$WORK/script.txt")" --eval "$call" 2>"$WORK/heap-$way.log" | tr -d '\r')
  RC=${PIPESTATUS[0]}
  expect_line "$way under heap checks gives nil" "=> nil"
  expect_line "$way: every heap is valid after the call" "[host] heaps valid"
  heap=$(grep -cE ':(err|warn):heap' "$WORK/heap-$way.log")
  if [ "$heap" -eq 0 ]; then pass "$way: Wine's heap checks report nothing"
  else fail "$way: Wine's heap checks report $heap problems"; grep -E ':(err|warn):heap' "$WORK/heap-$way.log" | head -5; fi
done

finish
