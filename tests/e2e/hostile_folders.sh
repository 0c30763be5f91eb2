#!/usr/bin/env bash
# Folders a careless or hostile user gives the explorer: empty, unreadable, deleted while shown, a folder
# of many files, start paths of 259, 260 and 1,000 characters, a relative start path and one without its
# final backslash. The explorer shows what it can and says the rest; the host takes input again after
# every call. (bench/bench_big_folder.sh measures 100,000 and 1,000,000 files.)
. "$(dirname "$0")/lib.sh"

# checked_devhost ARGS...: one call with the host checks at the end of its script, then those checks.
checked_devhost() { devhost "$@"; calls=$((${calls:-0} + 1)); expect_host_usable "call $calls (${*: -1})"; }

# fresh_script LINE...: the script of one call, on no settings file: the drawing picked last would be
# chosen again and scrolled to.
fresh_script() { rm -f "$WORK/lib/Orvex1.ini"; script_with_host_checks "$@"; }

base="$WORK/hostilefolders"
mkdir -p "$base/empty" "$base/locked" "$base/going"
gen_dwg "$base/locked" 2 --variant 4
gen_dwg "$base/going" 3 --variant 6
call_on() { printf '(Orvex 1 2 "%s" "Insert" "Close")' "$1"; }
ready='wait contains=".dwg" timeout=20000'
shot() { printf 'screenshot contains="%s" nth=0 %s' "$1" "$(winpath "$WORK/$2.png")"; }
labels() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | head -1; }

# 1. An empty folder: an empty grid; Accept is greyed and its click does nothing; Close gives nil.
fresh_script 'wait contains="empty" timeout=20000' 'sleep 1000' 'count class=Edit contains=".dwg"' \
  "$(shot empty folders-empty)" 'enabled text="Insert"' 'click text="Insert"' 'sleep 500' 'click text="Close"'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$(call_on "$(lisppath "$base/empty")\\\\")"
expect_line "an empty folder shows no cell" "[script] count 0"
expect_line "an empty folder: Accept is greyed" "[script] enabled no"
expect_line "an empty folder: Close gives nil" "=> nil"

# 2. A folder that cannot be read: an empty grid, no crash; Escape gives nil.
# File modes do not bind root: there the folder is a link to itself, which no one can list either.
if [ "$(id -u)" -eq 0 ]; then rm -rf "$base/locked"; ln -s locked "$base/locked"; else chmod 000 "$base/locked"; fi
# The status bar says so, and the title (the explorer's name) does not name it as open.
fresh_script 'wait contains="Thumbnail Explorer" nth=0 timeout=20000' 'move contains="Thumbnail Explorer" nth=0' 'sleep 1000' \
  'count class=Edit contains=".dwg"' \
  'text class=msctls_statusbar32' 'text contains="Thumbnail Explorer" nth=0' \
  "screenshot contains=\"Thumbnail Explorer\" nth=0 $(winpath "$WORK/folders-unreadable.png")" 'key escape'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$(call_on "$(lisppath "$base/locked")\\\\")"
[ -L "$base/locked" ] || chmod 755 "$base/locked"
expect_line "an unreadable folder shows no cell" "[script] count 0"
expect_true "an unreadable folder is said in the status bar" \
  grep -q '^\[script\] text The folder cannot be read: .*locked' <(printf '%s\n' "$OUT")
expect_line "the title does not name the unreadable folder" "[script] text Kelmar Dwg Thumbnail Explorer"
expect_line "an unreadable folder: Escape gives nil" "=> nil"

# 3. A folder deleted while the grid shows it: repaints and new cell sizes go on, a pick is refused with a
#    message, the window stays, and Escape gives nil.
first=$(ls "$base/going" | head -1 | tr 'A-Z' 'a-z')
fresh_script "$ready" 'sleep 1000' "click text=\"$first\" at=60,-50" 'echo deleting' 'sleep 1000' \
  'key alt+v d' 'sleep 300' 'key alt+v i' 'sleep 300' 'key end' 'key home' "$(shot going folders-deleted)" \
  "double-click text=\"$first\" at=60,-50" 'wait class=#32770 text="Orvex1" timeout=5000' \
  'text class=#32770 text="Orvex1" > class=Static contains="no longer exists"' 'key enter' \
  'gone class=#32770 text="Orvex1" timeout=5000' 'exists contains="going" nth=0' 'key escape'
( for _ in $(seq 1 300); do
    grep -q 'deleting' "$WORK/script.log" 2>/dev/null && { rm -rf "$base/going"; break; }
    sleep 0.1
  done ) &
