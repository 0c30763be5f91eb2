#!/usr/bin/env bash
# The main job: build Orvex1.arx and the development host, then call the LISP function the way a LISP
# program in the CAD application does, on a folder of drawings, and print the call and its result.
#
# With a display (DISPLAY set) the explorer waits for you: pick a drawing (double-click it, or type the
# start of its name and press "Insert"), or press Escape. Without one (or with DEMO_HEADLESS=1) it runs
# headless under Xvfb: a script moves the mouse, types and picks like a person would, and takes
# screenshots. They go to build/demo/, so a clone stays as it was; DEMO_SHOTS=docs writes them over the
# README's pictures in docs/ instead.
set -euo pipefail
cd "$(dirname "$0")"
case "${DEMO_SHOTS:-build}" in
  docs) shots=docs ;;
  build) shots=build/demo ;;
  *)
    echo "demo.sh: DEMO_SHOTS is 'docs' (refresh the README's pictures) or unset (build/demo)" >&2
    exit 2
    ;;
esac
# Whether an Xvfb of the project's Wine prefix runs already (then the headless run leaves it running).
xvfb_before=""
[ -e "${WINEPREFIX:-$PWD/build/wineprefix}.xvfb" ] && xvfb_before=1
tools/ensure-packages
cmake --preset windows >/dev/null
cmake --build --preset windows --target Orvex1 devhost gen-dwg-samples

# Drawings to show: the real samples beside the project when they are there (one folder for each format
# version), else synthetic ones the project generates (files in the drawing container layout with generated
# preview pictures) in two folders. The explorer opens on their root: the tree shows the folders.
root="$(cd .. && pwd)/shared/dwg-samples"
if [ ! -d "$root/2004" ]; then
  root="$PWD/build/demo-drawings"
  for version in 2004 2010; do
    if [ ! -d "$root/$version" ]; then
      mkdir -p "$root/$version"
      tools/wine-run build/windows/bin/gen-dwg-samples.exe "$(printf 'Z:%s' "$root/$version" | tr '/' '\\')" 40 \
        --variant "${version: -2}" >/dev/null
    fi
  done
fi
# The folders in the tree's order; the demo walks into the second one.
folders=$(find "$root" -mindepth 1 -maxdepth 1 -type d -printf '%f\n' | LC_ALL=C sort)
samples="$root/$(printf '%s\n' "$folders" | sed -n 2p)"
folder=$(printf 'Z:%s\\' "$root" | tr '/' '\\')
lisp_folder=$(printf '%s' "$folder" | sed 's/\\/\\\\/g')
call="(Orvex 1 2 \"$lisp_folder\" \"Insert\" \"Close\")"
echo "Command: $call"

if [ -n "${DISPLAY:-}" ] && [ -z "${CI:-}" ] && [ -z "${DEMO_HEADLESS:-}" ]; then
  tools/wine-run build/windows/bin/devhost.exe --eval "$call" | tr -d '\r'
  exit 0
fi

# Headless: a person's session, scripted, from fresh explorer settings with a left pane wide enough for
# the tree's labels. The settings the explorer had beside the library come back at the end, and the
# Xvfb and wine server this run started end with it.
settings=build/windows/bin/Orvex1.ini
kept=""
if [ -e "$settings" ]; then
  kept=build/demo/Orvex1.ini.kept
  mkdir -p build/demo
  cp -p "$settings" "$kept"
fi
finish() {
  if [ -n "$kept" ]; then mv -f "$kept" "$settings"; else rm -f "$settings"; fi
  [ -n "$xvfb_before" ] || [ -n "${DISPLAY:-}" ] || tools/wine-stop
}
trap finish EXIT
printf '[Size]\r\nSplitterSize=240\r\n' >"$settings"
mkdir -p "$shots"
names=$(ls "$samples" | grep -i '\.dwg' | tr 'A-Z' 'a-z' | sort)
first=$(printf '%s\n' "$names" | head -1)
pick=$(printf '%s\n' "$names" | sed -n 3p)
prefix=${pick:0:2}
frame="contains=\"$(basename "$samples")\" nth=0"   # the frame's title shows the folder
script=build/demo-script.txt
win() { printf 'Z:%s/%s' "$PWD" "$1" | tr '/' '\\'; }
root_frame="contains=\"$(basename "$root")\" nth=0"
cat >"$script" <<SCRIPT
# The tree opens on the root of the drawings, its folders shown. Right selects the first folder, Down the
# second: the grid shows its drawings.
wait $root_frame timeout=30000
sleep 800
screenshot $root_frame $(win "$shots/explorer-tree.png")
key right
wait contains=".dwg" timeout=30000
sleep 800
key down
wait $frame timeout=30000
wait contains=".dwg" timeout=30000
sleep 1000
tree-items class=SysTreeView32
# Look at the explorer, hover a drawing for its tooltip, type the start of a name, pick that drawing.
screenshot $frame $(win "$shots/explorer.png")
move text="$first" at=60,-50
sleep 200
move text="$first" at=70,-55
sleep 1500
tooltip
screenshot $frame $(win "$shots/explorer-tooltip.png")
click id=32790
type "$prefix"
sleep 500
screenshot $frame $(win "$shots/explorer-search.png")
double-click text="$pick" at=60,-50
# The call has returned: the host takes input again.
returned timeout=30000
enabled class=DevhostFrame
focus
SCRIPT
tools/wine-run build/windows/bin/devhost.exe --script "$(win "$script")" --eval "$call" | tr -d '\r' |
  grep -v '^\[script\] tree-item [0-9]* [^ ]*$' # the tree's lines, less the folders neither open nor chosen
echo "Screenshots in $PWD/$shots/: explorer-tree.png, explorer.png, explorer-tooltip.png, explorer-search.png"

# The folder's insertion parameters: a right click on the folder in the tree opens its one-entry menu and
# the "Folder settings" dialog; a layer, a colour from the host's palette and a LISP command are filled in
# and shown, then cancelled, so the sample folder keeps what it had. The tree opens on the root again,
# the folder the first call picked in among its children.
label=$(tr -d '\r' <"$settings" | sed -n 's/^ShellPath=//p')
dialog='class=#32770 contains="Folder settings"'
if [ -n "$label" ] && [ ! -e "$samples/datains.ini" ]; then
  cat >"$script" <<SCRIPT
wait $root_frame timeout=30000
sleep 800
tree-right-click class=SysTreeView32 path="$label"
wait class=#32768 timeout=5000
screenshot class=#32768 $(win "$shots/folder-menu.png")
click class=#32768 at=30,10
wait $dialog timeout=5000
click $dialog > id=1081
click $dialog > id=1017
type "DOORS"
click $dialog > id=200
wait class=DevhostColorDialog timeout=5000
click class=DevhostColorDialog > id=1030
sleep 300
screenshot class=DevhostColorDialog $(win "$shots/devhost-color-dialog.png")
click class=DevhostColorDialog > id=1
click $dialog > id=201
type "(c:fixdoor)"
sleep 300
screenshot $dialog $(win "$shots/folder-settings.png")
click $dialog > id=2
key escape
returned timeout=30000
SCRIPT
  tools/wine-run build/windows/bin/devhost.exe --script "$(win "$script")" --eval "$call" | tr -d '\r'
  echo "Screenshots in $PWD/$shots/: folder-menu.png, folder-settings.png, devhost-color-dialog.png"
fi
