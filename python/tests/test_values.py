"""Values: conversion from Python objects, comparison, copies, output and pickling."""

import copy
import gc
import math
import pickle
import sys
from collections.abc import Callable
from typing import Any

import numpy as np
import pytest

import tarn_engine_base as tarn
from tarn_engine_base import (  # noqa: F401  (names that representations use)
    Path,
    PathBuilder,
    PathElement,
    PathInstruction,
    Type,
    TypeInfo,
    Unsigned,
    Unstructured,
    Value,
)

CIRCLE = PathBuilder().circle((0, 0), 5).build()

MADE: list[tuple[str, Any, Type, str]] = [
    ("nothing given", Value(), Type.FLOAT, "Value(0.0)"),
    ("float", Value(2.5), Type.FLOAT, "Value(2.5)"),
    ("negative zero", Value(-0.0), Type.FLOAT, "Value(-0.0)"),
    ("infinite", Value(-math.inf), Type.FLOAT, "Value(float('-inf'))"),
    ("int", Value(3), Type.INT, "Value(3)"),
    ("largest int", Value(2**63 - 1), Type.INT, "Value(9223372036854775807)"),
    ("smallest int", Value(-(2**63)), Type.INT, "Value(-9223372036854775808)"),
    ("True", Value(True), Type.BOOLEAN, "Value(True)"),
    ("str", Value("text"), Type.STRING, "Value('text')"),
    ("str with a zero", Value("a\0b"), Type.STRING, r"Value('a\x00b')"),
    ("bytes that are no UTF-8", Value("\udcff"), Type.STRING, r"Value('\udcff')"),
    ("two numbers", Value([1, 2.5]), Type.VEC2, "Value((1.0, 2.5))"),
    ("three numbers", Value((1, 2, 3)), Type.VEC3, "Value((1.0, 2.0, 3.0))"),
    ("an array of four", Value(np.arange(4)), Type.VEC4, "Value((0.0, 1.0, 2.0, 3.0))"),
    ("a vector with an infinity", Value((math.inf, 0)), Type.VEC2, "Value((float('inf'), 0.0))"),
    ("numpy's float", Value(np.float32(0.5)), Type.FLOAT, "Value(0.5)"),
    ("numpy's int", Value(np.int16(-7)), Type.INT, "Value(-7)"),
    (
        "identity",
        Value(np.eye(4)),
        Type.MAT4,
        "Value(((1.0, 0.0, 0.0, 0.0), (0.0, 1.0, 0.0, 0.0), (0.0, 0.0, 1.0, 0.0), (0.0, 0.0, 0.0, 1.0)))",
    ),
    ("image", Value.image(2**64 - 1), Type.IMAGE, "Value.image(18446744073709551615)"),
    ("video", Value.video(7), Type.VIDEO, "Value.video(7)"),
    ("sound", Value.sound(0), Type.SOUND, "Value.sound(0)"),
    ("model", Value.model(1), Type.MODEL, "Value.model(1)"),
    ("dict", Value({"a": 1}), Type.UNSTRUCTURED, "Value(Unstructured({'a': 1}))"),
    ("data", Value(Unstructured([1, 2])), Type.UNSTRUCTURED, "Value(Unstructured([1, 2]))"),
    ("path", Value(CIRCLE), Type.PATH, f"Value({CIRCLE!r})"),
]


@pytest.mark.parametrize("what, value, type_, text", MADE, ids=lambda item: item if isinstance(item, str) else "")
def test_is_constructed_printed_and_copied(what: str, value: Value, type_: Type, text: str) -> None:
    assert value.type is type_
    assert repr(value) == text
    again = eval(text)
    assert again == value
    assert repr(again) == text
    for copied in (pickle.loads(pickle.dumps(value)), copy.copy(value), copy.deepcopy(value)):
        assert copied == value
        assert repr(copied) == text
        assert hash(copied) == hash(value)


