#!/usr/bin/env bash
# Builds what the benchmarks need and runs them all, printing their tables:
#   bench_sort, bench_preview   (Windows build, under Wine)
#   bench_first_paint.sh        LISP call -> first complete paint of the explorer
#   bench_scroll.sh             one scroll step at the top and at the bottom of the grid
#   bench_slow_share.sh         first screen, a row step and the host thread's longest wait at 0-50 ms a read
#   bench_phases.sh             where the milliseconds of the first complete paint go
#   bench_tree_expand           the folder tree expanding a folder of 2,000 and of 20,000 sub-folders
#   bench_scan                  folder scan against a bare FindFirstFile loop (last: it makes its folders)
# Builds go to build/bench-win (mingw-w64, Release) and build/bench-native (the generator, to make the big
# folders of drawings quickly); drawings to build/bench-data, kept between runs. BENCH_RUNS sets the runs
# of the explorer benchmarks (default 5). At the end, one summary table: each goal of the speed work, the
# figure measured and its ratio to the goal (at most 1.00 when the goal is met).
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
cd "$root"
source bench/explorer-lib.sh

{
  cmake -S . -B "$win_build" -G Ninja --toolchain cmake/mingw-w64-x86_64.cmake -DCMAKE_BUILD_TYPE=Release
  cmake --build "$win_build" -j2 --target Orvex1 devhost gen-dwg-samples bench_sort bench_preview bench_scan bench_tree_expand
  cmake -S . -B "$native_build" -G Ninja -DCMAKE_BUILD_TYPE=Release
  cmake --build "$native_build" -j2 --target gen-dwg-samples make_scan_folder
} >"$root/build/bench-build.log" 2>&1 || {
  echo "build failed: see build/bench-build.log" >&2
  exit 1
}

export BENCH_BUILT=1 # the explorer benchmarks need not build again
export BENCH_RESULTS=$(mktemp)
logs=$(mktemp -d)
trap 'rm -rf "$BENCH_RESULTS" "$logs"' EXIT
run_wine() { "$root/tools/wine-run" "$@" 2>/dev/null; }

echo "== bench_sort"
run_wine "$win_build/bin/bench_sort.exe" | tee "$logs/sort"
echo
echo "== bench_preview"
mkdir -p "$data"
(cd "$data" && run_wine "$win_build/bin/bench_preview.exe") | tee "$logs/preview" # it writes its drawings where it runs
echo
echo "== bench_first_paint.sh"
bench/bench_first_paint.sh
echo
echo "== bench_scroll.sh"
bench/bench_scroll.sh
echo "== bench_slow_share.sh"
bench/bench_slow_share.sh
echo
echo "== bench_phases.sh"
bench/bench_phases.sh
echo
echo "== bench_tree_expand"
# Its folders of empty sub-folders are made here (natively: much faster than through Wine), marked complete.
for count in 2000 20000; do
  dir="$data/tree/folders-$count"
  if [ ! -f "$dir/.complete" ]; then
    rm -rf "$dir" && mkdir -p "$dir"
    (cd "$dir" && seq -f 'd%05g' 1 "$count" | xargs mkdir && touch .complete)
  fi
done
run_wine "$win_build/bin/bench_tree_expand.exe" "$(winpath "$data/tree")" 2000 20000
echo
echo "== bench_scan"
# bench_scan makes its folders itself when they lack their ".complete" marker; natively is much faster.
for count in 10000 100000; do
  dir="$data/scan/files-$count"
  if [ ! -f "$dir/.complete" ]; then
    rm -rf "$dir" && mkdir -p "$dir"
    "$native_build/bench/make_scan_folder" "$dir" "$count"
  fi
done
run_wine "$win_build/bin/bench_scan.exe" "$(winpath "$data/scan")" | tee "$logs/scan"

