#!/usr/bin/env bash
# A folder whose path is too long for the runtime, as a person meets it: chosen in the tree, or given as
# the start folder, it is refused, and the title, the status bar, and what is saved (Path and ShellPath of
# Orvex1.ini) all name one and the same folder. And F5 reads the folder again without taking the search
# text away, and the drawing found stays chosen.
# Real input through devhost's script; the screenshots are looked at.
. "$(dirname "$0")/lib.sh"

# A parent folder whose path fits, with a drawing, and below it a folder whose path does not (Wine on
# Linux keeps such paths).
seg=$(printf 'd%.0s' $(seq 1 60))
parent="$WORK/orvexlong/$seg/$seg/$seg"
gen_dwg "$parent" 2 --variant 1
i=0
for f in "$parent"/*; do mv "$f" "$parent/plan-$i.dwg"; i=$((i + 1)); done
child_name="toolong-$(printf 'e%.0s' $(seq 1 40))"
child="$parent/$child_name"
mkdir -p "$child"
cp "$parent/plan-0.dwg" "$child/inside.dwg"
parent_win=$(winpath "$parent")
child_win=$(winpath "$child")
[ ${#parent_win} -lt 250 ] && [ ${#child_win} -gt 260 ] &&
  pass "a folder of ${#parent_win} characters holding one of ${#child_win}" ||
  fail "the folders: ${#parent_win} and ${#child_win} characters"

tree='class=SysTreeView32'
settings="$WORK/lib/Orvex1.ini"
ini_value() { tr -d '\r' <"$settings" 2>/dev/null | sed -n "s/^$1=//p"; }
run() {
  devhost --script "$(winpath "$WORK/script.txt")" --eval "$1"
  expect_host_usable "$1"
}
call_at() { printf '(Orvex 1 2 "%s\\\\" "Insert" "Close")' "$(lisppath "$1")"; }
shot() { printf 'screenshot contains="orvexlong" nth=0 %s' "$(winpath "$WORK/$1")"; }
texts() { sed -n 's/^\[script\] text //p' <<<"$OUT"; }

# 1. Open on the parent: its label path is saved. A wide tree: the labels of the long names fit it.
printf '[Size]\r\nSplitterSize=900\r\nWindowWidth=1500\r\nWindowHeight=700\r\n' >"$settings"
script_with_host_checks 'wait class=Edit contains="plan-0" timeout=30000' 'key escape'
run "$(call_at "$parent")"
label=$(ini_value ShellPath)
expect_true "the parent's label path is known" [ "${label##*\\}" == "ddd${seg:3}" ]

# 2. The long folder chosen in the tree: refused; the title, the status bar and the saved settings name it.
script_with_host_checks 'wait class=Edit contains="plan-0" timeout=30000' "tree-count $tree at-least=5 timeout=20000" \
  'sleep 500' "tree-select $tree path=\"$label\\$child_name\" timeout=10000" 'sleep 800' \
  'echo chosen' 'text contains="orvexlong" nth=0' 'text class=msctls_statusbar32' \
  'count class=Edit contains="plan-"' "$(shot refused-in-tree.png)" 'key escape'
run "$(call_at "$parent")"
title=$(texts | sed -n 1p | sed 's/\\\\/\\/g') # backslashes as devhost writes them: doubled
status=$(texts | sed -n 2p)
[ "$title" == "$child_win" ] && pass "the title names the refused folder" || fail "title: $title"
grep -q "cannot be read: its path is" <<<"$status" && pass "the status bar says why" || fail "status: $status"
[ "$(ini_value Path)" == "$child_win" ] && pass "Path names the refused folder" ||
  fail "Path: $(ini_value Path)"
[ "$(ini_value ShellPath)" == "$label\\$child_name" ] && pass "ShellPath names the refused folder" ||
  fail "ShellPath: $(ini_value ShellPath)"

# 3. Opened again with no start folder: the saved one, refused again, and still named by all.
# The walk to the saved folder may take a while on a loaded machine: wait for the title to name it.
script_with_host_checks "tree-count $tree at-least=5 timeout=30000" 'wait contains="orvexlong" timeout=30000' 'sleep 1000' \
  'text contains="orvexlong" nth=0' 'text class=msctls_statusbar32' "$(shot refused-at-start.png)" 'key escape'
run '(Orvex 1 2 "" "Insert" "Close")'
title=$(texts | sed -n 1p | sed 's/\\\\/\\/g')
status=$(texts | sed -n 2p)
[ "$title" == "$child_win" ] && pass "opened on the saved folder, the title names it" || {
  fail "title at start: $title"; printf '%s\n' "$OUT" | grep -E '^\[script\]|^=>' | tail -12; }
grep -q "cannot be read: its path is" <<<"$status" && pass "and the status bar says why" || fail "status at start: $status"
[ "$(ini_value Path)" == "$child_win" ] && [ "$(ini_value ShellPath)" == "$label\\$child_name" ] &&
  pass "Path and ShellPath still name it" || fail "Path: $(ini_value Path); ShellPath: $(ini_value ShellPath)"

# 4. F5 reads the folder again: the search text stays, and the drawing it found stays chosen.
script_with_host_checks 'wait class=Edit contains="plan-0" timeout=30000' 'sleep 500' 'click id=32790' \
  'type "plan-1"' 'sleep 300' 'text contains="orvexlong" nth=0' 'key f5' 'sleep 1000' 'text id=32790' \
  'text contains="orvexlong" nth=0' "$(shot refresh-search.png)" 'key enter'
run "$(call_at "$parent")"
searched=$(texts | sed -n 2p)
[ "$searched" == "plan-1" ] && pass "F5 keeps the search text" || fail "search text after F5: '$searched'"
[ "$(texts | sed -n 1p)" == "$(texts | sed -n 3p)" ] && pass "F5 keeps the drawing found chosen (the title names it)" ||
  fail "title before and after F5: $(texts | sed -n 1p) / $(texts | sed -n 3p)"
expect_line "Enter then picks it" "=> (\"$(lisppath "$parent")\\\\plan-1.dwg\" (\"\" \"\" \"\"))"

finish
