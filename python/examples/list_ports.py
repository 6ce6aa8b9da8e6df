"""Lists all ports of a type in the documents of a folder.

    python3 list_ports.py FOLDER TYPE        python3 list_ports.py examples/documents path
"""

import sys
from collections.abc import Iterator
from pathlib import Path

import tarn_engine_base as tarn


def patches(root: tarn.Patch) -> Iterator[tarn.Patch]:
    """The patch and all patches inside it. Not recursive: documents may be deep."""
    pending = [root]
    while pending:
        patch = pending.pop()
        yield patch
        pending.extend(reversed(patch.children))


def main(folder: str, type_name: str) -> int:
    wanted = tarn.string_to_type(type_name)
    if wanted is None:
        print(f"there is no type {type_name!r}", file=sys.stderr)
        return 2
    for file in sorted(Path(folder).glob("*.json")):
        try:
            root = tarn.load_document(file)
        except tarn.DocumentError as error:
            print(f"{file.name}: {error}", file=sys.stderr)
            continue
        for patch in patches(root):
            for port in (*patch.inputs, *patch.outputs):
                if port.type_info.type == wanted:
                    print(f"{file.name}: patch {patch.id} {patch.name!r}, port {port.id} {port.name!r}")
    return 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:3]))
