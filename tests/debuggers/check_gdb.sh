#!/bin/sh
# Compares everything that gdb prints for the objects of a program with a file.
#
#     check_gdb.sh PROGRAM PRINTERS EXPECTED
set -eu

names="integer number pair color matrix truth image text none data tree path drawn many element bounded pulse \
some nothing input inner root evaluated index evaluatedIndex"
commands=$(mktemp)
trap 'rm -f "$commands" "$commands.out"' EXIT
{
    echo "set confirm off"
    echo "set debuginfod enabled off"
    echo "set print pretty on"
    echo "set width 0"
    echo "source $2"
    echo "break here"
    echo "run"
    echo "finish"
    for name in $names; do
        printf '%s\n' "echo $name\\n" "output $name" 'echo \n'
    done
} > "$commands"
gdb -q -nx -batch -x "$commands" "$1" 2> /dev/null > "$commands.out"
sed -n '/^integer$/,$p' "$commands.out" | diff "$3" -
echo "output as expected"
