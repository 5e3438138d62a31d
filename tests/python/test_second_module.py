# tests/python/test_second_module.py: every operation and every error of examples/second_module.
"""The module that others start from, called through the package as any module is."""

from __future__ import annotations

import os
import re
from pathlib import Path
from typing import Any

import numpy as np
import pytest
import tessel

SOURCE = Path(__file__).parents[2] / "examples" / "second_module" / "series.cpp"
series = tessel.load(Path(os.environ["TESSEL_SERIES"]))

SERIES = np.array([3.0, -1.0, 4.0, 1.5])
ONE = np.array([7.0])
EMPTY = np.empty(0)

# What is called, and the number that it gives.
NUMBERS: list[tuple[str, tuple[Any, ...], float]] = [
    ("sum", (SERIES,), 7.5),
    ("sum", (EMPTY,), 0),
    ("mean", (SERIES,), 1.875),
    ("least", (SERIES,), -1),
    ("greatest", (SERIES,), 4),
    ("count", (SERIES,), 4),
    ("count", (EMPTY,), 0),
    ("product", (SERIES, np.array([1.0, 2.0, 3.0, -4.0])), 7),
    ("product", (EMPTY, EMPTY), 0),
    ("sum", (np.array([[1.0, 2.0], [3.0, 4.0]]),), 10),
]

# What is called, and the values of the column that it gives.
COLUMNS: list[tuple[str, Any, list[float]]] = [
    ("running", SERIES, [3, 2, 6, 7.5]),
    ("running", EMPTY, []),
    ("backwards", SERIES, [1.5, 4, -1, 3]),
    ("backwards", EMPTY, []),
    ("sorted", SERIES, [-1, 1.5, 3, 4]),
    ("sorted", EMPTY, []),
    ("differences", SERIES, [-4, 5, -2.5]),
    ("differences", ONE, []),
    ("differences", EMPTY, []),
    ("running", np.array([[1.0, 2.0], [3.0, 4.0]]), [1, 4, 6, 10]),  # first dimension fastest
]

# The arguments of a call, the identifier of its error and the message.
ERRORS: list[tuple[tuple[Any, ...], str, str]] = [
    ((), "noName", "The first input is the name of an operation."),
    ((3.0, SERIES), "noName", "The first input is the name of an operation."),
    (("median", SERIES), "noOperation", 'There is no operation "median".'),
    (("sum",), "inputs", "The operation takes 2 inputs, and got 1."),
    (("sum", SERIES, SERIES), "inputs", "The operation takes 2 inputs, and got 3."),
    (("product", SERIES), "inputs", "The operation takes 3 inputs, and got 2."),
    (("sum", "text"), "badClass", "A series is double, and not char."),
    (("differences", np.array([1], np.int16)), "badClass", "A series is double, and not int16."),
    (("product", SERIES, np.float32(1)), "badClass", "A series is double, and not single."),
    (("mean", EMPTY), "empty", "An empty series has no such value."),
    (("least", EMPTY), "empty", "An empty series has no such value."),
    (("greatest", EMPTY), "empty", "An empty series has no such value."),
    (("product", SERIES, ONE), "lengths", "The series have 4 and 1 values."),
]


@pytest.mark.parametrize("operation, arguments, expected", NUMBERS)
def test_numbers(operation: str, arguments: tuple[Any, ...], expected: float) -> None:
    found = series(operation, *arguments)
    assert (found.dtype, found.shape) == (np.float64, (1, 1))
    assert found.item() == expected


@pytest.mark.parametrize("operation, values, expected", COLUMNS)
def test_columns(operation: str, values: Any, expected: list[float]) -> None:
    found = series(operation, values)
    assert (found.dtype, found.shape) == (np.float64, (len(expected), 1))
    assert found[:, 0].tolist() == expected


@pytest.mark.parametrize("arguments, word, message", ERRORS)
def test_errors(arguments: tuple[Any, ...], word: str, message: str) -> None:
    with pytest.raises(tessel.Error) as raised:
        series(*arguments)
    assert (raised.value.identifier, raised.value.message) == (f"series:{word}", message)


def test_no_operation_and_no_error_is_left_out() -> None:
    source = SOURCE.read_text()
    operations = set(re.findall(r'Operation\{"(\w+)"', source))
    words = set(re.findall(r'"series:(\w+)"', source))
    assert len(operations) == 10
    assert operations == {row[0] for row in (*NUMBERS, *COLUMNS)}
    assert words == {word for _, word, _ in ERRORS}
