#!/usr/bin/env bash
# devhost --timing and --preview flat as the speed benchmarks use them, on the real explorer: the marks of
# each phase of a call come in order (settings read, frame and bars, folder scan, thumbnails, previews),
# and the thumbnails' pictures are the library's own (read and decoded off the host's thread): the host's
# preview operation, flat here, is not asked for a drawing the library can draw.
. "$(dirname "$0")/lib.sh"

folder="$WORK/orvextiming"
gen_dwg "$folder" 30 --variant 7
[ "$(ls "$folder" | wc -l)" -eq 30 ] && pass "30 drawings generated" || fail "generator: $(cat "$WORK/gen.err")"
call="(Orvex 1 2 \"$(lisppath "$folder")\\\\\" \"Insert\" \"Close\")"
timing() { printf '%s\n' "$OUT" | grep '^\[timing\] '; }
# first_at WHAT-REGEX: the time of the first timing line whose words after the time match.
first_at() { timing | awk -v re="$1" '{ w = $3; for (i = 4; i <= NF; i++) w = w " " $i } w ~ re { print $2; exit }'; }

script_with_host_checks 'wait contains=".dwg" timeout=30000' 'sleep 500' \
  "screenshot class=Orvex1Wnd nth=0 $(winpath "$WORK/flat.bmp")" 'key escape'
devhost --timing --preview flat --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "flat previews with timing marks"
expect_line "the explorer is cancelled with Escape" "=> nil"

look=$(first_at '^settings-look orvex1\.ini$|^settings-look Orvex1\.ini$')
frame=$(first_at '^create Orvex1:.* in #32770$')
toolbar=$(first_at '^create ToolbarWindow32 ')
tree=$(first_at '^create SysTreeView32 ')
scan=$(first_at "^scan-begin .*orvextiming")
scanned=$(timing | awk '$3 == "scan-begin" && /orvextiming/ { s = 1; next } s && $3 == "scan-end" { print $4; exit }')
thumb=$(first_at '^create Orvex1Wnd ')
preview=$(first_at '^preview ')
end=$(first_at '^call-end$')
echo "marks: settings $look, frame $frame, toolbar $toolbar, tree $tree, scan $scan ($scanned entries)," \
  "first thumbnail $thumb, first preview $preview, end $end"
in_order() {
  local previous=-1 t
  for t in "$@"; do
    [ -n "$t" ] || return 1
    awk -v a="$previous" -v b="$t" 'BEGIN { exit !(a + 0 <= b + 0) }' || return 1
    previous=$t
  done
}
expect_true "the phases are marked in the order of a call: settings, frame, tree, scan, thumbnails, previews, end" \
  in_order "$look" "$frame" "$tree" "$scan" "$thumb" "$preview" "$end"
expect_true "the toolbars come after the frame and before the thumbnails" in_order "$frame" "$toolbar" "$thumb"
expect_true "the scan of the folder counts its 30 drawings with . and .." test "${scanned:-0}" -eq 32
expect_true "times never go back" bash -c "printf '%s\n' \"\$1\" | awk '\$2 + 0 < last { exit 1 } { last = \$2 + 0 }'" _ "$(timing)"
complete=$(timing | awk '$3 == "preview" { split($4, dv, "/"); if (dv[1] == dv[2] && dv[2] > 0) { print dv[2]; exit } }')
expect_true "a complete paint is seen: every visible thumbnail has its picture (${complete:-none} thumbnails)" \
  test "${complete:-0}" -gt 0
named=$(timing | awk '$3 == "preview" { sub(/^[^ ]+ [^ ]+ [^ ]+ [^ ]+ /, ""); print }' | sort -u)
listing=$(ls "$folder")
missing=$(printf '%s\n' "$named" | while read -r n; do grep -qixF -- "$n" <<<"$listing" || echo "$n"; done)
expect_true "each preview line names a drawing of the folder" test -z "$missing"

# The host's flat colour (RGB 0x40 0x80 0xB0) is nowhere in the thumbnail: the library drew the picture.
flat=$(python3 - "$WORK/flat.bmp" <<'EOF'
import struct, sys
data = open(sys.argv[1], "rb").read()
offset, = struct.unpack_from("<I", data, 10)
width, height, _, bits = struct.unpack_from("<iiHH", data, 18)
row = (width * 3 + 3) & ~3
hits = sum(1 for y in range(abs(height)) for x in range(width)
           if data[offset + y * row + x * 3: offset + y * row + x * 3 + 3] == bytes([0xB0, 0x80, 0x40]))
print(hits * 100 // (width * abs(height)))
EOF
)
echo "flat colour covers ${flat:-?}% of the first thumbnail"
expect_true "the library draws the picture itself, not the host's flat preview" test "${flat:-100}" -eq 0
complete_named=$(timing | awk '$3 == "preview" { n++ } END { print n + 0 }')
expect_true "the pictures painted from memory are marked as previews ($complete_named lines)" \
  test "$complete_named" -gt 0

finish
