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

# need_builds: builds what the explorer benchmarks run (devhost, the library and the generator, Windows
# Release in $win_build; the generator natively in $native_build), so that a benchmark run alone works.
# The build runs every time (quick when nothing changed), so a benchmark never measures an old library.
need_builds() {
  [ -n "${BENCH_BUILT:-}" ] && return 0
  echo "building the benchmarks' programs (log: build/bench-build.log) ..." >&2
  mkdir -p "$root/build"
  {
    cmake -S "$root" -B "$win_build" -G Ninja --toolchain "$root/cmake/mingw-w64-x86_64.cmake" \
      -DCMAKE_BUILD_TYPE=Release &&
      cmake --build "$win_build" -j2 --target Orvex1 devhost gen-dwg-samples &&
      cmake -S "$root" -B "$native_build" -G Ninja -DCMAKE_BUILD_TYPE=Release &&
      cmake --build "$native_build" -j2 --target gen-dwg-samples
  } >>"$root/build/bench-build.log" 2>&1 || { echo "build failed: see build/bench-build.log" >&2; exit 1; }
  export BENCH_BUILT=1
}

# folder_of COUNT [CASE]: prints the folder (dwg-COUNT-CASE/drawings) of COUNT synthetic drawings whose
# names are in CASE, "mixed"
# (default: upper and lower case mixed, as the generator makes them) or "lower" (all lower case, what the
# list asks for: Wine then opens a file by its name without searching the folder, as a Windows file
# system always does). Made on first use and kept for later runs. The native generator is used (much
# faster than the Windows one under Wine). A folder is marked done only when the generator succeeded and
# its drawings are counted; otherwise the benchmark stops here instead of measuring an empty or half-made
# folder. A folder marked done that has lost its drawings is made again.
folder_of() {
  local count=$1 case=${2:-mixed} made=0
  # Alone in a folder of its own: the tree asks each folder it shows whether it has sub-folders, which
  # for a sibling of 100,000 drawings means reading it whole, and the figures would depend on what else
  # lies in $data.
  local dir="$data/dwg-$count-$case/drawings"
  case $case in
    mixed) flag=() ;;
    lower) flag=(--lower-case) ;;
    *) echo "folder_of: names are mixed or lower, not $case" >&2; exit 2 ;;
  esac
  if [ -f "$dir.done" ] && [ "$(find "$dir" -maxdepth 1 -iname '*.dwg' 2>/dev/null | wc -l)" -ne "$count" ]; then
    echo "$dir is marked done but does not hold $count drawings: making it again" >&2
    rm -f "$dir.done"
  fi
  if [ ! -f "$dir.done" ]; then
    rm -rf "$(dirname "$dir")" && mkdir -p "$dir"
    echo "making $count drawings ($case-case names) in $dir ..." >&2
    "$native_build/tools/gen-dwg-samples/gen-dwg-samples" "$dir" "$count" --variant "$count" "${flag[@]}" \
      >/dev/null || made=$?
    local found
    found=$(find "$dir" -maxdepth 1 -iname '*.dwg' | wc -l)
    if [ "$made" -ne 0 ] || [ "$found" -ne "$count" ]; then
      echo "the generator failed for $dir (exit $made, $found of $count drawings); nothing measured" >&2
      rm -rf "$(dirname "$dir")"
      exit 1
    fi
    touch "$dir.done"
  fi
  printf '%s' "$dir"
}

# need_drawings FOLDER: stops the benchmark with a message when FOLDER is missing or holds no drawing.
need_drawings() {
  if [ ! -d "$1" ] || [ -z "$(find "$1" -maxdepth 1 -iname '*.dwg' -print -quit)" ]; then
    echo "no drawings in $1: nothing to measure" >&2
    exit 1
  fi
}

# explorer_run FOLDER [DEVHOST OPTIONS...]: one call of the explorer on FOLDER under devhost --timing;
# standard output is devhost's. The settings file is removed first, so that every run starts from the
# same window and picture size. A missing or empty folder fails at once with a message.
# A run that waits for input that will not come (a script that failed half way) is cancelled by devhost's
# timer after BENCH_CALL_LIMIT_MS (default 180 s), so a benchmark always ends; should even the cancel not
# end it, the process is stopped 60 s later.
explorer_run() {
  local folder=$1
  shift
  need_drawings "$folder"
  rm -f "$win_build/bin/Orvex1.ini"
  local limit=() ms=${BENCH_CALL_LIMIT_MS:-180000}
  if [[ " $* " == *" --after-ms "* ]]; then
    ms=$(printf '%s\n' "$@" | awk 'p { print; exit } $0 == "--after-ms" { p = 1 }')
  else
    limit=(--after-ms "$ms" --post cancel)
  fi
  timeout --kill-after=10 $((ms / 1000 + 60)) \
    "$root/tools/wine-run" "$win_build/bin/devhost.exe" --timing "${limit[@]}" "$@" \
    --eval "(Orvex 1 2 \"$(lisp_path "$folder")\\\\\" \"Insert\" \"Close\")" 2>/dev/null || {
    local rc=$?
    [ "$rc" -ne 124 ] && [ "$rc" -ne 137 ] || echo "a run on $folder did not end by itself: stopped" >&2
  }
}

# record KEY... VALUE: appends one result line to $BENCH_RESULTS (when set), for run-benchmarks.sh's summary.
record() { [ -z "${BENCH_RESULTS:-}" ] || echo "$*" >>"$BENCH_RESULTS"; }

# median [DECIMALS]: the median of the numbers on standard input, one a line, with DECIMALS decimals
# (default 1); "-" when there are none. Words that are not numbers ("incomplete") sort first.
median() {
  sort -g | awk -v d="${1:-1}" '{ v[NR] = $1 }
    END { if (!NR) print "-"; else { m = v[int((NR + 1) / 2)]; print (m ~ /^[0-9.]+$/ ? sprintf("%.*f", d, m) : m) } }'
}
