#!/usr/bin/env bash
# The release zip as it ships (release_reproducible.sh made it from the commit): unpacked into a folder
# whose path has a space and is 150 characters long, its library is loaded from there by the host, shows
# its version in the about box, gives a pick on the sample drawings and is unloaded; its version resource
# is read by a Windows program of its own; its LISP file is read whole by the host's LISP reader and the
# call of Orvex in it is made.
. "$(dirname "$0")/lib.sh"
: "${RELEASE_ZIP:?the zip release_reproducible.sh kept}"
: "${ORVEX_VERSION:?}" "${ORVEX_COPYRIGHT:?}" "${VERSION_PROBE:?}"

# The commit the zip was made of (the checkout may have moved on since).
commit=$(cat "$(dirname "$RELEASE_ZIP")/release.commit") || { echo "FAILED: no release.commit beside the zip"; exit 1; }

# ---- unpacked where a CAD manager might put it --------------------------------------------------------
dir="$WORK/CAD tools"
while [ ${#dir} -lt 140 ]; do dir="$dir/Orvex1"; done
dir="$dir/$(printf 'x%.0s' $(seq $((150 - ${#dir} - 1 - 2))))" # 150 with Wine's "Z:" in front
win_dir=$(winpath "$dir")
expect_true "the folder's Windows path has a space and is 150 characters long ($win_dir)" \
  test "${#win_dir}" -eq 150 -a "${win_dir/ /}" != "$win_dir"
mkdir -p "$dir"
python3 -m zipfile -e "$RELEASE_ZIP" "$dir" || fail "the zip unpacks"
expect_true "the checksums of SHA256SUMS hold" bash -c "cd \"$dir\" && sha256sum --quiet -c SHA256SUMS"
expect_true "no file of the build, the tests or devhost" \
  test "$(ls "$dir" | tr '\n' ' ')" == "CHANGELOG.md LICENSE.txt Orvex1.arx README.txt SHA256SUMS orvex-insert.lsp "
expect_true "README.txt names the version" grep -q "^Orvex1 $ORVEX_VERSION - " "$dir/README.txt"
expect_true "the licence carries the copyright line" grep -qF "$ORVEX_COPYRIGHT" "$dir/LICENSE.txt"
expect_true "CHANGELOG.md is the repository's" \
  bash -c "tr -d '\r' <\"$dir/CHANGELOG.md\" | cmp -s - <(git -C \"$ROOT\" show $commit:CHANGELOG.md)"
ARX="$dir/Orvex1.arx"

# ---- the version resource, read as the system's file properties read it --------------------------------
probe=$("$WINE_RUN" "$VERSION_PROBE" "$(winpath "$ARX")" 2>&1 | tr -d '\r')
expected="fixed-file-version $ORVEX_VERSION.0
fixed-product-version $ORVEX_VERSION.0
file-type 2
translation 040904b0
CompanyName=The Orvex1 developers
FileDescription=Orvex1 drawing thumbnail explorer
FileVersion=$ORVEX_VERSION
InternalName=Orvex1
LegalCopyright=$ORVEX_COPYRIGHT
OriginalFilename=Orvex1.arx
ProductName=Orvex1
ProductVersion=$ORVEX_VERSION"
if [ "$probe" == "$expected" ]; then pass "the version resource's fields"; else
  fail "the version resource's fields"; echo "--- expected"; echo "$expected"; echo "--- got"; echo "$probe"; fi

# ---- loaded from there: the about box, a pick on the sample drawings, unloaded -------------------------
drawings="$WORK/drawings"
mkdir -p "$drawings"
if [ -d "$ROOT/../shared/dwg-samples/2018" ]; then
  cp "$ROOT/../shared/dwg-samples/2018/"*.dwg "$drawings/"
  pick=$(ls "$drawings" | head -1)
else
  echo "note: ../shared/dwg-samples is absent; the pick is made on generated drawings"
  gen_dwg "$drawings" 3 --variant 11
  pick=$(ls "$drawings" | head -1)
fi
lower_pick=$(tr 'A-Z' 'a-z' <<<"$pick")
cat >"$WORK/about.txt" <<SCRIPT
wait text="$lower_pick" timeout=30000
key alt+h
key a
wait class=#32770 text="About Orvex1" timeout=10000
text class=#32770 text="About Orvex1" > id=1000
text class=#32770 text="About Orvex1" > id=1002
screenshot class=#32770 text="About Orvex1" $WORK/about.png
click class=#32770 text="About Orvex1" > id=1
gone class=#32770 text="About Orvex1" visible=any
double-click text="$lower_pick" at=60,-50
SCRIPT
devhost --verbose --script "$(winpath "$WORK/about.txt")" \
  --eval "(Orvex 1 2 \"$(lisppath "$drawings")\\\\\" \"Insert\" \"Close\")"
expect_line "the library is loaded from the folder" "[host] loaded $win_dir\\Orvex1.arx"
expect_line "the about box's first line" "[script] text Orvex1"
expect_line "the about box's second line: the version and the commit" \
  "[script] text Version $ORVEX_VERSION (commit ${commit:0:12})"
expect_line "a pick on the sample drawings" "=> (\"$(lisppath "$drawings")\\\\$lower_pick\" (\"\" \"\" \"\"))"
expect_line "the library is unloaded" "[host] unloading $win_dir\\Orvex1.arx"
expect_true "devhost ends well" test "$RC" -eq 0
expect_true "the settings file is written beside the library" test -f "$dir/Orvex1.ini"

# ---- the LISP file: read whole by the host's reader, its call of Orvex made ----------------------------
lsp=$(winpath "$dir/orvex-insert.lsp")
devhost --load "$lsp"
expect_line "the LISP file reads whole" "[load] $lsp: 1 forms"
expect_line "it defines the command DWGLIB" "[load] defun c:dwglib"
call=$(sed -n 's/^\[load\] call \((Orvex .*)\) (line [0-9]*)$/\1/p' <<<"$OUT")
expect_true "its one call of Orvex has constant arguments" test "$(grep -c '^\[load\] call' <<<"$OUT")" -eq 1 -a -n "$call"
expect_true "the call is the one docs/lisp.md explains" test "$call" == '(Orvex 1 2 "C:\\Drawings\\Doors\\" "Insert" "Close")'
devhost --after-ms 1500 --post cancel --eval "$call"
expect_output "the library takes the call's arguments (cancelled: nil)" "=> nil"

finish
