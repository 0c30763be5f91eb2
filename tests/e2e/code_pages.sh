#!/usr/bin/env bash
# Japanese, Chinese and Korean names as a user in Japan, China, Taiwan or Korea meets them: Wine runs each
# call in the code page of its locale (932, 936, 950, 949), where the second byte of 表 ソ 能 運 功 許 is "\"
# (0x5C). Folders ending in such a character are opened and picked from (never their parent's drawings),
# the tree walks through ソフト, drawings are copied, pasted, deleted and renamed there, the saved name's
# search text is whole, a folder's settings in 運 are read with the pick, and folders are sorted and
# searched by the locale's order (Korean, Chinese, full-width Japanese letters, digits by value).
# Wine takes each program's code page from LANG when it starts (the probe below checks it); tools/wine-run
# runs the CJK locales in a prefix of their own whose interface font links to the CJK font that
# tools/ensure-packages installs (with the locales).
. "$(dirname "$0")/lib.sh"

: "${CODEPAGE_PROBE:?path of codepage_probe.exe}"

# Wine's trash (a delete below) is the desktop's (XDG): this test's own. Wine's services read it when
# they start, so the test waits for the Wine of an earlier test to end before its first Windows program,
# in both prefixes (tools/wine-run runs the CJK locales in one of their own).
export XDG_DATA_HOME="$WORK/xdg"
mkdir -p "$XDG_DATA_HOME"
for prefix in "$ROOT/build/wineprefix" "$ROOT/build/wineprefix-cjk"; do
  WINEPREFIX="${WINEPREFIX:-$prefix}" "$(command -v wineserver || echo /usr/lib/wine/wineserver)" -w 2>/dev/null || true
done

# in_locale LOCALE COMMAND...: runs a command (a shell function too) with Wine in that locale.
in_locale() {
  local LANG=$1 LC_ALL=$1
  export LANG LC_ALL
  shift
  "$@"
}

# The machine must have the locales, or Wine falls back to the Western code page and these checks would
# test nothing: each locale gives its code page.
for pair in ja_JP.UTF-8=932 zh_CN.UTF-8=936 zh_TW.UTF-8=950 ko_KR.UTF-8=949 C.UTF-8=1252; do
  acp=$(in_locale "${pair%=*}" "$WINE_RUN" "$CODEPAGE_PROBE" 2>/dev/null | tr -d '\r')
  if [ "$acp" != "acp ${pair#*=}" ]; then
    fail "Wine runs ${pair%=*} in code page ${pair#*=} (got '$acp'; tools/ensure-packages generates the locales)"
    finish
    exit 1
  fi
done
pass "Wine runs each locale in its code page (932, 936, 950, 949, 1252)"
if ! fc-list 2>/dev/null | grep -qi 'wqy\|cjk'; then
  echo "note: no CJK font is installed (tools/ensure-packages installs one): the screenshots show boxes"
fi

