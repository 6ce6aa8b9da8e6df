#!/bin/sh
# Compares `document_road --help` with the file that scripts/demo prints. Versions of CLI11 write defaults as "=13" or
# " [13] ", and end with a blank line or not.
#
#     check_help.sh EXPECTED PROGRAM
set -eu

actual=$(mktemp)
expected=$(mktemp)
trap 'rm -f "$actual" "$expected"' EXIT
alike() { sed -E 's/=([0-9]+)$/ [\1]/; s/ +$//; /^$/d'; }
"$2" --help | alike > "$actual"
alike < "$1" > "$expected"
[ -s "$expected" ]
diff "$expected" "$actual"
