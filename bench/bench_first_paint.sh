#!/usr/bin/env bash
# Time from the LISP call to the first complete paint of the explorer on a folder of synthetic drawings,
# under Wine: median of BENCH_RUNS runs (default 5). Prints a table.
#   bench/bench_first_paint.sh [COUNT...]        (default: 10000 100000)
# Each size is measured on a folder of lower-case names and on one of mixed-case names (BENCH_CASES, default
# "lower mixed"), each with real previews (devhost draws the picture stored in each file) and with flat ones
# (devhost --preview flat: one colour, no file opened, so the time is the library's own).
#
# devhost --timing prints "[timing] MS preview DRAWN/VISIBLE NAME" after each preview it draws, MS being
# milliseconds since the call began, VISIBLE the thumbnails shown inside the grid's client area at that
# moment and DRAWN how many of them have had their preview drawn. The first complete paint is the first
# such line with DRAWN = VISIBLE: every thumbnail one can see shows its picture. "settled" is the last
# preview before previews stop arriving for 300 ms, "previews" how many were drawn until then (more than
# VISIBLE when the grid draws some twice). Nothing else runs in devhost meanwhile: no script, the call is
# cancelled by devhost's --after-ms timer long after the paint.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

counts=("$@")
[ ${#counts[@]} -gt 0 ] || counts=(10000 100000)
read -r -a cases <<<"${BENCH_CASES:-lower mixed}"

# One run's output -> "first complete settled previews visible" (ms, ms, ms, count, count).
parse() {
  awk '
    $1 == "[timing]" && $3 == "preview" {
      t = $2 + 0; split($4, dv, "/")
      if (n > 0 && t - last >= 300) done = 1
      if (done) next
      if (n == 0) first = t
      n++; last = t
      if (complete == "" && dv[2] > 0 && dv[1] == dv[2]) { complete = t; visible = dv[2] }
    }
    END {
      if (complete == "") complete = "incomplete"
      printf "%s %s %s %d %s\n", (n ? first : "-"), complete, (n ? last : "-"), n, (visible == "" ? "-" : visible)
    }'
}

row() { printf '%10s %6s %11s %11s %14s %14s %9s %8s\n' "$@"; }
printf 'First complete paint under Wine (ms since the LISP call began), median of %d runs\n' "$runs"
printf 'first: the first preview drawn; complete: every visible thumbnail has its picture\n'
printf 'real: devhost draws the stored pictures; flat: --preview flat, one colour, no file opened\n\n'
row drawings names "first real" "first flat" "complete real" "complete flat" previews visible
row ---------- ------ ----------- ----------- -------------- -------------- --------- --------
for count in "${counts[@]}"; do
  for case in "${cases[@]}"; do
    folder=$(folder_of "$count" "$case")
    need_drawings "$folder"
    declare -A first=() complete=()
    previews=() visibles=()
    for preview in real flat; do
      firsts=() completes=()
      for ((r = 0; r < runs; r++)); do
        read -r f c settled n visible < <(explorer_run "$folder" --preview "$preview" --after-ms 8000 --post cancel |
          parse)
        firsts+=("$f") completes+=("$c")
        [ "$preview" == flat ] || { previews+=("$n"); visibles+=("$visible"); }
        [ -z "${BENCH_VERBOSE:-}" ] ||
          echo "  $count $case $preview run $((r + 1)): first $f complete $c settled $settled previews $n visible $visible" >&2
      done
      first[$preview]=$(printf '%s\n' "${firsts[@]}" | median)
      complete[$preview]=$(printf '%s\n' "${completes[@]}" | median)
      record first_paint "$count" "$case" "$preview" "${complete[$preview]}"
    done
    row "$count" "$case" "${first[real]}" "${first[flat]}" "${complete[real]}" "${complete[flat]}" \
      "$(printf '%s\n' "${previews[@]}" | median 0)" "$(printf '%s\n' "${visibles[@]}" | median 0)"
    unset first complete
  done
done
