"""All public names of the package are documented and in the type stubs."""

import enum
import re

import tarn_engine_base as tarn

# What pybind11 writes ahead of a docstring.
SIGNATURE = re.compile(r"^(\d+\. )?\w+\(.*\) -> |^Overloaded function")


def sentences(documented: object) -> str:
    lines = (documented.__doc__ or "").splitlines()
    return "".join(line for line in lines if line and not SIGNATURE.match(line)).strip()


def test_everything_is_documented() -> None:
    checked = 0
    for name in tarn.__all__:
        offered = getattr(tarn, name)
        if name == "__version__":
            continue
        assert sentences(offered), name
        checked += 1
        if not isinstance(offered, type) or issubclass(offered, (enum.Enum, int, Exception)):
            continue
        for member, value in vars(offered).items():
            if member.startswith("_"):
                continue
            described = value.__func__ if isinstance(value, staticmethod) else value
            assert sentences(described), f"{name}.{member}"
            checked += 1
    assert checked > 150


def test_the_version_has_three_numbers() -> None:
    assert re.fullmatch(r"\d+\.\d+\.\d+", tarn.__version__)


def test_classes_have_public_names() -> None:
    assert repr(tarn.Value) == "<class 'tarn_engine_base.Value'>"
    assert tarn.Type.__module__ == "tarn_engine_base"
