# Helpers for the end-to-end tests: run devhost.exe with Orvex1.arx under Wine and check its command line.
# Each test gets its own folder with its own copy of the library, so the settings file beside it
# (Orvex1.ini) belongs to that test alone.
set -uo pipefail

: "${DEVHOST:?path of devhost.exe}"
: "${ORVEX_ARX:?path of Orvex1.arx}"
ROOT=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
WINE_RUN="$ROOT/tools/wine-run"

failures=0
checks=0

WORK=$(mktemp -d "${TMPDIR:-/tmp}/orvex-e2e.XXXXXX")
# E2E_SHOTS=DIR keeps the screenshots a test took (its *.png) in DIR, to look at them.
trap 'if [ -n "${E2E_SHOTS:-}" ]; then mkdir -p "$E2E_SHOTS" && cp "$WORK"/*.png "$E2E_SHOTS"/ 2>/dev/null; fi; rm -rf "$WORK"' EXIT
mkdir -p "$WORK/lib"
cp "$ORVEX_ARX" "$WORK/lib/Orvex1.arx"
ARX="$WORK/lib/Orvex1.arx"

# The Windows form of a path of this machine (Wine maps / to drive Z:).
winpath() { printf 'Z:%s' "$1" | tr '/' '\\'; }
# The same, escaped as LISP prints it.
lisppath() { winpath "$1" | sed 's/\\/\\\\/g'; }

# The path of this machine for a Windows path of drive Z:.
unixpath() { local p=${1#Z:}; printf '%s' "$p" | tr '\\' '/'; }

# devhost ARGS... -> its standard output without carriage returns, in $OUT; exit code in $RC.
# Every call is followed by the host checks: a script that does not end in them (or no script at all) gets
# them appended, their lines are checked with expect_host_usable and taken out of $OUT, so that tests
# compare only what the call printed.
devhost() {
  local args=() script="" added=no
  while [ $# -gt 0 ]; do
    if [ "$1" == --script ] && [ $# -gt 1 ]; then script=$(unixpath "$2"); shift 2; else args+=("$1"); shift; fi
  done
  if [ -z "$script" ] || ! grep -q '^returned' "$script"; then
    { [ -n "$script" ] && cat "$script"; echo 'echo host-checks'; printf '%s\n' "${HOST_CHECKS[@]}"; } \
      >"$WORK/with-host-checks.txt"
    script="$WORK/with-host-checks.txt"; added=yes
  fi
  OUT=$("$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --script "$(winpath "$script")" "${args[@]}" \
        2>"$WORK/stderr" | tr -d '\r')
  RC=${PIPESTATUS[0]}
  if [ "$added" == yes ]; then
    calls=$((${calls:-0} + 1))
    expect_host_usable "call $calls (${args[*]: -1})"
    OUT=$(printf '%s\n' "$OUT" | awk '/^\[script\] host-checks$/ {h = 1; next} !(h && /^\[script\] /)')
    [ "$RC" -eq 4 ] && ! grep -q '^\[script\] error' <<<"$OUT" && RC=0 # a failed host check only
  fi
}

pass() { checks=$((checks + 1)); echo "ok: $1"; }
fail() { checks=$((checks + 1)); failures=$((failures + 1)); echo "FAILED: $1"; }

# expect_output NAME EXPECTED: the whole output must be EXPECTED.
expect_output() {
  if [ "$OUT" == "$2" ]; then pass "$1"; else
    fail "$1"; echo "--- expected"; printf '%s\n' "$2"; echo "--- got (exit $RC)"; printf '%s\n' "$OUT"
    echo "--- stderr"; tail -20 "$WORK/stderr"; fi
}

# expect_line NAME LINE: one line of the output must be LINE exactly.
expect_line() {
  if grep -qxF -- "$2" <<<"$OUT"; then pass "$1"; else
    fail "$1"; echo "--- expected a line: $2"; echo "--- got (exit $RC)"; printf '%s\n' "$OUT"
    echo "--- stderr"; tail -20 "$WORK/stderr"; fi
}

expect_true() { # NAME COMMAND...
  local name=$1; shift
  if "$@"; then pass "$name"; else fail "$name"; fi
}

finish() {
  echo "$((checks - failures)) passed, $failures failed"
  [ "$failures" -eq 0 ]
}

# gen_dwg DIR COUNT [ARGS...]: synthetic drawing files made by the project's generator (a Windows program here).
gen_dwg() {
  local dir=$1 count=$2; shift 2
  mkdir -p "$dir"
  "$WINE_RUN" "$GEN_DWG" "$(winpath "$dir")" "$count" "$@" >/dev/null 2>"$WORK/gen.err"
}

# The host must take input again after every call: its main frame enabled, the keyboard focus back in
# its drawing view, and keys typed then reaching that view. HOST_CHECKS are script lines that wait for
# the call to return and then look; append them to every script (the script goes on after the call).
HOST_CHECKS=('returned timeout=30000' 'enabled class=DevhostFrame' 'focus' 'type "ok"' 'typed')
# script_with_host_checks LINE...: writes $WORK/script.txt with the lines, then the host checks.
script_with_host_checks() { printf '%s\n' "$@" "${HOST_CHECKS[@]}" >"$WORK/script.txt"; }
# expect_host_usable NAME: the output of a run with HOST_CHECKS shows a host that takes input.
expect_host_usable() {
  local name=$1
  # grep reads a here-string: a pipe from printf could die of SIGPIPE once grep -q has its match, and
  # pipefail would call the check failed.
  if grep -qx '\[script\] enabled yes' <<<"$OUT" &&
     grep -qE '^\[script\] focus DevhostDrawingView id=' <<<"$OUT" &&
     grep -qx '\[script\] typed ok' <<<"$OUT"; then
    pass "$name: the host takes input again"
  else
    fail "$name: the host takes input again"
    echo "--- got (exit $RC)"; printf '%s\n' "$OUT" | grep -E '^\[script\]|^=>' | tail -8
  fi
}
