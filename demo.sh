#!/usr/bin/env bash
# The main job: build Orvex1.arx and devhost.exe, then call the LISP function the way a LISP program
# in the CAD application does, and print the call and its result.
set -euo pipefail
cd "$(dirname "$0")"
tools/ensure-packages
cmake --preset windows >/dev/null
cmake --build --preset windows

# Drawings to show: the real samples beside the project when they are there, else the project's
# synthetic ones (files in the drawing container layout with generated preview pictures).
samples="$(cd .. && pwd)/shared/dwg-samples/2004"
if [ ! -d "$samples" ]; then
  samples="$PWD/build/demo-drawings"
  if [ ! -d "$samples" ]; then
    cmake --preset native >/dev/null && cmake --build --preset native --target gen-dwg-samples
    build/native/tools/gen-dwg-samples/gen-dwg-samples "$samples" 60
  fi
fi
folder=$(printf 'Z:%s\\' "$samples" | tr '/' '\\')
lisp_folder=$(printf '%s' "$folder" | sed 's/\\/\\\\/g')
call="(Orvex 1 2 \"$lisp_folder\" \"Insert\" \"Close\")"

echo "Command: $call"
tools/wine-run build/windows/bin/devhost.exe --after-ms 3000 --post cancel --eval "$call" | tr -d '\r'
