"""Paths: builder, arrays, geometry and SVG path data."""

import gc
import pickle

import numpy as np
import pytest

import tarn_engine_base as tarn
from tarn_engine_base import Path, PathBuilder, PathElement, PathInstruction


def test_builder_calls_chain() -> None:
    builder = PathBuilder()
    assert builder.move_to((0, 0)) is builder
    path = builder.line_to([4, 0]).curve_to((5, 0), (6, 1), (6, 2)).quad_curve_to((6, 3), np.array([5.0, 3.0])).close().build()
    assert builder.current_point == (5.0, 3.0)
    assert [e.instruction for e in path.elements] == [
        PathInstruction.MOVE_TO,
        PathInstruction.LINE_TO,
        PathInstruction.CURVE_TO,
        PathInstruction.QUAD_CURVE_TO,
        PathInstruction.CLOSE,
    ]
    assert path.elements[2].points.tolist() == [[5, 0], [6, 1], [6, 2]]
    assert tarn.svg_path_data(path) == "M0 0L4 0C5 0 6 1 6 2Q6 3 5 3Z"
    assert tarn.path_from_svg_path_data(tarn.svg_path_data(path)) == path
    assert len(PathBuilder().append(path).append(path).build()) == 10


@pytest.mark.parametrize(
    "builder, box, elements",
    [
        (PathBuilder().circle((1, 2), 5), ((-4, -3), (6, 7)), 6),
        (PathBuilder().ellipse((0, 0), (2, 3)), ((-2, -3), (2, 3)), 6),
        (PathBuilder().round_rect((1, 2), (30, 40), 5), ((1, 2), (31, 42)), 10),
        (PathBuilder().hexa_rect((0, 0), (10, 20), 3), ((0, 0), (10, 20)), 9),
        (PathBuilder().move_to((0, 0)).arc_to((5, 5), True), ((0, 0), (5, 5)), 2),
    ],
)
def test_shapes(builder: PathBuilder, box: tuple[tuple[float, float], ...], elements: int) -> None:
    path = builder.build()
    assert path.bounds() == box
    assert len(path) == elements
    assert eval(repr(path)) == path
    assert pickle.loads(pickle.dumps(path)) == path
    assert hash(Path(path.elements)) == hash(path)


def test_points_share_the_memory_of_the_path() -> None:
    path = PathBuilder().move_to((1, 2)).line_to((3, 4)).build()
    points = path.elements[1].points
    address = points.__array_interface__["data"][0]
    assert path.elements[1].points.__array_interface__["data"][0] == address
    del path
    gc.collect()
    assert points.tolist() == [[3, 4]]
    assert not points.flags.writeable
    with pytest.raises(ValueError):
        points[0, 0] = 5
    many = PathElement(PathInstruction.LINE_TO, np.arange(200).reshape(100, 2))
    assert many.points.shape == (100, 2)
    assert many.points[99].tolist() == [198, 199]


def test_all_points() -> None:
    path = PathBuilder().move_to((1, 2)).quad_curve_to((3, 4), (5, 6)).close().build()
    assert path.points.tolist() == [[1, 2], [3, 4], [5, 6]]
    assert Path().points.shape == (0, 2)


def test_geometry() -> None:
    path = PathBuilder().move_to((1, 2)).line_to((3, 4)).build()
    assert path.translated((1, -1)).points.tolist() == [[2, 1], [4, 3]]
    assert path.scaled((2, 3)).points.tolist() == [[2, 6], [6, 12]]
    assert Path().bounds() is None
    half = tarn.interpolate(path, path.translated((2, 0)), 0.5)
    assert half == path.translated((1, 0))
    assert tarn.interpolate(path, Path(), 0.5) is None


def test_rejects() -> None:
    with pytest.raises(ValueError, match="unknown path instruction"):
        tarn.string_to_path_instruction("MoveTo")
    with pytest.raises(ValueError, match="invalid SVG path data"):
        tarn.path_from_svg_path_data("M")
    for point in (5, (1,), (1, 2, 3), "ab", None):
        with pytest.raises(TypeError, match="two numbers"):
            PathBuilder().move_to(point)
    for instruction in PathInstruction:
        name = tarn.path_instruction_to_string(instruction)
        assert tarn.string_to_path_instruction(name) is instruction
