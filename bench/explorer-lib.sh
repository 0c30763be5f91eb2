# Shared by the explorer benchmarks (bench_first_paint.sh, bench_scroll.sh): where things are, the folders
# of synthetic drawings, and one devhost run with --timing. Sourced, not run.

root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
win_build=${BENCH_WIN_BUILD:-$root/build/bench-win}
native_build=${BENCH_NATIVE_BUILD:-$root/build/bench-native}
data=${BENCH_DATA:-$root/build/bench-data}
runs=${BENCH_RUNS:-5}
export WINEPREFIX=${WINEPREFIX:-$root/build/bench-wineprefix}

# The Windows path Wine gives a Linux path (drive Z: is the root).
winpath() { printf 'Z:%s' "${1//\//\\}"; }

# A LISP string holding a Windows path: every backslash doubled.
lisp_path() { local p; p=$(winpath "$1"); printf '%s' "${p//\\/\\\\}"; }

# folder_of COUNT: prints the folder of COUNT synthetic drawings, made on first use and kept for later
# runs. The native generator is used when it is built (much faster than the Windows one under Wine).
folder_of() {
  local count=$1 dir="$data/dwg-$1"
  if [ ! -f "$dir.done" ]; then
    rm -rf "$dir" && mkdir -p "$dir"
    echo "making $count drawings in $dir ..." >&2
    if [ -x "$native_build/tools/gen-dwg-samples/gen-dwg-samples" ]; then
      "$native_build/tools/gen-dwg-samples/gen-dwg-samples" "$dir" "$count" --variant "$count" >/dev/null
    else
      "$root/tools/wine-run" "$win_build/bin/gen-dwg-samples.exe" "$(winpath "$dir")" "$count" \
        --variant "$count" >/dev/null
    fi
    touch "$dir.done"
  fi
  printf '%s' "$dir"
}

# explorer_run FOLDER [DEVHOST OPTIONS...]: one call of the explorer on FOLDER under devhost --timing;
# standard output is devhost's. The settings file is removed first, so that every run starts from the
# same window and picture size.
explorer_run() {
  local folder=$1
  shift
  rm -f "$win_build/bin/Orvex1.ini"
  "$root/tools/wine-run" "$win_build/bin/devhost.exe" --timing "$@" \
    --eval "(Orvex 1 2 \"$(lisp_path "$folder")\\\\\" \"Insert\" \"Close\")" 2>/dev/null
}

# median [DECIMALS]: the median of the numbers on standard input, one a line, with DECIMALS decimals
# (default 1); "-" when there are none. Words that are not numbers ("incomplete") sort first.
median() {
  sort -g | awk -v d="${1:-1}" '{ v[NR] = $1 }
    END { if (!NR) print "-"; else { m = v[int((NR + 1) / 2)]; print (m ~ /^[0-9.]+$/ ? sprintf("%.*f", d, m) : m) } }'
}
