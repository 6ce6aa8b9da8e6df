#!/bin/sh
# Compiles every program in the guide and every example at the top of a header, and compares the programs' output with
# the guide.
#
#     check_guide.sh SOURCE_DIR COMPILER LIBRARY_DIR INCLUDE_DIR
set -eu

root=$1
compiler=$2
libraries=$3
boost=${4:-/usr/include}
[ "$boost" = /usr/include ] && boost="" || boost="-isystem $boost"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

programs=0
for page in "$root"/docs/*.md; do
    name=$(basename "$page" .md)
    awk -v base="$work/$name" '
        /^```cpp$/ { n++; out = base "-" n ".cpp"; next }
        /^```text$/ { out = base "-" n ".txt"; next }
        /^```/ { out = ""; next }
        out != "" { print > out }' "$page"
done
for program in "$work"/*.cpp; do
    base=${program%.cpp}
    "$compiler" -std=c++17 -I"$root" $boost "$program" -o "$base" -L"$libraries" -ltarn_engine_document \
        -ltarn_engine_base -Wl,-rpath,"$libraries"
    "$base" > "$base.out"
    diff "$base.txt" "$base.out" || { echo "$(basename "$base") prints something else"; exit 1; }
    programs=$((programs + 1))
done
[ "$programs" -ge 9 ]

headers=0
for header in "$root"/examples/*.h "$root"/examples/*/*.h; do
    name=${header#"$root/examples/"}
    {
        printf '#include "%s"\n#include <Engine/Base/base.h>\n#include <Engine/Document/document.h>\n' "$name"
        printf '#include "animation/evaluator.h"\n#include "report/film.h"\n#include "report/layout.h"\n'
        printf '#include <fstream>\n#include <iostream>\nusing namespace tarn::engine;\n'
        printf 'extern Document document;\nextern Document before;\nextern Document after;\nextern Evaluator evaluator;\n'
        printf 'extern Patch patch;\nextern EvalPort port;\nextern Film film;\n'
        use=$(sed -n '/^\/\/     /s///p; /^#ifndef/q' "$header")
        [ -n "$use" ] || { echo "$name has no example" >&2; exit 1; }
        printf 'void shown() {\n%s\n}\n' "$use"
    } > "$work/use.cpp"
    "$compiler" -std=c++17 -fsyntax-only -I"$root" -I"$root/examples" $boost "$work/use.cpp" || {
        cat "$work/use.cpp"
        exit 1
    }
    headers=$((headers + 1))
done
for header in "$root"/Engine/Base/*.h "$root"/Engine/Document/*.h; do
    name=${header#"$root/"}
    {
        printf '#include <%s>\n#include <Engine/Base/assertion.h>\n' "$name"
        printf '#include <Engine/Base/patch.h>\n#include <Engine/Base/path.h>\n#include <iostream>\n'
        printf 'using namespace tarn::engine;\nvoid follow(Connection const&);\nvoid use(Type);\nbool hasValue();\n'
        printf 'extern Patch root;\nextern Patch before;\nextern Patch after;\nextern unsigned long long portId;\nextern std::string text;\n'
        use=$(sed -n '/^\/\/     /s///p; /^#ifndef/q' "$header")
        [ -n "$use" ] || { echo "$name has no example" >&2; exit 1; }
        case $use in
            '#include'* | 'TARN_'*) printf '%s\n' "$use" ;;
            *) printf 'void shown() {\n%s\n}\n' "$use" ;;
        esac
    } > "$work/use.cpp"
    "$compiler" -std=c++17 -fsyntax-only -I"$root" $boost "$work/use.cpp" || {
        cat "$work/use.cpp"
        exit 1
    }
    headers=$((headers + 1))
done
echo "$programs programs of the guide and the examples of $headers headers"
