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
need_builds() {
  [ -x "$win_build/bin/devhost.exe" ] && [ -f "$win_build/bin/Orvex1.arx" ] &&
    [ -x "$native_build/tools/gen-dwg-samples/gen-dwg-samples" ] && return 0
  echo "building the benchmarks' programs (log: build/bench-build.log) ..." >&2
  mkdir -p "$root/build"
  {
    cmake -S "$root" -B "$win_build" -G Ninja --toolchain "$root/cmake/mingw-w64-x86_64.cmake" \
      -DCMAKE_BUILD_TYPE=Release &&
      cmake --build "$win_build" --target Orvex1 devhost gen-dwg-samples &&
      cmake -S "$root" -B "$native_build" -G Ninja -DCMAKE_BUILD_TYPE=Release &&
      cmake --build "$native_build" --target gen-dwg-samples
  } >>"$root/build/bench-build.log" 2>&1 || { echo "build failed: see build/bench-build.log" >&2; exit 1; }
}

# folder_of COUNT: prints the folder of COUNT synthetic drawings, made on first use and kept for later
# runs. The native generator is used when it is built (much faster than the Windows one under Wine). A
# folder is marked done only when the generator succeeded and the drawings are all there; otherwise the
# benchmark stops here instead of measuring an empty or half-made folder.
folder_of() {
  local count=$1 dir="$data/dwg-$1" made=0
  if [ ! -f "$dir.done" ]; then
    rm -rf "$dir" && mkdir -p "$dir"
    echo "making $count drawings in $dir ..." >&2
    if [ -x "$native_build/tools/gen-dwg-samples/gen-dwg-samples" ]; then
      "$native_build/tools/gen-dwg-samples/gen-dwg-samples" "$dir" "$count" --variant "$count" >/dev/null || made=$?
    else
      "$root/tools/wine-run" "$win_build/bin/gen-dwg-samples.exe" "$(winpath "$dir")" "$count" \
        --variant "$count" >/dev/null || made=$?
    fi
    local found
    found=$(find "$dir" -maxdepth 1 -iname '*.dwg' | wc -l)
    if [ "$made" -ne 0 ] || [ "$found" -ne "$count" ]; then
      echo "the generator failed for $dir (exit $made, $found of $count drawings); nothing measured" >&2
      rm -rf "$dir"
      exit 1
    fi
    touch "$dir.done"
  fi
  printf '%s' "$dir"
}

# explorer_run FOLDER [DEVHOST OPTIONS...]: one call of the explorer on FOLDER under devhost --timing;
# standard output is devhost's. The settings file is removed first, so that every run starts from the
# same window and picture size.
# A run that waits for input that will not come (a script that failed half way) is cancelled by devhost's
# timer after BENCH_CALL_LIMIT_MS (default 180 s), so a benchmark always ends.
explorer_run() {
  local folder=$1
  shift
  rm -f "$win_build/bin/Orvex1.ini"
  local limit=()
  [[ " $* " == *" --after-ms "* ]] || limit=(--after-ms "${BENCH_CALL_LIMIT_MS:-180000}" --post cancel)
  "$root/tools/wine-run" "$win_build/bin/devhost.exe" --timing "${limit[@]}" "$@" \
    --eval "(Orvex 1 2 \"$(lisp_path "$folder")\\\\\" \"Insert\" \"Close\")" 2>/dev/null
}

# median [DECIMALS]: the median of the numbers on standard input, one a line, with DECIMALS decimals
# (default 1); "-" when there are none. Words that are not numbers ("incomplete") sort first.
median() {
  sort -g | awk -v d="${1:-1}" '{ v[NR] = $1 }
    END { if (!NR) print "-"; else { m = v[int((NR + 1) / 2)]; print (m ~ /^[0-9.]+$/ ? sprintf("%.*f", d, m) : m) } }'
}
