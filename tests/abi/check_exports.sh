#!/bin/sh
# Every symbol that the library exports is a name of the public interface.
#
#     check_exports.sh LIBRARY
set -eu

symbols=$(nm -D --defined-only "$1" | awk '{ print $NF }' | c++filt | sort -u)
allowed='^\(tarn::engine::\|\(double\|long long\) tarn::engine::ease\|std::hash<tarn::engine::Connection>::operator()\)'
if echo "$symbols" | grep -v "$allowed"; then
    echo "exported, and not part of the interface"
    exit 1
fi
for name in 'Value::Value(double)' 'Value::type() const' 'PathBuilder::hexaRect(' '_helper(' \
    'castValueToType(tarn::engine::Value const&' 'indexLoopCasting(' 'Unstructured::ifMap' \
    'Unstructured::~Unstructured()' '_findOutgoingConnectionsFromPort(' 'Path::~Path()' \
    'PatchIndex::findPatch' 'double tarn::engine::ease<double>(' \
    'std::hash<tarn::engine::Connection>::operator()('; do
    echo "$symbols" | grep -qF "$name" || { echo "not exported: $name"; exit 1; }
done
echo "$(echo "$symbols" | wc -l) exported names, all of the interface"
