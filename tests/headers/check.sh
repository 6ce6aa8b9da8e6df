#!/bin/sh
# Compiles every public header by itself, twice included, with all warnings as errors.
#
#     check.sh COMPILER STANDARD INCLUDE_DIR
set -eu

compiler=$1
standard=$2
root=$3

count=0
for header in "$root"/Engine/Base/*.h; do
    name=Engine/Base/$(basename "$header")
    printf '#include <%s>\n#include <%s>\n' "$name" "$name" \
        | "$compiler" "-std=$standard" "-I$root" -Wall -Wextra -Wpedantic -Wconversion -Wshadow \
            -Werror -fsyntax-only -x c++ -
    count=$((count + 1))
done
echo "$standard: $count headers compile alone"
[ "$count" -gt 0 ]
