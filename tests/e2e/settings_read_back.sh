#!/usr/bin/env bash
# Settings are never written in a form the program cannot read back. A start path holding a line break is
# refused before anything opens (before, Orvex1.ini gained a [View] section of the folder's name and every
# later close refused to save); the folder settings dialog takes no longer LISP command than datains.ini
# reads back and says so (before, 2,158 characters were saved, the next pick lost the command and colour,
# and every later Accept in that folder was refused).
. "$(dirname "$0")/lib.sh"

ini="$WORK/lib/Orvex1.ini"
root="$WORK/readback"
folder="$root/doors"
gen_dwg "$folder" 1 --variant 3
for f in "$folder"/*; do mv "$f" "$folder/x.dwg"; done
[ -f "$folder/x.dwg" ] && pass "a folder with one drawing, x.dwg" || fail "generator: $(cat "$WORK/gen.err")"
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
shot() { winpath "$WORK/$1"; }
ini_value() { tr -d '\r' <"$ini" 2>/dev/null | sed -n "s/^$1=//p"; }
call=$(printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$folder")")

# 1. A start path with a line break: refused on the command line and in an alert; no window; the settings
#    file is left as it was, and the next call opens and saves as usual.
printf '[CurrentPath]\r\nPath=%s\r\nName=\r\nShellPath=\r\n\r\n[Size]\r\nSplitterSize=150\r\nWindowWidth=900\r\nWindowHeight=600\r\n\r\n' \
  "$(winpath "$folder")" >"$ini"
cp "$ini" "$WORK/ini.saved"
script 'sleep 500' 'count contains="Thumbnail Explorer"'
devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "Z:\\dwg\r\n[View]\r\nx\\" "Insert" "Close")'
expect_line "a start path with a line break is refused on the command line" \
  "Orvex: the start path holds a control character (code 13 at character 7); it is refused"
expect_line "... and in an alert" "[alert] \\nOrvex: the start path holds a control character"
expect_line "... before any window opens" "[script] count 0"
expect_line "... and the call returns as the other refusals do" "=> (no value)"
if cmp -s "$ini" "$WORK/ini.saved"; then pass "Orvex1.ini is left as it was"; else fail "Orvex1.ini changed"; cat -A "$ini"; fi

script 'wait contains="x.dwg" timeout=30000' "screenshot contains=\"doors\" nth=0 $(shot after-refused-path.png)" \
       'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval '(Orvex 1 2 "" "Insert" "Close")'
expect_line "the next call opens the saved folder and ends" "=> nil"
n=$(tr -d '\r' <"$ini" | grep -c '^\[View\]$')
[ "$n" -eq 1 ] && pass "the settings file has one [View] section" || fail "[View] sections: $n"
expect_true "and its close was saved (window width $(ini_value WindowWidth))" [ -n "$(ini_value WindowWidth)" ]
if tr -d '\r' <"$ini" | grep -q '^Path=.*doors$'; then pass "the folder is kept"; else fail "Path: $(ini_value Path)"; fi

# 2. The folder settings dialog: a typed command stops at the longest datains.ini reads back (2,034
#    characters after "Lisp command="), a note under it says so, Accept saves it, and the pick returns the
#    whole command and the colour after it.
label=$(ini_value ShellPath)
expect_true "the tree's label path of the folder is known ($label)" [ "${label##*\\}" == "doors" ]
tree='class=SysTreeView32'
dialog='class=#32770 contains="Folder settings - "'
long=$(printf '(princ "%s")' "$(printf 'c%.0s' $(seq 1 2040))")   # 2,051 characters
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" \
       "text $dialog > id=202" \
       "click $dialog > id=1081" \
       "click $dialog > id=1017" 'type "LONG"' \
       "click $dialog > id=201" "type \"${long//\"/\\\"}\"" \
       'key end' "screenshot $dialog $(shot folder-settings-limit.png)" \
       "text $dialog > id=202" \
       "click $dialog > id=1" \
       "gone $dialog timeout=5000" \
       'sleep 300' 'double-click text="x.dwg" at=40,-40'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
notes=$(printf '%s\n' "$OUT" | sed -nE 's/^\[script\] text ?//p' | grep -v 'Layer name' | tr '\n' '|')
expect_true "no note before the limit, the note once it is reached (got $notes)" \
  [ "$notes" == "|The command holds at most 2034 characters; the rest was not taken.|" ]
kept=${long:0:2034}
expect_line "the pick returns the layer, the colour and the command as far as it was taken" \
  "=> (\"$(lisppath "$folder")\\\\x.dwg\" (\"LONG\" \"7\" \"${kept//\"/\\\"}\"))"
line=$(tr -d '\r' <"$folder/datains.ini" | grep '^Lisp command=')
expect_true "datains.ini holds it on one line of 2047 characters (got ${#line})" [ "${#line}" -eq 2047 ]

# 3. The dialog reopens with the command, and a later Accept in that folder is saved.
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" \
       "click $dialog > id=1017" 'key end' 'type "2"' \
       "click $dialog > id=1" \
       "gone $dialog timeout=5000" \
       'sleep 300' 'text contains="Layer name:"' 'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_line "a later Accept is saved: the toolbar shows the new layer" "[script] text  Layer name: LONG2"
expect_true "datains.ini holds the new layer and still the command" \
  [ "$(tr -d '\r' <"$folder/datains.ini" | grep -c -e '^Layer=LONG2$' -e "^Lisp command=${kept//\\/\\\\}\$")" -eq 2 ]

finish
