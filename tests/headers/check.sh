#!/bin/sh
# Compiles every public header by itself, twice included, with all warnings as errors; and all of them
# without exceptions and run-time type information. So compile records in braces. Boost's macro for smaller variants is refused.
#
#     check.sh COMPILER STANDARD INCLUDE_DIR BOOST_DIR
set -eu

compiler=$1
standard=$2
root=$3
# The system's own folder is to keep its place among the others.
boost="-isystem $4"
[ "$4" != /usr/include ] || boost=""

headers=$(ls "$root"/Engine/Base/*.h "$root"/Engine/Document/*.h)
# One of them bridges to a library that its callers have.
echo '#include <nlohmann/json.hpp>' | "$compiler" "-std=$standard" -fsyntax-only -x c++ - 2> /dev/null ||
    headers=$(echo "$headers" | grep -v '/json\.h$')

count=0
for header in $headers; do
    name=${header#"$root/"}
    printf '#include <%s>\n#include <%s>\n' "$name" "$name" \
        | "$compiler" "-std=$standard" "-I$root" $boost -Wall -Wextra -Wpedantic -Wconversion -Wshadow \
            -Werror -fsyntax-only -x c++ -
    count=$((count + 1))
done
echo "$standard: $count headers compile alone"
[ "$count" -gt 0 ]

"$compiler" "-std=$standard" "-I$root" $boost -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Werror -fsyntax-only \
    "$root/tests/headers/braces.cpp"
echo "$standard: records in braces"

everything() { for header in $headers; do echo "#include <${header#"$root/"}>"; done; }
everything | "$compiler" "-std=$standard" "-I$root" $boost -fno-exceptions -fno-rtti -Wall -Wextra -Werror -fsyntax-only -x c++ -
echo "$standard: without exceptions and run-time type information"

everything | "$compiler" "-std=$standard" "-I$root" $boost -DBOOST_VARIANT_MINIMIZE_SIZE -fsyntax-only -x c++ - \
    2> /dev/null && { echo "smaller variants are not refused"; exit 1; }
everything | LC_ALL=C "$compiler" "-std=$standard" "-I$root" $boost -DBOOST_VARIANT_MINIMIZE_SIZE -fsyntax-only -x c++ - 2>&1 \
    | grep -q 'error: .*undefine BOOST_VARIANT_MINIMIZE_SIZE'
echo "$standard: smaller variants are refused"
