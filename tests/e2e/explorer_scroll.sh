#!/usr/bin/env bash
# A folder of 3,000 drawings: sorting, cell sizes and keyboard navigation through real input, with the
# number of live thumbnail windows bounded by the visible rows.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexmany"
gen_dwg "$folder" 3000 --variant 5
[ "$(ls "$folder" | wc -l)" -eq 3000 ] && pass "3000 drawings generated" || fail "generator: $(cat "$WORK/gen.err")"
# The order the explorer shows them in, the file manager's: letters by the alphabet with case ignored,
# runs of digits by value (after the punctuation, before the letters), a hyphen passed over as the
# locale's word sort does, then space, "." and "_" in the locale's order of them (the only characters
# these names hold).
names=$(ls "$folder" | tr 'A-Z' 'a-z' | python3 -c '
import re, sys
punctuation = {" ": 0x02, ".": 0x33, "_": 0x44}
def key(name):
    weights = []
    for part in re.findall(r"[0-9]+|[^0-9]", name):
        if part.isdigit():
            value = part.lstrip("0")
            weights.append((0x0D, len(value), value))
        elif part in punctuation:
            weights.append((0x07, punctuation[part], ""))
        elif part != "-":
            weights.append((0x0E, 0, part))
    return weights
print("\n".join(sorted(sys.stdin.read().splitlines(), key=key)))')
first=$(printf '%s\n' "$names" | head -1)
last=$(printf '%s\n' "$names" | tail -1)
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
grid='contains="orvexmany" nth=0'
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
counts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p'; }

# Home, End, Page Down, Page Up, arrows; the labels (one per live thumbnail) are counted after each.
steps=('wait contains=".dwg" timeout=30000' "click text=\"$first\" at=60,-50" 'count class=Edit contains=".dwg" visible=any'
       "exists text=\"$first\"")
steps+=('key end' 'count class=Edit contains=".dwg" visible=any' "exists text=\"$last\"" "exists text=\"$first\"")
steps+=('key home' 'count class=Edit contains=".dwg" visible=any' "exists text=\"$first\"")
for _ in 1 2 3 4 5 6; do steps+=('key pagedown' 'count class=Edit contains=".dwg" visible=any'); done
steps+=("exists text=\"$first\"")
for _ in 1 2 3 4 5 6 7; do steps+=('key pageup' 'count class=Edit contains=".dwg" visible=any'); done
steps+=("exists text=\"$first\"")
for _ in $(seq 1 12); do steps+=('key down' 'count class=Edit contains=".dwg" visible=any'); done
steps+=("exists text=\"$first\"")
for _ in $(seq 1 12); do steps+=('key up' 'count class=Edit contains=".dwg" visible=any'); done
steps+=("exists text=\"$first\"")
# The scroll bar: clicks below its thumb move down row by row.
for _ in $(seq 1 8); do steps+=("click $grid window-at=-14,-90" 'count class=Edit contains=".dwg" visible=any'); done
steps+=("exists text=\"$first\"" 'key escape')
script "${steps[@]}"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "navigation ends with the explorer cancelled" "=> nil"
all=$(counts)
pool=$(printf '%s\n' "$all" | head -1)
max=$(printf '%s\n' "$all" | sort -n | tail -1)
min=$(printf '%s\n' "$all" | sort -n | head -1)
n=$(printf '%s\n' "$all" | wc -l)
echo "live thumbnails: at the top $pool, over $n steps between $min and $max"
[ "$n" -ge 48 ] && pass "every step was counted" || fail "only $n counts"
[ "${pool:-0}" -gt 0 ] && [ "$max" -le "$pool" ] && [ "$min" -gt 0 ] &&
  pass "live thumbnails never exceed columns x (visible rows + 2) = $pool" || fail "live thumbnails $min..$max, pool $pool"
ex=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] exists //p' | tr '\n' ' ')
[ "$ex" == "yes yes no yes no yes no yes no " ] && pass "End reaches the last row, Home the first; Page Down, Page Up, the arrows and the scroll bar move by rows" ||
  fail "exists sequence: $ex"

# Sorting: the first cell of the grid after each sort command (View and Sort menus from the keyboard).
small="$WORK/orvexsort"
mkdir -p "$small"
for n in b c a d; do head -c $(( ${#n} * 100 + $(printf '%d' "'$n") * 7 )) /dev/zero >"$small/$n.dwg"; done
touch -d '2020-01-05' "$small/a.dwg"; touch -d '2020-01-02' "$small/b.dwg"
touch -d '2020-01-04' "$small/c.dwg"; touch -d '2020-01-03' "$small/d.dwg"
truncate -s 900 "$small/a.dwg"; truncate -s 300 "$small/b.dwg"; truncate -s 100 "$small/c.dwg"; truncate -s 700 "$small/d.dwg"
touch -d '2020-01-05' "$small/a.dwg"; touch -d '2020-01-02' "$small/b.dwg"
touch -d '2020-01-04' "$small/c.dwg"; touch -d '2020-01-03' "$small/d.dwg"
scall="(Orvex 1 2 \"$(lisppath "$small")\\\\\" \"Insert\" \"Close\")"
sgrid='contains="orvexsort" nth=0'
for mode in n d s; do
  script 'wait contains=".dwg" timeout=20000' "click $sgrid at=200,60" "key alt+s $mode" 'sleep 300' \
         'rect text="a.dwg"' 'rect text="b.dwg"' 'rect text="c.dwg"' 'rect text="d.dwg"' 'key escape'
  devhost --script "$(winpath "$WORK/script.txt")" --eval "$scall"
  # Order of the four cells by position: top to bottom, left to right.
  order=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p' | paste - <(printf 'a\nb\nc\nd\n') |
          sort -k2,2n -k1,1n | awk '{print $5}' | tr -d '\n')
  eval "order_$mode=$order"
done
# Every drawing takes its place, whichever the folder read met last.
expect_order() { # NAME GOT EXPECTED
  [ "$2" == "$3" ] && pass "$1 ($2)" || fail "$1: got $2, expected $3"
}
expect_order "sort by name" "$order_n" abcd
expect_order "sort by date: oldest first" "$order_d" bdca
expect_order "sort by size: smallest first" "$order_s" cbda

# Increase, Decrease and Align change the cells.
script 'wait contains=".dwg" timeout=20000' "click $sgrid at=200,60" 'rect text="a.dwg"' \
       'key alt+v i' 'sleep 300' 'rect text="a.dwg"' 'key alt+v d' 'sleep 300' 'rect text="a.dwg"' \
       "rect $sgrid" 'key alt+v a' 'sleep 500' "rect $sgrid" 'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$scall"
widths=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p' | awk '{print $3}' | tr '\n' ' ')
read -r w0 w1 w2 f0 f1 <<<"$widths"
[ "$((w1 - w0))" -eq 43 ] && pass "Increase widens the cells from 173 to 216 pixels" || fail "Increase: label widths $w0 -> $w1"
[ "$w2" -eq "$w0" ] && pass "Decrease brings them back" || fail "Decrease: $w1 -> $w2"
[ "$f1" != "$f0" ] && pass "Align fits the frame to whole columns ($f0 -> $f1 wide)" || fail "Align left the frame at $f0"

finish
