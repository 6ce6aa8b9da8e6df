#!/bin/sh
# Validates documents against docs/document.schema.json: those in examples/documents, what document_road writes for
# them, and random ones from a test. The schema must reject invalid documents.
#
#     check.sh SOURCE_DIR DOCUMENT_TEST DOCUMENT_ROAD
set -eu

root=$1
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

TARN_WRITTEN_DOCUMENTS=$work "$2" --gtest_filter=WriteDocument.RoundTripsToTheLastBit > /dev/null
for document in "$root"/examples/documents/*.json; do
    "$3" "$document" --frames 0 --write "$work/$(basename "$document")" > /dev/null 2>&1
done
python3 "$root/tests/schema/validate.py" "$root/docs/document.schema.json" \
    "$root/examples/documents/animation.json" "$root/examples/documents/small.json" "$work"/*.json