base="$WORK/orvexcjk"
samples="$ROOT/../shared/dwg-samples"
# drawing FILE...: a drawing with a preview at each path.
drawing() {
  local f
  for f in "$@"; do
    mkdir -p "$(dirname "$f")"
    if [ -f "$samples/MANIFEST.csv" ]; then
      cp "$samples/2000/Arc.dwg" "$f"
    else
      [ -f "$WORK/gen-one.dwg" ] || { gen_dwg "$WORK/gen" 1 && mv "$WORK/gen"/* "$WORK/gen-one.dwg"; }
      cp "$WORK/gen-one.dwg" "$f"
    fi
  done
}
[ -f "$samples/MANIFEST.csv" ] || echo "note: ../shared/dwg-samples is absent; synthetic drawings stand in for the real ones"

frame='contains="orvexcjk" nth=0'
tree='class=SysTreeView32'
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$1"; }
call_at() { printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$1")"; }
shot() { printf 'screenshot %s %s' "$frame" "$(winpath "$WORK/$1.png")"; }
labels() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] text \(.*\.dwg\)$/\1/p' | tr '\n' ' ' | sed 's/ $//'; }
counts() { printf '%s\n' "$OUT" | sed -n 's/^\[script\] count //p' | tr '\n' ' ' | sed 's/ $//'; }
ini_value() { tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n "s/^$1=//p"; }
has() { grep -q -- "$2" <<<"$1"; }
on_disk() { (cd "$1" && ls | LC_ALL=C sort | tr '\n' ' ' | sed 's/ $//'); }
# The result list's path as devhost prints it.
picked() { printf '%s' "$(lisppath "$1")"; }
# ini FILE CODEPAGE LAYER COLOR COMMAND: a folder's settings file in the code page the library reads it in.
ini() {
  printf '[Default Parameters]\r\nLayer=%s\r\nColor=%s\r\nLisp command=%s\r\n' "$3" "$4" "$5" |
    iconv -f UTF-8 -t "$2" >"$1"
}

# --- 936: a start folder ending in 運, its settings, the pick -------------------------------------------
lib936="$base/cn/lib"
drawing "$lib936/運輸.dwg" "$lib936/運/plan.dwg" "$lib936/運/門.dwg"
ini "$lib936/運/datains.ini" CP936 "墙" 3 "(c:ins)"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       'text class=Edit contains=".dwg" nth=0' 'text class=Edit contains=".dwg" nth=1' "$(shot cp936-start)" \
       'double-click class=Edit text="plan.dwg" at=60,-50'
in_locale zh_CN.UTF-8 run "$(call_at "$lib936/運")"
expect_line "936: the folder ending in 運 shows its own two drawings, not its parent's 運輸.dwg" "[script] count 2"
expect_true "936: its labels are whole (got $(labels))" [ "$(labels)" == "plan.dwg 門.dwg" ]
expect_line "936: the pick returns the drawing of 運 with 運's settings" \
  "=> (\"$(picked "$lib936/運/plan.dwg")\" (\"墙\" \"3\" \"(c:ins)\"))"

# The folder's settings edited in 運 from the tree's menu: the dialog shows 運's layer, writes 運\datains.ini
# in the code page (not 運datains.ini beside it), the toolbar and the pick follow.
shell936=$(ini_value ShellPath | iconv -f CP936 -t UTF-8)
expect_true "936: the tree's label path ends in 運 (got $shell936)" [ "${shell936##*\\}" == "運" ]
dialog='class=#32770 contains="Folder settings"'
erase7=('key backspace' 'key backspace' 'key backspace' 'key backspace' 'key backspace' 'key backspace' 'key backspace')
script 'wait contains=".dwg" timeout=30000' "tree-right-click $tree path=\"$shell936\"" 'wait class=#32768 timeout=5000' \
       'click class=#32768 at=30,10' "wait $dialog timeout=5000" "text $dialog > id=1017" \
       "click $dialog > id=201" 'key end' "${erase7[@]}" 'type "(c:door)"' \
       "screenshot $dialog $(winpath "$WORK/cp936-folder-settings.png")" "click $dialog > id=1" \
       "gone $dialog timeout=5000" 'sleep 300' 'text contains="Layer name:"' "$(shot cp936-settings-saved)" \
       'double-click class=Edit text="門.dwg" at=60,-50'
in_locale zh_CN.UTF-8 run "$(call_at "$lib936/運")"
expect_line "936: the dialog shows 運's layer" "[script] text 墙"
expect_line "936: the toolbar shows it after Accept" "[script] text  Layer name: 墙"
expect_true "936: 運\\datains.ini holds the new command ($(iconv -f CP936 -t UTF-8 <"$lib936/運/datains.ini" | tr -d '\r' | tr '\n' '|'))" \
  grep -q '^Lisp command=(c:door)' "$lib936/運/datains.ini"
expect_true "936: and nothing was written beside 運 ($(on_disk "$lib936"))" [ "$(on_disk "$lib936")" == "運 運輸.dwg" ]
expect_line "936: the pick returns 門.dwg with 運's new settings" \
  "=> (\"$(picked "$lib936/運/門.dwg")\" (\"墙\" \"3\" \"(c:door)\"))"

# The settings file is written in the code page of the run that saved it: each locale starts afresh.
rm -f "$WORK/lib/Orvex1.ini"
# --- 950: a start folder ending in 功: Delete there and the pick; then Copy and Paste ----------------------
lib950="$base/tw/lib"
drawing "$lib950/功能.dwg" "$lib950/功/功能.dwg" "$lib950/功/arc.dwg" "$lib950/許/x.dwg"
ini "$lib950/功/datains.ini" CP950 "牆" 5 ""
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       'right-click class=Edit text="arc.dwg" at=60,-50' 'sleep 300' 'key d' \
       'wait class=#32770 > class=Button contains="&Y" timeout=10000' \
       "screenshot class=#32770 $(winpath "$WORK/cp950-delete-asked.png")" \
       'click class=#32770 > class=Button contains="&Y"' \
       'gone class=Edit text="arc.dwg" timeout=10000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       "$(shot cp950-after-delete)" 'double-click class=Edit text="功能.dwg" at=60,-50'
in_locale zh_TW.UTF-8 run "$(call_at "$lib950/功")"
expect_true "950: the folder ending in 功 shows its own two drawings, then one after the delete (got $(counts))" \
  [ "$(counts)" == "2 1" ]
expect_true "950: Delete took arc.dwg out of 功 ($(on_disk "$lib950/功"))" [ "$(on_disk "$lib950/功")" == "datains.ini 功能.dwg" ]
# The shell asked in the locale's language ("Yes" is "是(&Y)"); the trash knows the path it was given.
expect_true "950: and put it in the trash" [ -f "$XDG_DATA_HOME/Trash/files/arc.dwg" ]
trashed=$(python3 -c 'import sys, urllib.parse; print(urllib.parse.unquote(open(sys.argv[1]).read()))' \
          "$XDG_DATA_HOME/Trash/info/arc.dwg.trashinfo" 2>/dev/null)
expect_true "950: as 功/arc.dwg" has "$trashed" "^Path=.*/tw/lib/功/arc.dwg$"
expect_true "950: the parent's 功能.dwg is untouched" [ -f "$lib950/功能.dwg" ]
expect_line "950: the pick returns 功\\功能.dwg with 功's settings (not 功datains.ini)" \
  "=> (\"$(picked "$lib950/功/功能.dwg")\" (\"牆\" \"5\" \"\"))"
shell950=$(ini_value ShellPath | iconv -f CP950 -t UTF-8)
to950="${shell950%\\*}\\許"
expect_true "950: the tree's label path ends in 功 (got $shell950)" [ "${shell950##*\\}" == "功" ]
script 'wait contains=".dwg" timeout=30000' 'click class=Edit text="功能.dwg" at=60,-50' 'key ctrl+c' 'clipboard-files' \
       "tree-select $tree path=\"$to950\"" 'wait class=Edit text="x.dwg" timeout=10000' \
       'click class=Edit text="x.dwg" at=60,-50' 'key ctrl+v' 'wait class=Edit text="功能.dwg" timeout=10000' \
       'sleep 300' 'count class=Edit contains=".dwg"' "$(shot cp950-pasted)" 'key escape'
in_locale zh_TW.UTF-8 run "$(call_at "$lib950/功")"
expect_line "950: Copy put 功\\功能.dwg on the clipboard (not 功功能.dwg)" \
  "[script] clipboard-file $(winpath "$lib950/功/功能.dwg" | sed 's/\\/\\\\/g')"
expect_true "950: Paste in 許 copied it there ($(on_disk "$lib950/許"))" [ "$(on_disk "$lib950/許")" == "x.dwg 功能.dwg" ]
expect_true "950: the copy is the same file" cmp -s "$lib950/功/功能.dwg" "$lib950/許/功能.dwg"
expect_line "950: the grid of 許 shows both" "[script] count 2"

rm -f "$WORK/lib/Orvex1.ini"
# --- 932: the tree through ソフト to 図表, renames to and from ソフト.dwg, the saved name's search text -------
lib932="$base/jp/lib"
drawing "$lib932/ソフト/図表一覧.dwg" "$lib932/ソフト/図表/表示.dwg" "$lib932/ソフト/図表/能力.dwg"
script 'wait contains=".dwg" timeout=30000' 'sleep 500' 'count class=Edit contains=".dwg"' "tree-items $tree" \
       "$(shot cp932-start)" \
       'double-click class=Edit text="表示.dwg"' 'clipboard-text "ソフト.dwg"' 'key ctrl+v' 'key enter' \
       'wait class=Edit text="ソフト.dwg" timeout=10000' 'sleep 300' 'count class=Edit text="ソフト.dwg"' \
       "$(shot cp932-renamed)" \
       'double-click class=Edit text="ソフト.dwg"' 'clipboard-text "表示.dwg"' 'key ctrl+v' 'key enter' \
       'wait class=Edit text="表示.dwg" timeout=10000' 'sleep 300' 'count class=Edit text="表示.dwg"' \
       'double-click class=Edit text="表示.dwg" at=60,-50'
in_locale ja_JP.UTF-8 run "$(call_at "$lib932/ソフト/図表")"
expect_true "932: the folder ending in 図表 shows its own two drawings, not ソフト's 図表一覧.dwg; then the renamed label, and the old one back (got $(counts))" \
  [ "$(counts)" == "2 1 1" ]
expect_true "932: the tree walked through ソフト and selected 図表" \
  has "$OUT" '^\[script\] tree-item [0-9]* 図表 \(expanded \)\?selected'
expect_true "932: ソフト is open above it" has "$OUT" '^\[script\] tree-item [0-9]* ソフト expanded$'
expect_true "932: the renames to ソフト.dwg and back went through ($(on_disk "$lib932/ソフト/図表"))" \
  [ "$(on_disk "$lib932/ソフト/図表")" == "能力.dwg 表示.dwg" ]
expect_true "932: no message refused them" bash -c '! grep -q "Cannot rename" <<<"$1"' _ "$OUT"
expect_line "932: the pick returns 図表\\表示.dwg" "=> (\"$(picked "$lib932/ソフト/図表/表示.dwg")\" (\"\" \"\" \"\"))"
expect_true "932: the saved name is the drawing's ($(ini_value Name | iconv -f CP932 -t UTF-8))" \
  [ "$(ini_value Name | iconv -f CP932 -t UTF-8)" == "表示.dwg" ]

# Reopened without a start path: the saved drawing's name without .dwg is the search text, whole; text
# pasted into the search (typing it through Wine's ANSI edit cannot enter such characters) finds 能力.dwg.
# The edit's own menu pastes: Ctrl+V is the explorer's Paste of drawing files.
search='id=32790'
# The settings as that pick left them, written here so this part stands on its own.
printf '[CurrentPath]\r\nPath=%s\r\nName=%s\r\n' "$(winpath "$lib932/ソフト/図表")" "表示.dwg" | iconv -f UTF-8 -t CP932 \
  >"$WORK/lib/Orvex1.ini"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' "text $search" \
       "click $search" 'key end' 'key backspace' 'key backspace' 'clipboard-text "能"' \
       "right-click $search" 'sleep 300' 'key p' 'sleep 300' \
       "text $search" "$(shot cp932-search)" 'click text="Insert"'
in_locale ja_JP.UTF-8 run '(Orvex 1 2 "" "Insert" "Close")'
expect_line "932: 表示.dwg reopens with the search text 表示" "[script] text 表示"
expect_line "932: 能 pasted into the search edit" "[script] text 能"
expect_line "932: the search chose 能力.dwg, which accept returns" \
  "=> (\"$(picked "$lib932/ソフト/図表/能力.dwg")\" (\"\" \"\" \"\"))"

# A tooltip shows name, size and date on three lines: a Japanese name whole on its line, the tooltip as
# high as an English name's.
drawing "$lib932/tips/ソフトウェア設計図.dwg" "$lib932/tips/software-plan.dwg"
hover() { printf '%s\n' "move class=Edit text=\"$1\" at=60,-50" 'sleep 300' "move class=Edit text=\"$1\" at=70,-55" \
  'sleep 1500' 'tooltip' 'rect class=tooltips_class32'; }
script 'wait contains=".dwg" timeout=30000' "$(hover "ソフトウェア設計図.dwg")" \
       "screenshot class=tooltips_class32 $(winpath "$WORK/cp932-tooltip.png")" "$(shot cp932-tooltip-frame)" \
       'move class=Edit text="software-plan.dwg" at=60,10' 'sleep 500' "$(hover "software-plan.dwg")" \
       "screenshot class=tooltips_class32 $(winpath "$WORK/cp932-tooltip-ascii.png")" 'key escape'
in_locale ja_JP.UTF-8 run "$(call_at "$lib932/tips")"
heights=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] rect [-0-9]* [-0-9]* [0-9]* \([0-9]*\)$/\1/p' | tr '\n' ' ' | sed 's/ $//')
tips=$(printf '%s\n' "$OUT" | sed -n 's/^\[script\] tooltip //p')
expect_true "932: the tooltips name their drawings (got $(tr '\n' '|' <<<"$tips"))" \
  [ "$(sed -n 1p <<<"$tips" | sed 's/\\r\\n.*//')" == "ソフトウェア設計図.dwg" ]
expect_true "932: a Japanese name's tooltip is as high as an English one's (got heights $heights)" \
  bash -c '[ $# -eq 2 ] && [ "$1" -eq "$2" ]' _ $heights

rm -f "$WORK/lib/Orvex1.ini"
# --- 949: a Korean folder listed and sorted by name ------------------------------------------------------
# By the locale's order, as the system's file manager lists them: Latin letters first, then the syllables
# in their Korean order. 갂 and 똠 are in the code page's extension range (lead bytes 0x81-0xA0): by bytes
# they came before 도면 and 한국.
lib949="$base/kr/lib"
drawing "$lib949/도면.dwg" "$lib949/한국.dwg" "$lib949/갂.dwg" "$lib949/똠.dwg" "$lib949/zz.dwg"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'count class=Edit contains=".dwg"' \
       'text class=Edit contains=".dwg" nth=0' 'text class=Edit contains=".dwg" nth=1' \
       'text class=Edit contains=".dwg" nth=2' 'text class=Edit contains=".dwg" nth=3' \
       'text class=Edit contains=".dwg" nth=4' "$(shot cp949-sorted)" 'key escape'
in_locale ko_KR.UTF-8 run "$(call_at "$lib949")"
expect_line "949: the five drawings are shown" "[script] count 5"
expect_true "949: their labels are whole, in the Korean order (got $(labels))" \
  [ "$(labels)" == "zz.dwg 갂.dwg 도면.dwg 똠.dwg 한국.dwg" ]

# --- 936: a GBK extension character among the common ones ------------------------------------------------
# 丂 (kao, 0x81 0x40) is a GBK extension character: by bytes it came before every common one; by the
# locale's order it stands between 安 (an) and 一 (yi).
lib936s="$base/cn/sorted"
drawing "$lib936s/一.dwg" "$lib936s/丂.dwg" "$lib936s/安.dwg"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'text class=Edit contains=".dwg" nth=0' \
       'text class=Edit contains=".dwg" nth=1' 'text class=Edit contains=".dwg" nth=2' "$(shot cp936-sorted)" \
       'key escape'
in_locale zh_CN.UTF-8 run "$(call_at "$lib936s")"
expect_true "936: 丂 sorts between 安 and 一, not before them (got $(labels))" [ "$(labels)" == "安.dwg 丂.dwg 一.dwg" ]

rm -f "$WORK/lib/Orvex1.ini"
# --- 932: a full-width name found by its half-width letters ------------------------------------------------
# Ｂｏｘ.dwg is written in full-width letters; typing "b" on the keyboard finds it, as the file manager does,
# and full-width "ｃ" pasted into the search finds c.dwg. Full-width letters sort with their half-width
# ones, and runs of digits by value (２ before 10).
lib932w="$base/jp/wide"
drawing "$lib932w/a.dwg" "$lib932w/Ｂｏｘ.dwg" "$lib932w/c.dwg" "$lib932w/d10.dwg" "$lib932w/d２.dwg"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'text class=Edit contains=".dwg" nth=0' \
       'text class=Edit contains=".dwg" nth=1' 'text class=Edit contains=".dwg" nth=2' \
       'text class=Edit contains=".dwg" nth=3' 'text class=Edit contains=".dwg" nth=4' \
       "click $search" 'clipboard-text "ｃ"' "right-click $search" 'sleep 300' 'key p' 'sleep 300' \
       "text $search" 'text contains="orvexcjk" nth=0' \
       "click $search" 'key end' 'key shift+home' 'type "b"' 'sleep 300' "text $search" "$(shot cp932-search-wide)" \
       'click text="Insert"'
in_locale ja_JP.UTF-8 run "$(call_at "$lib932w")"
labels932=$(labels | cut -d' ' -f1-5) # then the title, which names the drawing chosen
expect_true "932: full-width Ｂ sorts with b, d２ before d10 (got $labels932)" \
  [ "$labels932" == "a.dwg Ｂｏｘ.dwg c.dwg d２.dwg d10.dwg" ]
expect_line "932: full-width ｃ pasted into the search" "[script] text ｃ"
expect_true "932: and it chose c.dwg, which the title names" has "$OUT" '^\[script\] text .*\\c\.dwg$'
expect_line "932: b typed into the search" "[script] text b"
expect_line "932: b chose Ｂｏｘ.dwg, which accept returns" \
  "=> (\"$(picked "$lib932w/Ｂｏｘ.dwg")\" (\"\" \"\" \"\"))"

rm -f "$WORK/lib/Orvex1.ini"
# --- 1252: runs of digits by value ------------------------------------------------------------------------
lib1252="$base/west/doors"
drawing "$lib1252/door-1000.dwg" "$lib1252/door-900.dwg" "$lib1252/Door-90.dwg" "$lib1252/étage.dwg" "$lib1252/f.dwg"
script 'wait contains=".dwg" timeout=30000' 'sleep 300' 'text class=Edit contains=".dwg" nth=0' \
       'text class=Edit contains=".dwg" nth=1' 'text class=Edit contains=".dwg" nth=2' \
       'text class=Edit contains=".dwg" nth=3' 'text class=Edit contains=".dwg" nth=4' "$(shot cp1252-sorted)" \
       'key escape'
in_locale C.UTF-8 run "$(call_at "$lib1252")"
expect_true "1252: door-90, door-900, door-1000 by value, étage before f (not after it, as its byte 0xE9) (got $(labels))" \
  [ "$(labels)" == "door-90.dwg door-900.dwg door-1000.dwg étage.dwg f.dwg" ]

finish
