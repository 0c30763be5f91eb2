#!/usr/bin/env bash
# Fifty calls in a row, each closed while pictures are still being read (20 ms a read, the explorer
# cancelled 700 ms after each call began): the last calls leave the process no more GDI objects,
# windows, handles and threads than the first ones, the GDI objects of the first call exactly, and the
# windows it had before it.
# The first call may leave what the system builds once on first use (window classes, the common
# controls' images, the system colours' brushes); the library keeps nothing from one call to the next.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexfifty"
gen_dwg "$folder" 150 --variant 11
[ "$(ls "$folder" | wc -l)" -eq 150 ] && pass "150 drawings generated" || fail "generator: $(cat "$WORK/gen.err")"
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"

ncalls=50
evals=()
for _ in $(seq "$ncalls"); do evals+=(--eval "$call"); done
# The host checks once the fifty calls have returned: they take longer than the checks' usual wait.
printf '%s\n' 'returned timeout=240000' "${HOST_CHECKS[@]:1}" >"$WORK/script.txt"
devhost --resources --file-latency 20 --after-ms 700 --post cancel --script "$(winpath "$WORK/script.txt")" \
  "${evals[@]}"
expect_host_usable "after $ncalls calls in a row"

ended=$(grep -cx '=> nil' <<<"$OUT")
expect_true "all $ncalls calls were cancelled and returned nil ($ended)" test "$ended" -eq "$ncalls"

# "[host] resources WHEN: gdi=G windows=W handles=H threads=T" -> "G W H T"
counts() { sed -nE "s/^\[host\] resources $1: gdi=(-?[0-9]+) windows=([0-9]+) handles=([0-9]+) threads=([0-9]+)$/\1 \2 \3 \4/p" <<<"$OUT"; }
before=$(counts "before the first call")
after=$(counts "after the call")
echo "before the first call (gdi windows handles threads): $before"
echo "after each call, the distinct counts:"; sort <<<"$after" | uniq -c
read -r gdi0 windows0 handles0 threads0 <<<"$before"
expect_true "the counts were taken before the first call and after each of the $ncalls calls" \
  test -n "$before" -a "$(grep -c . <<<"$after")" -eq "$ncalls"
expect_true "GDI objects are counted in this process (${gdi0:-?})" test "${gdi0:--1}" -gt 0

# The largest of a count over the first ten calls and over the last ten. Wine's own handles and threads
# come and go by a few between calls (four handles more from some call on, in some runs, in a process
# that did nothing else): handles and threads may end up to eight higher. A thing kept by each call would
# add up to forty more over the forty calls between; GDI objects and windows do not move at all.
largest() { # COLUMN FIRST-LINE LAST-LINE
  sed -n "$2,$3p" <<<"$after" | awk -v c="$1" 'BEGIN { m = -1 } $c > m { m = $c } END { print m }'
}
column=1
for what in "GDI objects" windows handles threads; do
  early=$(largest $column 1 10)
  late=$(largest $column $((ncalls - 9)) "$ncalls")
  slack=0
  case $what in handles | threads) slack=8 ;; esac
  expect_true "calls 41 to 50 leave no more $what than calls 1 to 10 ($late, $early, give or take $slack)" \
    test "$late" -ge 0 -a "$late" -le $((early + slack))
  column=$((column + 1))
done
read -r gdi1 windows1 _ <<<"$(head -1 <<<"$after")"
read -r gdi50 windows50 _ <<<"$(tail -1 <<<"$after")"
expect_true "after the last call the process holds the GDI objects it held after the first ($gdi50, $gdi1)" \
  test "${gdi50:-x}" == "${gdi1:-y}"
expect_true "the explorer's windows are all gone after each call ($windows50 windows, $windows0 before)" \
  test "${windows50:-x}" == "${windows0:-y}"

finish
