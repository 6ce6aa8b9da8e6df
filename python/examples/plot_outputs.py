"""Plots the outputs of an animation over time, as a picture.

    python3 plot_outputs.py DOCUMENT PICTURE [FRAMES]

All frames are evaluated at once: a port's values are an array with an element for each frame. What is no number, or
comes from a kind of patch that is not known here, is left out.
"""

import sys
from typing import Any

import matplotlib

matplotlib.use("Agg")

import matplotlib.pyplot as plt  # noqa: E402  (the backend is chosen before)
import numpy as np  # noqa: E402
import numpy.typing as npt  # noqa: E402

import tarn_engine_base as tarn  # noqa: E402
from list_ports import patches  # noqa: E402

Frames = npt.NDArray[np.floating[Any]]


class Animation:
    """Computes each output once, on demand."""

    def __init__(self, root: tarn.Patch, seconds: Frames, frames: Frames) -> None:
        self.index = tarn.PatchIndex(root)
        self.clock = {1: seconds, 2: frames, 3: seconds * 1000}
        self.known: dict[int, Frames | None] = {}

    def output(self, port: tarn.Port) -> Frames | None:
        """The values of an output port, or None."""
        if port.id not in self.known:
            self.known[port.id] = None  # A circle of connections ends here.
            patch = self.index.owner_of_port(port.id)
            if patch is not None and port.type_info.type == tarn.Type.FLOAT:
                self.known[port.id] = self.compute(patch, port)
        return self.known[port.id]

    def input(self, patch: tarn.Patch | None, tag: int) -> Frames | None:
        """The value of an input port: that of the connected output, or its default value."""
        port = tarn.in_port_for_tag(patch, tag) if patch is not None else None
        if port is None:
            return None
        connection = self.index.incoming_connection(port.id)
        if connection is None:
            return np.full_like(self.clock[1], float(port.default_value))
        source = self.index.find_output_port(connection.from_port_id)
        return self.output(source) if source is not None else None

    def compute(self, patch: tarn.Patch, port: tarn.Port) -> Frames | None:
        kind = tarn.kind_to_string(patch.builtin)
        if kind == "group":
            ends = [child for child in patch.children if tarn.kind_to_string(child.builtin) == "output"]
            return self.input(ends[0], port.tag) if ends else None
        if kind == "input":
            return self.input(self.index.parent_of(patch.id), port.tag)
        if kind == "time":
            return self.clock.get(port.tag)
        arrived = [self.input(patch, i.tag) for i in patch.inputs]
        values = [v for v in arrived if v is not None]
        if len(values) < len(arrived):
            return None
        result: Frames | None = None
        if kind == "add":
            result = np.sum(values, axis=0)
        elif kind == "multiply":
            result = np.prod(values, axis=0)
        elif kind == "oscillator" and len(values) == 4:
            amplitude, hertz, turns, seconds = values
            result = amplitude * np.sin(2 * np.pi * (hertz * seconds + turns))
        elif kind == "ease" and len(values) == 4:
            result = self.ease(patch, values[2])
        return result

    @staticmethod
    def ease(patch: tarn.Patch, progress: Frames) -> Frames:
        start, end, _, curve = (port.default_value for port in patch.inputs)
        function = tarn.string_to_easing_function(str(curve))
        if function is None:
            function = tarn.EasingFunction(int(curve))
        return tarn.ease(function, float(start), float(end), progress)


def main(document: str, picture: str, frame_count: str = "121") -> int:
    root, info = tarn.load_document_with_info(document)
    frames: Frames = np.arange(float(frame_count))
    animation = Animation(root, frames / info.frames_per_second, frames)
    figure, axes = plt.subplots(figsize=(8, 4))
    for patch in patches(root):
        for port in patch.outputs:
            values = animation.output(port) if patch.children else None
            if values is not None:
                axes.plot(frames, values, label=f"{patch.name}: {port.name}")
                print(f"{patch.name}: {port.name} from {values.min():g} to {values.max():g}")
    axes.set_xlabel("frame")
    axes.legend()
    figure.savefig(picture)
    return 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:4]))