def test_is_constructed_by_keyword_and_by_subclasses() -> None:
    class Derived(Value):
        """A subclass with its own attribute."""

        def doubled(self) -> float:
            return 2 * float(self)

    assert Value(value=3) == Value(3)
    assert Derived(2.5).doubled() == 5
    assert Derived(value=3) == Value(3)
    assert isinstance(Derived(), Value)
    assert Derived() == Value()
    assert Value(Derived(7)) == Value(7)
    assert Value.__new__(Value) == Value()
    for make in (Value, Derived):
        with pytest.raises(TypeError, match="at most one argument"):
            make(1, 2)
        with pytest.raises(TypeError, match="at most one argument"):
            make(1, value=2)
        with pytest.raises(TypeError, match='keyword argument of Value is "value"'):
            make(number=2)
        with pytest.raises(TypeError, match="converts to Value, not complex"):
            make(1j)


def test_values_and_types_are_released() -> None:
    gc.collect()
    before = sys.getrefcount(Value), sys.getrefcount(Type.FLOAT)
    values = [Value(float(i)) for i in range(1000)] + [Value(i).as_type(Type.FLOAT) for i in range(1000)]
    assert all(value.type is Type.FLOAT for value in values)
    for make in (lambda: Value(1j), lambda: Value([1, "a"]), lambda: Value(2**64)):
        with pytest.raises((TypeError, OverflowError)):
            make()
    del values
    gc.collect()
    assert (sys.getrefcount(Value), sys.getrefcount(Type.FLOAT)) == before


def test_values_have_no_order() -> None:
    with pytest.raises(TypeError):
        sorted([Value(1), Value(2)])
    assert Value(1).__eq__(1) is NotImplemented


def test_values_of_different_types_differ() -> None:
    for i, (_, a, _, _) in enumerate(MADE):
        for j, (_, b, _, _) in enumerate(MADE):
            zeros = {MADE[i][0], MADE[j][0]} == {"nothing given", "negative zero"}
            assert (a == b) is (i == j or zeros)
            assert (a != b) is not (a == b)
    assert Value(1) != Value(1.0)
    assert (Value(1) == 1) is False
    assert Value(math.nan) != Value(math.nan)


@pytest.mark.parametrize(
    "make, error",
    [
        (lambda: Value(2**63), OverflowError),
        (lambda: Value(-(2**63) - 1), OverflowError),
        (lambda: Value(None), TypeError),
        (lambda: Value([1.0]), TypeError),
        (lambda: Value([1, "a"]), TypeError),
        (lambda: Value(()), TypeError),
        (lambda: Value([1, 2, 3, 4, 5]), TypeError),
        (lambda: Value(np.zeros(5)), TypeError),
        (lambda: Value(np.zeros((2, 2))), TypeError),
        (lambda: Value(np.array(["a", "b"])), TypeError),
        (lambda: Value(object()), TypeError),
        (lambda: Value(1j), TypeError),
        (lambda: Value(b"bytes"), TypeError),
        (lambda: Value.image(-1), OverflowError),
        (lambda: Value.image(2**64), OverflowError),
        (lambda: Value().as_type(3), TypeError),
        (lambda: Type(14), ValueError),
        (lambda: Value.default(99), TypeError),
        (lambda: Unstructured(2**64), OverflowError),
        (lambda: Unstructured(-(2**63) - 1), OverflowError),
        (lambda: Unstructured(Unsigned(-1)), OverflowError),
        (lambda: Unstructured({1: 2}), TypeError),
        (lambda: Unstructured({"a": object()}), TypeError),
        (lambda: Unstructured({"a": {1, 2}}), TypeError),
    ],
)
def test_rejects(make: Callable[[], Any], error: type[Exception]) -> None:
    with pytest.raises(error) as caught:
        make()
    assert len(str(caught.value)) > 10


def test_converts_to_every_type() -> None:
    for _, value, _, _ in MADE:
        for type_ in Type:
            assert value.as_type(type_).type is type_


def test_returns_its_payload() -> None:
    assert Value((1, 2)).data == {"X": 1.0, "Y": 2.0}
    assert Value(True).data == 1
    assert Value.image(3).data is None
    assert Value(CIRCLE).path == CIRCLE
    assert len(Value(1).path) == 0
    matrix = Value(np.arange(16).reshape(4, 4)).mat4
    assert matrix.shape == (4, 4)
    assert matrix.tolist() == np.arange(16).reshape(4, 4).tolist()
    assert Value(1).mat4.tolist() == np.eye(4).tolist()
    assert Value.default(Type.VEC4, 4).vec4 == (0, 0, 0, 1)


