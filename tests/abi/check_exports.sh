#!/bin/sh
# The library exports exactly the public interface: each symbol belongs to a public name and is in the list that
# scripts/abi stores, and none of that list is missing.
#
#     check_exports.sh LIBRARY NM SYMBOLS       LIBRARY may be the import library of a DLL
set -eu

library=$1
nm=$2
symbols=$(dirname "$0")/$3
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# The type of identifiers is another alias of 64 bits on each system.
names() { c++filt | sed 's/unsigned long long/unsigned long/g' | LC_ALL=C sort -u; }

case $library in
    *.dll.a) "$nm" --defined-only "$library" | awk '$2 == "T" { print $3 }' ;;
    *) "$nm" -D --defined-only "$library" | awk '{ print $NF }' ;;
esac | names > "$work/exported"
names < "$symbols" > "$work/kept"

if grep -v '^\(tarn::engine::\|\(double\|long long\|void\) tarn::engine::ease\|std::hash<tarn::engine::\(Connection\|Value\)>::operator()\)' \
    "$work/exported"; then
    echo "exported, but not part of the interface"
    exit 1
fi
diff "$work/kept" "$work/exported" || {
    echo "differs from tests/abi/$3 (scripts/abi renew)"
    exit 1
}
echo "$(wc -l < "$work/exported") exported names, all public"
