#!/usr/bin/env bash
# bytewise_paths.sh PYTHON CHECK: runs the narrow text check on small made-up trees and expects it to fail
# exactly on the lines that look for a backslash one byte at a time.
set -uo pipefail
python=$1 check=$2
work=$(mktemp -d "${TMPDIR:-/tmp}/orvex-narrow.XXXXXX")
trap 'rm -rf "$work"' EXIT
failures=0

# tree NAME FILE TEXT: a fresh tree holding one source file.
tree() {
  root="$work/$1"
  mkdir -p "$root/$(dirname "$2")"
  printf '%s\n' "$3" >"$root/$2"
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

tree clean thumbs/Walk.cpp '#include "hostapi/NarrowText.h"
// A comment may say "\\" and strrchr(path, '"'"'\\'"'"') freely.
bool Ends(const std::string& p) { return EndsWithSeparator(p); }
std::string Root(const std::string& p) { return p.substr(0, 3); }
bool Drive(const std::string& p) { return p[2] == '"'"'\\'"'"'; } // one byte: after "C:" a byte is a character
const char* kSet = "\\/:";
// one byte: the third byte after "C:" starts a character
bool Drive3(const std::string& p) { return p[2] != '"'"'\\'"'"'; }'
run "walks by character, comments and marked drive tests pass" 0

tree marked-too-far thumbs/Walk.cpp '// one byte: the third byte after "C:" starts a character

bool Drive3(const std::string& p) { return p[2] != '"'"'\\'"'"'; }'
run "a mark two lines up does not count" 1

tree back thumbs/Scan.cpp 'bool Ends(const std::string& p) { return p.back() == '"'"'\\'"'"'; }'
run "a last byte compared with a backslash fails" 1 \
  "thumbs/Scan.cpp:1: compares a byte with '\\\\': bool Ends(const std::string& p) { return p.back() == '\\\\'; }"

tree strrchr frame/Name.cpp 'const char* n = strrchr(path, '"'"'\\'"'"');'
run "strrchr for a backslash fails" 1 \
  "frame/Name.cpp:1: searches bytes for a backslash (strchr/strrchr): const char* n = strrchr(path, '\\\\');"

tree findlast tree/Label.cpp '
auto s = label.find_last_of("\\/");'
run "find_last_of a backslash fails" 1 \
  "tree/Label.cpp:2: searches bytes for a backslash (find/rfind/find_last_of): auto s = label.find_last_of(\"\\\\/\");"

tree find tree/Walk.cpp 'for (auto s = path.find('"'"'\\'"'"', 3); s != npos; ++s) {}'
run "find of a backslash fails" 1

tree strchr settings/Bad.cpp 'return std::strchr("\\/:*?\"<>|", c) != nullptr;'
run "a set of bytes holding a backslash fails" 1

tree outside tests/thumbs/Walk.cpp 'bool Ends(const std::string& p) { return p.back() == '"'"'\\'"'"'; }'
run "tests are not product code" 0

tree walker hostapi/NarrowText.cpp 'bool Ends(const std::string& p) { return p.back() == '"'"'\\'"'"'; }'
run "the walker itself is not checked" 0

[ "$failures" -eq 0 ] && echo "narrow text check: all cases behave" || exit 1
