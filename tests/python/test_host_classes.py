"""tests/python/test_host_classes.py: the classes of the host of which no module can make an array,
to the host and back without a module between."""

from __future__ import annotations

import gc
import os
import sys
from collections.abc import Callable
from typing import Any

import numpy as np
import pytest
import tessel
from made_files import MIB
from test_memory import resident

INT32 = 11


sys.path.append(os.path.dirname(os.environ["TESSEL_CONVERSIONS"]))
import conversions  # noqa: E402


def objects(values: list[Any], shape: tuple[int, ...]) -> np.ndarray:
    """An object array with the values first dimension fastest, whatever they are."""
    made = np.empty(len(values), object)
    made[:] = values
    return made.reshape(shape, order="F")


def same(found: Any, expected: Any) -> bool:
    """Whether two values are equal, down to type, dtype, shape and order of keys."""
    if type(found) is not type(expected):
        return False
    if isinstance(expected, dict):
        return list(found) == list(expected) and all(same(found[k], expected[k]) for k in expected)
    if not isinstance(expected, np.ndarray):
        return bool(found == expected)
    if (found.dtype, found.shape) != (expected.dtype, expected.shape):
        return False
    if expected.dtype == object:
        return all(map(same, found.ravel(order="F"), expected.ravel(order="F")))
    return found.tobytes() == expected.tobytes()


ONE, TWO = np.array([[1.0]]), np.array([[2.0]])
SHARED = ["s"]

BACK = {
    # value: what comes back
    "bool": (True, np.array([[True]])),
    "bool array": (np.array([[True, False, True]]), np.array([[True, False, True]])),
    "complex": (1 - 2j, np.array([[1 - 2j]])),
    "complex array": (np.array([[1 + 2j, 3], [4j, np.inf]]), np.array([[1 + 2j, 3], [4j, np.inf]])),
    "single complex": (np.array([[1 + 2j, 3]], "c8"), np.array([[1 + 2j, 3]], "c8")),
    "no complex": (np.empty((0, 3), complex), np.empty((0, 3), complex)),
    "other byte order": (np.array([[1 + 2j]], ">c16"), np.array([[1 + 2j]])),
    "list": (["a", 1, True], objects(["a", ONE, np.array([[True]])], (1, 3))),
    "lists": ([["a"], []], objects([objects(["a"], (1, 1)), np.empty((0, 0))], (1, 2))),
    "the same list twice": ([SHARED, SHARED], objects([objects(["s"], (1, 1))] * 2, (1, 2))),
    "cell": (objects(["a", 1, "c", "d", "e", 2], (2, 3)),
             objects(["a", ONE, "c", "d", "e", TWO], (2, 3))),
    "row-major cell": (np.ascontiguousarray(objects(["a", "b", "c", "d"], (2, 2))),
                       objects(["a", "b", "c", "d"], (2, 2))),
    "no cell": (np.empty((3, 0), object), np.empty((3, 0), object)),
    "nothing in it": ([None, "a"], objects([None, "a"], (1, 2))),
    "empty cell": (np.empty((2, 2), object), np.empty((2, 2), object)),
    "dict": ({"b": "x", "a": 1}, {"b": "x", "a": ONE}),
    "no field": ({}, {}),
    "field without value": ({"a": None}, {"a": None}),
    "dict in dict": ({"é": {"a": [1, 2]}}, {"é": {"a": np.array([[1.0, 2.0]])}}),
    "structs": (objects([{"a": 1, "b": "x"}, {"b": "y", "a": 2}], (2, 1)),
                objects([{"a": ONE, "b": "x"}, {"a": TWO, "b": "y"}], (2, 1))),
    "one struct in three dimensions": (objects([{"a": 1}], (1, 1, 1)),
                                       objects([{"a": ONE}], (1, 1, 1))),
    "list of structs": ([{"a": 1}, {"b": 2}], objects([{"a": ONE}, {"b": TWO}], (1, 2))),
    "function": (tessel.Function("größe"), tessel.Function("größe")),
    "unknown": (tessel.Unknown((2, 0)), tessel.Unknown((2, 0))),
    "unknown in a cell": ([tessel.Unknown((1, 1))], objects([tessel.Unknown((1, 1))], (1, 1))),
}


@pytest.mark.parametrize("value, expected", BACK.values(), ids=BACK.keys())
def test_there_and_back(value: Any, expected: Any) -> None:
    back, _keeper = conversions.round_trip(value)
    assert same(back, expected), back
    if isinstance(back, np.ndarray):
        assert back.flags.f_contiguous and back.flags.writeable


