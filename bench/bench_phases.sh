#!/usr/bin/env bash
# Where the milliseconds of the first complete paint go: the phases of one call of the explorer, from the
# marks devhost --timing prints, median of BENCH_RUNS runs (default 5) for each folder size, with real and
# with flat previews. Prints a table.
#   bench/bench_phases.sh [COUNT...]        (default: 10000 100000; BENCH_CASES names, default "lower")
#
# The marks (devhost/README.md, "Timing lines"): the settings file looked for, each window about to be
# created (frame, tree, toolbars, status bar, thumbnails), the folder search begun and closed, each preview
# drawn. A phase runs from one mark to the next; what has no mark of its own (filling the tree, the sort,
# the layout) is named after the marks around it.
set -euo pipefail
source "$(dirname "${BASH_SOURCE[0]}")/explorer-lib.sh"
need_builds

counts=("$@")
[ ${#counts[@]} -gt 0 ] || counts=(10000 100000)
read -r -a cases <<<"${BENCH_CASES:-lower}"

phases=(
  "call -> settings file looked for"
  "settings read, run dialog"
  "frame, splitter, panes, tree control"
  "tree's Desktop item (walk after the paint)"
  "toolbars, status bar"
  "-> folder scan begins"
  "folder scan"
  "sort, grid layout (scan -> 1st thumbnail)"
  "thumbnail windows (pool)"
  "last thumbnail -> 1st preview"
  "previews until complete paint"
  "total: call -> complete paint"
)

# One run's output (FOLDER NAME as $1) -> one line of the phases' durations in ms, and the thumbnails made.
parse() {
  FOLDER=$1 awk 'BEGIN { folder = ENVIRON["FOLDER"] } # not -v, which would read its backslashes as escapes

    $1 != "[timing]" { next }
    { t = $2 + 0; what = $3; rest = $0; sub(/^[^ ]+ [^ ]+ /, "", rest) }
    what == "settings-look" && A == "" { A = t }
    what == "create" && B == "" && rest ~ / in #32770$/ && rest ~ /^create Orvex1:/ { B = t }
    what == "create" && C == "" && rest ~ /^create SysTreeView32 / { C = t }
    what == "create" && D == "" && rest ~ /^create ToolbarWindow32 / { D = t }
    what == "create" && E == "" && rest ~ /^create msctls_statusbar32 / { E = t }
    what == "scan-begin" && F == "" && index(rest, folder "\\") { F = t; inscan = 1 }
    what == "scan-end" && inscan && G == "" { G = t; inscan = 0 }
    what == "create" && rest ~ /^create Orvex1Wnd / && J == "" { if (H == "") H = t; I = t; made++ }
    what == "preview" && J == "" { J = t }
    what == "preview" && K == "" { split($4, dv, "/"); if (dv[2] > 0 && dv[1] == dv[2]) K = t }
    END {
      n = split("A B C D E F G H I J K", names, " ")
      v["A"] = A; v["B"] = B; v["C"] = C; v["D"] = D; v["E"] = E; v["F"] = F; v["G"] = G; v["H"] = H
      v["I"] = I; v["J"] = J; v["K"] = K
      prev = 0; line = ""
      for (i = 1; i <= n; i++) {
        x = v[names[i]]
        if (x == "" || prev == "") { line = line " -"; prev = (x == "" ? "" : x); continue }
        line = line " " sprintf("%.1f", x - prev); prev = x
      }
      printf "%s %s %d\n", line, (K == "" ? "-" : sprintf("%.1f", K)), made
    }'
}

for count in "${counts[@]}"; do
  for case in "${cases[@]}"; do
    folder=$(folder_of "$count" "$case")
    need_drawings "$folder"
    name=$(winpath "$folder")
    declare -A cell=()
    for preview in real flat; do
      results=$(mktemp)
      for ((r = 0; r < runs; r++)); do
        explorer_run "$folder" --preview "$preview" --after-ms 8000 --post cancel | parse "$name" >>"$results"
      done
      for ((p = 0; p < ${#phases[@]} + 1; p++)); do
        cell[$preview,$p]=$(awk -v c=$((p + 1)) '{ print $c }' "$results" | median)
      done
      [ -z "${BENCH_VERBOSE:-}" ] || sed "s/^/  $preview /" "$results" >&2
      rm -f "$results"
    done
    printf '\nPhases of the first complete paint, %s drawings (%s-case names), ms, median of %d runs\n\n' \
      "$count" "$case" "$runs"
    printf '%-44s %10s %10s\n' phase real flat
    printf '%-44s %10s %10s\n' -------------------------------------------- ---------- ----------
    for ((p = 0; p < ${#phases[@]}; p++)); do
      printf '%-44s %10s %10s\n' "${phases[$p]}" "${cell[real,$p]}" "${cell[flat,$p]}"
    done
    printf '%-44s %10s %10s\n' "thumbnail windows made" "${cell[real,${#phases[@]}]}" "${cell[flat,${#phases[@]}]}"
    unset cell
  done
done
