#!/bin/sh
# Compiles the statements in table.txt, each in its own function: those that must compile as one program, the others
# as one in which the compiler must reject every line.
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
#include <Engine/Base/fwd.h>
#include <Engine/Base/easing.h>
#include <Engine/Base/layers.h>
#include <Engine/Base/media.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/path_geometry.h>
#include <Engine/Base/svg_path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/vector_math.h>
#include <Engine/Base/value.h>
#include <algorithm>
#include <cstdint>
#include <memory>
#include <sstream>
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
struct Derived : Value {
    using Value::Value;
};
extern Derived const derived;
extern Array<Port> const ports;
int function(int);
template <class T>
void use(T const&);
CPP

grep -n '^yes |' "$table" | cut -d: -f1 > "$work/yes"
grep -n '^no  |' "$table" | cut -d: -f1 > "$work/no"
[ -s "$work/yes" ] && [ -s "$work/no" ] || { echo "$table has no statements"; exit 1; }
if grep -vn '^yes | .\|^no  | .\|^#\|^$' "$table"; then echo "$table: malformed lines"; exit 1; fi

# program ANSWER: prints a program with the statements that have this answer. Its line N is the statement in line N of
# the table.
program() {
    awk -F ' [|] ' -v wanted="$1" '
        NR == 1 { print "#include \"prelude.h\""; next }
        substr($0, 1, length(wanted) + 1) ~ "^" wanted "[ ]" && index($0, "| ") {
            print "[[maybe_unused]] static void statement" NR "() { " substr($0, index($0, "| ") + 2) " }"
            next
        }
        { print "" }' "$table"
}
program yes > "$work/yes.cpp"
program no > "$work/no.cpp"

limit=-fmax-errors=0
"$compiler" --version | grep -q clang && limit=-ferror-limit=0
# compile FILE: prints the errors, wherever they are.
compile() {
    # shellcheck disable=SC2086
    timeout 300 "$compiler" "-std=$standard" $includes "-I$work" $limit -w -fsyntax-only "$1" 2>&1
}
compile "$work/yes.cpp" || { echo "statements that must compile do not"; exit 1; }
compile "$work/no.cpp" > "$work/errors" && { echo "the compiler accepts statements that must not compile"; exit 1; }
sed -n "s|^.*no\.cpp:\([0-9]*\):[0-9]*: \(fatal \)\{0,1\}error: .*|\1|p" "$work/errors" \
    | sort -nu > "$work/refused"

status=0
for line in $(cat "$work/no"); do
    if ! grep -qx "$line" "$work/refused"; then
        echo "compiles: $(sed -n "${line}s/^no  | //p" "$table")"
        status=1
    fi
done
echo "$standard: $(wc -l < "$work/yes") statements that must compile, $(wc -l < "$work/no") that must not"
exit $status
