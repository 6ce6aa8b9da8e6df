"""Conversions of values, by the table that the C++ tests use too."""

import math
import struct
from pathlib import Path

import pytest

import tarn_engine_base as tarn

TABLE = Path(__file__).parents[2] / "tests" / "tables" / "conversions.json"


def bits(number: float) -> bytes:
    return struct.pack("<d", number)


def rows() -> list[tarn.Port]:
    return list(tarn.load_document(TABLE).inputs)


@pytest.mark.parametrize("row", rows(), ids=lambda row: row.name)
def test_converts_to(row: tarn.Port) -> None:
    value = row.default_value
    expected = row.attributes
    assert expected.keys()
    for key in expected:
        if key == "integer":
            assert int(value) == expected[key]
        elif key == "number":
            assert bits(float(value)) == bits(expected[key])
            assert type(float(value)) is float
        elif key == "boolean":
            assert bool(value) is bool(expected[key])
        elif key == "identifier":
            assert value.id == expected[key]
        elif key in ("vec2", "vec3", "vec4"):
            assert [bits(n) for n in getattr(value, key)] == [bits(n) for n in expected[key]]
        elif key == "to_string":
            assert str(value) == expected[key]
        else:
            assert key == "string"
            assert str(value.as_type(tarn.Type.STRING)) == expected[key]


def test_the_table_has_rows_of_every_type() -> None:
    assert {row.default_value.type for row in rows()} == set(tarn.Type)


def test_a_nan_converts_to_zero_and_true() -> None:
    value = tarn.Value(math.nan)
    assert math.isnan(float(value))
    assert int(value) == 0
    assert bool(value)
