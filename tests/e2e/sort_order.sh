#!/usr/bin/env bash
# The sort as a person sees it: every drawing takes its place by name, date and size, the last one the
# folder read meets included; drawings of 2 GiB and more show their whole size and sort by it, and their
# thumbnails do not read them whole.
. "$(dirname "$0")/lib.sh"
: "${SCAN_ORDER_PROBE:?path of scan_order_probe.exe}"

script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
# The order in which the runtime's file search (the folder read's) meets a folder's entries.
scan_order() { "$WINE_RUN" "$SCAN_ORDER_PROBE" "$(winpath "$1")" 2>/dev/null | tr -d '\r'; }
# LISTED NAMES...: the names ordered by where their labels are in the grid (top to bottom, left to right),
# from the "rect" lines of the last run, one per name in the order the names are given.
grid_order() {
  local n=$#
  printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p' | head -n "$n" | paste - <(printf '%s\n' "$@") |
    sort -k2,2n -k1,1n | awk '{print $5}' | tr '\n' ' '
}
used_bytes() { df --output=used -B1 "$WORK" | tail -1 | tr -d ' '; }

# ---- 1. The last file the folder read meets is sorted like every other one --------------------------
gen_dwg "$WORK/gen" 4 --variant 3 --lower-case
folder="$WORK/orvexorder"
mkdir -p "$folder"
# "_" comes after the letters in the listing order of Wine (and NTFS), which compare names upper-cased,
# but before them by name, where names are compared lower-cased. Not assumed: the probe says.
names=(_plan.dwg bath.dwg door.dwg roof.dwg)
i=0
for f in "$WORK/gen"/*; do cp "$f" "$folder/${names[$i]}"; i=$((i + 1)); done
read_order=$(scan_order "$folder")
last=$(printf '%s\n' "$read_order" | tail -1)
first_by_name=$(printf '%s\n' "${names[@]}" | LC_ALL=C sort | head -1)
echo "the folder read meets: $(printf '%s ' $read_order)"
[ "$(printf '%s\n' "$read_order" | grep -c .)" -eq 4 ] && [ "$last" == "$first_by_name" ] &&
  pass "the folder read meets $last last, and it is the first by name" ||
  fail "setup: the folder read meets '$last' last, the first by name is $first_by_name"

# Found last, and also the oldest and the smallest (a 16 KB drawing among ones of 1.4 MB and more).
k=0
for n in "${names[@]}"; do
  if [ "$n" == "$last" ]; then
    touch -d '2001-02-03 04:05:06' "$folder/$n"
  else
    k=$((k + 1))
    truncate -s $((1400000 + (4 - k) * 100000)) "$folder/$n"
    touch -d "2015-0$((5 - k))-01 12:00:00" "$folder/$n"
  fi
done
[ "$(scan_order "$folder")" == "$read_order" ] && pass "sizes and dates left the read order as it was" ||
  fail "the read order changed: $(scan_order "$folder" | tr '\n' ' ')"
want_name=$(cd "$folder" && ls | LC_ALL=C sort | tr '\n' ' ')
want_date=$(cd "$folder" && stat -c '%Y %n' * | sort -n | awk '{print $2}' | tr '\n' ' ')
want_size=$(cd "$folder" && stat -c '%s %n' * | sort -n | awk '{print $2}' | tr '\n' ' ')

call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
grid='contains="orvexorder" nth=0'
rects=()
for n in "${names[@]}"; do rects+=("rect text=\"$n\""); done
steps=('wait contains=".dwg" timeout=20000' "click $grid at=200,60")
for mode in n d s; do
  steps+=("key alt+s $mode" 'sleep 500' "${rects[@]}" "screenshot $grid $(winpath "$WORK/sort-order-$mode.png")")
done
steps+=('key escape')
script "${steps[@]}"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "the sorts end with the explorer cancelled" "=> nil"
all_rects=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p')
mode_order() { # NTH-MODE: the grid's order after that sort command
  OUT=$(printf '%s\n' "$all_rects" | sed -n "$(($1 * 4 + 1)),$(($1 * 4 + 4))p" | sed 's/^/[script] rect /')
  grid_order "${names[@]}"
}
saved=$OUT
got_name=$(mode_order 0); got_date=$(mode_order 1); got_size=$(mode_order 2)
OUT=$saved
[ "$got_name" == "$want_name" ] && pass "by name: $got_name" || fail "by name: got '$got_name', expected '$want_name'"
[ "$got_date" == "$want_date" ] && pass "by date, oldest first: $got_date" ||
  fail "by date: got '$got_date', expected '$want_date'"
[ "$got_size" == "$want_size" ] && pass "by size, smallest first: $got_size" ||
  fail "by size: got '$got_size', expected '$want_size'"
for by in name date size; do
  got=got_$by
  [ "${!got%% *}" == "$last" ] && pass "the last file found leads the grid by $by ($last)" ||
    fail "the last file found ($last) is not first by $by: ${!got}"
done

# ---- 2. Drawings of 3 and 5 GiB (sparse: no room taken) -------------------------------------------
rm -f "$WORK/lib/Orvex1.ini" # the drawing chosen above belongs to that folder
huge="$WORK/orvexhuge"
mkdir -p "$huge"
gen_dwg "$WORK/gen2" 2 --variant 4 --lower-case
set -- "$WORK/gen2"/*
cp "$1" "$huge/small.dwg"
cp "$2" "$huge/mid.dwg"
truncate -s 1400000 "$huge/mid.dwg"
before=$(used_bytes)
# Real drawings made large: the preview stays at the start, the rest is a hole.
cp "$1" "$huge/three-gib.dwg" && truncate -s 3G "$huge/three-gib.dwg"
cp "$2" "$huge/five-gib.dwg" && truncate -s 5G "$huge/five-gib.dwg"
after=$(used_bytes)
echo "disk used: $before -> $after bytes; $(du -h --apparent-size "$huge/three-gib.dwg" | cut -f1) apparent, $(du -h "$huge/three-gib.dwg" | cut -f1) on disk"
[ $((after - before)) -lt $((64 << 20)) ] && pass "the 3 and 5 GiB files are sparse (df grew by $((after - before)) bytes)" ||
  fail "the large files took $((after - before)) bytes of disk"
echo "the folder read meets: $(scan_order "$huge" | tr '\n' ' ')"
want_size=$(cd "$huge" && stat -c '%s %n' * | sort -n | awk '{print $2}' | tr '\n' ' ')

hcall="(Orvex 1 2 \"$(lisppath "$huge")\\\\\" \"Insert\" \"Close\")"
hgrid='contains="orvexhuge" nth=0'
hnames=(small.dwg mid.dwg three-gib.dwg five-gib.dwg)
tip() { printf '%s\n' "move text=\"$1\" at=60,-50" 'sleep 300' "move text=\"$1\" at=70,-55" 'sleep 1500' 'tooltip'; }
steps=('wait contains=".dwg" timeout=20000' "click $hgrid at=200,60" 'key alt+s s' 'sleep 500')
for n in "${hnames[@]}"; do steps+=("rect text=\"$n\""); done
steps+=("screenshot $hgrid $(winpath "$WORK/sort-order-huge.png")")
steps+=("$(tip three-gib.dwg)" "$(tip five-gib.dwg)")
steps+=("screenshot $hgrid $(winpath "$WORK/sort-order-huge-tooltip.png")" 'key escape')
script "${steps[@]}"
# What the host process reads while it shows them: the thumbnails read a header and a preview, never the
# gigabytes (read from /proc while it runs; its command line holds this test's own folder).
io_log="$WORK/io.log"
(
  tag=$(winpath "$WORK")
  while :; do
    for p in /proc/[0-9]*; do
      if { tr '\0' ' ' <"$p/cmdline"; } 2>/dev/null | grep -qF -- "$tag"; then
        r=$(sed -n 's/^rchar: //p' "$p/io" 2>/dev/null) && [ -n "$r" ] && echo "${p#/proc/} $r"
      fi
    done >>"$io_log"
    sleep 0.5
  done
) &
watcher=$!
devhost --script "$(winpath "$WORK/script.txt")" --eval "$hcall"
kill "$watcher" 2>/dev/null
wait "$watcher" 2>/dev/null
expect_line "the large drawings' explorer ends cancelled" "=> nil"
got_size=$(grid_order "${hnames[@]}")
[ "$got_size" == "$want_size" ] && pass "by size, 3 GiB after the small ones and 5 GiB after it: $got_size" ||
  fail "by size: got '$got_size', expected '$want_size'"
tips=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] tooltip //p')
printf '%s\n' "$tips"
grep -qE '^three-gib\.dwg\\r\\nSize=3221225472\\r\\n[0-9]{2}/' <<<"$tips" && pass "the 3 GiB drawing's tooltip reads Size=3221225472" ||
  fail "3 GiB tooltip: $(head -1 <<<"$tips")"
grep -qE '^five-gib\.dwg\\r\\nSize=5368709120\\r\\n[0-9]{2}/' <<<"$tips" && pass "the 5 GiB drawing's tooltip reads Size=5368709120" ||
  fail "5 GiB tooltip: $(tail -1 <<<"$tips")"
most=$(awk '{print $2}' "$io_log" 2>/dev/null | sort -n | tail -1)
echo "most bytes read by one host process: ${most:-none seen}"
[ -n "$most" ] && [ "$most" -lt $((512 << 20)) ] && pass "the host read less than 512 MiB while it showed 8 GiB of drawings" ||
  fail "the host read ${most:-an unknown number of} bytes"

finish
