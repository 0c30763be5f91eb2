#!/usr/bin/env bash
# A folder's insertion parameters as a person sets them: right click on the folder in the tree, "Folder
# settings", a layer typed, a colour chosen in the host's colour dialog, a LISP command typed, Accept.
# datains.ini holds them (keys of its own kept), the toolbar shows the layer and the next pick in the
# folder returns them. Then "Use current layer" with no command removes the file again.
. "$(dirname "$0")/lib.sh"

root="$WORK/orvexsettings"
doors="$root/doors"
gen_dwg "$doors" 1 --variant 3
for f in "$doors"/*; do mv "$f" "$doors/x.dwg"; done
[ -f "$doors/x.dwg" ] && pass "a folder with one drawing, x.dwg" || fail "generator: $(cat "$WORK/gen.err")"
# A settings file that already holds a section of its own: the dialog keeps it.
printf '[Mine]\r\nKeep=1\r\n\r\n' >"$doors/datains.ini"

tree='class=SysTreeView32'
dialog='class=#32770 contains="Folder settings - "'
colors='class=DevhostColorDialog'
frame='contains="orvexsettings" nth=0' # the explorer's title shows the folder
call=$(printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$doors")")
script() { printf '%s\n' "$@" >"$WORK/script.txt"; }
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$1"; }
has() { grep -q -- "$2" <<<"$1"; }
ini_value() { tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n "s/^$1=//p"; }
shot() { winpath "$WORK/$1"; }

# A double click on the picture, above the label, picks (one on the label would rename).
# 1. Open the explorer on the folder once: the tree's label path of the folder is kept in Orvex1.ini.
script 'wait contains="x.dwg" timeout=30000' 'text contains="Layer name:"' 'key escape'
run "$call"
expect_line "the folder opens with no layer of its own" "[script] text  Layer name: Current"
label=$(ini_value ShellPath)
expect_true "the tree's label path of the folder is known ($label)" [ "${label##*\\}" == "doors" ]

# 2. Right click, "Folder settings", fill it in, Accept; then pick the drawing.
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' \
       "screenshot class=#32768 $(shot folder-menu.png)" "screenshot $frame $(shot folder-menu-frame.png)" \
       'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" \
       'echo opened' "enabled $dialog > id=1017" "enabled $dialog > id=200" "text $dialog > id=201" \
       "screenshot $dialog $(shot folder-settings-new.png)" \
       "click $dialog > id=1081" \
       'echo unchecked' "enabled $dialog > id=1017" "enabled $dialog > id=200" \
       "click $dialog > id=1017" 'type "DOORS"' \
       "click $dialog > id=200" \
       "wait $colors timeout=5000" \
       'echo palette' "text $colors > id=1302" "enabled $colors > id=1301" "enabled $colors > id=1300" \
       "click $colors > id=1030" \
       'echo chosen' "text $colors > id=1302" \
       "screenshot $colors $(shot color-dialog.png)" \
       "click $colors > id=1" \
       "gone $colors timeout=5000" \
       "click $dialog > id=201" 'type "(c:fixdoor)"' \
       "screenshot $dialog $(shot folder-settings-filled.png)" "screenshot $frame $(shot folder-settings-frame.png)" \
       "click $dialog > id=1" \
       "gone $dialog timeout=5000" \
       'sleep 300' 'echo label' 'text contains="Layer name:"' \
       'double-click text="x.dwg" at=40,-40'
run "$call"
section() { printf '%s\n' "$OUT" | sed -n "/^\[script\] $1\$/,/^\[script\] [a-z]*\$/p" | sed -n 's/^\[script\] \(text\|enabled\) //p' |
            tr '\n' '|'; }
expect_true "a datains.ini without a layer opens with the layer edit and the swatch off, no command (got $(section opened))" \
  [ "$(section opened)" == "no|no||" ]
expect_true "clearing Use current layer enables the layer and the swatch (got $(section unchecked))" \
  [ "$(section unchecked)" == "yes|yes|" ]
expect_true "the palette opens on colour 7 with ByLayer and ByBlock disabled (got $(section palette))" \
  [ "$(section palette)" == "Color 7|no|no|" ]
expect_true "a click on swatch 30 chooses it (got $(section chosen))" [ "$(section chosen)" == "Color 30|" ]
expect_line "the toolbar shows the folder's layer after Accept" "[script] text  Layer name: DOORS"
expect_line "the pick returns the drawing with the folder's layer, colour and command" \
  "=> (\"$(lisppath "$doors")\\\\x.dwg\" (\"DOORS\" \"30\" \"(c:fixdoor)\"))"
ini=$(tr -d '\r' <"$doors/datains.ini" 2>/dev/null)
expect_true "datains.ini holds the three keys after the section it had (got: $(printf '%s' "$ini" | tr '\n' '|'))" \
  [ "$(printf '%s' "$ini" | tr '\n' '|')" == "[Mine]|Keep=1||[Default Parameters]|Layer=DOORS|Lisp command=(c:fixdoor)|Color=30" ]

# 3. Reopen: the dialog shows what was saved. Use current layer with no command removes the file.
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" \
       'echo reopened' "text $dialog > id=1017" "text $dialog > id=201" "enabled $dialog > id=200" \
       "click $dialog > id=1081" \
       "click $dialog > id=201" 'key end' 'key shift+home' 'key delete' \
       'echo cleared' "text $dialog > id=201" "enabled $dialog > id=1017" 'echo end' \
       "click $dialog > id=1" \
       "gone $dialog timeout=5000" \
       'sleep 300' 'text contains="Layer name:"' \
       'key escape'
run "$call"
expect_true "the dialog reopens with the layer and the command (got $(section reopened))" \
  [ "$(section reopened)" == "DOORS|(c:fixdoor)|yes|" ]
expect_true "the command is cleared and the layer edit disabled (got $(section cleared))" \
  [ "$(section cleared)" == "|no|" ]
expect_true "Use current layer with no command deletes datains.ini" [ ! -e "$doors/datains.ini" ]
expect_line "the toolbar says Current again" "[script] text  Layer name: Current"
expect_line "Escape still cancels the pick" "=> nil"

# 4. Cancel leaves the folder as it was; the next pick returns three empty strings.
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" \
       "click $dialog > id=201" 'type "(c:never)"' \
       "click $dialog > id=2" "gone $dialog timeout=5000" \
       "tree-right-click $tree path=\"Desktop\"" 'sleep 500' 'echo virtual' 'exists class=#32768' \
       'double-click text="x.dwg" at=40,-40'
run "$call"
expect_true "Cancel writes nothing" [ ! -e "$doors/datains.ini" ]
expect_true "the Desktop, a folder without a path, gets no menu" \
  [ "$(printf '%s\n' "$OUT" | sed -n '/^\[script\] virtual$/{n;p}')" == "[script] exists no" ]
expect_line "a pick in a folder without settings returns three empty strings" \
  "=> (\"$(lisppath "$doors")\\\\x.dwg\" (\"\" \"\" \"\"))"

# 5. A folder whose path leaves no room for "\datains.ini" in the dialog's 260-character buffer: the menu
# says so in a message box and no dialog opens. The folder (250 characters) is reached in the tree from a
# shorter one, since its label path is longer than a start path may be.
top="$WORK/long"
long=$top
while [ ${#long} -lt 228 ]; do n=$((228 - ${#long} > 60 ? 60 : 228 - ${#long})); long="$long/$(printf 'd%.0s' $(seq 1 $n))"; done
long="$long/$(printf 'e%.0s' $(seq 1 $((250 - 2 - 1 - ${#long}))))"
mkdir -p "$long" && cp "$doors/x.dwg" "$long/x.dwg" && cp "$doors/x.dwg" "$top/x.dwg"
expect_true "a folder of 250 characters (got $(winpath "$long" | wc -c | tr -d ' '))" [ "$(winpath "$long" | wc -c)" -eq 250 ]
topcall=$(printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$top")")
script 'wait contains="x.dwg" timeout=30000' 'key escape'
run "$topcall"
toplabel=$(ini_value ShellPath)
# A wide window and folder pane, so that the long labels leave the expand buttons in view.
sed -i -e 's/^SplitterSize=[0-9]*/SplitterSize=1100/' -e 's/^WindowWidth=[0-9]*/WindowWidth=1500/' "$WORK/lib/Orvex1.ini"
steps=('wait contains="x.dwg" timeout=30000')
path=$toplabel
for part in $(printf '%s' "${long#"$top"/}" | tr '/' ' '); do
  path="$path\\$part"
  [ "$part" != "${long##*/}" ] && steps+=("tree-expand $tree path=\"$path\"")
