#!/usr/bin/env bash
# back_edges.sh PYTHON CHECK: runs the layer check on small made-up trees and expects it to fail exactly
# on the includes that point up or sideways.
set -uo pipefail
python=$1 check=$2
work=$(mktemp -d "${TMPDIR:-/tmp}/orvex-layers.XXXXXX")
trap 'rm -rf "$work"' EXIT
failures=0

# tree NAME: a fresh tree with one header in each of a few folders.
tree() {
  root="$work/$1"
  mkdir -p "$root"/{framework,hostapi,settings,preview,thumbs,tree,fileops,frame,host}
  for d in framework hostapi settings preview thumbs tree fileops frame host; do echo '#pragma once' >"$root/$d/$d.h"; done
  echo '#pragma once' >"$root/framework/afxwin.h"
}
# run NAME STATUS [LINE]: the check on the tree exits with STATUS and, when given, prints LINE.
run() {
  local out status
  out=$("$python" "$check" "$root" 2>&1); status=$?
  if [ "$status" -ne "$2" ] || { [ $# -gt 2 ] && ! printf '%s\n' "$out" | grep -qxF -- "$3"; }; then
    failures=$((failures + 1)); echo "FAILED: $1 (exit $status)"; printf '%s\n' "$out"
  else
    echo "ok: $1"
  fi
}

tree clean
printf '#include "framework/framework.h"\n#include "hostapi/hostapi.h"\n#include "settings/settings.h"\n' \
  >"$root/preview/Reader.cpp"
printf '#include "preview/preview.h"\n#include "thumbs/thumbs.h"\n#include "afxwin.h"\n#include <windows.h>\n' \
  >"$root/thumbs/View.cpp"
printf '#include "frame/frame.h"\n#include "tree/tree.h"\n' >"$root/host/Module.cpp"
run "includes of the own folder and of folders below pass" 0

tree up
printf '#include "settings/settings.h"\n' >"$root/hostapi/Binding.cpp"
run "an include of a folder above fails" 1 \
  "hostapi/Binding.cpp:1: includes settings/settings.h (settings/, layer 1) from hostapi/ (layer 0): up"

tree sideways
printf '// the framework\n\n#include "hostapi/hostapi.h"\n' >"$root/framework/afxwin.cpp"
run "an include of a folder beside fails" 1 \
  "framework/afxwin.cpp:3: includes hostapi/hostapi.h (hostapi/, layer 0) from framework/ (layer 0): sideways"

tree bare
printf '#include "frame.h"\n' >"$root/frame/Main.cpp"
printf '#include "preview.h"\n' >"$root/preview/Draw.cpp"
cp "$root/frame/frame.h" "$root/preview/frame.h"
printf '#include "frame.h"\n' >"$root/thumbs/Grid.cpp"
cp "$root/frame/frame.h" "$root/framework/frame.h"
run "a bare name found below the including folder passes" 0

tree relative
printf '#include "preview.h"\n#include "../frame/frame.h"\n' >"$root/preview/Draw.cpp"
run "a relative path to a folder above fails" 1 \
  "preview/Draw.cpp:2: includes ../frame/frame.h (frame/, layer 5) from preview/ (layer 2): up"

tree module
printf '#include "host/host.h"\n' >"$root/thumbs/Thumb.cpp"
run "the module included from below fails" 1 \
  "thumbs/Thumb.cpp:1: includes host/host.h (host/, layer 6) from thumbs/ (layer 3): up"

[ "$failures" -eq 0 ] && echo "layer check: every case as expected" || exit 1
