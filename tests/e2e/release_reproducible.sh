#!/usr/bin/env bash
# ./release.sh on the commit checked out here, in two fresh clones in two different folders: the two zips
# must be the same bytes, with no time in the library's header or the zip's entries. The first clone's zip
# is kept as $RELEASE_TEST_DIR/release.zip, its commit in release.commit, for release_zip.sh, which tests it as it ships.
#
# The clones take the commit, not uncommitted changes: what ships is what is committed.
set -uo pipefail
: "${RELEASE_TEST_DIR:?folder for the clones}"
: "${ORVEX_VERSION:?the project version}"
: "${OBJDUMP:?objdump of the cross tools}"
ROOT=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)

failures=0
checks=0
pass() { checks=$((checks + 1)); echo "ok: $1"; }
fail() { checks=$((checks + 1)); failures=$((failures + 1)); echo "FAILED: $1"; }

commit=$(git -C "$ROOT" rev-parse HEAD) || { echo "FAILED: $ROOT is not a git checkout"; exit 1; }
rm -rf "$RELEASE_TEST_DIR"
mkdir -p "$RELEASE_TEST_DIR"
zip_name=Orvex1-$ORVEX_VERSION-win64.zip

for clone in first second; do
  dir="$RELEASE_TEST_DIR/$clone"
  git clone -q --no-checkout "$ROOT" "$dir" && git -C "$dir" checkout -q --detach "$commit" || {
    echo "FAILED: cloning $ROOT"; exit 1; }
  start=$(date +%s)
  # No compiler cache: a cached object made in the other clone would hide a build path in the objects.
  if CCACHE_DISABLE=1 ORVEX_SKIP_PACKAGES=1 "$dir/release.sh" >"$RELEASE_TEST_DIR/$clone.log" 2>&1; then
    pass "release.sh in the $clone clone ($(($(date +%s) - start)) s)"
  else
    fail "release.sh in the $clone clone"; tail -30 "$RELEASE_TEST_DIR/$clone.log"; exit 1
  fi
  [ -f "$dir/dist/$zip_name" ] && pass "the $clone clone wrote dist/$zip_name" ||
    { fail "the $clone clone wrote dist/$zip_name"; ls "$dir/dist"; exit 1; }
done

a="$RELEASE_TEST_DIR/first/dist/$zip_name"
b="$RELEASE_TEST_DIR/second/dist/$zip_name"
if cmp -s "$a" "$b"; then pass "the two zips are the same bytes"; else
  fail "the two zips are the same bytes"
  for z in "$a" "$b"; do (cd "$(dirname "$z")" && unzip -o -q "$zip_name" -d x && sha256sum x/*); done
fi

# The same bytes twice could still hold a time that happened to be the same: look for none.
entries=$(python3 - "$a" <<'PY'
import sys, zipfile
with zipfile.ZipFile(sys.argv[1]) as z:
    for i in z.infolist():
        print(i.filename, "%04d-%02d-%02d %02d:%02d:%02d" % i.date_time)
PY
)
names=$(awk '{print $1}' <<<"$entries" | tr '\n' ' ')
if [ "$names" == "CHANGELOG.md LICENSE.txt Orvex1.arx README.txt SHA256SUMS orvex-insert.lsp " ]; then
  pass "the zip holds the six files, sorted"
else
  fail "the zip holds the six files, sorted (got: $names)"
fi
if ! grep -qv ' 1980-01-01 00:00:00$' <<<"$entries"; then pass "every entry carries the fixed date"; else
  fail "every entry carries the fixed date"; printf '%s\n' "$entries"; fi

mkdir -p "$RELEASE_TEST_DIR/unpacked"
unzip -q -o "$a" Orvex1.arx -d "$RELEASE_TEST_DIR/unpacked"
header=$(TZ=UTC "$OBJDUMP" -p "$RELEASE_TEST_DIR/unpacked/Orvex1.arx" | grep '^Time/Date')
if grep -q '^Time/Date[[:space:]]*Thu Jan  1 00:00:00 1970$' <<<"$header" &&
   ! grep -qv '1970$\|[[:space:]]0$' <<<"$header"; then
  pass "the library's headers carry no link time"
else
  fail "the library's headers carry no link time: $header"
fi
if ! grep -aqF "$RELEASE_TEST_DIR" "$RELEASE_TEST_DIR/unpacked/Orvex1.arx"; then
  pass "the library names no folder of the build"
else
  fail "the library names no folder of the build"
fi

cp "$a" "$RELEASE_TEST_DIR/release.zip"
echo "$commit" >"$RELEASE_TEST_DIR/release.commit"
# The clones' build trees are large; the zip is all the next test needs.
rm -rf "$RELEASE_TEST_DIR/first" "$RELEASE_TEST_DIR/second" "$RELEASE_TEST_DIR/unpacked"

echo "$((checks - failures)) passed, $failures failed"
[ "$failures" -eq 0 ]
