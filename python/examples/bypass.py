"""Removes every patch of a kind from a document and connects the sources of its inputs to the targets of its output.

    python3 bypass.py DOCUMENT KIND TAG [RESULT]
    python3 bypass.py examples/documents/animation.json choose 3

The patch that the values come from is renamed, and every change is printed. TAG is that of the input.
"""

import sys

import tarn_engine_base as tarn
from list_ports import patches


def bypass(index: tarn.PatchIndex, edit: tarn.PatchEdit, patch: tarn.Patch, tag: int) -> None:
    port = tarn.in_port_for_tag(patch, tag)
    incoming = index.incoming_connection(port.id) if port is not None else None
    source = edit.patch(incoming.from_patch_id) if incoming is not None else None
    if incoming is None or source is None:
        return
    source.name = f"{source.name}, without {patch.name}"
    outgoing = index.outgoing_connections_from_patch(patch.id)
    edit.remove_patch(patch.id)
    for connection in outgoing:
        edit.connect(
            tarn.Connection(
                incoming.from_patch_id, incoming.from_port_id, connection.to_patch_id, connection.to_port_id
            )
        )


def main(document: str, kind_name: str, tag: str, result: str | None = None) -> int:
    root, info = tarn.load_document_with_info(document)
    kind = tarn.string_to_kind(kind_name)
    if kind is None:
        print(f"there is no kind {kind_name!r}", file=sys.stderr)
        return 2
    index = tarn.PatchIndex(root)
    edit = tarn.PatchEdit(index)
    for patch in patches(root):
        if patch.builtin == kind:
            bypass(index, edit, patch, int(tag))
    after = edit.commit()
    for change in tarn.patch_changes(root, after):
        print(change)
    if result is not None:
        tarn.save_document(result, after, info.frames_per_second)
    return 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:5]))
