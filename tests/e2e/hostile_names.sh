#!/usr/bin/env bash
# File names the system's code page holds and names it cannot, two names differing only in case, and
# names that look alike: a pick returns a path that names the file the user chose, or the user is told
# and the window stays open. The host takes input again after every call.
. "$(dirname "$0")/lib.sh"

# checked_devhost ARGS...: one call with the host checks at the end of its script, then those checks.
checked_devhost() { devhost "$@"; calls=$((${calls:-0} + 1)); expect_host_usable "call $calls (${*: -1})"; }

# fresh_script LINE...: the script of one call, on no settings file: the drawing picked last would be
# chosen again and scrolled to.
fresh_script() { rm -f "$WORK/lib/Orvex1.ini"; script_with_host_checks "$@"; }

folder="$WORK/hostilenames"
gen_dwg "$folder" 1 --variant 2
sample="$folder/$(ls "$folder" | head -1)"
for name in 'café-été.dwg' 'чертёж.dwg' 'łuk.dwg' 'luk.dwg' 'Plan.dwg' 'plan.dwg' 'rn-0.dwg' 'm-O.dwg'; do
  cp "$sample" "$folder/$name"
done
rm "$sample"
start="$(lisppath "$folder")\\\\"
call="(Orvex 1 2 \"$start\" \"Insert\" \"Close\")"
prefix="$(lisppath "$folder")\\\\"
frame='contains="hostilenames" nth=0'
ready='wait contains=".dwg" timeout=20000'
box='class=#32770 text="Orvex1"'
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1.png")"; }

# refused NAME-OF-SHOT THUMBNAIL WORDS...: a double click on the thumbnail brings the message box that
# holds WORDS; Enter closes it and the window is still open.
refused() {
  local name=$1 thumb=$2 words=$3
  printf '%s\n' "double-click $thumb at=60,-50" "wait $box timeout=5000" \
    "text $box > class=Static contains=\"$words\"" \
    "screenshot $box $(winpath "$WORK/$name.png")" 'key enter' "gone $box timeout=5000" "exists $frame"
}

# 1. The grid: every name has its cell; then names the code page holds, and plain look-alikes, are picked.
fresh_script "$ready" 'sleep 1000' 'count class=Edit contains=".dwg"' "$(shot names-grid)" \
  'double-click text="café-été.dwg" at=60,-50'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "each of the 8 names has its cell" "[script] count 8"
expect_line "a name of the code page's letters is picked as it is" "=> (\"${prefix}café-été.dwg\" (\"\" \"\" \"\"))"
for look in rn-0.dwg m-o.dwg; do
  fresh_script "$ready" "double-click text=\"$look\" at=60,-50"
  checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
  expect_line "the look-alike $look is picked as itself" "=> (\"$prefix$look\" (\"\" \"\" \"\"))"
done

# 2. Names the code page cannot hold: Cyrillic letters come out as question marks, a Polish l with stroke
#    as a plain l beside the file really named so. None is returned; each pick says why.
mapfile -t lines < <(refused names-foreign 'text="??????.dwg"' "code page cannot hold the letters"
  refused names-lookalike-1 'text="luk.dwg" nth=0' "code page cannot hold the letters"
  refused names-lookalike-2 'text="luk.dwg" nth=1' "code page cannot hold the letters"
  echo 'key escape')
fresh_script "$ready" 'sleep 500' "${lines[@]}"
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
n=$(printf '%s\n' "$OUT" | grep -c "^\[script\] text .*code page cannot hold the letters")
[ "$n" -eq 3 ] && pass "the three picks whose path would name no file or another one are refused and said" ||
  fail "refusals said: $n"$'\n'"$OUT"
[ "$(printf '%s\n' "$OUT" | grep -cx '\[script\] exists yes')" -eq 3 ] &&
  pass "the window stays open after each message" || fail "the window closed"
expect_line "no path is returned: Escape gives nil" "=> nil"

# 3. Two names differing only in case (a case-sensitive folder): the listed name fits both files.
mapfile -t lines < <(refused names-case-1 'text="plan.dwg" nth=0' "other letter case"
  refused names-case-2 'text="plan.dwg" nth=1' "other letter case"; echo 'key escape')
fresh_script "$ready" 'sleep 500' 'count class=Edit text="plan.dwg"' "${lines[@]}"
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "both files have a cell of their own" "[script] count 2"
n=$(printf '%s\n' "$OUT" | grep -c "^\[script\] text .*plan.dwg.*other letter case")
[ "$n" -eq 2 ] && pass "a pick of either is refused and said" || fail "refusals said: $n"$'\n'"$OUT"
expect_line "no path is returned: Escape gives nil" "=> nil"

# 4. Once one of them is renamed, the other is picked.
mv "$folder/Plan.dwg" "$folder/plan-old.dwg"
fresh_script "$ready" 'double-click text="plan.dwg" at=60,-50'
checked_devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "the name left alone is picked" "=> (\"${prefix}plan.dwg\" (\"\" \"\" \"\"))"

finish
