#!/usr/bin/env bash
# Settings files a careless or hostile user could leave, seen through the host: a huge datains.ini beside
# the drawings, a read-only, a locked, a garbage and a long-lined Orvex1.ini, and a library installed in
# too long a folder. Each call must work, say what went wrong on the command line, leave the file as it
# was and give the host back its input.
. "$(dirname "$0")/lib.sh"

shots="${SCREENSHOT_DIR:-$WORK}"
mkdir -p "$shots"
ini="$WORK/lib/Orvex1.ini"
ini_win=$(winpath "$ini")

folder="$WORK/badsettings-drawings"
gen_dwg "$folder" 3 --variant 5
cp "$folder/$(ls "$folder" | head -1)" "$folder/plan.dwg"
pick_result="=> (\"$(lisppath "$folder")\\\\plan.dwg\" (\"\" \"\" \"\"))"

# expect_unchanged NAME FILE SAVED_COPY: the file is byte for byte what was saved before the run.
expect_unchanged() {
  if cmp -s "$2" "$3"; then pass "$1"; else fail "$1"; cmp "$2" "$3" | head -3; fi
}

# --- a datains.ini of 300,000 keys beside the drawings ---
{
  printf '[Default Parameters]\r\nLayer=Walls\r\nColor=3\r\nLisp command=(c:walls)\r\n'
  seq 1 300000 | sed 's/.*/key&=&\r/'
} >"$folder/datains.ini"
cp "$folder/datains.ini" "$WORK/datains.saved"
printf '[CurrentPath]\r\nPath=%s\r\nName=\r\n\r\n' "$(winpath "$folder")" >"$ini"
script_with_host_checks 'wait text="plan.dwg" timeout=20000' \
  "screenshot contains=\"badsettings-drawings\" nth=0 $(winpath "$shots/bad-settings-huge-datains.png")" \
  'double-click text="plan.dwg" at=60,-50'
devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_line "huge datains.ini: the pick gives three empty parameters" "$pick_result"
expect_line "huge datains.ini: the command line says why" \
  "Orvex: $(winpath "$folder")\\datains.ini is larger than 1 MiB; it was not read"
n=$(printf '%s\n' "$OUT" | grep -c 'datains.ini is larger than 1 MiB')
[ "$n" -eq 1 ] && pass "huge datains.ini: said once" || fail "huge datains.ini: said $n times"
expect_unchanged "huge datains.ini is left as it was" "$folder/datains.ini" "$WORK/datains.saved"
expect_host_usable "huge datains.ini"
rm "$folder/datains.ini"

# --- a read-only Orvex1.ini ---
printf '[CurrentPath]\r\nPath=%s\r\nName=\r\n\r\n[View]\r\nSort=2\r\n\r\n' "$(winpath "$folder")" >"$ini"
chmod a-w "$ini"
cp "$ini" "$WORK/ini.saved"
script_with_host_checks 'wait text="plan.dwg" timeout=20000' \
  "screenshot contains=\"badsettings-drawings\" nth=0 $(winpath "$shots/bad-settings-read-only.png")" \
  'double-click text="plan.dwg" at=60,-50'
devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_line "read-only Orvex1.ini: the call works with its settings" "$pick_result"
expect_line "read-only Orvex1.ini: the command line says it was not saved" \
  "Orvex: $ini_win was not saved: it is read-only; the file is left as it was"
expect_unchanged "read-only Orvex1.ini is left as it was" "$ini" "$WORK/ini.saved"
expect_host_usable "read-only Orvex1.ini"
chmod u+w "$ini"

# --- an Orvex1.ini another program holds open without sharing ---
helper="$(dirname "$DEVHOST")/settings_helper.exe"
if [ -f "$helper" ]; then
  printf '[CurrentPath]\r\nPath=%s\r\nName=\r\n\r\n[View]\r\nSort=2\r\n\r\n' "$(winpath "$folder")" >"$ini"
  cp "$ini" "$WORK/ini.saved"
  rm -f "$WORK/held" "$WORK/release"
  "$WINE_RUN" "$helper" hold "$ini_win" "$(winpath "$WORK/held")" "$(winpath "$WORK/release")" 120000 \
    >"$WORK/holder.out" 2>&1 &
  holder=$!
  for _ in $(seq 1 300); do [ -f "$WORK/held" ] && break; sleep 0.1; done
  if [ -f "$WORK/held" ]; then
    script_with_host_checks 'wait text="Cancel" timeout=20000' 'sleep 300' \
      "screenshot contains=\"Explorer\" nth=0 $(winpath "$shots/bad-settings-locked.png")"
    devhost --after-ms 1500 --post cancel --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
    expect_line "locked Orvex1.ini: the call works on defaults" "=> nil"
    expect_line "locked Orvex1.ini: the command line says it was not saved" \
      "Orvex: $ini_win was not saved: it could not be read; the file is left as it was"
    expect_host_usable "locked Orvex1.ini"
  else
    fail "the helper holds Orvex1.ini open"; cat "$WORK/holder.out"
  fi
  touch "$WORK/release"
  wait "$holder"
  expect_unchanged "locked Orvex1.ini is left as it was" "$ini" "$WORK/ini.saved"