done
box='class=#32770 text="Drawing explorer"'
script "${steps[@]}" "tree-right-click $tree path=\"$path\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $box timeout=5000" "text $box > id=65535" "screenshot $box $(shot folder-too-long.png)" \
       'key enter' "gone $box timeout=5000" \
       "exists $dialog" \
       'key escape'
run "$topcall"
expect_true "a message box says the folder is too long for its settings" \
  has "$OUT" '^\[script\] text The folder.s path is too long for its settings (262 characters'
expect_line "and no settings dialog opens" "[script] exists no"
expect_true "nothing is written in the long folder" [ ! -e "$long/datains.ini" ]
expect_line "the explorer goes on: Escape cancels" "=> nil"

# 6. The call ends while the folder settings dialog and the host's colour dialog are open (devhost's
# --after-ms, as a host that ends the call): both close, nothing is written, the call returns nil.
script 'wait contains="x.dwg" timeout=30000' \
       "tree-right-click $tree path=\"$label\"" \
       'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
       "wait $dialog timeout=5000" "click $dialog > id=1081" "click $dialog > id=1017" 'type "LATE"' \
       "click $dialog > id=200" "wait $colors timeout=5000" 'echo waiting' \
       'returned timeout=30000' "exists $colors visible=any" "exists $dialog visible=any" \
       "${HOST_CHECKS[@]:1}"
devhost --script "$(winpath "$WORK/script.txt")" --after-ms 6000 --post cancel --eval "$call"
expect_host_usable "a call ended in the colour dialog"
expect_true "the colour dialog was open when the call ended" has "$OUT" '^\[script\] waiting$'
expect_line "the call returns nil" "=> nil"
expect_true "both dialogs are gone (got $(printf '%s\n' "$OUT" | grep -c '^\[script\] exists no$') of 2)" \
  [ "$(printf '%s\n' "$OUT" | grep -c '^\[script\] exists no$')" -eq 2 ]
expect_true "nothing is written" [ ! -e "$doors/datains.ini" ]

finish
