#!/usr/bin/env bash
# The explorer on one folder of very many files under Wine: how long the scan, the first complete paint
# and a pick take, and how much memory the host process needed at its peak. Prints a table.
#   bench/bench_big_folder.sh [COUNT...]        (default: 100000 1000000)
# The files are small (16 bytes, no preview: each cell shows the no-preview mark) so that a folder of a
# million is made in a minute or two and takes little disk; the scan, the list, the sort and the grid
# do the same work as for real drawings. Each folder lies alone in a folder of its own under
# build/bench-data/big-COUNT and is kept for later runs. BENCH_RUNS runs of each (default 1).
#
# Times are devhost --timing marks (ms since the LISP call began): "scan" from scan-begin to scan-end,
# "complete" the first moment every visible thumbnail had its picture (or its no-preview mark) drawn.
# "pick" is a double click on the first thumbnail up to the call's value, measured here by the wall clock
# (it holds the check that the picked name names one file, a listing of the folder by its wide names).
# "peak MB" is the host process's peak resident memory (VmHWM), "growth MB" that peak less the peak of
# the same call on an empty folder: what the folder's size costs.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

counts=("$@")
[ ${#counts[@]} -gt 0 ] || counts=(100000 1000000)
big_runs=${BENCH_RUNS:-1}

# big_folder COUNT: prints the folder of COUNT small files named f-NNNNNNN.dwg (made on first use).
big_folder() {
  local count=$1 dir="$data/big-$1/files"
  if [ ! -f "$dir.done" ] || [ "$(find "$dir" -maxdepth 1 -name '*.dwg' | wc -l)" -ne "$count" ]; then
    rm -rf "$(dirname "$dir")" && mkdir -p "$dir"
    echo "making $count files in $dir ..." >&2
    python3 - "$dir" "$count" <<'PY'
import os, sys
folder, count = sys.argv[1], int(sys.argv[2])
for i in range(count):
    with open(os.path.join(folder, 'f-%07d.dwg' % i), 'wb') as f:
        f.write(b'AC1018\0\0\0\0\0\0\0\0\0\0')
PY
    touch "$dir.done"
  fi
  printf '%s' "$dir"
}

# The devhost process of this prefix: its peak resident memory in kB, polled until the run ends.
peak_of_run() {
  local peak=0 pid hwm
  while [ ! -f "$1" ]; do
    for pid in $(pgrep -x devhost.exe || true); do
      { tr '\0' '\n' <"/proc/$pid/environ"; } 2>/dev/null | grep -qxF "WINEPREFIX=$WINEPREFIX" || continue
      hwm=$(awk '/^VmHWM:/ { print $2 }' "/proc/$pid/status" 2>/dev/null || echo 0)
      [ "${hwm:-0}" -gt "$peak" ] && peak=$hwm
    done
    sleep 0.2
  done
  echo "$peak"
}

# one_run FOLDER: "scan complete pick peak-kB entries" for one call that picks the first thumbnail.
one_run() {
  local folder=$1 tmp
  tmp=$(mktemp -d)
  printf '%s\n' 'wait contains=".dwg" timeout=900000' 'sleep 1500' 'echo picking' \
    'double-click class=Edit contains=".dwg" nth=0 at=60,-50' >"$tmp/script.txt"
  [ -n "$(find "$folder" -maxdepth 1 -name '*.dwg' -print -quit)" ] || printf '%s\n' 'sleep 3000' 'echo picking' \
    'click text="Close"' >"$tmp/script.txt"
  rm -f "$win_build/bin/Orvex1.ini"
  peak_of_run "$tmp/ended" >"$tmp/peak" &
  local poller=$!
  timeout --kill-after=10 1200 "$root/tools/wine-run" "$win_build/bin/devhost.exe" --timing \
    --after-ms 1100000 --post cancel --script "$(winpath "$tmp/script.txt")" \
    --eval "(Orvex 1 2 \"$(lisp_path "$folder")\\\\\" \"Insert\" \"Close\")" 2>/dev/null |
    while IFS= read -r line; do printf '%s %s\n' "$(date +%s.%N)" "${line%$'\r'}"; done >"$tmp/out" || true
  touch "$tmp/ended"
  wait "$poller"
  [ -z "${BENCH_VERBOSE:-}" ] || grep -v ' preview ' "$tmp/out" >&2
  awk -v peak="$(cat "$tmp/peak")" '
    $2 == "[timing]" && $4 == "scan-begin" && sb == "" { sb = $3 }
    $2 == "[timing]" && $4 == "scan-end" && se == "" { se = $3; entries = $5 }
    $2 == "[timing]" && $4 == "preview" && complete == "" { split($5, dv, "/"); if (dv[2] > 0 && dv[1] == dv[2]) complete = $3 }
    $2 == "[script]" && $3 == "picking" { picking = $1 }
    $2 == "=>" { done = $1 }
    END {
      printf "%s %s %s %d %s\n", (se != "" ? sprintf("%.1f", se - sb) : "-"), (complete != "" ? complete : "-"),
        (picking != "" && done != "" ? sprintf("%.1f", (done - picking) * 1000) : "-"), peak, (entries != "" ? entries - 2 : "-")
    }' "$tmp/out"
  rm -rf "$tmp"
}

empty="$data/big-0/files"
mkdir -p "$empty"
read -r _ _ _ base_peak _ < <(one_run "$empty")

row() { printf '%10s %10s %12s %12s %10s %10s %10s\n' "$@"; }
printf 'The explorer on one folder of many small files under Wine (devhost --timing), %d run(s) each\n' "$big_runs"
printf 'scan: the folder search; complete: call -> every visible cell drawn; pick: double click -> value\n'
printf 'peak: the host process'"'"'s peak resident memory; growth: less the peak on an empty folder (%d MB)\n\n' \
  $((base_peak / 1024))
row files listed "scan ms" "complete ms" "pick ms" "peak MB" "growth MB"
row ---------- ---------- ------------ ------------ ---------- ---------- ----------
for count in "${counts[@]}"; do
  folder=$(big_folder "$count")
  for ((r = 0; r < big_runs; r++)); do
    read -r scan complete pick peak entries < <(one_run "$folder")
    row "$count" "$entries" "$scan" "$complete" "$pick" $((peak / 1024)) $(((peak - base_peak) / 1024))
  done
done
