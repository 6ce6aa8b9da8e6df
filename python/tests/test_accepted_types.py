"""Code that type checkers must accept. Checked by mypy, and run as a test."""

import numpy as np
import tarn_engine_base as tarn

VALUES = [
    tarn.Value(1),
    tarn.Value(np.float32(1)),
    tarn.Value(np.bool_(True)),
    tarn.Value([1, 2.5]),
    tarn.Value(range(3)),
    tarn.Value(np.eye(4)),
    tarn.Value([[1, 0, 0, 0]] * 4),
    tarn.Value({"a": [1, None]}),
    tarn.Value(tarn.Unstructured(np.arange(6).reshape(2, 3))),
]
NUMBER: float = tarn.ease(tarn.EasingFunction.LINEAR, 0, 1, np.float32(0.5))
ARRAY = tarn.ease(tarn.EasingFunction.LINEAR, (0, 1), (2, 3), [0.0, 0.5])
VALUE: tarn.Value = tarn.ease(tarn.EasingFunction.LINEAR, tarn.Value(1), 2.5, tarn.Value(0.5))
COPIED = tarn.Port(attributes=tarn.Port(attributes={"a": 1}).attributes)


def test_runs() -> None:
    assert [value.type.name for value in VALUES] == [
        "INT", "FLOAT", "BOOLEAN", "VEC2", "VEC3", "MAT4", "MAT4", "UNSTRUCTURED", "UNSTRUCTURED",
    ]  # fmt: skip
    assert NUMBER == 0.5 and ARRAY.shape == (2, 2) and VALUE == tarn.Value(1.75)
    assert COPIED.attributes == {"a": 1}