else
  echo "note: $helper is not built; the locked-file check is skipped"
fi

# --- garbage, and a line of 3,000 characters, in Orvex1.ini ---
python3 -c '
import random, sys
r = random.Random(11)
sys.stdout.buffer.write(b"[View]\r\nSort=1\r\n" + bytes(r.randrange(256) for _ in range(20000)))
' >"$ini"
cp "$ini" "$WORK/ini.saved"
script_with_host_checks 'wait text="Cancel" timeout=20000' 'sleep 300' \
  "screenshot contains=\"Explorer\" nth=0 $(winpath "$shots/bad-settings-garbage.png")"
devhost --after-ms 1500 --post cancel --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_line "garbage Orvex1.ini: the call works" "=> nil"
if grep -qE "^Orvex: $(printf '%s' "$ini_win" | sed 's/[\\.]/\\&/g') was not saved: line [0-9]+ .*; the file is left as it was$" <<<"$OUT"; then
  pass "garbage Orvex1.ini: the command line says it was not saved"
else
  fail "garbage Orvex1.ini: the command line says it was not saved"; printf '%s\n' "$OUT" | grep -v '^\[script\]'
fi
expect_unchanged "garbage Orvex1.ini survives a close byte for byte" "$ini" "$WORK/ini.saved"
expect_host_usable "garbage Orvex1.ini"

{
  printf '[CurrentPath]\r\nPath=%s\r\nName=' "$(winpath "$folder")"
  head -c 3000 /dev/zero | tr '\0' 'n'
  printf '\r\n\r\n[View]\r\nSort=1\r\n\r\n'
} >"$ini"
cp "$ini" "$WORK/ini.saved"
script_with_host_checks 'wait text="plan.dwg" timeout=20000' 'double-click text="plan.dwg" at=60,-50'
devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_line "3,000-character line: the pick works" "$pick_result"
expect_line "3,000-character line: the command line says it was not saved" \
  "Orvex: $ini_win was not saved: line 3 is longer than 2047 characters; the file is left as it was"
expect_unchanged "a 3,000-character line survives a close byte for byte" "$ini" "$WORK/ini.saved"
expect_host_usable "3,000-character line"

# --- the library in a folder too long for its settings file ---
deep="$WORK/lib"
while [ ${#deep} -lt 280 ]; do deep="$deep/a-folder-with-a-rather-long-name"; done
mkdir -p "$deep"
cp "$ORVEX_ARX" "$deep/Orvex1.arx"
saved_arx=$ARX
ARX="$deep/Orvex1.arx"
script_with_host_checks 'wait text="Cancel" timeout=20000' 'sleep 300' \
  "screenshot contains=\"Explorer\" nth=0 $(winpath "$shots/bad-settings-long-folder.png")"
devhost --after-ms 1500 --post cancel --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "" "")'
ARX=$saved_arx
expect_line "too long a folder: the call works on defaults" "=> nil"
expect_line "too long a folder: the alert says why" \
  "[alert] \\nOrvex: the library's folder is too long for its settings file ($((${#deep} + 13)) characters, at most 259); the explorer uses its default settings and does not save them: $(lisppath "$deep")\\\\Orvex1.ini\\n"
expect_line "too long a folder: the command line says why" \
  "Orvex: the library's folder is too long for its settings file ($((${#deep} + 13)) characters, at most 259); the explorer uses its default settings and does not save them: $(winpath "$deep")\\Orvex1.ini"
expect_true "too long a folder: no settings file is written" test ! -e "$deep/Orvex1.ini"
expect_host_usable "too long a folder"

finish
