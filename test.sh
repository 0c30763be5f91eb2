#!/usr/bin/env bash
# Builds everything and runs every test: native unit tests (under ASan and UBSan), a short run of each
# fuzz target, and the Windows tests and end-to-end tests under Wine. Installs what is missing first.
set -uo pipefail
cd "$(dirname "$0")" || exit 1
# The wine server and the Xvfb the Windows tests start end with this script, however it ends: all steps
# done, a step failed, Ctrl+C or a kill. An interrupt ends the script (status 130 or 143) instead of going
# on with the next step.
trap 'tools/wine-stop' EXIT
trap 'echo; echo "test.sh: interrupted" >&2; exit 130' INT
trap 'exit 143' TERM
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
  targets=()
  [ -f build/fuzz/fuzz-targets.txt ] && mapfile -t targets <build/fuzz/fuzz-targets.txt
  for t in "${targets[@]}"; do
    [ -n "$t" ] || continue
    name=$(basename "$t")
    corpus=tests/fuzz/corpus/$name
    dict=tests/fuzz/dict/$name.dict
    work=build/fuzz/corpus/$name; mkdir -p "$work"
    options=(-max_total_time="$FUZZ_SECONDS" -rss_limit_mb=2048)
    [ -f "$dict" ] && options+=("-dict=$dict")
    folders=("$work")
    [ -d "$corpus" ] && folders+=("$corpus")
    fuzz_n=$((fuzz_n + 1))
    if "$t" "${options[@]}" "${folders[@]}" >"build/fuzz/$name.log" 2>&1; then
      echo "fuzz $name: ok"
    else
      echo "fuzz $name: FAILED"; tail -30 "build/fuzz/$name.log"; fuzz_bad=$((fuzz_bad + 1)); fuzz_rc=1
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

step "summary"
printf '%s\n' "${summary[@]}"
exit $status
