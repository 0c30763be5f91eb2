#!/usr/bin/env bash
# The explorer as a person uses it: real clicks and keys through devhost's script, real drawing files.
. "$(dirname "$0")/lib.sh"

# A folder of drawings: the real samples when they are there, plus synthetic ones the tests make.
folder="$WORK/orvexdrawings"
mkdir -p "$folder"
if [ -d "$ROOT/../shared/dwg-samples/2004" ]; then
  cp "$ROOT/../shared/dwg-samples/2004/"*.dwg "$folder/"
  real_samples=yes
else
  echo "note: ../shared/dwg-samples is absent; the checks on real previews are skipped"
  gen_dwg "$folder" 12 --variant 7
  real_samples=no
fi
names=$(ls "$folder" | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
start="$(lisppath "$folder")\\\\"
call="(Orvex 1 2 \"$start\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"

script() { printf '%s\n' "$@" >"$WORK/script.txt"; }

# Double-click on a thumbnail's picture (the label is above the picture's bottom edge: aim above it).
script 'wait contains=".dwg" timeout=20000' \
       "double-click text=\"$first\" at=60,-50"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "double-click on a thumbnail picks its drawing" "=> (\"$prefix$first\" (\"\" \"\" \"\"))"

# Type the start of a name in the search edit, then press the accept button. A fresh settings file:
# a drawing name saved by the last run would be put into the search edit and chosen at once.
rm -f "$WORK/lib/Orvex1.ini"
target=$(printf '%s\n' "$names" | grep -v "^$first$" | head -1)
typed=$(printf '%s' "${target:0:3}" | tr 'a-z' 'A-Z')
script 'wait contains=".dwg" timeout=20000' \
       'enabled text="Insert"' \
       'click id=32790' \
       "type \"$typed\"" \
       'enabled text="Insert"' \
       'click text="Insert"'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "accept is disabled before a drawing is chosen" "[script] enabled no"
expect_line "typing a prefix (any case) then accept picks that drawing" "=> (\"$prefix$target\" (\"\" \"\" \"\"))"
n_en=$(printf '%s\n' "$OUT" | grep -c '^\[script\] enabled yes$')
[ "$n_en" -eq 1 ] && pass "the search enables the accept button" || fail "the search enables the accept button"

# The parameters of the folder come back with the pick.
printf '[Default Parameters]\r\nLayer=Doors\r\nLisp command=(c:fixdoor)\r\nColor=3\r\n\r\n' >"$folder/datains.ini"
script 'wait contains=".dwg" timeout=20000' \
       'text contains="Layer name:"' \
       "double-click text=\"$first\" at=60,-50"
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "the layer label shows the folder's layer" "[script] text  Layer name: Doors"
expect_line "a pick returns the folder's layer, colour and command" "=> (\"$prefix$first\" (\"Doors\" \"3\" \"(c:fixdoor)\"))"
rm "$folder/datains.ini"

# Escape in the grid, Escape in the search edit, the cancel button, the close box: each gives nil.
script 'wait contains=".dwg" timeout=20000' "click text=\"$first\" at=60,-50" 'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "Escape in the grid cancels" "=> nil"

script 'wait contains=".dwg" timeout=20000' 'click id=32790' 'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "Escape in the search edit cancels" "=> nil"

script 'wait contains=".dwg" timeout=20000' 'click text="Close"'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "the cancel button cancels" "=> nil"

rm -f "$WORK/lib/Orvex1.ini"
script 'wait contains=".dwg" timeout=20000' 'click contains="orvexdrawings" nth=0 window-at=-12,12'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "the frame's close box cancels" "=> nil"
w=$(tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n 's/^WindowWidth=//p')
h=$(tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n 's/^WindowHeight=//p')
if [ "${w:-0}" -gt 0 ] && [ "${h:-0}" -gt 0 ]; then pass "closing saves the window size ($w x $h) in Orvex1.ini"
else fail "closing saves the window size in Orvex1.ini (got '${w:-}' x '${h:-}')"; fi

# Selection: Ctrl+click adds, a plain click leaves one, Shift+click does nothing.
second=$(printf '%s\n' "$names" | sed -n 2p)
third=$(printf '%s\n' "$names" | sed -n 3p)
script 'wait contains=".dwg" timeout=20000' \
       "click text=\"$first\" at=60,-50" \
       "click text=\"$second\" at=60,-50 with=ctrl" \
       'text contains="orvexdrawings" nth=0' \
       "click text=\"$third\" at=60,-50 with=shift" \
       'text contains="orvexdrawings" nth=0' \
       "click text=\"$third\" at=60,-50" \
       'text contains="orvexdrawings" nth=0' \
       "click text=\"$third\" at=60,-50 with=ctrl" \
       'text contains="orvexdrawings" nth=0' \
       'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
titles=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] text //p' | sed 's/\\\\/\\/g')
t1=$(printf '%s\n' "$titles" | sed -n 1p); t2=$(printf '%s\n' "$titles" | sed -n 2p)
t3=$(printf '%s\n' "$titles" | sed -n 3p); t4=$(printf '%s\n' "$titles" | sed -n 4p)
[ "$t1" == "$(winpath "$folder")\\$second" ] && pass "Ctrl+click selects and names the drawing" || fail "Ctrl+click: title '$t1'"
[ "$t2" == "$t1" ] && pass "Shift+click does nothing" || fail "Shift+click changed the title to '$t2'"
[ "$t3" == "$(winpath "$folder")\\$third" ] && pass "a plain click selects one" || fail "plain click: title '$t3'"
[ "$t4" == "$(winpath "$folder")" ] && pass "Ctrl+click on the selected one deselects it" || fail "Ctrl+click deselect: title '$t4'"

# Tooltip text and a screenshot with the previews drawn.
script 'wait contains=".dwg" timeout=20000' \
       "move text=\"$first\" at=60,-50" 'sleep 300' "move text=\"$first\" at=70,-55" 'sleep 1500' 'tooltip' \
       "screenshot contains=\"orvexdrawings\" nth=0 $(winpath "$WORK/explorer.bmp")" \
       'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
size=$(stat -c %s "$folder/$(ls "$folder" | grep -ix "$first")")
tip=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] tooltip //p')
if grep -qE "^$first\\\\r\\\\nSize=$size\\\\r\\\\n[0-9]{2}/[0-9]{2}/[0-9]{4};[0-9]{2}\.[0-9]{2}\.[0-9]{2}$" <<<"$tip"; then
  pass "the tooltip reads name, size and date"
else
  fail "tooltip: '$tip'"
fi
if [ -f "$WORK/explorer.bmp" ] && [ "$real_samples" == yes ]; then
  # The previews of the samples are dark pictures: a screenshot of white cells would have almost no dark pixels.
  dark=$(python3 - "$WORK/explorer.bmp" <<'PY'
import struct, sys
d = open(sys.argv[1], 'rb').read()
off, w, h, bpp = struct.unpack_from('<I', d, 10)[0], *struct.unpack_from('<iiH', d, 18)[:2], struct.unpack_from('<H', d, 28)[0]
row = (w * bpp // 8 + 3) & ~3
dark = sum(1 for y in range(abs(h)) for x in range(0, w, 4)
           if sum(d[off + y * row + x * 3: off + y * row + x * 3 + 3]) < 120)
print(dark)
PY
)
  cp "$WORK/explorer.bmp" "${SCREENSHOT_DIR:-$WORK}/" 2>/dev/null || true
  [ "${dark:-0}" -gt 5000 ] && pass "the screenshot shows drawn previews ($dark dark samples)" || fail "screenshot shows no previews ($dark)"
fi

finish
