#!/usr/bin/env bash
# A folder of 20,000 sub-folders expanded in the folder tree: while it fills, the tree shows the loading
# item with its hourglass turning and its progress bar (drawn by the animation thread while the
# user-interface thread inserts); afterwards the node holds every sub-folder, sorted, and the explorer
# goes on as before.
. "$(dirname "$0")/lib.sh"

count=20000
root="$WORK/bigtree"
gen_dwg "$root" 2
mkdir -p "$root/many"
(cd "$root/many" && seq -f 'd%05g' 1 "$count" | xargs mkdir)
expect_true "$count sub-folders and 2 drawings made" \
  [ "$(find "$root/many" -mindepth 1 -maxdepth 1 -type d | wc -l) $(find "$root" -maxdepth 1 -iname '*.dwg' | wc -l)" == "$count 2" ]

# A wide left pane, so that the loading item's label and bar are on the screen.
printf '[Size]\r\nSplitterSize=360\r\n' >"$WORK/lib/Orvex1.ini"

tree='class=SysTreeView32'
frame='contains="bigtree" nth=0'
shots=()
for i in 1 2 3 4; do shots+=("screenshot $tree $(winpath "$WORK/fill-$i.bmp")" 'sleep 150'); done
# The start folder is shown expanded: Right moves to its only child, many; Right again expands it.
printf '%s\n' 'wait contains=".dwg" timeout=30000' 'key right' 'sleep 800' "tree-count $tree" \
  'key right' 'sleep 200' "${shots[@]}" \
  "tree-count $tree at-least=$count timeout=240000" 'sleep 1000' "tree-count $tree" \
  "screenshot $tree $(winpath "$WORK/filled.png")" \
  'key down' 'sleep 500' "text $frame" 'count contains=".dwg"' \
  "screenshot $frame $(winpath "$WORK/first-child.png")" 'key escape' >"$WORK/script.txt"
devhost --timing --script "$(winpath "$WORK/script.txt")" --eval "(Orvex 1 2 \"$(lisppath "$root")\\\\\" \"Insert\" \"Close\")"
expect_line "Escape ends the call" "=> nil"

# The first folder searched is the start folder: opening the explorer scans no other folder on the way.
first_scan=$(printf '%s\n' "$OUT" | sed -n 's/^\[timing\] [0-9.]* scan-begin //p' | head -1)
expect_true "the first folder scanned is the start folder (got $first_scan)" \
  [ "$first_scan" == "$(winpath "$root")\\*" ]
# The count before the expansion, and the last one: the wait for at least $count items ends while the
# last of them are still being inserted (the tree held other items before).
counts=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] tree-count //p' | tr '\n' ' ')
read -r before _ after <<<"$counts"
expect_true "the node holds the $count sub-folders afterwards (tree items $before before, ${after:-none} after)" \
  [ "$((${after:-0} - ${before:-0}))" -eq "$count" ]
# The expansion's length, from the key press to the end of its handling (devhost's timing hook).
expand_ms=$(printf '%s\n' "$OUT" | awk '/^\[timing\] [0-9.]+ key 39$/ {k = $2} /key-handled$/ && k {e = $2 - k; k = 0} END {printf "%d", e}')
echo "expanding $count sub-folders took ${expand_ms} ms"
has() { grep -q -- "$1" <<<"$OUT"; }
expect_true "Down selects the first sub-folder, d00001, and the title names it" has '^\[script\] text .*\\d00001$'
# devhost's drawing view is the one window of the count: no thumbnail.
expect_true "an empty folder shows an empty grid" has '^\[script\] count 1$'

# The screenshots taken while it filled: the red bar beside "Loading...", and the hourglass left of the
# label changing between shots (the animation ticks while the user-interface thread is busy).
verdict=$(python3 - "$WORK"/fill-{1,2,3,4}.bmp <<'PY'
import struct, sys
def read(path):
    d = open(path, 'rb').read()
    off, = struct.unpack_from('<I', d, 10)
    w, h, _, bpp = struct.unpack_from('<iiHH', d, 18)
    stride = (w * 3 + 3) & ~3
    rows = [[(d[off + y * stride + x * 3 + 2], d[off + y * stride + x * 3 + 1], d[off + y * stride + x * 3])
             for x in range(w)] for y in range(abs(h))]
    return rows[::-1] if h > 0 else rows
shots = [read(p) for p in sys.argv[1:]]
bars = []
for rows in shots:
    red = [(x, y) for y, row in enumerate(rows) for x, p in enumerate(row) if p == (255, 0, 0)]
    bars.append((min(x for x, _ in red), min(y for _, y in red), max(y for _, y in red)) if red else None)
with_bar = [i for i, b in enumerate(bars) if b]
changed = False
if with_bar:
    left, top, bottom = bars[with_bar[0]]
    # the hourglass: the icon place left of the "Loading..." label, on the bar's rows
    region = lambda rows: [rows[y][max(0, left - 110):max(0, left - 60)] for y in range(top - 6, bottom + 7)]
    regions = [region(shots[i]) for i in with_bar]
    changed = any(r != regions[0] for r in regions[1:])
print(len(with_bar), 'yes' if changed else 'no')
PY
)
read -r bar_shots hourglass_turns <<<"$verdict"
expect_true "the progress bar is on the screen while the node fills ($bar_shots of 4 shots)" [ "${bar_shots:-0}" -ge 2 ]
expect_true "the hourglass turns between the shots" [ "$hourglass_turns" == yes ]

finish
