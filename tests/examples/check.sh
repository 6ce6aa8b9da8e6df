#!/bin/sh
# Compares the output of an example with a file.
#
#     check.sh EXPECTED PROGRAM [ARGUMENT...]
set -eu

expected=$1
shift
actual=$(mktemp)
trap 'rm -f "$actual"' EXIT
"$@" > "$actual" 2>&1
[ -s "$expected" ]
cmp "$expected" "$actual" || { diff "$expected" "$actual"; exit 1; }
