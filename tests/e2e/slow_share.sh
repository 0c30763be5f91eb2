#!/usr/bin/env bash
# A drawing library on a slow file server (devhost --file-latency adds 20 ms to every read of a drawing):
# the explorer shows a quiet loading state at first, then every visible thumbnail gets its picture after
# scrolls, jumps, a size change and a sort, while the host's thread keeps answering; the same at 0 ms;
# and a share that stops answering (--file-hang) never holds the call's end.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvexslow"
gen_dwg "$folder" 150 --variant 11
[ "$(ls "$folder" | wc -l)" -eq 150 ] && pass "150 drawings generated" || fail "generator: $(cat "$WORK/gen.err")"
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
frame='contains="orvexslow" nth=0'

# After each step: the frame's screenshot and the rectangles of the thumbnails, to find every thumbnail
# that lies in the grid and check that it shows a picture, not the loading state.
look() { # NAME
  local lines=("screenshot $frame $(winpath "$WORK/$1.bmp")" "rect $frame" "echo rects $1")
  # the same picture for a person to look at (kept with E2E_SHOTS=DIR)
  lines+=("screenshot $frame $(winpath "$WORK/slow-share-$1.png")")
  lines+=("rects class=Orvex1Wnd")
  printf '%s\n' "${lines[@]}" "echo end $1"
}

# checks the thumbnails of step NAME in the output: prints "SHOWN LOADING" (thumbnails wholly in the grid
# showing a picture, and those showing only the background).
count_pictures() { # NAME
  printf '%s\n' "$OUT" | python3 "$(dirname "$0")/thumbnail_states.py" "$WORK/$1.bmp" "$1"
}

