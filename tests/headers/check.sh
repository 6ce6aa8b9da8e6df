#!/bin/sh
# Compiles every public header alone, included twice, with all warnings as errors; and all headers together without
# exceptions and run-time type information, and the braced initialisers of records. Boost's macro for smaller variants
# must be rejected.
#
#     check.sh COMPILER STANDARD INCLUDE_DIR BOOST_DIR
set -eu

compiler=$1
standard=$2
root=$3
# The system's include folder must keep its position.
boost="-isystem $4"
[ "$4" != /usr/include ] || boost=""

headers=$(ls "$root"/Engine/Base/*.h "$root"/Engine/Document/*.h)
# json.h needs a library that its callers have.
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
echo "$standard: braced initialisers of records"

everything() { for header in $headers; do echo "#include <${header#"$root/"}>"; done; }
everything | "$compiler" "-std=$standard" "-I$root" $boost -fno-exceptions -fno-rtti -Wall -Wextra -Werror -fsyntax-only -x c++ -
echo "$standard: without exceptions and run-time type information"

everything | "$compiler" "-std=$standard" "-I$root" $boost -DBOOST_VARIANT_MINIMIZE_SIZE -fsyntax-only -x c++ - \
    2> /dev/null && { echo "the macro for smaller variants is not rejected"; exit 1; }
everything | LC_ALL=C "$compiler" "-std=$standard" "-I$root" $boost -DBOOST_VARIANT_MINIMIZE_SIZE -fsyntax-only -x c++ - 2>&1 \
    | grep -q 'error: .*undefine BOOST_VARIANT_MINIMIZE_SIZE'
echo "$standard: the macro for smaller variants is rejected"
