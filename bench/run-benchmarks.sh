#!/usr/bin/env bash
# Builds what the benchmarks need and runs them all, printing their tables:
#   bench_sort, bench_preview   (Windows build, under Wine)
#   bench_first_paint.sh        LISP call -> first complete paint of the explorer
#   bench_scroll.sh             one scroll step at the top and at the bottom of the grid
#   bench_tree_expand           the folder tree expanding a folder of 2,000 and of 20,000 sub-folders
#   bench_scan                  folder scan against a bare FindFirstFile loop (last: it makes its folders)
# Builds go to build/bench-win (mingw-w64, Release) and build/bench-native (the generator, to make the big
# folders of drawings quickly); drawings to build/bench-data, kept between runs. BENCH_RUNS sets the runs
# of the explorer benchmarks (default 5).
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
cd "$root"
source bench/explorer-lib.sh

{
  cmake -S . -B "$win_build" -G Ninja --toolchain cmake/mingw-w64-x86_64.cmake -DCMAKE_BUILD_TYPE=Release
  cmake --build "$win_build" --target Orvex1 devhost gen-dwg-samples bench_sort bench_preview bench_scan bench_tree_expand
  cmake -S . -B "$native_build" -G Ninja -DCMAKE_BUILD_TYPE=Release
  cmake --build "$native_build" --target gen-dwg-samples make_scan_folder
} >"$root/build/bench-build.log" 2>&1 || {
  echo "build failed: see build/bench-build.log" >&2
  exit 1
}

run_wine() { "$root/tools/wine-run" "$@" 2>/dev/null; }

echo "== bench_sort"
run_wine "$win_build/bin/bench_sort.exe"
echo
echo "== bench_preview"
mkdir -p "$data"
(cd "$data" && run_wine "$win_build/bin/bench_preview.exe") # it writes its synthetic drawings where it runs
echo
echo "== bench_first_paint.sh"
bench/bench_first_paint.sh
echo
echo "== bench_scroll.sh"
bench/bench_scroll.sh
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
run_wine "$win_build/bin/bench_scan.exe" "$(winpath "$data/scan")"
