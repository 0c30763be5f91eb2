#!/usr/bin/env bash
# The grid's scroll bar in a folder of 200,000 drawings (33,334 rows of six, far more rows than the bar has
# positions), through real mouse input: the thumb dragged to the middle of the bar takes the grid to the
# middle of the folder and stays where it was dropped; a click in the trough below the thumb moves one page,
# as Page Down does; after End the thumb is at the bottom.
. "$(dirname "$0")/lib.sh"

count=200000
folder="$WORK/huge"
# Empty files are drawings without a preview: the grid shows them all the same, and they are made at once.
python3 - "$folder" "$count" <<'PY'
import os, sys
folder, count = sys.argv[1], int(sys.argv[2])
os.makedirs(folder)
for i in range(count):
    open(os.path.join(folder, 'd%06d.dwg' % i), 'w').close()
PY
expect_true "$count drawings made" [ "$(ls "$folder" | wc -l)" -eq "$count" ]

grid='id=59649' # the grid view, the second pane of the splitter
labels="$grid > class=Edit"
# At the top the thumb sits just below the bar's up arrow: the press at 22 pixels from the view's top takes
# it (the first scrollbar line says where it is, and the check below looks).
printf '%s\n' 'wait contains=".dwg" timeout=60000' 'click text="d000000.dwg"' "scrollbar $grid" \
  "drag $grid window-at=-8,22 to=-8,50% steps=20" 'sleep 300' 'echo dropped' "scrollbar $grid" "windows $labels" \
  "rect $grid" "screenshot $grid $(winpath "$WORK/dropped.png")" \
  "click $grid window-at=-8,-60" 'echo trough' "scrollbar $grid" "windows $labels" \
  'key pagedown' 'echo pagedown' "scrollbar $grid" "windows $labels" \
  'key end' 'echo end' "scrollbar $grid" "windows $labels" "screenshot $grid $(winpath "$WORK/end.png")" \
  'key escape' >"$WORK/script.txt"
devhost --script "$(winpath "$WORK/script.txt")" --eval "(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
expect_line "Escape ends the call" "=> nil"

# One verdict per line: NAME|yes or NAME|no (what was seen).
printf '%s\n' "$OUT" >"$WORK/out.txt"
verdicts=$(python3 - "$count" "$WORK/out.txt" <<'PY'
import re, sys
count = int(sys.argv[1])
steps, step = {}, 'start'
bars, labels, rect = {}, {}, None
for line in open(sys.argv[2]):
    line = line.rstrip('\n')
    if m := re.match(r'\[script\] (dropped|trough|pagedown|end)$', line):
        step = m.group(1)
    elif m := re.match(r'\[script\] scrollbar pos=(-?\d+) min=(-?\d+) max=(-?\d+) page=(\d+) thumb=(-?\d+),(-?\d+)', line):
        bars[step] = dict(zip(('pos', 'min', 'max', 'page', 'top', 'bottom'), map(int, m.groups())))
    elif m := re.match(r'\[script\] window (-?\d+) (-?\d+) \d+ \d+ d(\d+)\.dwg$', line):
        labels.setdefault(step, []).append((int(m.group(2)), int(m.group(1)), int(m.group(3))))
    elif m := re.match(r'\[script\] rect (-?\d+) (-?\d+) (\d+) (\d+)$', line):
        rect = tuple(map(int, m.groups()))

def say(name, ok, seen):
    print(f"{name} (seen: {seen})|{'yes' if ok else 'no'}")

if set(bars) != {'start', 'dropped', 'trough', 'pagedown', 'end'} or not rect or 'dropped' not in labels:
    say('the script saw the scroll bar and the labels at every step', False, f'{sorted(bars)}, rect {rect}')
    sys.exit()
# The first drawing shown: the label at the top left; the columns: the labels on its row.
def first(step):
    top, left, index = min(labels[step])
    return index, sum(1 for t, _, _ in labels[step] if t == top)
index, columns = first('dropped')
rows = -(-count // columns)
b = bars['dropped']
max_pos = b['max'] - b['page'] + 1
grab = 22 - bars['start']['top']
say('the press took the thumb at the top of the bar', 0 <= grab <= bars['start']['bottom'] - bars['start']['top'],
    f"thumb {bars['start']['top']}..{bars['start']['bottom']}, pressed at 22")
drop_y = rect[3] * 50 // 100
say('the thumb stays where it was dropped', abs(b['top'] + grab - drop_y) <= 2,
    f"thumb top {b['top']}, dropped at {drop_y} holding it {grab} pixels below its top")
row = index // columns
# A click in the trough below the thumb: one page, as Page Down then moves.
trough_index, _ = first('trough')
page_index, _ = first('pagedown')
by_trough = (trough_index - index) // columns
by_key = (page_index - trough_index) // columns
say('a click in the trough moves one page, as Page Down does', by_trough == by_key and by_trough > 1,
    f'trough {by_trough} rows, Page Down {by_key} rows')
# The thumb's place in the bar is the first row's place between the top and the last page (a page being
# what Page Down moved).
last = rows - by_key
say('the grid shows the middle of the folder, where the thumb was dropped',
    abs(row / last - b['pos'] / max_pos) < 0.002 and abs(index / count - 0.5) < 0.03,
    f"first drawing d{index:06d}, row {row} of {rows}; thumb at {b['pos']} of {max_pos}")
t = bars['trough']
say('after the trough click the thumb shows the new row',
    abs(t['pos'] / max_pos - (trough_index // columns) / last) < 0.002 and t['pos'] >= b['pos'],
    f"pos {b['pos']} -> {t['pos']}")
# End: the last page, the thumb at the bottom of the bar.
e = bars['end']
end_index, _ = first('end')
say('after End the last drawing is shown and the thumb is at the bottom',
    e['pos'] == e['max'] - e['page'] + 1 and any(i == count - 1 for _, _, i in labels['end']) and
    end_index // columns > rows - 6, f"pos {e['pos']} of {e['max'] - e['page'] + 1}, first drawing d{end_index:06d}")
PY
)
while IFS='|' read -r name ok; do
  [ -n "$name" ] && expect_true "$name" [ "$ok" == yes ]
done <<<"$verdicts"
finish
