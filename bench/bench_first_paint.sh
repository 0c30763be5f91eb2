#!/usr/bin/env bash
# Time from the LISP call to the first complete paint of the explorer on a folder of synthetic drawings,
# under Wine: median of BENCH_RUNS runs (default 5). Prints a table.
#   bench/bench_first_paint.sh [COUNT...]        (default: 10000 100000)
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

printf 'First complete paint under Wine (ms since the LISP call began), median of %d runs\n\n' "$runs"
printf '%10s %14s %16s %10s %9s %9s\n' drawings "first preview" "complete paint" settled previews visible
printf '%10s %14s %16s %10s %9s %9s\n' ---------- -------------- ---------------- ---------- --------- ---------
for count in "${counts[@]}"; do
  folder=$(folder_of "$count")
  firsts=() completes=() settles=() previews=() visibles=()
  for ((r = 0; r < runs; r++)); do
    read -r first complete settled n visible < <(explorer_run "$folder" --after-ms 8000 --post cancel | parse)
    firsts+=("$first") completes+=("$complete") settles+=("$settled") previews+=("$n") visibles+=("$visible")
    [ -z "${BENCH_VERBOSE:-}" ] ||
      echo "  run $((r + 1)): first $first complete $complete settled $settled previews $n visible $visible" >&2
  done
  printf '%10s %14s %16s %10s %9s %9s\n' "$count" \
    "$(printf '%s\n' "${firsts[@]}" | median)" "$(printf '%s\n' "${completes[@]}" | median)" \
    "$(printf '%s\n' "${settles[@]}" | median)" "$(printf '%s\n' "${previews[@]}" | median 0)" \
    "$(printf '%s\n' "${visibles[@]}" | median 0)"
done
