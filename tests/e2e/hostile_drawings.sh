#!/usr/bin/env bash
# Drawing files a careless or hostile folder holds, seen through the host: empty, cut short, sections and
# pictures whose numbers lie, a pipe and a folder named like drawings, and files deleted, replaced or
# made unreadable while the grid shows them. The grid shows what it can, never waits, never crashes, and
# the host takes input again after every call.
. "$(dirname "$0")/lib.sh"

# checked_devhost ARGS...: one call with the host checks at the end of its script, then those checks.
checked_devhost() { devhost "$@"; calls=$((${calls:-0} + 1)); expect_host_usable "call $calls (${*: -1})"; }

folder="$WORK/hostiledrawings"
gen_dwg "$folder" 3 --variant 5
good=$(ls "$folder" | head -1)
# The damaged files, made from a good one where the damage is in its numbers.
python3 - "$folder" "$folder/$good" <<'PY'
import struct, sys, zlib
folder, good = sys.argv[1], open(sys.argv[2], 'rb').read()
def put(name, data): open(f"{folder}/{name}", 'wb').write(data)
def patched(offset, value):
    d = bytearray(good); struct.pack_into('<I', d, offset, value); return bytes(d)
address = struct.unpack_from('<I', good, 0x0D)[0]
# The entries follow the sentinel, the section size and the count; the generator's second is the bitmap.
bitmap_entry = address + 16 + 4 + 1 + 9
put('zero.dwg', b'')
put('twelve.dwg', good[:12])
put('address-past-end.dwg', patched(0x0D, len(good) + 4096))
put('entry-outside.dwg', patched(bitmap_entry + 1, 0xFFFFFFF0))
put('entry-4gib.dwg', patched(bitmap_entry + 5, 0xFFFFFFFF))
# A container holding one picture of the given kind.
def container(code, picture):
    head = bytearray(0x40); head[:6] = b'AC1018'; struct.pack_into('<I', head, 0x0D, 0x40)
    sentinel = bytes([0x1F, 0x25, 0x6D, 0x07, 0xD4, 0x36, 0x28, 0x28, 0x9D, 0x57, 0xCA, 0x3F, 0x9D, 0x44, 0x10, 0x2B])
    data = 0x40 + 21 + 9
    section = struct.pack('<IB', 1 + 9 + len(picture), 1) + struct.pack('<BII', code, data, len(picture))
    return bytes(head) + sentinel + section + picture + bytes(16)
def chunk(kind, body): return struct.pack('>I', len(body)) + kind + body + struct.pack('>I', zlib.crc32(kind + body))
png = b'\x89PNG\r\n\x1a\n' + chunk(b'IHDR', struct.pack('>IIBBBBB', 100000, 100000, 8, 6, 0, 0, 0)) + \
      chunk(b'IDAT', zlib.compress(bytes(100000))) + chunk(b'IEND', b'')
put('png-bomb.dwg', container(6, png))
words = [1, 9, 0x0300, 0xFFFF, 0xFFFF, 0, 3, 0, 0, 0xFFFF, 0x7FFF, 0x041B, 190, 290, 10, 10]
put('metafile-lies.dwg', container(3, struct.pack(f'<{len(words)}H', *words)))
PY
mkfifo "$folder/pipe.dwg"
mkdir "$folder/folder.dwg" "$folder/.dotted.dwg" # the scan lists a folder whose name begins with a dot
names=$(ls -A "$folder" | grep -vx -e pipe.dwg -e folder.dwg | tr 'A-Z' 'a-z' | sort)
count=$(printf '%s\n' "$names" | wc -l)
start="$(lisppath "$folder")\\\\"
call="(Orvex 1 2 \"$start\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="hostiledrawings" nth=0'
ready='wait contains=".dwg" timeout=20000'
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1.png")"; }
labels() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | head -1; }

# 1. Every damaged file has its cell (no picture), a pipe and a folder named like drawings have none;
#    scrolling and new cell sizes repaint them all; an empty file is a file and can be picked.
script_with_host_checks "$ready" 'sleep 1500' 'count class=Edit contains=".dwg"' \
  'exists text="pipe.dwg" visible=any' 'exists text="folder.dwg" visible=any' "$(shot drawings-damaged)" \
  'click text="zero.dwg" at=60,-50' 'key end' 'key home' 'key alt+v d' 'sleep 300' 'key alt+v i' 'sleep 300' \
  'key alt+s n' 'sleep 300' "$(shot drawings-damaged-repainted)" 'double-click text=".dotted.dwg" at=60,-50' \
  'wait class=#32770 text="Orvex1" timeout=5000' 'text class=#32770 text="Orvex1" > class=Static contains="folder"' \
  'key enter' 'gone class=#32770 text="Orvex1" timeout=5000' 'double-click text="zero.dwg" at=60,-50'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
[ "$(labels)" == "$count" ] && pass "each of the $count files named .dwg has its cell" ||
  fail "cells: $(labels), files: $count"$'\n'"$OUT"