# The summary. Explorer figures: medians of the tables above, on lower-case names (a Windows file system
# opens a file at the same cost whatever the case of its name) with real previews unless said otherwise.
get() { awk -v k="$*" '{ v = $NF; $NF = ""; sub(/ $/, "") } $0 == k { print v; exit }' "$BENCH_RESULTS"; }
# step COUNT CASE POSITION PREVIEW: the slower of the Down and Up steps there.
step() {
  local d u
  d=$(get scroll "$1" "$2" "$3" Down "$4") u=$(get scroll "$1" "$2" "$3" Up "$4")
  printf '%s\n' "$d" "$u" | awk '$1 ~ /^[0-9.]+$/ { if ($1 > m) m = $1; n++ } END { if (n) print m; else print "-" }'
}
max_of() { printf '%s\n' "$@" | awk '$1 ~ /^[0-9.]+$/ { if ($1 > m) m = $1; n++ } END { if (n) print m; else print "-" }'; }
divide() { awk -v a="$1" -v b="$2" 'BEGIN { if (a ~ /^[0-9.]+$/ && b ~ /^[0-9.]+$/ && b > 0) printf "%.2f", a / b; else print "-" }'; }
goal() { # TEXT FIGURE UNIT LIMIT
  printf '%-62s %10s %-3s %6s %6s\n' "$1" "$2" "$3" "$4" "$(divide "$2" "$4")"
}
for case in lower mixed; do
  for pos in top bottom; do
    for count in 10000 100000; do
      eval "step_${count}_${pos}_${case}=\$(step $count $case $pos real)"
      eval "flat_${count}_${pos}_${case}=\$(step $count $case $pos flat)"
    done
  done
done
# (The Windows programs end their lines with CR LF.)
scan10=$(tr -d '\r' <"$logs/scan" | awk '$1 == 10000 { print $5 }')
scan100=$(tr -d '\r' <"$logs/scan" | awk '$1 == 100000 { print $5 }')
sortname=$(tr -d '\r' <"$logs/sort" | awk '/^SortDwgList by name/ { print $NF }')
previewratio=$(tr -d '\r' <"$logs/preview" | awk '/^synthetic/ { print $(NF - 1) }')

echo
echo "== summary: the goals (under Wine on this machine; ratio = figure / goal, at most 1.00 when met)"
echo "   figures on lower-case names with real previews; \"library's share\": flat previews (devhost"
echo "   --preview flat); a step is the slower of Down and Up, the library's share the slowest of all"
echo
printf '%-62s %10s %-3s %6s %6s\n' goal figure "" goal ratio
printf '%-62s %10s %-3s %6s %6s\n' -------------------------------------------------------------- ---------- --- ------ ------
for case in lower mixed; do
  n=""; [ "$case" == lower ] || n=" (mixed case)"
  goal "call -> first complete paint, 10,000 drawings$n" "$(get first_paint 10000 $case real)" ms 300
  goal "call -> first complete paint, 100,000 drawings$n" "$(get first_paint 100000 $case real)" ms 450
  eval "t10=\$step_10000_top_$case b10=\$step_10000_bottom_$case b100=\$step_100000_bottom_$case"
  goal "one scroll step, top of 10,000$n" "$t10" ms 16
  goal "one scroll step, bottom of 10,000$n" "$b10" ms 16
  goal "step: bottom of 100,000 / top of 10,000$n" "$(divide "$b100" "$t10")" x 1.2
  goal "library's share: first complete paint of 10,000$n" "$(get first_paint 10000 $case flat)" ms 150
  eval "f=\$(max_of \$flat_10000_top_$case \$flat_10000_bottom_$case \$flat_100000_top_$case \$flat_100000_bottom_$case)"
  goal "library's share: slowest scroll step$n" "$f" ms 4
done
goal "no regression: scan of 10,000 / bare FindFirstFileA loop" "${scan10:--}" x 1.14
goal "no regression: scan of 100,000 / bare FindFirstFileA loop" "${scan100:--}" x 1.14
goal "no regression: name sort of 100,000 records" "${sortname:--}" ms 60
goal "no regression: preview read / raw read of the same bytes" "${previewratio:--}" x 1.08
