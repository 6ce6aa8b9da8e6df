#!/bin/sh
# Compares everything that lldb prints for the objects of a program with a file.
#
#     check_lldb.sh PROGRAM FORMATTERS EXPECTED
set -eu

names="integer number pair color matrix truth image text none data tree path drawn many element bounded pulse \
some nothing input inner root evaluated index evaluatedIndex"
# Debian's lldb does not find its own Python module.
for folder in /usr/lib/llvm-*/lib/python3*/dist-packages; do
    [ ! -f "$folder/lldb/embedded_interpreter.py" ] || export PYTHONPATH="$folder"
done
lldb -b -x -o "command script import $2" -o "breakpoint set -n here" \
    -o "process launch --no-stdio" -o finish \
    -o "frame variable $names" "$1" 2>&1 |
    sed -n 's/^(tarn::engine::[A-Za-z:<>]*) //; /^integer = /,$p' | diff "$3" -
echo "output as expected"
