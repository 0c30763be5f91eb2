#!/usr/bin/env bash
# Builds everything and runs every test: native unit tests (under ASan and UBSan), a short run of each
# fuzz target, and the Windows tests and end-to-end tests under Wine. Installs what is missing first.
set -uo pipefail
cd "$(dirname "$0")"
tools/ensure-packages || exit 1
FUZZ_SECONDS=${FUZZ_SECONDS:-15}
summary=()
status=0

step() { echo; echo "=== $* ==="; }
record() { # name, exit code, ctest log
  local name=$1 rc=$2 log=${3:-}
  local line=""
  [ -n "$log" ] && line=$(grep -E 'tests passed|tests failed' "$log" | tail -1)
  summary+=("$name: ${line:-exit $rc}")
  [ "$rc" -eq 0 ] || status=1
}

step "native unit tests (ASan + UBSan)"
if cmake --preset native-asan >/dev/null && cmake --build --preset native-asan; then
  ctest --preset native-asan 2>&1 | tee build/native-asan.log; record native "${PIPESTATUS[0]}" build/native-asan.log
else
  record native 1
fi

step "fuzz targets (${FUZZ_SECONDS}s each)"
fuzz_rc=0; fuzz_n=0; fuzz_bad=0
if cmake --preset fuzz >/dev/null && cmake --build --preset fuzz --target orvex_fuzz_all; then
  for t in $(cat build/fuzz/fuzz-targets.txt 2>/dev/null); do
    corpus=tests/fuzz/corpus/$(basename "$t")
    dict=tests/fuzz/dict/$(basename "$t").dict
    work=build/fuzz/corpus/$(basename "$t"); mkdir -p "$work"
    fuzz_n=$((fuzz_n + 1))
    if "$t" -max_total_time="$FUZZ_SECONDS" -rss_limit_mb=2048 $( [ -f "$dict" ] && echo "-dict=$dict" ) \
        "$work" $( [ -d "$corpus" ] && echo "$corpus" ) \
        >"build/fuzz/$(basename "$t").log" 2>&1; then
      echo "fuzz $(basename "$t"): ok"
    else
      echo "fuzz $(basename "$t"): FAILED"; tail -30 "build/fuzz/$(basename "$t").log"; fuzz_bad=$((fuzz_bad + 1)); fuzz_rc=1
    fi
  done
else
  fuzz_rc=1
fi
summary+=("fuzz: $((fuzz_n - fuzz_bad)) passed, $fuzz_bad failed")
[ "$fuzz_rc" -eq 0 ] || status=1

step "Windows tests under Wine"
if cmake --preset windows >/dev/null && cmake --build --preset windows; then
  ctest --preset windows 2>&1 | tee build/windows.log; record windows "${PIPESTATUS[0]}" build/windows.log
else
  record windows 1
fi
tools/wine-stop

step "summary"
printf '%s\n' "${summary[@]}"
exit $status
