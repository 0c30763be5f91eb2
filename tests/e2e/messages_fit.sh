#!/usr/bin/env bash
# Messages and labels that fit, as a person meets them: a rename refused for a name of 300 characters is
# said in a box that lies on the screen; a rename to ".dwg" alone says the name is empty; two selected
# drawings whose long names differ at their start show that start; a name cut at the smallest size ends
# in an ellipsis; a tooltip near the screen's right edge stays on the screen, its box around its lines.
# Real input through devhost's script; the screenshots are looked at.
. "$(dirname "$0")/lib.sh"

# The screen of tools/wine-run's Xvfb.
screen_w=1600
screen_h=1000

folder="$WORK/orvexfit"
tail=$(printf 'x%.0s' $(seq 1 120))
names=("alpha-$tail.dwg" "bravo-$tail.dwg" "charlie-$tail.dwg" "delta-$tail.dwg" "echo-$tail.dwg"
       "foxtrot-$tail.dwg" "short.dwg" "$(printf 'W%.0s' $(seq 1 200)).dwg")
gen_dwg "$WORK/gen" ${#names[@]} --variant 2
mkdir -p "$folder"
i=0
for f in "$WORK/gen"/*; do mv "$f" "$folder/${names[$i]}"; i=$((i + 1)); done
[ "$(ls "$folder" | wc -l)" -eq ${#names[@]} ] && pass "${#names[@]} drawings, seven with long names" ||
  fail "the folder: $(ls "$folder")"

frame='contains="orvexfit" nth=0'
box='class=#32770 text="Drawing explorer"'
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
settings="$WORK/lib/Orvex1.ini"
# The frame as wide as the screen: the last column of thumbnails lies at its right edge.
printf '[Size]\r\nSplitterSize=150\r\nWindowWidth=%d\r\nWindowHeight=900\r\n' "$screen_w" >"$settings"
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"; }
shot() { printf 'screenshot %s %s' "$1" "$(winpath "$WORK/$2")"; }
# inside_screen NAME "[script] rect L T W H"
inside_screen() {
  local l t w h
  read -r l t w h <<<"$(sed 's/^\[script\] rect //' <<<"$2")"
  if [ -n "$h" ] && [ "$l" -ge 0 ] && [ "$t" -ge 0 ] && [ $((l + w)) -le $screen_w ] && [ $((t + h)) -le $screen_h ]; then
    pass "$1 ($l $t $w $h)"
  else
    fail "$1: $2 on a screen of $screen_w x $screen_h"
  fi
}
long=$(printf 'n%.0s' $(seq 1 296)).dwg

# 1. A rename refused for a name of 300 characters: the box that says so lies on the screen.
script_with_host_checks "wait $frame timeout=30000" 'double-click class=Edit text="short.dwg"' 'sleep 300' \
  "type \"$long\"" 'key enter' "wait $box timeout=5000" 'sleep 300' 'echo box' "rect $box" \
  "text $box > id=65535" "$(shot "$box" refusal-long-name.png)" 'key enter' 'sleep 300' 'key escape'
run
inside_screen "the refusal of a 300-character name lies on the screen" \
  "$(sed -n '/^\[script\] box$/,$p' <<<"$OUT" | grep -m1 '^\[script\] rect ')"
said=$(sed -n 's/^\[script\] text //p' <<<"$OUT" | head -1)
[ "$(sed 's/\\n//g' <<<"$said")" == "Cannot rename to \"$long\": the full path would be longer than 259 characters." ] &&
  pass "the refusal names the whole name, in lines" || fail "the refusal said: $said"
expect_true "the file keeps its name" test -e "$folder/short.dwg"

# 2. A rename to ".dwg" alone: the name is empty.
script_with_host_checks "wait $frame timeout=30000" 'double-click class=Edit text="short.dwg"' 'sleep 300' \
  'type ".dwg"' 'key enter' "wait $box timeout=5000" "text $box > id=65535" \
  "$(shot "$box" refusal-extension-alone.png)" 'key enter' 'sleep 300' 'key escape'
run
expect_line "renaming to .dwg says the name is empty" \
  '[script] text Cannot rename to ".dwg": the name before .dwg is empty.'
expect_true "the file keeps its name" test -e "$folder/short.dwg"

# View > Decrease, ten times: the smallest size.
smaller=()
for n in 1 2 3 4 5 6 7 8 9 10; do smaller+=('key alt+v' 'key d'); done
# 3. Two selected drawings whose long names differ at their start show that start; then the smallest
#    size, where a cut name ends in an ellipsis. Looked at in the screenshots.
script_with_host_checks "wait $frame timeout=30000" \
  'click class=Edit contains="alpha-" at=40,-40' 'click class=Edit contains="bravo-" at=40,-40 with=ctrl' \
  'sleep 500' "$(shot "$frame" labels-selected.png)" \
  'key ctrl+a' 'sleep 200' 'click class=Edit text="short.dwg" at=40,-40' \
  "${smaller[@]}" 'sleep 800' \
  "$(shot "$frame" labels-smallest.png)" 'key escape'
run
expect_line "Escape then cancels" "=> nil"

# 4. The tooltip of a drawing at the screen's right edge stays on the screen. (The picture size chosen
#    above was saved: back to the one of the start.)
printf '[Size]\r\nSplitterSize=150\r\nWindowWidth=%d\r\nWindowHeight=900\r\n' "$screen_w" >"$settings"
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' 'rects class=Edit contains="-xxx"' \
  'move class=Edit contains="foxtrot-" at=60,-40' 'sleep 2500' 'tooltip' 'echo tip' \
  'rects class=tooltips_class32' "$(shot "$frame" tooltip-edge.png)" 'key escape'
run
printf '%s\n' "$OUT" | grep -E '^\[script\] (rect|tooltip)' | head -20
edge_tip=$(sed -n '/^\[script\] tip$/,$p' <<<"$OUT" | grep -m1 '^\[script\] rect ')
inside_screen "the tooltip at the right edge lies on the screen" "$edge_tip"

# 5. The tooltip of a name wider than the screen: its box lies on the screen, the name in lines.
script_with_host_checks "wait $frame timeout=30000" 'sleep 500' \
  'move class=Edit contains="wwww" at=60,-40' 'sleep 2500' 'tooltip' 'echo tip' \
  'rects class=tooltips_class32' "$(shot "$frame" tooltip-wide-name.png)" 'key escape'
run
printf '%s\n' "$OUT" | grep -E '^\[script\] (rect|tooltip)' | head -20
wide_tip=$(sed -n '/^\[script\] tip$/,$p' <<<"$OUT" | grep -m1 '^\[script\] rect ')
inside_screen "the tooltip of a name wider than the screen lies on the screen" "$wide_tip"
# Three lines at the edge; the name in more than one line here, and the box around all of them.
[ "$(awk '{print $6}' <<<"$wide_tip")" -gt "$(awk '{print $6}' <<<"$edge_tip")" ] &&
  pass "the tooltip's box grows with the lines the name takes" ||
  fail "the tooltip's box: $wide_tip against $edge_tip for three lines"

finish