run_at() { # LATENCY
  local steps=('wait contains=".dwg" timeout=30000')
  steps+=("$(look early-$1)")
  steps+=('sleep 3000') ; steps+=("$(look first-$1)")
  steps+=("click $frame at=600,120" 'key down' 'sleep 1500') ; steps+=("$(look down-$1)")
  steps+=('key pagedown' 'key pagedown' 'key pagedown' 'sleep 2500') ; steps+=("$(look pagedown-$1)")
  steps+=('key end' 'sleep 2500') ; steps+=("$(look end-$1)")
  steps+=('key home' 'sleep 1500') ; steps+=("$(look home-$1)")
  # Back over rows already seen: a page down and a page up read no file (devhost counts the opens).
  steps+=('key pagedown' 'sleep 1500' 'key pageup' 'sleep 1500' 'key home' 'sleep 500')
  steps+=('key alt+v i' 'sleep 3000') ; steps+=("$(look bigger-$1)")
  steps+=('key alt+s d' 'sleep 3000') ; steps+=("$(look sorted-$1)")
  # Back to the first size and the name order, which the settings file keeps for the next call.
  steps+=('key alt+v d' 'key alt+s n' 'sleep 500' 'key escape')
  printf '%s\n' "${steps[@]}" >"$WORK/script.txt"
  devhost --timing --file-latency "$1" --script "$(winpath "$WORK/script.txt")" --eval "$call"
  expect_line "at $1 ms a read the explorer is cancelled with Escape" "=> nil"
  local step result
  for step in first down pagedown end home bigger sorted; do
    result=$(count_pictures "$step-$1")
    read -r shown loading <<<"$result"
    expect_true "at $1 ms, after '$step' every thumbnail in the grid shows its picture ($shown shown, ${loading:-?} loading)" \
      test "${shown:-0}" -gt 0 -a "${loading:-1}" -eq 0
  done
  # "opened N" comes before each key: the drawings opened in the process so far.
  local reads
  reads=$(printf '%s\n' "$OUT" | awk '$1 == "[timing]" && $3 == "opened" { opened = $4 }
    $1 == "[timing]" && $3 == "key" { if (up != "" && after == "") after = opened
                                       if ($4 == 34 && first == "") first = opened; if ($4 == 35 && atEnd == "") atEnd = opened
                                       if ($4 == 34) down = opened; if ($4 == 33 && up == "") up = opened }
    END { if (down != "" && up != "" && after != "") print up - down, after - up, atEnd - first }')
  read -r down_reads up_reads new_reads <<<"$reads"
  expect_true "at $1 ms, the first page downs into rows not seen open drawings (${new_reads:-?})" \
    test "${new_reads:-0}" -gt 0
  expect_true "at $1 ms, a page down over rows seen before opens no drawing (${down_reads:-?})" \
    test "${down_reads:-x}" == 0
  expect_true "at $1 ms, a page up back to the first rows opens no drawing (${up_reads:-?})" \
    test "${up_reads:-x}" == 0
  wait_ms=$(printf '%s\n' "$OUT" | awk '$1 == "[timing]" && $3 == "longest-unanswered" { print $4 }')
  echo "at $1 ms a read: the host's thread left a message unanswered for at most $wait_ms ms"
  expect_true "the longest wait of the host's thread is measured at $1 ms" test -n "$wait_ms"
}

run_at 20
# Looked at right away: pictures still loading show the background alone (no no-preview cross).
read -r shown loading <<<"$(count_pictures early-20)"
expect_true "early at 20 ms some thumbnails show the quiet loading state ($shown shown, ${loading:-?} loading)" \
  test "${loading:-0}" -gt 0
run_at 0

# A share that stops answering: reads of one drawing never return; Escape still ends the call at once.
hung=$(ls "$folder" | LC_ALL=C sort -f | head -3 | tail -1)
printf '%s\n' 'wait contains=".dwg" timeout=30000' 'sleep 1500' 'key escape' >"$WORK/script.txt"
devhost --timing --file-hang "$hung" --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "with a hung read the explorer is cancelled with Escape" "=> nil"
closing=$(printf '%s\n' "$OUT" | awk '$1 == "[timing]" && $3 == "key" && $4 == 27 { k = $2 }
                                      $1 == "[timing]" && $3 == "call-end" && k != "" { printf "%d", $2 - k }')
echo "Escape to the call's end with a read hanging: ${closing:-?} ms"
expect_true "a hung read does not hold the call's end (Escape to return: ${closing:-?} ms)" \
  test -n "$closing" -a "${closing:-99999}" -lt 2000
expect_true "devhost ended on its own after the call (exit $RC)" test "$RC" -eq 0

# A drawing another program changes while it is shown: its picture is kept under the size and write time
# the scan saw, so it stays until the folder is read again; after F5 the new picture is shown.
changed="$WORK/orvexchanged"
gen_dwg "$changed" 6 --variant 21
gen_dwg "$WORK/replacement" 1 --variant 58
first=$(ls "$changed" | LC_ALL=C sort -f | head -1)
thumb='class=Orvex1Wnd nth=0'
script_with_host_checks 'wait contains=".dwg" timeout=30000' 'sleep 2000' \
  "screenshot $thumb $(winpath "$WORK/changed-before.bmp")" 'echo changing' 'sleep 2000' 'key f5' 'sleep 2000' \
  "screenshot $thumb $(winpath "$WORK/changed-after.bmp")" \
  "screenshot contains=\"orvexchanged\" nth=0 $(winpath "$WORK/slow-share-changed-after-f5.png")" 'key escape'
( for _ in $(seq 1 300); do
    if grep -q 'changing' "$WORK/script.log" 2>/dev/null; then
      cp "$WORK/replacement/$(ls "$WORK/replacement" | head -1)" "$changed/$first.new"
      touch -d '2030-01-02 03:04:05' "$changed/$first.new" && mv "$changed/$first.new" "$changed/$first"
      break
    fi
    sleep 0.1
  done ) &
watcher=$!
OUT=$("$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --script "$(winpath "$WORK/script.txt")" \
      --eval "(Orvex 1 2 \"$(lisppath "$changed")\\\\\" \"Insert\" \"Close\")" 2>"$WORK/stderr" |
      tee "$WORK/script.log" | tr -d '\r')
RC=${PIPESTATUS[0]}
wait "$watcher" 2>/dev/null
expect_host_usable "a drawing changed while shown"
expect_true "the first drawing ($first) was replaced while shown" cmp -s "$changed/$first" "$WORK/replacement/$(ls "$WORK/replacement" | head -1)"
expect_true "the first thumbnail's picture was taken before and after" \
  test -s "$WORK/changed-before.bmp" -a -s "$WORK/changed-after.bmp"
expect_true "after F5 the changed drawing shows its new picture" \
  bash -c '! cmp -s "$1" "$2"' _ "$WORK/changed-before.bmp" "$WORK/changed-after.bmp"

finish
