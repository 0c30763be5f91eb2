#!/usr/bin/env bash
# The LISP function as a LISP program calls it: argument checks, cancel, accept, the result list.
. "$(dirname "$0")/lib.sh"

nl=$'\n'

devhost --eval '(Orvex)'
expect_output "no arguments: printed, then alerted" \
  "${nl}Missing parametrs${nl}[alert] \\nMissing parametrs\\n${nl}=> (no value)"

devhost --eval '(Orvex 1)'
expect_output "one argument: missing printed, type message alerted" \
  "${nl}Missing parametrs${nl}[alert] \\nArgument should be an short${nl}=> (no value)"

devhost --eval '(Orvex "a" 2 "" "" "")'
expect_output "first argument not a short" \
  "${nl}Argument should be an short${nl}[alert] \\nArgument should be an short${nl}=> (no value)"

devhost --eval '(Orvex 1 2.5 "" "" "")'
expect_output "second argument not a short: alerted, then printed" \
  "[alert] \\nArgument should be an short${nl}${nl}Argument should be an short${nl}=> (no value)"

devhost --eval '(Orvex 1 2 3 "" "")'
expect_line "start path not a string" "[alert] \\nArgument should be an short"

devhost --eval '(Orvex 1 2 "" "")'
expect_line "cancel caption missing" "[alert] \\nArgument should be an short"

devhost --after-ms 300 --post cancel --eval '(Orvex 1 2 "" "Insert" "Close")'
expect_output "cancelled run gives nil" "=> nil"

# A pick. Without a start path the explorer opens the folder saved in the settings file beside the library.
folder="$WORK/drawings"
mkdir -p "$folder"
gen_dwg "$folder" 3 --variant 11
cp "$folder/$(ls "$folder" | head -1)" "$folder/plan.dwg"
printf 'wait text="plan.dwg" timeout=20000\ndouble-click text="plan.dwg" at=60,-50\n' >"$WORK/pick.txt"
printf '[CurrentPath]\r\nPath=%s\r\nName=\r\n\r\n' "$(winpath "$folder")" >"$WORK/lib/Orvex1.ini"
devhost --script "$(winpath "$WORK/pick.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_output "a pick in a folder without datains.ini gives three empty strings" \
  "=> (\"$(lisppath "$folder")\\\\plan.dwg\" (\"\" \"\" \"\"))"

printf '[Default Parameters]\r\nLayer=Walls\r\nLisp command=(command "_zoom" "_e")\r\nColor=3\r\n\r\n' >"$folder/datains.ini"
printf '[CurrentPath]\r\nPath=%s\\\r\nName=\r\n\r\n' "$(winpath "$folder")" >"$WORK/lib/Orvex1.ini"
devhost --script "$(winpath "$WORK/pick.txt")" --eval '(Orvex 1 2 "" "" "")'
expect_output "a pick returns layer, colour and command of the folder; no doubled separator" \
  "=> (\"$(lisppath "$folder")\\\\plan.dwg\" (\"Walls\" \"3\" \"(command \\\"_zoom\\\" \\\"_e\\\")\"))"

devhost --after-ms 300 --post cancel --eval '(Orvex 1 2 "C:\\Work\\a.dwg" "" "")' --eval '(Orvex 1 2 "" "" "")'
expect_output "two calls in a row, each cancelled" "=> nil${nl}=> nil"

devhost --eval '(orvex2)'
expect_line "unknown function" "; error: no function definition: orvex2"

finish
