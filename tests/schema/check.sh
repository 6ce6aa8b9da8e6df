#!/bin/sh
# Validates documents with docs/document.schema.json: those of examples/documents, what document_road makes of
# them, and those that a test writes at random; and that the schema refuses what it has to.
#
#     check.sh SOURCE_DIR DOCUMENT_TEST DOCUMENT_ROAD
set -eu

root=$1
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

TARN_WRITTEN_DOCUMENTS=$work "$2" --gtest_filter=WriteDocument.IsReadBackToTheLastBit > /dev/null
for document in "$root"/examples/documents/*.json; do
    "$3" "$document" --frames 0 --write "$work/$(basename "$document")" > /dev/null 2>&1
done
python3 "$root/tests/schema/validate.py" "$root/docs/document.schema.json" \
    "$root/examples/documents/animation.json" "$root/examples/documents/small.json" "$work"/*.json
