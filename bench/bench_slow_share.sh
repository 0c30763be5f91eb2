#!/usr/bin/env bash
# The explorer on a drawing library behind a slow file server: devhost --file-latency adds MS to every read
# of a drawing (0, 5, 20 and 50 ms by default), on about 300 synthetic drawings under Wine. Median of
# BENCH_RUNS runs (default 3) at each latency. Prints a table.
#   bench/bench_slow_share.sh [MS...]
#
# first screen: from the call's start to the first moment every visible thumbnail has its picture
# ("[timing] preview DRAWN/VISIBLE" with DRAWN = VISIBLE). row step: from a Down key to the last picture
# drawn before the next key (5 steps, 1.5 s apart, median), key: from the key to its handling's end.
# pictures/step: pictures painted a step; files/step: drawing files opened a step (devhost's "opened" count
# before each key, from the Down to the next key; read ahead of the view counts in the step that began
# it). longest wait: the longest time the host's thread left a WM_NULL
# sent to the explorer every 10 ms unanswered, from the call to its end ("longest-unanswered").
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

latencies=("$@")
[ ${#latencies[@]} -gt 0 ] || latencies=(0 5 20 50)
runs=${BENCH_RUNS:-3}
folder=$(folder_of 300 lower)
script="$data/slow-share-script.txt"
{
  echo 'wait class=Orvex1Wnd timeout=120000'
  echo 'sleep 3000'
  echo 'click class=Edit contains=".dwg" nth=0 at=60,-50'
  echo 'sleep 1500'
  for _ in 1 2 3 4 5; do echo 'key down'; echo 'sleep 1500'; done
  echo 'key escape'
} >"$script"

# One run -> "FIRST STEP KEY PICTURES WAIT FILES" (ms, ms, ms, count, ms, count).
parse() {
  awk '
    function flush() {
      if (key == 40) { steps[ns++] = (last > handled ? last : handled) - start; keys[nk++] = handled - start; pics += n
                       files += opened - openedAtKey }
      key = ""
    }
    function median(a, n,   i, j, t) {
      for (i = 0; i < n; i++) for (j = i + 1; j < n; j++) if (a[j] < a[i]) { t = a[i]; a[i] = a[j]; a[j] = t }
      return n ? a[int(n / 2)] : -1
    }
    $1 == "[timing]" && $3 == "preview" && first == "" { split($4, dv, "/"); if (dv[2] > 0 && dv[1] == dv[2]) first = $2 }
    $1 == "[timing]" && $3 == "opened" { opened = $4 }
    $1 == "[timing]" && $3 == "key" { flush(); openedAtKey = opened; key = $4; start = $2; handled = $2; last = 0; n = 0; want = 1 }
    $1 == "[timing]" && $3 == "key-handled" && want { handled = $2; want = 0 }
    $1 == "[timing]" && $3 == "preview" && key != "" { last = $2; n++ }
    $1 == "[timing]" && $3 == "longest-unanswered" { wait = $4 }
    $1 == "[timing]" && $3 == "call-end" { flush() }
    END { printf "%.0f %.0f %.1f %.1f %.0f %.1f\n", first, median(steps, ns), median(keys, nk), (ns ? pics / ns : 0), wait, (ns ? files / ns : 0) }'
}

median_col() { sort -n | awk '{ v[NR] = $1 } END { print (NR ? v[int((NR + 1) / 2)] : "-") }'; }

printf 'The explorer on 300 drawings behind a slow share (devhost --file-latency), median of %d run(s)\n\n' "$runs"
printf '| read latency | first screen (ms) | row step (ms) | its key (ms) | pictures a step | files read a step | longest wait of the host thread (ms) |\n'
printf '|---:|---:|---:|---:|---:|---:|---:|\n'
for ms in "${latencies[@]}"; do
  results="$data/slow-share-$ms.txt"
  : >"$results"
  for ((r = 0; r < runs; r++)); do
    explorer_run "$folder" --file-latency "$ms" --script "$(winpath "$script")" | parse >>"$results"
  done
  [ -z "${BENCH_VERBOSE:-}" ] || sed "s/^/  $ms ms: /" "$results" >&2
  printf '| %s ms | %s | %s | %s | %s | %s | %s |\n' "$ms" \
    "$(awk '{print $1}' "$results" | median_col)" "$(awk '{print $2}' "$results" | median_col)" \
    "$(awk '{print $3}' "$results" | median_col)" "$(awk '{print $4}' "$results" | median_col)" \
    "$(awk '{print $6}' "$results" | median_col)" "$(awk '{print $5}' "$results" | median_col)"
done
