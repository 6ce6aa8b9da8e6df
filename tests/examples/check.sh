#!/bin/sh
# Runs an example and compares what it prints with a file, whole.
#
#     check.sh EXPECTED PROGRAM [ARGUMENT...]
set -eu

expected=$1
shift
actual=$(mktemp)
trap 'rm -f "$actual"' EXIT
"$@" > "$actual"
[ -s "$expected" ]
cmp "$expected" "$actual" || { diff "$expected" "$actual"; exit 1; }
