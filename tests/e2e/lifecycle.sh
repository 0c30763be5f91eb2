#!/usr/bin/env bash
# Loading and unloading: the export table, both load orders, several drawings.
. "$(dirname "$0")/lib.sh"

exports=$("${OBJDUMP:-x86_64-w64-mingw32-objdump}" -p "$ORVEX_ARX" |
  sed -n '/\[Ordinal\/Name Pointer\] Table/,/^$/p' | sed -n 's/^[[:space:]]*\[ *[0-9]*\] //p' | sort | tr '\n' ' ')
if [ "$exports" == "acrxEntryPoint acrxGetApiVersion odrxCreateModuleObject odrxGetAPIVersion " ]; then
  pass "the export table holds the four entry points and nothing else"
else
  fail "export table: $exports"
fi

imports=$("${OBJDUMP:-x86_64-w64-mingw32-objdump}" -p "$ORVEX_ARX" | awk '/DLL Name:/ {print tolower($3)}' | sort -u)
unexpected=$(printf '%s\n' "$imports" | grep -vxE 'kernel32.dll|msvcrt.dll|user32.dll|gdi32.dll|shell32.dll|shlwapi.dll|ole32.dll|comctl32.dll|comdlg32.dll|oleaut32.dll|advapi32.dll|windowscodecs.dll|winmm.dll|psapi.dll|uxtheme.dll' || true)
if [ -z "$unexpected" ]; then pass "the library needs system DLLs only"; else fail "non-system imports: $unexpected"; fi

for order in entry-first module-first; do
  devhost --order "$order" --after-ms 300 --post cancel --eval '(Orvex 1 2 "" "" "")'
  expect_output "load order $order: the call works" "=> nil"
  [ "$RC" -eq 0 ] && pass "load order $order: devhost exits cleanly" || fail "load order $order: exit $RC"
done

devhost --drawings 3 --after-ms 300 --post cancel --eval '(Orvex 1 2 "" "" "")'
expect_output "three drawings: the function is defined in the active one and works" "=> nil"

finish
