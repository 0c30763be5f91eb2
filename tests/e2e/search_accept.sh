#!/usr/bin/env bash
# Choosing a drawing by name as a person does: the drawing of the last run chosen again, a whole name
# typed, a text no name starts with, the grid after a search jump against the same cells reached by
# scrolling, refused renames, and settings the desktop cannot show. Real input through devhost's script;
# after every call the host must take input again.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexsearch"
mkdir -p "$folder"
samples="$ROOT/../shared/dwg-samples"
# Five groups of drawings named by their year, as a person sorts a folder: 14, 12, 12, 11 and 11 files.
if [ -f "$samples/MANIFEST.csv" ]; then
  for year in 2000 2004 2007 2010 2013; do
    for f in "$samples/$year"/*.dwg; do
      b=$(basename "$f")
      grep -q "^$year/$b,[^,]*,none," "$samples/MANIFEST.csv" && continue # no preview: a blank cell by nature
      cp "$f" "$folder/${year}_$b"
    done
  done
  # A second helix whose name starts with the first one's name without its extension.
  cp "$folder/2010_Helix.dwg" "$folder/2010_helix-b.dwg"
  real_samples=yes
else
  echo "note: ../shared/dwg-samples is absent; synthetic drawings stand in for the real ones"
  gen_dwg "$WORK/gen" 60 --variant 9
  i=0
  for f in "$WORK/gen"/*; do
    if [ $i -lt 14 ]; then year=2000; elif [ $i -lt 26 ]; then year=2004; elif [ $i -lt 37 ]; then year=2007
    elif [ $i -lt 49 ]; then year=2010; else year=2013; fi
    mv "$f" "$folder/${year}_$(printf 'd%02d' $i).dwg"
    i=$((i + 1))
  done
  mv "$folder/2010_d48.dwg" "$folder/2010_helix.dwg"
  mv "$folder/2010_d37.dwg" "$folder/2010_helix-b.dwg"
  real_samples=no
fi
count=$(ls "$folder" | wc -l)
[ "$count" -eq 60 ] && pass "60 drawings in the folder" || fail "the folder holds $count drawings, not 60"

# The list keeps the file system's last entry last (it takes no part in the sort); Wine hands the entries
# over in the order the directory lists them. The names below avoid that one.
last_scanned=$(python3 -c 'import os, sys; print([n for n in os.listdir(sys.argv[1]) if ".dwg" in n.lower()][-1].lower())' "$folder")
names=$(ls "$folder" | tr 'A-Z' 'a-z' | LC_ALL=C sort | grep -vxF "$last_scanned")
pick_name() { printf '%s\n' "$names" | grep "^$1" | sed -n "${2}p"; } # PREFIX N: the N-th name with PREFIX

call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="orvexsearch" nth=0'
view="$frame > id=59649" # the grid, the splitter's second pane
settings="$WORK/lib/Orvex1.ini"
# The explorer's settings file: 6 columns and 2 whole rows of 173 x 143 pictures, and extra lines.
write_settings() {
  printf '[CurrentPath]\r\nPath=%s\r\nName=%s\r\n\r\n[Size]\r\nWindowWidth=%s\r\nWindowHeight=%s\r\n\r\n' \
    "$(winpath "$folder")" "$1" "${2:-1200}" "${3:-590}" >"$settings"
  printf '[View]\r\nPictureWidth=%s\r\nPictureHeight=%s\r\nSort=0\r\n' "${4:-173}" "${5:-143}" >>"$settings"
}
texts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] text //p' | sed 's/\\\\/\\/g'; }
# The accept button's states the script asked for (the host checks' own line about the host frame comes last).
accept_states() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] enabled //p' | head -"$1" | tr '\n' ' '; }
run() { devhost --script "$(winpath "$WORK/script.txt")" "$@" --eval "$call"; }

# --- the drawing of the last run --------------------------------------------------------------------------
# Its name without the extension goes into the search edit, which finds 2010_helix-b.dwg first; the saved
# drawing itself is chosen, and the accept button takes it.
write_settings "2010_helix.dwg"
script_with_host_checks 'wait contains=".dwg" timeout=30000' 'enabled text="Insert"' 'text id=32790' \
  "text $frame" 'click text="Insert"'
run
[ "$(accept_states 1)" == "yes " ] && pass "reopened with a saved drawing, accept is enabled" ||
  fail "reopened with a saved drawing, accept enabled: $(accept_states 1)"
t=$(texts)
[ "$(printf '%s\n' "$t" | sed -n 1p)" == "2010_helix" ] && pass "the search edit shows the saved name" ||
  fail "search edit: '$(printf '%s\n' "$t" | sed -n 1p)'"
[ "$(printf '%s\n' "$t" | sed -n 2p)" == "$(winpath "$folder")\\2010_helix.dwg" ] &&
  pass "the title names the saved drawing" || fail "title: '$(printf '%s\n' "$t" | sed -n 2p)'"
expect_line "the accept button returns the saved drawing" "=> (\"${prefix}2010_helix.dwg\" (\"\" \"\" \"\"))"
expect_host_usable "saved drawing, accept button"

# The same with the accept message instead of the button (the host or a LISP timer may post it).
write_settings "2010_helix.dwg"
script_with_host_checks 'wait contains=".dwg" timeout=30000'
run --after-ms 8000 --post accept
expect_line "the accept message returns the saved drawing" "=> (\"${prefix}2010_helix.dwg\" (\"\" \"\" \"\"))"
expect_host_usable "saved drawing, accept message"

# --- a whole name, in other case ---------------------------------------------------------------------------
whole=$(pick_name 2007_ 4)
write_settings ""
script_with_host_checks 'wait contains=".dwg" timeout=30000' 'enabled text="Insert"' 'click id=32790' \
  "type \"$(printf '%s' "$whole" | tr 'a-z' 'A-Z')\"" 'enabled text="Insert"' "text $frame" 'click text="Insert"'
run
en=$(accept_states 2)
[ "$en" == "no yes " ] && pass "typing a whole name enables accept" || fail "accept enabled: $en"
[ "$(texts)" == "$(winpath "$folder")\\$whole" ] && pass "the title names the typed drawing" || fail "title: '$(texts)'"
expect_line "a whole name typed, then accept, returns that drawing" "=> (\"$prefix$whole\" (\"\" \"\" \"\"))"
expect_host_usable "whole name"

# --- a text no name starts with ----------------------------------------------------------------------------
write_settings ""
script_with_host_checks 'wait contains=".dwg" timeout=30000' 'click id=32790' 'type "2004_"' \
  'enabled text="Insert"' 'type "zq"' 'enabled text="Insert"' 'text class=msctls_statusbar32' "text $frame" \
  'click text="Insert"' 'sleep 500' 'click text="Close"'
run
en=$(accept_states 2)
[ "$en" == "yes no " ] && pass "a text no name starts with disables accept" || fail "accept enabled: $en"
[ "$(texts | sed -n 1p)" == 'No drawing starts with "2004_zq"' ] && pass "the status bar says no drawing starts with it" ||
  fail "status bar: '$(texts | sed -n 1p)'"
[ "$(texts | sed -n 2p)" == "$(winpath "$folder")" ] && pass "the title shows the folder" || fail "title: '$(texts | sed -n 2p)'"
expect_line "the disabled accept button takes nothing; Close gives nil" "=> nil"
expect_host_usable "no match"

# --- the grid after a search jump, and the same cells reached by scrolling ---------------------------------
# 60 drawings in 6 columns make 10 rows; 2 whole rows are visible, so scrolling down stops at row 8, the row
# the search brings the second drawing of 2013 to.
target=$(pick_name 2013_ 2)
grid_shot() { # what the grid shows, after the mouse has gone to the toolbar and any tooltip has faded
  printf '%s\n' "move text=\"Search:\"" 'sleep 1500' "count $frame > contains=\".dwg\"" "rect $view" \
    "rect text=\"$target\"" "screenshot $view $(winpath "$WORK/$1")"
}
write_settings ""
mapfile -t shot < <(grid_shot jump.bmp)
script_with_host_checks 'wait contains=".dwg" timeout=30000' 'click id=32790' "type \"$target\"" 'sleep 3000' \
  "${shot[@]}" 'click text="Close"'
run
jump_counts=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p')
label_rect=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p' | sed -n 2p)
expect_host_usable "search jump"

first=$(pick_name 2000_ 1)
write_settings ""
mapfile -t shot < <(grid_shot scrolled.bmp)
steps=('wait contains=".dwg" timeout=30000' "click text=\"$first\" at=60,-50")
for _ in $(seq 1 12); do steps+=('key down'); done
steps+=("click text=\"$target\" at=60,-50" "${shot[@]}" 'click text="Close"')
script_with_host_checks "${steps[@]}"
run
scroll_counts=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p')
expect_host_usable "scrolled"
echo "live labels after the jump: $jump_counts, after scrolling: $scroll_counts; target label at $label_rect"

if [ -f "$WORK/jump.bmp" ] && [ -f "$WORK/scrolled.bmp" ]; then
  cp "$WORK/jump.bmp" "$WORK/scrolled.bmp" "${SCREENSHOT_DIR:-$WORK}/" 2>/dev/null || true
  verdict=$(python3 - "$WORK/jump.bmp" "$WORK/scrolled.bmp" $label_rect <<'PY'
import struct, sys

def load(path):
    d = open(path, 'rb').read()
    off = struct.unpack_from('<I', d, 10)[0]
    w, h = struct.unpack_from('<ii', d, 18)
    row = (w * 3 + 3) & ~3
    top_down = h < 0
    h = abs(h)
    def px(x, y):
        yy = y if top_down else h - 1 - y
        i = off + yy * row + x * 3
        return d[i], d[i + 1], d[i + 2]
    return w, h, px

jw, jh, jump = load(sys.argv[1])
sw, sh, scrolled = load(sys.argv[2])
label_height = int(sys.argv[6])
problems = []
if (jw, jh) != (sw, sh):
    problems.append('sizes differ: %dx%d and %dx%d' % (jw, jh, sw, sh))
# Cell geometry inside the view's one-pixel border: 173 x 143 pictures, columns 178 apart, rows a label lower.
pitch = 143 + label_height + 4
cells = []
for row in range(2):
    for col in range(6):
        x0, y0 = 1 + col * 178, 1 + row * pitch
        if x0 + 173 <= jw and y0 + pitch <= jh:
            cells.append((row, col, x0, y0))
for name, px in (('after the jump', jump), ('after scrolling', scrolled)):
    blank = []
    for row, col, x0, y0 in cells:
        colours = {px(x, y) for y in range(y0 + 2, y0 + 141, 3) for x in range(x0 + 2, x0 + 171, 3)}
        # The name: pixels that are not the label's background (plain or highlighted).
        label = [px(x, y) for y in range(y0 + 145, y0 + 143 + label_height) for x in range(x0 + 3, x0 + 170, 2)]
        background = max(set(label), key=label.count)
        text = sum(1 for c in label if c != background)
        if len(colours) < 2 or text < 10:
            blank.append('%d,%d (%d colours, %d text pixels)' % (row, col, len(colours), text))
    if blank:
        problems.append('blank cells %s: %s' % (name, '; '.join(blank)))
# The same pixels, the scroll bar aside.
if (jw, jh) == (sw, sh):
    differ = sum(1 for y in range(jh) for x in range(jw - 20) if jump(x, y) != scrolled(x, y))
    if differ:
        problems.append('%d pixels differ between the two grids' % differ)
print('ok' if not problems else ' | '.join(problems))
PY
)
  [ "$verdict" == "ok" ] && pass "after a search jump every visible cell shows its picture and name, as after scrolling to it" ||
    fail "search jump against scrolling: $verdict"
else
  fail "the screenshots of the grid were not taken"
fi

# --- renames the label refuses ------------------------------------------------------------------------------
victim=$(pick_name 2000_ 2)
other=$(pick_name 2004_ 1)
box='class=#32770 text="Drawing explorer"'
write_settings ""
steps=('wait contains=".dwg" timeout=30000')
for bad in 'a*b.dwg' 'x|y.dwg' 'a\"b.dwg' 'plan.txt' 'plan' 'con.dwg' "$(printf '%s' "$other" | tr 'a-z' 'A-Z')"; do
  steps+=("double-click text=\"$victim\" at=20,5" "type \"$bad\"" 'key enter' "wait $box" "text $box > id=65535"
          "click $box > text=OK" "gone $box" "exists text=\"$victim\"")
done
steps+=('click text="Close"')
script_with_host_checks "${steps[@]}"
run
messages=$(texts)
n=$(printf '%s\n' "$messages" | grep -c '^Cannot rename to ')
[ "$n" -eq 7 ] && pass "each refused rename is explained in a message box" || { fail "rename messages ($n)"; printf '%s\n' "$messages"; }
grep -qF 'Cannot rename to "a*b.dwg": a name cannot contain' <<<"$messages" &&
  grep -qF "Cannot rename to \"plan.txt\": a drawing's name ends in .dwg." <<<"$messages" &&
  grep -qF 'Cannot rename to "con.dwg": the name is reserved for a device.' <<<"$messages" &&
  grep -qF 'a file of that name already exists.' <<<"$messages" &&
  pass "the messages name the rule" || fail "messages: $messages"
ex=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] exists //p' | tr '\n' ' ')
[ "$ex" == "yes yes yes yes yes yes yes " ] && pass "the label shows the old name again after each refusal" ||
  fail "old label back: $ex"
[ "$(ls "$folder" | wc -l)" -eq 60 ] && [ -n "$(ls "$folder" | grep -ixF "$victim")" ] &&
  pass "no file was renamed" || fail "the folder changed: $(ls "$folder" | tr '\n' ' ')"
expect_line "refused renames end with Close" "=> nil"
expect_host_usable "refused renames"

# --- settings the desktop cannot show ------------------------------------------------------------------------
write_settings "" -500 100000 -3 1
script_with_host_checks 'wait contains=".dwg" timeout=30000' "rect $frame" 'click text="Close"'
run
read -r fx fy fw fh < <(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect //p' | head -1)
if [ -n "${fw:-}" ] && [ "$fw" -gt 100 ] && [ "$fh" -gt 100 ] && [ "$fx" -ge -8 ] && [ "$fy" -ge -8 ] &&
   [ $((fx + fw)) -le 1616 ] && [ $((fy + fh)) -le 1016 ]; then
  pass "a negative width and a huge height open the frame on the screen ($fx,$fy ${fw}x$fh)"
else
  fail "frame placed at '${fx:-} ${fy:-} ${fw:-} ${fh:-}'"
fi
pw=$(tr -d '\r' <"$settings" | sed -n 's/^PictureWidth=//p')
ph=$(tr -d '\r' <"$settings" | sed -n 's/^PictureHeight=//p')
[ "$pw" == 70 ] && [ "$ph" == 58 ] && pass "tiny and negative picture sizes become the smallest picture (70 x 58)" ||
  fail "picture size saved as '$pw' x '$ph'"
expect_host_usable "desktop limits"

finish
