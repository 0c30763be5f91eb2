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
# Each size is measured on a folder of lower-case names and on one of mixed-case names (BENCH_CASES, default
# "lower mixed"), each with real previews and with flat ones (devhost --preview flat: one colour, no file
# opened, so the step's time is the library's own). The script's last key (Escape) cancels the explorer; if
# it does not, devhost's timer cancels the call BENCH_CALL_LIMIT_MS after it began (default here 60 s).
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

counts=("$@")
[ ${#counts[@]} -gt 0 ] || counts=(10000 100000)
steps=${BENCH_STEPS:-5}
read -r -a cases <<<"${BENCH_CASES:-lower mixed}"
export BENCH_CALL_LIMIT_MS=${BENCH_CALL_LIMIT_MS:-60000}

script="$data/scroll-script.txt"
mkdir -p "$data"
{
  echo 'wait class=Orvex1Wnd timeout=120000' # the first thumbnail
  echo 'sleep 1000'
  # Above the first label: a tooltip shown where the pointer rests holds a drawing's name too.
  echo 'click class=Edit contains=".dwg" nth=0 at=60,-50'
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

row() { printf '%10s %6s %9s %6s %10s %10s %9s\n' "$@"; }
printf 'One scroll step of the grid under Wine (ms from the key to the new row drawn), median of %d runs x %d steps\n' \
  "$runs" "$steps"
printf 'real: devhost draws the stored pictures; flat: --preview flat, one colour, no file opened\n\n'
row drawings names position key "step real" "step flat" previews
row ---------- ------ --------- ------ ---------- ---------- ---------
for count in "${counts[@]}"; do
  for case in "${cases[@]}"; do
    folder=$(folder_of "$count" "$case")
    need_drawings "$folder"
    real=$(mktemp) flat=$(mktemp)
    for ((r = 0; r < runs; r++)); do
      explorer_run "$folder" --preview real --script "$(winpath "$script")" | parse >>"$real"
      explorer_run "$folder" --preview flat --script "$(winpath "$script")" | parse >>"$flat"
    done
    for where in top bottom; do
      for key in Down Up; do
        sel() { awk -v w="$where" -v k="$key" -v c="$2" '$1 == w && $2 == k { print $c }' "$1"; }
        [ -n "$(sel "$real" 3)$(sel "$flat" 3)" ] || continue
        r=$(sel "$real" 4 | median) f=$(sel "$flat" 4 | median)
        row "$count" "$case" "$where" "$key" "$r" "$f" "$(sel "$real" 5 | median 0)"
        record scroll "$count" "$case" "$where" "$key" real "$r"
        record scroll "$count" "$case" "$where" "$key" flat "$f"
      done
    done
    if [ -n "${BENCH_VERBOSE:-}" ]; then
      sed 's/^/  real /' "$real" >&2
      sed 's/^/  flat /' "$flat" >&2
    fi
    rm -f "$real" "$flat"
  done
done
