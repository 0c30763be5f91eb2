#!/usr/bin/env bash
# Time of one scroll step of the explorer's grid (Down / Up arrow: one row) at the top and at the bottom of
# folders of synthetic drawings, under Wine: median over BENCH_RUNS runs (default 5) of STEPS steps each.
# Prints a table.
#   bench/bench_scroll.sh [COUNT...]        (default: 10000 100000)
#
# Each run opens the explorer on the folder and drives it with devhost's script: a click on the first
# thumbnail (the grid takes the keyboard), STEPS x Down then STEPS x Up at the top, End, then STEPS x Up
# and STEPS x Down at the bottom, 300 ms between keys. devhost --timing prints when the user-interface
# thread takes each key from its queue ("key VK"), when it takes its next message ("key-handled": the key's
# handling is over) and each preview drawn. A step lasts from its key to the later of key-handled and the
# last preview drawn before the next key: the row is on the screen, pictures included. "previews" is how
# many pictures a step draws. A step should cost the same whatever the folder's size.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

counts=("$@")
[ ${#counts[@]} -gt 0 ] || counts=(10000 100000)
steps=${BENCH_STEPS:-5}

script="$data/scroll-script.txt"
mkdir -p "$data"
{
  echo 'wait contains=".dwg" timeout=120000'
  echo 'sleep 1000'
  echo 'click contains=".dwg" nth=0 at=60,-50'
  echo 'sleep 500'
  echo 'echo top'
  for ((i = 0; i < steps; i++)); do echo 'key down'; echo 'sleep 300'; done
  for ((i = 0; i < steps; i++)); do echo 'key up'; echo 'sleep 300'; done
  echo 'key end'
  echo 'sleep 2000'
  echo 'echo bottom'
  for ((i = 0; i < steps; i++)); do echo 'key up'; echo 'sleep 300'; done
  for ((i = 0; i < steps; i++)); do echo 'key down'; echo 'sleep 300'; done
  echo 'key escape'
} >"$script"

# One run's output -> lines "POSITION KEY MS_HANDLED MS_STEP PREVIEWS" for the arrow keys (38 up, 40 down).
parse() {
  awk '
    function flush() {
      if (key != "" && (key == 38 || key == 40))
        printf "%s %s %.3f %.3f %d\n", where, (key == 40 ? "Down" : "Up"), handled - start,
               (last > handled ? last : handled) - start, n
      key = ""
    }
    $1 == "[script]" && ($2 == "top" || $2 == "bottom") { flush(); where = $2 }
    $1 == "[timing]" && $3 == "key" { flush(); key = $4; start = $2; handled = $2; last = 0; n = 0; wanthandled = 1 }
    $1 == "[timing]" && $3 == "key-handled" && wanthandled { handled = $2; wanthandled = 0 }
    $1 == "[timing]" && $3 == "preview" && key != "" { last = $2; n++ }
    $1 == "[timing]" && $3 == "call-end" { flush() }
    END { flush() }'
}

printf 'One scroll step of the grid under Wine (ms from the key to the new row drawn), median of %d runs x %d steps\n\n' \
  "$runs" "$steps"
printf '%10s %9s %6s %14s %12s %9s\n' drawings position key "key handled" "step done" previews
printf '%10s %9s %6s %14s %12s %9s\n' ---------- --------- ------ -------------- ------------ ---------
for count in "${counts[@]}"; do
  folder=$(folder_of "$count")
  results=$(mktemp)
  for ((r = 0; r < runs; r++)); do
    explorer_run "$folder" --script "$(winpath "$script")" | parse >>"$results"
  done
  for where in top bottom; do
    for key in Down Up; do
      sel() { awk -v w="$where" -v k="$key" -v c="$1" '$1 == w && $2 == k { print $c }' "$results"; }
      [ -n "$(sel 3)" ] || continue
      printf '%10s %9s %6s %14s %12s %9s\n' "$count" "$where" "$key" "$(sel 3 | median)" "$(sel 4 | median)" \
        "$(sel 5 | median 0)"
    done
  done
  [ -z "${BENCH_VERBOSE:-}" ] || sed 's/^/  /' "$results" >&2
  rm -f "$results"
done
