#!/bin/sh
# Compiles every statement of table.txt, each in a function of its own, and compares which of them
# the compiler refuses with which it should.
#
#     check.sh COMPILER STANDARD INCLUDE_DIR...
set -eu

compiler=$1
standard=$2
shift 2
includes=""
for directory in "$@"; do includes="$includes -I$directory"; done

table=$(dirname "$0")/table.txt
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

cat > "$work/prelude.h" <<'CPP'
#include <Engine/Base/easing.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/media.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
using namespace tarn::engine;
extern Value const value;
extern Unstructured const data;
extern Path const path;
extern Port const port;
extern Patch const patch;
extern FloatVec2 const vec2;
template <class T>
void use(T const&);
CPP

# Line N of the program is the statement on line N of the table.
sed -e '1s/.*/#include "prelude.h"/' -e '1!{/^ *#/s/.*//}' \
    -e 's/^\(yes\|no \) | \(.*\)$/[[maybe_unused]] static void \1_LINE() { \2 }/' \
    -e 's/no _LINE/no_LINE/' "$table" \
    | awk '{ gsub(/_LINE/, "_" NR); print }' > "$work/program.cpp"
grep -n '^yes |' "$table" | cut -d: -f1 > "$work/yes"
grep -n '^no  |' "$table" | cut -d: -f1 > "$work/no"
[ -s "$work/yes" ] && [ -s "$work/no" ] || { echo "$table has no statements"; exit 1; }
if grep -vn '^yes | .\|^no  | .\|^#\|^$' "$table"; then echo "$table: lines not understood"; exit 1; fi

limit=-fmax-errors=0
"$compiler" --version | grep -q clang && limit=-ferror-limit=0
# shellcheck disable=SC2086
timeout 300 "$compiler" "-std=$standard" $includes "-I$work" $limit -w -fsyntax-only "$work/program.cpp" \
    2> "$work/errors" && { echo "the compiler refuses nothing"; exit 1; }
sed -n "s|^.*program\.cpp:\([0-9]*\):[0-9]*: \(fatal \)\{0,1\}error: .*|\1|p" "$work/errors" \
    | sort -nu > "$work/refused"
status=0
for line in $(cat "$work/yes"); do
    if grep -qx "$line" "$work/refused"; then
        echo "does not compile: $(sed -n "${line}s/^yes | //p" "$table")"
        grep -m1 "program\.cpp:$line:.*error" "$work/errors"
        status=1
    fi
done
for line in $(cat "$work/no"); do
    if ! grep -qx "$line" "$work/refused"; then
        echo "compiles: $(sed -n "${line}s/^no  | //p" "$table")"
        status=1
    fi
done
echo "$standard: $(wc -l < "$work/yes") statements that must compile, $(wc -l < "$work/no") that must not"
exit $status
