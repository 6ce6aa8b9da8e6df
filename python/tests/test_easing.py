"""Easing: one number, vectors, values and arrays of any shape."""

import threading

import numpy as np
import pytest

import tarn_engine_base as tarn
from tarn_engine_base import EasingFunction, Value, ease


def test_known_points() -> None:
    assert ease(EasingFunction.CUBIC_OUT, 0, 100, 0.5) == 87.5
    assert ease(EasingFunction.QUADRATIC_IN, 0.0, 1.0, 1.5) == 2.25
    assert ease(EasingFunction.LINEAR, (0, 10), [10, 20], 0.25) == (2.5, 12.5)
    assert ease(EasingFunction.LINEAR, np.zeros(4), (1, 2, 3, 4), 0.5) == (0.5, 1.0, 1.5, 2.0)
    assert ease(EasingFunction.LINEAR, Value(0), Value(10), 0.55) == Value(5)
    assert ease(EasingFunction.LINEAR, Value(0.0), (2, 4), 0.5) == Value((1, 2))


def test_names() -> None:
    for function, name in zip(EasingFunction, tarn.easing_function_names()):
        assert tarn.string_to_easing_function(name) is function
    assert tarn.string_to_easing_function("Bounce") is None


@pytest.mark.parametrize("function", list(EasingFunction), ids=lambda f: f.name)
def test_arrays_match_single_calls_bit_for_bit(function: EasingFunction) -> None:
    progress = np.linspace(-0.5, 1.5, 97)
    numbers = ease(function, 3.0, 7.0, progress)
    assert numbers.tobytes() == np.array([ease(function, 3.0, 7.0, t) for t in progress]).tobytes()
    for ends in (((1, 2), (3, 5)), ((1, 2, 3), (3, 5, 7)), ((1, 2, 3, 4), (3, 5, 7, 9))):
        vectors = ease(function, *ends, progress)
        assert vectors.shape == (97, len(ends[0]))
        assert vectors.tobytes() == np.array([ease(function, *ends, t) for t in progress]).tobytes()


def test_shapes_are_preserved() -> None:
    for shape in ((), (0,), (5,), (2, 3), (2, 0, 4), (2, 3, 4)):
        progress = np.full(shape, 0.25)
        assert ease(EasingFunction.LINEAR, 0.0, 4.0, progress).shape == shape
        assert ease(EasingFunction.LINEAR, (0, 0, 0), (1, 2, 3), progress).shape == (*shape, 3)
    assert ease(EasingFunction.LINEAR, 0.0, 4.0, [0, 1]).tolist() == [0, 4]
    strided = np.arange(10.0)[::2]
    assert ease(EasingFunction.LINEAR, 0.0, 1.0, strided).tolist() == strided.tolist()
    assert ease(EasingFunction.LINEAR, 0.0, 1.0, np.arange(3, dtype=np.int8)).tolist() == [0, 1, 2]
    assert ease(EasingFunction.LINEAR, 0.0, 1.0, np.zeros((3, 2)).T).shape == (2, 3)


def test_rejects() -> None:
    with pytest.raises(TypeError, match="vectors of the same size"):
        ease(EasingFunction.LINEAR, (1, 2), (1, 2, 3), 0.5)
    with pytest.raises(TypeError, match="vectors of the same size"):
        ease(EasingFunction.LINEAR, 1.0, (1, 2), 0.5)
    with pytest.raises(TypeError):
        ease(3, 0.0, 1.0, 0.5)
    with pytest.raises(TypeError):
        ease(EasingFunction.LINEAR, "a", "b", 0.5)
    with pytest.raises(TypeError):
        ease(EasingFunction.LINEAR, 0.0, 1.0, "half")
    with pytest.raises(TypeError):
        ease(EasingFunction.LINEAR, 0.0, 1.0, np.array(["a"]))


def test_other_threads_run_concurrently() -> None:
    progress = np.linspace(0, 1, 20_000_000)
    counted = 0
    done = threading.Event()

    def count() -> None:
        nonlocal counted
        while not done.is_set():
            counted += 1

    thread = threading.Thread(target=count)
    thread.start()
    before = counted
    ease(EasingFunction.SINUSOIDAL_IN, 0.0, 1.0, progress)
    after = counted
    done.set()
    thread.join()
    assert after > before