watcher=$!
OUT=$("$WINE_RUN" "$DEVHOST" --arx "$(winpath "$ARX")" --script "$(winpath "$WORK/script.txt")" \
      --eval "$(call_on "$(lisppath "$base/going")\\\\")" 2>"$WORK/stderr" | tee "$WORK/script.log" | tr -d '\r')
RC=${PIPESTATUS[0]}
wait "$watcher" 2>/dev/null
expect_host_usable "a folder deleted while shown"
[ ! -e "$base/going" ] && pass "the watcher deleted the folder" || fail "the folder is still there"
expect_true "a pick in the deleted folder is refused: the drawing no longer exists" \
  grep -q "^\[script\] text .*$first.*no longer exists" <(printf '%s\n' "$OUT")
expect_line "the window stays open after the message" "[script] exists yes"
expect_line "a folder deleted while shown: Escape gives nil" "=> nil"

# 4. A relative start path (to the host's current folder) and one without its final backslash (the
#    last part is then a file name: the explorer opens on the folder that holds it).
mkdir -p "$base/rel/inner"
gen_dwg "$base/rel" 2 --variant 8
gen_dwg "$base/rel/inner" 1 --variant 9
relname=$(ls "$base/rel" | grep -i dwg | head -1 | tr 'A-Z' 'a-z')
innername=$(ls "$base/rel/inner" | head -1 | tr 'A-Z' 'a-z')
pushd "$base" >/dev/null
fresh_script "$ready" 'sleep 500' "$(shot hostilefolders folders-relative)" "double-click text=\"$relname\" at=60,-50"
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "rel\\" "Insert" "Close")'
popd >/dev/null
expect_true "a relative start path opens its folder and a pick returns a full path" \
  grep -qxF "=> (\"$(lisppath "$base/rel")\\\\$relname\" (\"\" \"\" \"\"))" <(printf '%s\n' "$OUT")
fresh_script "$ready" 'sleep 500' 'count class=Edit contains=".dwg"' "$(shot rel folders-no-backslash)" \
  "double-click text=\"$relname\" at=60,-50"
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$(call_on "$(lisppath "$base/rel/inner")")"
expect_line "without the final backslash the folder that holds the last part is shown" "[script] count 2"
expect_line "... and picked from" "=> (\"$(lisppath "$base/rel")\\\\$relname\" (\"\" \"\" \"\"))"

# 5. Start paths of 260 and 1,000 characters are refused before anything is copied; one of 259 is taken,
#    and a folder too long for the scan's search pattern is said in the status bar.
for n in 260 1000; do
  long="Z:\\$(printf 'y%.0s' $(seq 1 $((n - 3))))"
  fresh_script
  checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "(Orvex 1 2 \"${long//\\/\\\\}\" \"Insert\" \"Close\")"
  expect_line "a start path of $n characters is refused on the command line" \
    "Orvex: the start path is too long ($n characters; at most 259)"
  expect_line "a start path of $n characters is refused in an alert" "[alert] \\nOrvex: an argument is too long"
  expect_line "a start path of $n characters leaves the result void" "=> (no value)"
done
deep=$base/deep
while [ ${#deep} -lt 200 ]; do deep="$deep/abcdefghij"; done
deep="$deep/$(printf 'z%.0s' $(seq 1 $((255 - ${#deep}))))"   # "Z:", the path, "\": 259 characters
mkdir -p "$deep"
gen_dwg "$deep" 1 --variant 3 --lower-case
deepwin="$(winpath "$deep")\\"
fresh_script 'wait contains="zzzz" nth=0 timeout=20000' 'sleep 1500' 'text class=msctls_statusbar32' \
  "$(shot zzzz folders-259)" 'count class=Edit contains=".dwg"' 'key escape'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$(call_on "${deepwin//\\/\\\\}")"
[ ${#deepwin} -eq 259 ] && pass "the deep start path has 259 characters" || fail "deep start path: ${#deepwin}"
expect_true "a start path of 259 characters is taken" \
  test "$(printf '%s\n' "$OUT" | grep -c 'too long')" -eq 0
expect_true "its folder, too long for the search pattern, is said in the status bar" \
  grep -q '^\[script\] text .*cannot be read.*258 characters' <(printf '%s\n' "$OUT")
expect_line "no cell is shown" "[script] count 0"
expect_line "a start path of 259 characters: Escape gives nil" "=> nil"

finish