[ "$(printf '%s\n' "$OUT" | grep -c '^\[script\] exists no$')" -eq 2 ] &&
  pass "a pipe and a folder named like drawings are not shown" || fail "a pipe or a folder is shown"$'\n'"$OUT"
expect_true "a folder named like a drawing is never picked: the user is told" \
  grep -q '^\[script\] text .*\.dotted\.dwg.*is a folder, not a drawing' <(printf '%s\n' "$OUT")
expect_line "an empty file is a file: it is picked" "=> (\"${prefix}zero.dwg\" (\"\" \"\" \"\"))"

# 2. The same folder drawn by the library itself (a host without the preview operation). No settings file:
#    the drawing picked last would be chosen again and scrolled to.
rm -f "$WORK/lib/Orvex1.ini"
script_with_host_checks "$ready" 'sleep 1500' 'count class=Edit contains=".dwg"' "$(shot drawings-damaged-library)" \
  'click text="png-bomb.dwg" at=60,-50' 'key end' 'key alt+v d' 'sleep 300' 'key alt+v i' 'sleep 300' 'key escape'
DEVHOST="$DEVHOST_NOPREVIEW" checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
[ "$(labels)" == "$count" ] && pass "the library's own drawing shows every cell" || fail "cells: $(labels)"$'\n'"$OUT"
expect_line "the library's own drawing: Escape gives nil" "=> nil"

# 3. While the grid shows them, one drawing is deleted, one replaced by 12 bytes, one made unreadable
#    (held open by another program without sharing):
#    repaints, scrolling and new cell sizes go on; the deleted one is refused with a message and the
#    window stays; the unreadable one is a file and is picked.
rm -f "$WORK/lib/Orvex1.ini"
helper="$(dirname "$DEVHOST")/settings_helper.exe"
mapfile -t victims < <(ls "$folder" | grep -iv -e '^zero' -e '^twelve' -e '^address' -e '^entry' -e '^png' \
  -e '^metafile' -e '^pipe' -e '^folder')
gone=$(printf '%s' "${victims[0]}" | tr 'A-Z' 'a-z')
locked=$(printf '%s' "${victims[2]}" | tr 'A-Z' 'a-z')
script_with_host_checks "$ready" 'sleep 1000' "click text=\"$gone\" at=60,-50" 'echo changing' 'sleep 3000' \
  'key alt+v d' 'sleep 300' 'key alt+v i' 'sleep 300' 'key end' 'key home' 'key alt+s s' 'sleep 300' \
  'key alt+s n' 'sleep 300' "$(shot drawings-changed)" \
  'click text="Insert"' 'wait class=#32770 text="Orvex1" timeout=5000' \
  'text class=#32770 text="Orvex1" > class=Static contains="no longer exists"' \
  "screenshot class=#32770 text=\"Orvex1\" $(winpath "$WORK/drawings-deleted-refused.png")" \
  'key enter' 'gone class=#32770 text="Orvex1" timeout=5000' "exists $frame" \
  "double-click text=\"$locked\" at=60,-50"
# The script cannot change files; a watcher does as soon as the script says so.
( for _ in $(seq 1 300); do
    if grep -q 'changing' "$WORK/script.log" 2>/dev/null; then
      rm -f "$folder/${victims[0]}"
      printf 'AC1018garbag' >"$folder/${victims[1]}.new" && mv "$folder/${victims[1]}.new" "$folder/${victims[1]}"
      # Unreadable: another program holds it open without sharing (file modes do not bind root).
      "$WINE_RUN" "$helper" hold "$(winpath "$folder/${victims[2]}")" "$(winpath "$WORK/held")" \
        "$(winpath "$WORK/release")" 60000 >"$WORK/holder.out" 2>&1 &
      for _ in $(seq 1 100); do [ -f "$WORK/held" ] && break; sleep 0.1; done
      break
    fi
    sleep 0.1
  done ) &
watcher=$!
OUT=$("$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --script "$(winpath "$WORK/script.txt")" --eval "$call" \
      2>"$WORK/stderr" | tee "$WORK/script.log" | tr -d '\r')
RC=${PIPESTATUS[0]}
wait "$watcher" 2>/dev/null
held=no; [ -f "$WORK/held" ] && held=yes
touch "$WORK/release"; wait
expect_host_usable "files changed while shown"
[ ! -e "$folder/${victims[0]}" ] && [ "$(stat -c %s "$folder/${victims[1]}")" -eq 12 ] && [ $held == yes ] &&
  pass "the watcher deleted one drawing, replaced another and held a third" ||
  fail "the watcher did not change the files (held: $held)"
expect_true "a pick of the deleted drawing is refused: it no longer exists" \
  grep -q "^\[script\] text .*$gone.*no longer exists" <(printf '%s\n' "$OUT")
expect_line "the window stays open after the message" "[script] exists yes"
expect_line "the unreadable drawing is still a file: it is picked" "=> (\"$prefix$locked\" (\"\" \"\" \"\"))"

finish
