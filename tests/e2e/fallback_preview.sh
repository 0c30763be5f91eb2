#!/usr/bin/env bash
# A host without the preview operation still shows pictures: the library draws them itself. The host here
# is devhost-nopreview.exe, devhost built without that one export; devhost.exe draws the same folder for
# comparison.
: "${DEVHOST_NOPREVIEW:?path of devhost-nopreview.exe}"
: "${DEVHOST:?path of devhost.exe}"
FULL_HOST=$DEVHOST
DEVHOST=$DEVHOST_NOPREVIEW
. "$(dirname "$0")/lib.sh"

folder="$WORK/fallbackdrawings"
mkdir -p "$folder"
if [ -d "$ROOT/../shared/dwg-samples/2004" ]; then
  cp "$ROOT/../shared/dwg-samples/2004/"*.dwg "$folder/"
  real_samples=yes
else
  echo "note: ../shared/dwg-samples/2004 is absent; synthetic drawings stand in and the dark-picture check is skipped"
  gen_dwg "$folder" 12 --variant 7
  real_samples=no
fi
start="$(lisppath "$folder")\\\\"
call="(Orvex 1 2 \"$start\" \"Insert\" \"Close\")"
notice="Orvex1: the host does not provide acdbDisplayPreviewFromDwg; the library draws the previews itself."

# shot FILE: the explorer on the folder, the pointer on the frame's caption (no tooltip), a screenshot, Escape.
# A fresh settings file each time, so both hosts show the same window at the same size.
shot() {
  rm -f "$WORK/lib/Orvex1.ini"
  printf '%s\n' 'wait contains=".dwg" timeout=20000' \
         'move contains="fallbackdrawings" nth=0 window-at=60,8' 'sleep 1500' \
         "screenshot contains=\"fallbackdrawings\" nth=0 $(winpath "$1")" \
         'key escape' >"$WORK/script.txt"
  devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
}

shot "$WORK/fallback.bmp"
expect_line "the call ends as usual" "=> nil"
n=$(printf '%s\n' "$OUT" | grep -cxF -- "$notice")
[ "$n" -eq 1 ] && pass "the command line says once that the host lacks the preview operation" ||
  fail "the notice of the missing preview operation appears $n times"$'\n'"$OUT"
[ -f "$WORK/fallback.bmp" ] && pass "a screenshot is taken" || fail "no screenshot"$'\n'"$OUT"
cp "$WORK/fallback.bmp" "${SCREENSHOT_DIR:-$WORK}/" 2>/dev/null || true

# The same folder in the host that draws the previews itself: no notice, and the same pictures.
DEVHOST=$FULL_HOST
shot "$WORK/host.bmp"
expect_line "the full host's call ends as usual" "=> nil"
grep -q "does not provide acdbDisplayPreviewFromDwg" <<<"$OUT" &&
  fail "the full host is said to lack the preview operation" || pass "the full host draws without a notice"

# dark SHOT: sampled pixels (every 4th of a row) darker than 120 in sum. diff A B: sampled pixels that differ.
pixels() {
  python3 - "$@" <<'PY'
import struct, sys
def load(path):
    d = open(path, 'rb').read()
    off = struct.unpack_from('<I', d, 10)[0]
    w, h = struct.unpack_from('<ii', d, 18)
    bpp = struct.unpack_from('<H', d, 28)[0]
    row = (w * bpp // 8 + 3) & ~3
    return w, abs(h), [d[off + y * row + x * 3: off + y * row + x * 3 + 3]
                       for y in range(abs(h)) for x in range(0, w, 4)]
if sys.argv[1] == 'dark':
    print(sum(1 for p in load(sys.argv[2])[2] if sum(p) < 120))
else:
    a, b = load(sys.argv[2]), load(sys.argv[3])
    if a[:2] != b[:2]:
        print('size %dx%d against %dx%d' % (a[0], a[1], b[0], b[1]))
    else:
        print('%d of %d' % (sum(1 for p, q in zip(a[2], b[2]) if p != q), len(a[2])))
PY
}

if [ -f "$WORK/fallback.bmp" ] && [ -f "$WORK/host.bmp" ]; then
  if [ "$real_samples" == yes ]; then
    # The previews of the samples are dark pictures: blank cells would give almost no dark pixels.
    dark=$(pixels dark "$WORK/fallback.bmp")
    [ "${dark:-0}" -gt 5000 ] && pass "the library drew the previews ($dark dark samples)" ||
      fail "the screenshot shows no previews ($dark dark samples)"
  fi
  # The library draws with the same code as the host: the two screenshots show the same pictures (a
  # little room for what differs between two runs, such as a caret).
  differ=$(pixels diff "$WORK/fallback.bmp" "$WORK/host.bmp")
  read -r changed _ total <<<"$differ"
  if [[ "$changed" =~ ^[0-9]+$ ]] && [ "$((changed * 100))" -le "$total" ]; then
    pass "the library's pictures are the host's ($differ sampled pixels differ)"
  else
    fail "the library's pictures are not the host's ($differ)"
  fi
fi

finish
