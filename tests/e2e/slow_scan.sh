#!/usr/bin/env bash
# A folder read over a slow network (devhost --scan-latency adds 40 ms to every entry of a folder search):
# the frame shows at once with the status bar counting the drawings found, Escape ends the call at once,
# a folder chosen in the tree meanwhile is shown and the first folder's drawings never are, and the grid
# fills when the read ends, where a pick returns the drawing's path.
. "$(dirname "$0")/lib.sh"

root="$WORK/orvexscan"
# folder DIR COUNT NAME: COUNT drawings named NAME-1.dwg ... in a new folder.
folder() {
  local dir=$1 count=$2 name=$3 i=1
  gen_dwg "$dir" "$count" --variant 5
  for f in "$dir"/*; do mv "$f" "$dir/$name-$i.dwg"; i=$((i + 1)); done
}
folder "$root/big" 60 big
folder "$root/small" 2 small
mkdir -p "$root/big/sub" # a quick folder would be opened in the tree to show it
[ "$(find "$root" -name '*.dwg' | wc -l)" -eq 62 ] && pass "62 drawings in two folders" ||
  fail "generator: $(cat "$WORK/gen.err")"

latency=40
call="(Orvex 1 2 \"$(lisppath "$root/big")\\\\\" \"Insert\" \"Close\")"
frame='contains="orvexscan" nth=0'
status='class=msctls_statusbar32'
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --timing --scan-latency "$latency" --script "$(winpath "$WORK/script.txt")" --eval "$call"; }
at() { printf '%s\n' "$OUT" | awk -v what="$1" '$1 == "[timing]" && $3 == what { print $2; exit }'; }
texts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] text //p'; }
counts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | tr '\n' ' ' | sed 's/ $//'; }
has() { grep -q -- "$2" <<<"$1"; } # has TEXT PATTERN

# 1. The frame shows while the folder is read; the status bar counts; the grid fills at the end and a
# double-click picks.
script "wait $status contains=\"Reading the folder\" timeout=20000" \
       "screenshot $frame $(winpath "$WORK/slow-scan-reading.png")" \
       "text $status" 'count class=Edit contains=".dwg" visible=any' \
       'echo tree-during' 'tree-items class=SysTreeView32' \
       'sleep 700' "text $status" \
       'wait contains="big-13.dwg" timeout=20000' 'sleep 300' \
       "screenshot $frame $(winpath "$WORK/slow-scan-read.png")" \
       "text $status" 'count class=Edit contains=".dwg" visible=any' \
       'echo tree-after' 'tree-items class=SysTreeView32' \
       'double-click text="big-13.dwg" at=60,-50'
run
first_paint=$(printf '%s\n' "$OUT" | awk '$1 == "[timing]" && $3 == "paint" && $4 == "ToolbarWindow32" { print $2; exit }')
scan_end=$(at scan-end)
echo "the frame first painted at ${first_paint:-?} ms; the folder's read ended at ${scan_end:-?} ms"
expect_true "the frame is drawn before the slow folder's read has ended (${first_paint:-?} < ${scan_end:-?} ms)" \
  awk -v p="${first_paint:-}" -v e="${scan_end:-}" 'BEGIN { exit !(p != "" && e != "" && p + 0 < e + 0) }'
reading=$(texts | head -1)
expect_true "the status bar says the folder is being read ($reading)" \
  has "$reading" '^Reading the folder\(…\|\.\.\.\) [0-9]* drawings\?$'
later=$(texts | sed -n 2p)
n1=$(sed 's/.* \([0-9]*\) drawings\?$/\1/' <<<"$reading"); n2=$(sed 's/.* \([0-9]*\) drawings\?$/\1/' <<<"$later")
expect_true "the count goes up while the folder is read ($reading, then $later)" \
  [ "${n2:-0}" -gt "${n1:-0}" ]
expect_true "no thumbnail shows while the folder is read, the grid's once it is (got $(counts))" \
  [ "$(counts | cut -d' ' -f1)" == "0" ]
expect_true "the status bar counts the folder's drawings at the end ($(texts | sed -n 3p))" \
  [ "$(texts | sed -n 3p)" == "60 drawings" ]
# The tree's item big as the tree listed it after the marker MARK: "big [expanded] [selected] ...".
big_item() { printf '%s\n' "$OUT" | sed -n "/^\[script\] $1\$/,\$p" |
             sed -n 's/^\[script\] tree-item [0-9]* \(big\( .*\)\?\)$/\1/p' | head -1; }
expect_true "the tree leaves the folder being read closed: reading it for its sub-folders would hold the host ($(big_item tree-during))" \
  test -n "$(big_item tree-during)" -a -z "$(big_item tree-during | grep expanded)"
expect_true "also once it is read: a folder slow to read is slow to open, the user opens it ($(big_item tree-after))" \
  test -n "$(big_item tree-after)" -a -z "$(big_item tree-after | grep expanded)"
expect_line "a double-click after the read picks its drawing" \
  "=> (\"$(lisppath "$root/big")\\\\big-13.dwg\" (\"\" \"\" \"\"))"

# 2. The drawing picked in the last call is chosen again once the slow folder is read, as after a quick one.
script "wait $status contains=\"Reading the folder\" timeout=20000" "text $frame" \
       'wait contains="big-13.dwg" timeout=20000' 'sleep 500' "text $frame" 'text id=32790' \
       'enabled text="Insert"' 'click text="Insert"'
run
titles() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] text //p' | sed 's/.*\\//' | tr '\n' ' ' | sed 's/ $//'; }
expect_true "the title names the folder while it is read, then the drawing of the last call, chosen again (got $(titles))" \
  [ "$(titles)" == "big big-13.dwg big-13" ]
expect_line "the accept button is enabled for it" "[script] enabled yes"
expect_line "the accept button takes the drawing chosen again" \
  "=> (\"$(lisppath "$root/big")\\\\big-13.dwg\" (\"\" \"\" \"\"))"

# 3. Escape while the folder is read: the call returns at once, the host takes input again.
script "wait $status contains=\"Reading the folder\" timeout=20000" 'key escape'
run
expect_line "Escape while the folder is read cancels" "=> nil"
closing=$(printf '%s\n' "$OUT" | awk '$1 == "[timing]" && $3 == "key" && $4 == 27 { k = $2 }
                                      $1 == "[timing]" && $3 == "call-end" && k != "" { printf "%d", $2 - k }')
echo "Escape to the call's end during the read: ${closing:-?} ms"
expect_true "Escape during the read ends the call at once (${closing:-?} ms) and before the read's end" \
  test -n "$closing" -a "${closing:-99999}" -lt 1000
expect_true "the abandoned read never reached its end during the call" test -z "$(at scan-end)"
expect_true "devhost ended on its own after the call (exit $RC)" test "$RC" -eq 0

# 4. Another folder chosen in the tree during the read: it is shown, the first one's drawings never are.
script "wait $status contains=\"Reading the folder\" timeout=20000" \
       "wait class=SysTreeView32 timeout=10000" 'focus' 'key down' \
       'wait contains="small-1.dwg" timeout=20000' 'sleep 300' \
       'count class=Edit contains="small-" visible=any' 'count class=Edit contains="big-" visible=any' \
       'sleep 3500' \
       "screenshot $frame $(winpath "$WORK/slow-scan-other.png")" \
       'count class=Edit contains="small-" visible=any' 'count class=Edit contains="big-" visible=any' \
       "text $status" "text $frame" 'echo tree-other' 'tree-items class=SysTreeView32' \
       'double-click text="small-2.dwg" at=60,-50'
run
expect_true "the keyboard is in the tree during the read ($(printf '%s\n' "$OUT" | sed -n 's/^\[script\] focus //p'))" \
  has "$OUT" '^\[script\] focus SysTreeView32 '
expect_true "the folder chosen in the tree shows its 2 drawings, none of the first's, also after the first's read would have ended (got $(counts))" \
  [ "$(counts)" == "2 0 2 0" ]
expect_true "the status bar counts the folder chosen ($(texts | head -1))" [ "$(texts | head -1)" == "2 drawings" ]
expect_true "the title names the folder chosen ($(texts | sed -n 2p))" has "$(texts | sed -n 2p)" 'small$'
expect_true "the folder left during its read is not opened behind the user's back ($(big_item tree-other))" \
  test -n "$(big_item tree-other)" -a -z "$(big_item tree-other | grep expanded)"
expect_line "a pick in the folder chosen returns its path" \
  "=> (\"$(lisppath "$root/small")\\\\small-2.dwg\" (\"\" \"\" \"\"))"

finish
