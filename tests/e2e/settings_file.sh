#!/usr/bin/env bash
# The explorer's settings file beside the library: created on the first run, unknown keys kept.
. "$(dirname "$0")/lib.sh"

rm -f "$WORK/lib/Orvex1.ini"
devhost --after-ms 300 --post cancel --eval '(Orvex 1 2 "" "" "")'
# Sizes depend on the screen, so they are compared as "a number"; every other byte must be as shown.
expected=$(printf '[CurrentPath]\r\nPath=\r\nName=\r\nShellPath=\r\n\r\n[Size]\r\nSplitterSize=N\r\nWindowWidth=N\r\nWindowHeight=N\r\n\r\n[View]\r\nPictureWidth=N\r\nPictureHeight=N\r\nSort=0\r\n\r\n' | od -c)
if [ -f "$WORK/lib/Orvex1.ini" ]; then
  got=$(sed -E 's/^(SplitterSize|WindowWidth|WindowHeight|PictureWidth|PictureHeight)=[0-9]+/\1=N/' "$WORK/lib/Orvex1.ini" | od -c)
  if [ "$got" == "$expected" ]; then pass "a fresh Orvex1.ini is written beside the library, laid out as expected"
  else fail "fresh Orvex1.ini layout"; cat -A "$WORK/lib/Orvex1.ini"; fi
  expect_true "a fresh run keeps the 100-pixel left pane" grep -q $'^SplitterSize=100\r$' "$WORK/lib/Orvex1.ini"
else
  fail "Orvex1.ini is written beside the library when the run ends"
fi

printf '[Mine]\r\nkeep=me\r\n\r\n[View]\r\nSort=2\r\nextra=1\r\n\r\n' >"$WORK/lib/Orvex1.ini"
devhost --after-ms 300 --post cancel --eval '(Orvex 1 2 "" "" "")'
content=$(tr -d '\r' <"$WORK/lib/Orvex1.ini")
expect_true "unknown section kept first" grep -qx '\[Mine\]' <(printf '%s\n' "$content" | head -1)
expect_true "unknown key kept" grep -qx 'extra=1' <(printf '%s\n' "$content")
expect_true "sort setting kept" grep -qx 'Sort=2' <(printf '%s\n' "$content")
expect_true "lines end in CR LF" grep -q $'keep=me\r$' "$WORK/lib/Orvex1.ini"

finish
