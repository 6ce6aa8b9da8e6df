#!/bin/sh
# Has a program write a picture and compares it with a file, whole.
#
#     check_picture.sh EXPECTED PROGRAM [ARGUMENT...]
set -eu

expected=$1
shift
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
"$@" --picture "$work/picture.svg" > /dev/null
[ -s "$expected" ]
cmp "$expected" "$work/picture.svg" || { diff "$expected" "$work/picture.svg"; exit 1; }