@pytest.mark.parametrize("dtype", ["?", "f8", "f4", "i1", "u1", "i2", "u2", "i4", "u4", "i8", "u8"])
def test_nothing_is_copied_on_either_way(dtype: str) -> None:
    values = np.ones((3, 4, 5), dtype, order="F")
    back, _keeper = conversions.round_trip(values)
    assert back.__array_interface__["data"][0] == values.__array_interface__["data"][0]
    inside, _keeper = conversions.round_trip([values, "text"])
    assert np.shares_memory(inside[0, 0], values)


REFUSED = {
    "complex integers": (lambda: conversions.of_dimensions([1, 1], INT32, True),
                         "unsupportedResult"),
    "33 dimensions": (lambda: conversions.of_dimensions([1] * 32 + [2], 5, False),
                      "tooManyDimensions"),
    "lengths that NumPy cannot count": (lambda: conversions.of_dimensions([0, 2**63], 5, False),
                                        "shapeTooLarge"),
    "too deep from the host": (lambda: conversions.in_cells(257), "nestedTooDeeply"),
    "too deep to the host": (lambda: conversions.to_host(in_lists(257)), "nestedTooDeeply"),
    "far too deep": (lambda: conversions.to_host(in_lists(100_000)), "nestedTooDeeply"),
    "a name that is no text": (lambda: conversions.round_trip({"\ud800": 1}), "notText"),
    "a function that is no text": (lambda: conversions.round_trip(tessel.Function("\ud800")),
                                   "notText"),
    "a negative length": (lambda: conversions.round_trip(tessel.Unknown((-1, 1))), "badShape"),
    "a length that is no number": (lambda: conversions.round_trip(tessel.Unknown(("a",))),
                                   "badShape"),
    "a mask inside": (lambda: conversions.round_trip([np.ma.zeros(2)]), "maskedArray"),
    "more fields": (lambda: conversions.round_trip(objects([{"a": 1}, {"a": 1, "b": 1}], (2, 1))),
                    "differentFields"),
    "fewer fields": (lambda: conversions.round_trip(objects([{"a": 1, "b": 1}, {"a": 1}], (2, 1))),
                     "differentFields"),
}


def in_lists(levels: int) -> Any:
    """A text inside of so many lists."""
    value: Any = "x"
    for _ in range(levels):
        value = [value]
    return value


@pytest.mark.parametrize("convert, word", REFUSED.values(), ids=REFUSED.keys())
def test_refusals(convert: Any, word: str) -> None:
    with pytest.raises(RuntimeError) as raised:
        convert()
    assert str(raised.value) == f"TESSEL:python:{word}"


def test_as_deep_as_allowed() -> None:
    value, levels = conversions.in_cells(256), 0
    while value.dtype == object:
        value, levels = value[0, 0], levels + 1
    assert levels == 256 and value == 1
    back, _keeper = conversions.round_trip(in_lists(256))
    assert back.shape == (1, 1)


def test_an_array_inside_keeps_its_memory() -> None:
    outer = conversions.in_cells(3)
    inside = outer[0, 0][0, 0][0, 0]
    del outer
    gc.collect()
    inside += 1
    assert inside == 2


class Changing:
    """A path that runs something while it is converted."""

    def __init__(self) -> None:
        self.change: Callable[[], object] = lambda: None

    def __fspath__(self) -> str:
        self.change()
        gc.collect()
        return "path"


def test_containers_that_change_meanwhile() -> None:
    path = Changing()
    values = [path, *(np.ones(100) for _ in range(100))]
    array = objects(values, (1, 101))
    for container, change in ((values, values.clear), (array, lambda: array.fill(None))):
        path.change = change
        back, _keeper = conversions.round_trip(container)
        assert back.shape == (1, 101) and back[0, 0] == "path" and back[0, 100].sum() == 100


def test_what_user_code_raises_comes_through() -> None:
    class Failing:
        def __fspath__(self) -> str:
            raise KeyError("mine")

    with pytest.raises(KeyError, match="mine"):
        conversions.round_trip(["a", Failing()])


@pytest.mark.without_sanitizers  # the sanitizer keeps memory that was freed
def test_memory_stays_flat() -> None:
    value = {"a": [np.ones((50, 50)), "text" * 50, 1j], "b": objects([{"c": 1}, {"c": 2}], (1, 2))}

    def after(rounds: int) -> int:
        for _ in range(rounds):
            conversions.round_trip(value)
            with pytest.raises(RuntimeError):
                conversions.round_trip([value, object()])
        return resident()

    before = after(500)
    assert after(5000) - before < MIB  # the values of one round fill more than 1 KiB


def test_nothing_keeps_an_argument() -> None:
    values = np.ones((5, 5), order="F")
    references = sys.getrefcount(values)
    conversions.round_trip([values, {"a": values}])
    with pytest.raises(RuntimeError):
        conversions.round_trip([values, object()])
    assert sys.getrefcount(values) == references
