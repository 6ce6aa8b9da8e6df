#!/bin/sh
# Builds the program in README.md with the CMakeLists.txt in README.md, in a new project that adds this one as a
# subdirectory, and compares its output with README.md. Then runs the installation commands.
#
#     check_readme.sh SOURCE_DIR COMPILER
set -eu

root=$1
compiler=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

block() { awk -v start="\`\`\`$1" '$0 == start { on = 1; next } /^```/ { if (on) exit } on' "$root/README.md"; }
block cpp > "$work/main.cpp"
block cmake > "$work/CMakeLists.txt"
block text > "$work/expected"
block sh > "$work/install.sh"
ln -s "$root" "$work/tarn-engine-base"

cmake -S "$work" -B "$work/build" -G Ninja -DCMAKE_CXX_COMPILER="$compiler" \
    -DCMAKE_EXPORT_COMPILE_COMMANDS=ON > /dev/null
cmake --build "$work/build" > "$work/log" || { cat "$work/log"; exit 1; }
"$work/build/first_steps" > "$work/actual"
diff "$work/expected" "$work/actual"
[ -s "$work/expected" ]

if grep -E -- '-W(all|extra|error)' "$work/build/compile_commands.json"; then
    echo "warning options leak into projects that use the library"
    exit 1
fi
if grep -E '_test\.cpp|document_road' "$work/build/compile_commands.json"; then
    echo "tests or examples are built in projects that use the library"
    exit 1
fi
for test in $(sed -n '/^## Guarantees/,$p' "$root/README.md" | grep -oE '`[A-Z][A-Za-z]+\.[A-Z][A-Za-z]+`' | tr -d '`'); do
    grep -qE "^TEST(_F)?\(${test%.*}, ${test#*.}\)" "$root"/tests/*_test.cpp "$root"/tests/*/*_test.cpp || { echo "no such test: $test"; exit 1; }
done
for script in $(sed -n '/^## Guarantees/,$p' "$root/README.md" | grep -oE '`(scripts/[a-z]+|\.ci/run)' | tr -d '`'); do
    [ -x "$root/$script" ] || { echo "no such script: $script"; exit 1; }
done
mkdir "$work/sources"
cp -R "$root/CMakeLists.txt" "$root/LICENSE" "$root/Engine" "$root/cmake" "$root/tools" "$work/sources"
(cd "$work/sources" && HOME=$work CXX=$compiler sh -eu ../install.sh) > "$work/log" || { cat "$work/log"; exit 1; }
for file in include/Engine/Base/value.h share/doc/tarn-engine-base/LICENSE; do [ -e "$work/tarn/$file" ]; done
if find "$work/tarn" -name 'changelog*' | grep .; then exit 1; fi
lines=$(wc -l < "$work/main.cpp")
echo "README.md: $lines lines compile and print the documented output"
