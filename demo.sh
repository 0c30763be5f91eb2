#!/usr/bin/env bash
# The main job: build Orvex1.arx and the development host, then call the LISP function the way a LISP
# program in the CAD application does, on a folder of drawings, and print the call and its result.
#
# With a display (DISPLAY set) the explorer waits for you: pick a drawing (double-click it, or type the
# start of its name and press "Insert"), or press Escape. Without one it runs headless under Xvfb: a
# script moves the mouse, types and picks like a person would, and screenshots go to docs/.
set -euo pipefail
cd "$(dirname "$0")"
tools/ensure-packages
cmake --preset windows >/dev/null
cmake --build --preset windows --target Orvex1 devhost gen-dwg-samples

# Drawings to show: the real samples beside the project when they are there, else synthetic ones the
# project generates (files in the drawing container layout with generated preview pictures).
samples="$(cd .. && pwd)/shared/dwg-samples/2004"
if [ ! -d "$samples" ]; then
  samples="$PWD/build/demo-drawings"
  if [ ! -d "$samples" ]; then
    mkdir -p "$samples"
    tools/wine-run build/windows/bin/gen-dwg-samples.exe "$(printf 'Z:%s' "$samples" | tr '/' '\\')" 60 >/dev/null
  fi
fi
folder=$(printf 'Z:%s\\' "$samples" | tr '/' '\\')
lisp_folder=$(printf '%s' "$folder" | sed 's/\\/\\\\/g')
call="(Orvex 1 2 \"$lisp_folder\" \"Insert\" \"Close\")"
echo "Command: $call"

if [ -n "${DISPLAY:-}" ] && [ -z "${CI:-}" ] && [ -z "${DEMO_HEADLESS:-}" ]; then
  tools/wine-run build/windows/bin/devhost.exe --eval "$call" | tr -d '\r'
  exit 0
fi

# Headless: a person's session, scripted, from fresh explorer settings.
rm -f build/windows/bin/Orvex1.ini
mkdir -p docs
names=$(ls "$samples" | grep -i '\.dwg' | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
pick=$(printf '%s\n' "$names" | sed -n 3p)
prefix=${pick:0:2}
frame="contains=\"$(basename "$samples")\" nth=0"   # the frame's title shows the folder
script=build/demo-script.txt
win() { printf 'Z:%s/%s' "$PWD" "$1" | tr '/' '\\'; }
cat >"$script" <<SCRIPT
# Look at the explorer, hover a drawing for its tooltip, type the start of a name, pick that drawing.
wait contains=".dwg" timeout=30000
sleep 800
screenshot $frame $(win docs/explorer.png)
move text="$first" at=60,-50
sleep 200
move text="$first" at=70,-55
sleep 1500
tooltip
screenshot $frame $(win docs/explorer-tooltip.png)
click id=32790
type "$prefix"
sleep 500
screenshot $frame $(win docs/explorer-search.png)
double-click text="$pick" at=60,-50
# The call has returned: the host takes input again.
returned timeout=30000
enabled class=DevhostFrame
focus
SCRIPT
tools/wine-run build/windows/bin/devhost.exe --script "$(win "$script")" --eval "$call" | tr -d '\r'
echo "Screenshots: docs/explorer.png, docs/explorer-tooltip.png, docs/explorer-search.png"

# The folder's insertion parameters: a right click on the folder in the tree opens its one-entry menu and
# the "Folder settings" dialog; a layer, a colour from the host's palette and a LISP command are filled in
# and shown, then cancelled, so the sample folder keeps what it had.
label=$(tr -d '\r' <build/windows/bin/Orvex1.ini | sed -n 's/^ShellPath=//p')
dialog='class=#32770 text="Folder settings"'
if [ -n "$label" ] && [ ! -e "$samples/datains.ini" ]; then
  cat >"$script" <<SCRIPT
wait contains=".dwg" timeout=30000
tree-right-click class=SysTreeView32 path="$label"
wait class=#32768 timeout=5000
screenshot class=#32768 $(win docs/folder-menu.png)
click class=#32768 at=30,10
wait $dialog timeout=5000
click $dialog > id=1081
click $dialog > id=1017
type "DOORS"
click $dialog > id=200
wait class=DevhostColorDialog timeout=5000
click class=DevhostColorDialog > id=1030
sleep 300
screenshot class=DevhostColorDialog $(win docs/devhost-color-dialog.png)
click class=DevhostColorDialog > id=1
click $dialog > id=201
type "(c:fixdoor)"
sleep 300
screenshot $dialog $(win docs/folder-settings.png)
click $dialog > id=2
key escape
returned timeout=30000
SCRIPT
  tools/wine-run build/windows/bin/devhost.exe --script "$(win "$script")" --eval "$call" | tr -d '\r'
  echo "Screenshots: docs/folder-menu.png, docs/folder-settings.png, docs/devhost-color-dialog.png"
fi