def test_ports_have_bounds() -> None:
    info = TypeInfo(Type.FLOAT, min=1, max=Value(2.5))
    assert info.min == Value(1)
    assert eval(repr(info)) == info
    assert pickle.loads(pickle.dumps(info)) == info
    assert tarn.cast_value_to_type(0.5, info) == Value(1)
    assert tarn.cast_value_to_type(2, info) == Value(2)
    assert tarn.index_loop_casting([Value(0.0), Value(2.0), Value(9.0)], info, 5) == Value(2.5)
    assert tarn.index_loop_casting([], info, 5) == Value(1)
    info.max = None
    assert tarn.cast_value_to_type(99, info) == Value(99)
    assert tarn.port_name_for_type_info(TypeInfo(Type.VEC4), True) == "Colors"


def test_types_have_names() -> None:
    for type_ in Type:
        assert tarn.string_to_type(tarn.type_to_string(type_)) is type_
    assert tarn.string_to_type("Float") is None
    assert [t for t in Type if tarn.type_is_resource(t)] == [Type.IMAGE, Type.VIDEO, Type.SOUND, Type.MODEL]


DATA: list[Any] = [
    None,
    0,
    -7,
    2**63 - 1,
    Unsigned(7),
    Unsigned(2**64 - 1),
    0.5,
    -0.0,
    math.inf,
    "",
    "text",
    "\udc80",
    [],
    {},
    [1, [2.5, None], {"a": "b"}],
    {"b": [], "a": {"c": Unsigned(0)}},
]


@pytest.mark.parametrize("data", DATA, ids=repr)
def test_data_round_trips(data: Any) -> None:
    made = Unstructured(data)
    back = made.data
    assert back == data
    assert repr(back) == repr(data) or isinstance(data, dict)
    assert type(back) is type(data)
    assert Unstructured(back) == made
    assert hash(Unstructured(back)) == hash(made)
    assert pickle.loads(pickle.dumps(made)) == made
    if data != math.inf:
        assert eval(repr(made)) == made


def test_data_from_other_types() -> None:
    assert Unstructured(True).data == 1
    assert type(Unstructured(True).data) is int
    assert Unstructured((1, 2)).data == [1, 2]
    assert Unstructured(np.array([[1, 2], [3, 4]])).data == [[1, 2], [3, 4]]
    assert Unstructured(np.float64(0.5)).data == 0.5
    assert Unstructured(2**63).type is tarn.UnstructuredType.UNSIGNED_INTEGER
    assert Unstructured(7) != Unstructured(Unsigned(7))
    assert Unstructured(7) != Unstructured(7.0)
    assert len(Unstructured([1, 2, 3])) == 3
    assert Unstructured({"id": Unsigned(7), "x": [1.5]}).to_text() == '{"id": 7u, "x": [1.5]}'


def test_shared_parts_are_not_a_cycle() -> None:
    shared = [1]
    assert Unstructured([shared, shared]).data == [[1], [1]]
    circle: list[Any] = []
    circle.append({"a": circle})
    with pytest.raises(ValueError, match="contains itself"):
        Unstructured(circle)


def test_deep_data_needs_no_deep_stack() -> None:
    deep: Any = 1
    for _ in range(200_000):
        deep = [deep]
    data = Unstructured(deep)
    back = data.data
    levels = 0
    while isinstance(back, list):
        back = back[0]
        levels += 1
    assert levels == 200_000
    assert Unstructured(deep) == data


def test_uninitialised_objects_raise() -> None:
    for name in tarn.__all__:
        cls = getattr(tarn, name)
        if not isinstance(cls, type) or type(cls).__name__ != "pybind11_type":
            continue
        empty = cls.__new__(cls)
        uses = [repr, str, hash, bool, copy.copy, pickle.dumps]
        uses += [lambda o, a=a: getattr(o, a) for a in dir(cls) if not a.startswith("__")]
        for use in uses:
            try:
                use(empty)
            except (TypeError, ValueError, RuntimeError, pickle.PicklingError) as error:
                assert str(error)
