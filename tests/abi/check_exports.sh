#!/bin/sh
# The library exports the public interface and nothing else: each symbol is one of its names, and one of the
# list that scripts/abi keeps, and none of that list is missing.
#
#     check_exports.sh LIBRARY NM SYMBOLS       LIBRARY may be the import library of a DLL
set -eu

library=$1
nm=$2
symbols=$(dirname "$0")/$3
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# One name for the type of identifiers, which is another alias of 64 bits on each system.
names() { c++filt | sed 's/unsigned long long/unsigned long/g' | LC_ALL=C sort -u; }

case $library in
    *.dll.a) "$nm" --defined-only "$library" | awk '$2 == "T" { print $3 }' ;;
    *) "$nm" -D --defined-only "$library" | awk '{ print $NF }' ;;
esac | names > "$work/exported"
names < "$symbols" > "$work/kept"

if grep -v '^\(tarn::engine::\|\(double\|long long\|void\) tarn::engine::ease\|std::hash<tarn::engine::\(Connection\|Value\)>::operator()\)' \
    "$work/exported"; then
    echo "exported, and not part of the interface"
    exit 1
fi
diff "$work/kept" "$work/exported" || {
    echo "not what tests/abi/$3 lists (scripts/abi renew)"
    exit 1
}
echo "$(wc -l < "$work/exported") exported names, all of the interface"
