#!/usr/bin/env bash
# A shared drawing folder whose datains.ini someone else wrote and made read-only: the folder settings
# dialog shows the stored LISP command as it is (the caller will run that text), and an Accept that
# cannot write the file tells the user in an alert, keeps the dialog open with what was typed and leaves
# the file byte for byte; the pick still returns what the file says.
. "$(dirname "$0")/lib.sh"

root="$WORK/refusedsettings"
doors="$root/doors"
gen_dwg "$doors" 1 --variant 4
for f in "$doors"/*; do mv "$f" "$doors/x.dwg"; done
[ -f "$doors/x.dwg" ] && pass "a folder with one drawing, x.dwg" || fail "generator: $(cat "$WORK/gen.err")"
command='(progn (command "_.ERASE" "_ALL" "") (princ "done"))'
printf '[Default Parameters]\r\nLayer=DOORS\r\nLisp command=%s\r\nColor=5\r\n\r\n[Theirs]\r\nKeep=1\r\n\r\n' \
  "$command" >"$doors/datains.ini"
chmod a-w "$doors/datains.ini"
cp "$doors/datains.ini" "$WORK/datains.saved"
ini_win="$(winpath "$doors")\\datains.ini"

tree='class=SysTreeView32'
dialog='class=#32770 contains="Folder settings - "'
frame='contains="refusedsettings" nth=0'
call=$(printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$doors")")
shot() { winpath "$WORK/$1"; }
lisp_command=$(printf '%s' "$command" | sed 's/"/\\"/g')
pick="=> (\"$(lisppath "$doors")\\\\x.dwg\" (\"DOORS\" \"5\" \"$lisp_command\"))"

# 1. Open the explorer on the folder once: the tree's label path of the folder is kept in Orvex1.ini.
script_with_host_checks 'wait contains="x.dwg" timeout=30000' 'key escape'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "the first opening"
label=$(tr -d '\r' <"$WORK/lib/Orvex1.ini" 2>/dev/null | sed -n 's/^ShellPath=//p')
expect_true "the tree's label path of the folder is known ($label)" [ "${label##*\\}" == "doors" ]

# 2. Folder settings: the stored command shown; a new one typed; Accept refused; Cancel; the pick.
script_with_host_checks 'wait contains="x.dwg" timeout=30000' \
  "tree-right-click $tree path=\"$label\"" \
  'wait class=#32768 timeout=5000' 'click class=#32768 at=30,10' \
  "wait $dialog timeout=5000" \
  'echo opened' "text $dialog > id=201" "text $dialog > id=1017" \
  "screenshot $dialog $(shot refused-opened.png)" \
  "click $dialog > id=201" 'key end' 'key shift+home' 'key delete' 'type "(c:mine)"' \
  "screenshot $dialog $(shot refused-typed.png)" \
  "click $dialog > id=1" \
  'sleep 300' \
  'echo accepted' "exists $dialog" "text $dialog > id=201" \
  "screenshot $frame $(shot refused-after-accept.png)" \
  "click $dialog > id=2" \
  "gone $dialog timeout=5000" \
  "screenshot $frame $(shot refused-cancelled.png)" \
  'double-click text="x.dwg" at=40,-40'
devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
expect_host_usable "the refused folder settings"
after() { printf '%s\n' "$OUT" | sed -n "/^\[script\] $1\$/,\$p"; }
expect_true "the dialog shows the stored LISP command as it is" \
  grep -qxF "[script] text $command" <(after opened | sed -n 2p)
expect_true "and the stored layer" grep -qxF "[script] text DOORS" <(after opened | sed -n 3p)
expect_line "the alert says the settings were not saved" \
  "[alert] The folder settings were not saved; the command line says why. The file is left as it was:\\n$(printf '%s' "$ini_win" | sed 's/\\/\\\\/g')"
expect_line "the command line says why" "Orvex: $ini_win was not saved: it is read-only; the file is left as it was"
expect_true "the dialog stays open after the refused Accept" \
  grep -qx '\[script\] exists yes' <(after accepted | sed -n 2p)
expect_true "with what was typed" grep -qxF '[script] text (c:mine)' <(after accepted | sed -n 3p)
expect_line "the pick returns what the file says" "$pick"
if cmp -s "$doors/datains.ini" "$WORK/datains.saved"; then pass "datains.ini is left byte for byte"
else fail "datains.ini is left byte for byte"; cat -A "$doors/datains.ini"; fi
chmod u+w "$doors/datains.ini"

# 3. Another program holds datains.ini open without sharing: the pick works and returns no parameters
#    (insert on the current layer, no command), and the file is left as it was.
helper="$(dirname "$DEVHOST")/settings_helper.exe"
if [ -f "$helper" ]; then
  rm -f "$WORK/held" "$WORK/release"
  "$WINE_RUN" "$helper" hold "$ini_win" "$(winpath "$WORK/held")" "$(winpath "$WORK/release")" 120000 \
    >"$WORK/holder.out" 2>&1 &
  holder=$!
  for _ in $(seq 1 300); do [ -f "$WORK/held" ] && break; sleep 0.1; done
  if [ -f "$WORK/held" ]; then
    script_with_host_checks 'wait contains="x.dwg" timeout=30000' \
      "screenshot $frame $(shot locked-datains.png)" 'double-click text="x.dwg" at=40,-40'
    devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"
    expect_host_usable "a datains.ini held by another program"
    expect_line "a datains.ini held by another program: the pick gives no parameters" \
      "=> (\"$(lisppath "$doors")\\\\x.dwg\" (\"\" \"\" \"\"))"
  else
    fail "the helper holds datains.ini open"; cat "$WORK/holder.out"
  fi
  touch "$WORK/release"
  wait "$holder"
  if cmp -s "$doors/datains.ini" "$WORK/datains.saved"; then pass "the held datains.ini is left byte for byte"
  else fail "the held datains.ini is left byte for byte"; fi
else
  echo "note: $helper is not built; the held-file check is skipped"
fi

finish
