"""Compares the module's speed with the C++ library, with NumPy formulas, and with plain Python.

    scripts/python --bench

Both sides of a row are measured in turns; the times are minima. Ends with 1 where a ratio is above its limit.
"""

import subprocess
import sys
import tempfile
import time
from collections.abc import Callable
from pathlib import Path

import numpy as np
import tarn_engine_base as tarn

ROUNDS = 15
PATCHES = 100_000
VALUES = 1_000_000


def seconds(work: Callable[[], object]) -> float:
    start = time.perf_counter()
    work()
    return time.perf_counter() - start


def graph() -> tarn.Patch:
    """Patches in groups of a hundred, each connected to the previous one."""
    groups = []
    for group in range(PATCHES // 100):
        children: list[tarn.Patch] = []
        connections = []
        for i in range(100):
            id = group * 101 + i + 3
            inputs = [tarn.Port(3 * id, 1, "value"), tarn.Port(3 * id + 1, 2, "progress", default_value=0.5)]
            if children:
                connections.append(tarn.Connection(id - 1, 3 * id - 1, id, 3 * id))
            children.append(tarn.Patch(id=id, builtin=6, inputs=inputs, outputs=[tarn.Port(3 * id + 2, 1, "eased")]))
        groups.append(tarn.Patch(id=group * 101 + 2, builtin=1, children=children, connections=connections))
    return tarn.Patch(id=1, builtin=1, children=groups)


def read_and_find(file: Path) -> int:
    """The number of connected inputs."""
    index = tarn.PatchIndex(tarn.load_document(file))
    found = 0
    pending = [index.root]
    while pending:
        patch = pending.pop()
        for port in patch.inputs:
            found += index.incoming_connection(port.id) is not None
        pending.extend(patch.children)
    return found


def cubic_in_out(t: np.ndarray) -> np.ndarray:
    return 10 + 10 * np.where(t < 0.5, 4 * t**3, 1 - (2 - 2 * t) ** 3 / 2)


class Cpp:
    """The C++ program for the same operations."""

    def __init__(self, program: str) -> None:
        self.process = subprocess.Popen([program], stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)

    def seconds(self, command: str) -> float:
        assert self.process.stdin and self.process.stdout
        print(command, file=self.process.stdin, flush=True)
        return float(self.process.stdout.readline())


def main(program: str) -> int:
    cpp = Cpp(program)
    t = np.linspace(0, 1, VALUES)
    curve = tarn.EasingFunction.CUBIC_IN_OUT
    numbers = [float(i) for i in range(100_000)]
    np.testing.assert_allclose(tarn.ease(curve, 10, 20, t), cubic_in_out(t), rtol=1e-14)
    worst = 0
    with tempfile.TemporaryDirectory() as folder:
        file = Path(folder) / "graph.json"
        tarn.save_document(file, graph())
        assert read_and_find(file) == PATCHES - PATCHES // 100
        ease = lambda: tarn.ease(curve, 10, 20, t)
        rows = [
            ("ease 1,000,000 numbers", "C++", 1.1, ease, lambda: cpp.seconds(f"ease {int(curve)} {VALUES}")),
            ("ease 1,000,000 numbers", "NumPy", None, ease, lambda: seconds(lambda: cubic_in_out(t))),
            (
                "read 100,000 patches, find every incoming connection",
                "C++",
                2.0,
                lambda: read_and_find(file),
                lambda: cpp.seconds(f"read {file}"),
            ),
            (
                "make a Value of a float",
                "a tuple of it",
                3.0,
                lambda: [tarn.Value(x) for x in numbers],
                lambda: seconds(lambda: [(x,) for x in numbers]),
            ),
        ]
        print("| operation | ms | beside | ms | ratio | limit |\n|---|---|---|---|---|---|")
        for name, peer, limit, ours, theirs in rows:
            times = [(seconds(ours), theirs()) for _ in range(ROUNDS)]
            mine, other = min(a for a, _ in times), min(b for _, b in times)
            ratio = mine / other
            worst = max(worst, 0 if limit is None else ratio > limit)
            print(f"| {name} | {mine * 1e3:.2f} | {peer} | {other * 1e3:.2f} | {ratio:.2f} | {limit or ''} |", flush=True)
    return worst


if __name__ == "__main__":
    sys.exit(main(sys.argv[1]))
