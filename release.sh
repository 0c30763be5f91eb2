#!/usr/bin/env bash
# Builds the release a CAD manager hands out: the Release library of this commit, and
# dist/Orvex1-<version>-win64.zip with the library, the install note, the example LISP command, the
# changelog, the licence and their SHA-256 checksums. Nothing of the build, the tests or devhost goes in.
#
# The same commit gives the same zip, byte for byte, wherever the clone lies: the library is built without
# time stamps, build paths or symbols (ORVEX_RELEASE), and the zip's entries are sorted and carry one fixed
# date. The version is the CMake project's.
#
#   ./release.sh            build/release is the build tree; prints the zip's path last
set -euo pipefail
cd "$(dirname "$0")"
root=$PWD

if [ -z "${ORVEX_SKIP_PACKAGES:-}" ]; then
  tools/ensure-packages >/dev/null || { echo "release.sh: the build packages are missing" >&2; exit 1; }
fi

build=build/release
cmake -S . -B "$build" -G Ninja --toolchain "$root/cmake/mingw-w64-x86_64.cmake" \
  -DCMAKE_BUILD_TYPE=Release -DORVEX_RELEASE=ON >/dev/null
cmake --build "$build" --target Orvex1

version=$(sed -n 's/^CMAKE_PROJECT_VERSION:[A-Z]*=//p' "$build/CMakeCache.txt")
[ -n "$version" ] || { echo "release.sh: no project version in $build/CMakeCache.txt" >&2; exit 1; }

stage=$build/zip
rm -rf "$stage"
mkdir -p "$stage" dist
cp "$build/bin/Orvex1.arx" "$stage/Orvex1.arx"

# The text files get Windows line ends: the people who read them open them in Windows editors.
python3 - "$root" "$stage" "$version" <<'PY'
import re, sys
root, stage, version = sys.argv[1:4]

def write_text(name, text):
    text = text.replace("\r\n", "\n").replace("\n", "\r\n")
    with open(f"{stage}/{name}", "w", encoding="utf-8", newline="") as f:
        f.write(text)

def read(path):
    with open(f"{root}/{path}", encoding="utf-8") as f:
        return f.read()

write_text("README.txt", read("packaging/README.txt").replace("@VERSION@", version))
# The example command is the first LISP block of the LISP guide, as it stands there, comments and all.
guide = read("docs/lisp.md")
block = re.search(r"^```lisp\n(.*?)^```", guide, re.S | re.M)
if not block or "(defun " not in block.group(1):
    sys.exit("release.sh: docs/lisp.md has no LISP block with a defun")
write_text("orvex-insert.lsp", block.group(1))
write_text("CHANGELOG.md", read("CHANGELOG.md"))
write_text("LICENSE.txt", read("LICENSE"))
PY

(cd "$stage" && sha256sum Orvex1.arx README.txt orvex-insert.lsp CHANGELOG.md LICENSE.txt >SHA256SUMS)

zip=dist/Orvex1-$version-win64.zip
python3 - "$stage" "$zip" <<'PY'
import os, sys, zipfile
stage, out = sys.argv[1:3]
tmp = out + ".tmp"
with zipfile.ZipFile(tmp, "w") as z:
    for name in sorted(os.listdir(stage)):
        info = zipfile.ZipInfo(name, date_time=(1980, 1, 1, 0, 0, 0))
        info.create_system = 3                 # the same on every build machine
        info.external_attr = 0o100644 << 16    # a plain file, read-write for its owner
        info.compress_type = zipfile.ZIP_DEFLATED
        with open(os.path.join(stage, name), "rb") as f:
            z.writestr(info, f.read(), compresslevel=9)
os.replace(tmp, out)
PY

echo "$root/$zip"
