#!/usr/bin/env bash
# The folder tree's right-click menu as a person meets it: a right click on the empty area below the
# items offers "&Folder settings" for the folder selected (the one highlighted), and a right click on
# "My Computer", which has no settings and so no menu, leaves the Escape that follows without effect on
# the explorer (the person pressed it to close a menu they expected), while the next Escape still cancels.
# Real input through devhost's script; the screenshots are looked at.
. "$(dirname "$0")/lib.sh"

# A folder on drive C: (the prefix's own drive), whose few neighbours leave the tree room below its items.
prefix="${WINEPREFIX:-$ROOT/build/wineprefix}"
"$WINE_RUN" cmd /c exit 0 >/dev/null 2>&1 || true # the prefix exists
top="orvexmenu-$$"
root="$prefix/drive_c/$top"
doors="$root/doors"
trap 'rm -rf "$root"; if [ -n "${E2E_SHOTS:-}" ]; then mkdir -p "$E2E_SHOTS" && cp "$WORK"/*.png "$E2E_SHOTS"/ 2>/dev/null; fi; rm -rf "$WORK"' EXIT
gen_dwg "$WORK/gen" 1 --variant 3
mkdir -p "$doors"
for f in "$WORK/gen"/*; do mv "$f" "$doors/x.dwg"; done
[ -f "$doors/x.dwg" ] && pass "a folder with one drawing, C:\\$top\\doors\\x.dwg" || fail "generator: $(cat "$WORK/gen.err")"

tree='class=SysTreeView32'
frame="contains=\"$top\" nth=0"
dialog='class=#32770 contains="Folder settings - "'
call="(Orvex 1 2 \"C:\\\\$top\\\\doors\\\\\" \"Insert\" \"Close\")"
printf '[Size]\r\nSplitterSize=220\r\nWindowWidth=900\r\nWindowHeight=900\r\n' >"$WORK/lib/Orvex1.ini"
run() { devhost --script "$(winpath "$WORK/script.txt")" --eval "$call"; }
shot() { printf 'screenshot %s %s' "$1" "$(winpath "$WORK/$2")"; }

# 1. A right click below the items: the menu of the selected folder, whose settings dialog names it.
script_with_host_checks "wait $frame timeout=30000" "tree-count $tree at-least=5 timeout=20000" 'sleep 500' \
  "tree-items $tree" "right-click $tree window-at=40,-20" 'wait class=#32768 timeout=3000' \
  "$(shot class=#32768 tree-menu-empty-area.png)" "$(shot "$frame" tree-menu-empty-area-frame.png)" \
  'click class=#32768 at=30,10' "wait $dialog timeout=5000" "text $dialog" \
  "$(shot "$dialog" tree-menu-empty-area-dialog.png)" "click $dialog > id=2" "gone $dialog timeout=5000" \
  'key escape'
run
expect_line "the selected folder is highlighted" "[script] tree-item 4 doors expanded selected highlighted"
expect_line "a right click below the items opens the selected folder's settings" \
  "[script] text Folder settings - doors"
expect_line "Escape then cancels" "=> nil"

# 2. A right click on My Computer: no menu; the Escape that follows leaves the explorer open, the next
#    one closes it.
script_with_host_checks "wait $frame timeout=30000" "tree-count $tree at-least=5 timeout=20000" 'sleep 500' \
  "tree-right-click $tree path=\"Desktop\\My Computer\"" 'sleep 500' 'count class=#32768' \
  "$(shot "$frame" tree-menu-my-computer.png)" 'key escape' 'sleep 800' 'echo after-first-escape' \
  "exists $frame" "$(shot "$frame" tree-menu-my-computer-escape.png)" 'key escape'
run
expect_line "My Computer has no menu" "[script] count 0"
after=$(sed -n '/after-first-escape/,$p' <<<"$OUT" | sed -n 2p)
[ "$after" == "[script] exists yes" ] && pass "Escape after the right click on My Computer leaves the explorer open" ||
  fail "Escape after the right click on My Computer closed the explorer: $after"
expect_line "the next Escape cancels" "=> nil"

# 3. The same with the keyboard in the grid before (a drawing clicked): the right click takes the
#    keyboard to the tree, and the Escape that follows still leaves the explorer open.
script_with_host_checks "wait $frame timeout=30000" "tree-count $tree at-least=5 timeout=20000" 'sleep 500' \
  'click class=Edit text="x.dwg" at=40,-40' 'sleep 300' \
  "tree-right-click $tree path=\"Desktop\\My Computer\"" 'sleep 500' 'key escape' 'sleep 800' \
  'echo after-first-escape' "exists $frame" 'key escape'
run
after=$(sed -n '/after-first-escape/,$p' <<<"$OUT" | sed -n 2p)
[ "$after" == "[script] exists yes" ] && pass "the same with a drawing clicked before: the explorer stays open" ||
  fail "with a drawing clicked before, Escape after the right click on My Computer closed the explorer: $after"
expect_line "the next Escape cancels, with a drawing clicked before" "=> nil"

finish
