"""tests/python/test_conversions.py: what becomes what between Python and the host, row by row.

The module "mirror" tells what it was given and gives back a copy of it.
"""

from __future__ import annotations

import gc
import os
import pathlib
from typing import Any

import numpy as np
import pytest
import tessel

mirror = tessel.load(os.environ["TESSEL_MIRROR"])
netcdf = tessel.load("netcdf")


def described(value: Any) -> tuple[str, tuple[int, ...]]:
    """The class and the dimensions that a value has in the host."""
    name, dims = mirror("describe", value)
    return name, tuple(int(length) for length in dims[0])


DTYPES = {"double": "f8", "single": "f4", "int8": "i1", "uint8": "u1", "int16": "i2",
          "uint16": "u2", "int32": "i4", "uint32": "u4", "int64": "i8", "uint64": "u8"}

TO_HOST = [
    # value, class, dimensions
    (1.5, "double", (1, 1)),
    (3, "double", (1, 1)),
    (2**53, "double", (1, 1)),
    (2**53 + 1, "int64", (1, 1)),
    (-(2**63), "double", (1, 1)),
    (-(2**63) + 1, "int64", (1, 1)),
    (2**64 - 1, "uint64", (1, 1)),
    (True, "logical", (1, 1)),
    (1 + 2j, "double", (1, 1)),
    ("", "char", (1, 0)),
    ("abc", "char", (1, 3)),
    ("é", "char", (1, 1)),
    ("𝄞", "char", (1, 2)),
    (b"a\xff", "char", (1, 2)),
    (pathlib.PurePath("a/b"), "char", (1, 3)),
    ([], "double", (0, 0)),
    ([1, 2.5, 3], "double", (1, 3)),
    ((4,), "double", (1, 1)),
    ([np.int16(1), 2], "double", (1, 2)),
    (["a", 1], "cell", (1, 2)),
    ([True], "cell", (1, 1)),
    ([[1]], "cell", (1, 1)),
    ({}, "struct", (1, 1)),
    ({"a": 1}, "struct", (1, 1)),
    (np.float32(1), "single", (1, 1)),
    (np.bool_(True), "logical", (1, 1)),
    (np.array(7, "i2"), "int16", (1, 1)),
    (np.zeros(4), "double", (4, 1)),
    (np.zeros((2, 3)), "double", (2, 3)),
    (np.zeros((2, 3), order="F"), "double", (2, 3)),
    (np.zeros((2, 0, 3)), "double", (2, 0, 3)),
    (np.zeros(0), "double", (0, 1)),
    (np.zeros((1,) * 32), "double", (1,) * 32),
    (np.zeros((2, 2), bool), "logical", (2, 2)),
    (np.zeros((2, 2), "c8"), "single", (2, 2)),
    (np.full((2, 2), "x"), "char", (2, 2)),
    (np.empty((2, 3), object), "cell", (2, 3)),
    (np.array([{"a": 1}, {"a": 2}], object), "struct", (2, 1)),
    (tessel.Function("sin"), "function_handle", (1, 1)),
    (tessel.Unknown((2, 2)), "unknown", (2, 2)),
]


@pytest.mark.parametrize("value, name, dims", TO_HOST, ids=lambda value: repr(value)[:40])
def test_class_and_dimensions_in_the_host(value: Any, name: str, dims: tuple[int, ...]) -> None:
    assert described(value) == (name, dims)


REFUSED = [
    (None, "unsupportedType"),
    (object(), "unsupportedType"),
    ({1, 2}, "unsupportedType"),
    (2**64, "double"),
    (2**64 + 1, "integerTooLarge"),
    ([2**53 + 1], "notRepresentable"),
    ({1: 2}, "badFieldName"),
    (np.zeros(2, "f2"), "unsupportedDtype"),
    (np.zeros(2, "g"), "unsupportedDtype"),
    (np.zeros(2, "M8[s]"), "unsupportedDtype"),
    (np.zeros(2, "U2"), "unsupportedDtype"),
    (np.zeros(2, [("a", "i4")]), "unsupportedDtype"),
    (np.ma.zeros(2), "maskedArray"),
    (np.array([{"a": 1}, {"b": 1}], object), "differentFields"),
    (np.array(["𝄞"]), "characterTooLarge"),
]


@pytest.mark.parametrize("value, word", REFUSED, ids=lambda value: repr(value)[:40])
def test_what_has_no_counterpart_is_refused(value: Any, word: str) -> None:
    if word == "double":  # a power of two that a double holds, however large
        assert described(value) == (word, (1, 1))
        return
    with pytest.raises(tessel.Error) as raised:
        mirror("describe", value)
    assert raised.value.identifier == f"TESSEL:python:{word}"


def test_a_value_in_itself_is_refused() -> None:
    endless: list[Any] = ["x"]
    endless.append(endless)
    for value in (endless, {"a": endless}, np.array([endless, 1], object)):
        with pytest.raises(tessel.Error) as raised:
            mirror("describe", value)
        assert raised.value.identifier == "TESSEL:python:nestedTooDeeply"


@pytest.mark.parametrize("name, dtype", DTYPES.items())
@pytest.mark.parametrize("order", ["C", "F"])
def test_numbers_there_and_back(name: str, dtype: str, order: str) -> None:
    info = np.finfo(dtype) if dtype[0] == "f" else np.iinfo(dtype)
    values = np.resize(np.array([info.min, info.max, 0, 1, 7], dtype), (2, 3, 4)).copy(order=order)
    back = mirror("copy", values)
    assert described(values)[0] == name
    assert back.dtype == values.dtype and back.shape == values.shape
    assert back.flags.f_contiguous and back.flags.writeable and back.flags.aligned
    assert np.array_equal(back, values)


LAYOUTS = {
    "row-major": lambda a: np.ascontiguousarray(a),
    "column-major": lambda a: np.asfortranarray(a),
    "every second": lambda a: np.repeat(a, 2, axis=1)[:, ::2],
    "backwards": lambda a: a[::-1, ::-1].copy()[::-1, ::-1],
    "other byte order": lambda a: a.astype(a.dtype.newbyteorder()),
    "read-only": lambda a: np.frombuffer(a.tobytes(), a.dtype).reshape(a.shape),
    "broadcast": lambda a: np.broadcast_to(a[:1], a.shape),
}


@pytest.mark.parametrize("layout", LAYOUTS.values(), ids=LAYOUTS.keys())
def test_any_layout_of_memory(layout: Any) -> None:
    values = layout(np.arange(12, dtype="i4").reshape(3, 4))
    assert np.array_equal(mirror("copy", values), values)


def test_column_major_input_is_lent_and_not_copied() -> None:
    values = np.asfortranarray(np.arange(1000.0).reshape(10, 100))
    assert int(mirror("borrowed", values)[0, 0]) == values.ctypes.data
    assert int(mirror("borrowed", values.T)[0, 0]) != values.ctypes.data


def test_a_result_is_the_hosts_memory_and_outlives_the_module() -> None:
    module = tessel.load(os.environ["TESSEL_MIRROR"])
    result = module("copy", np.arange(1e5))
    view = result[10:20]
    del module, result
    gc.collect()
    assert view.ravel().tolist() == list(range(10, 20))


TEXTS = ["", "a", "abc", "naïve", "日本語", "𝄞 clef", "\ud800", "a\0b", "\uffe9"]


@pytest.mark.parametrize("text", TEXTS, ids=ascii)
def test_text_there_and_back(text: str) -> None:
    assert mirror("copy", text) == text


def test_characters_of_other_shapes_there_and_back() -> None:
    letters = np.array([["a", "b", "c"], ["d", "é", "\uffe9"]])
    back = mirror("copy", letters)
    assert back.dtype == np.dtype("<U1") and back.shape == (2, 3)
    assert np.array_equal(back, letters)
    column = mirror("copy", letters[:, :1])
    assert column.shape == (2, 1)


def test_cells_from_the_host() -> None:
    names = netcdf("get_constant_names")
    assert names.dtype == object and names.shape == (69, 1) and names[0, 0] == "NC_BYTE"


def test_no_one_and_several_results() -> None:
    assert mirror("nothing") is None
    assert isinstance(mirror("copy", 1), np.ndarray)
    assert isinstance(mirror("describe", 1), tuple)
    assert mirror("third")[:2] == (None, None) and mirror("third")[2] == 3


@pytest.mark.parametrize("text", ["plain", "100 % of %s %n", "é 日本語", "x" * 10000])
def test_errors_carry_identifier_and_message(text: str) -> None:
    with pytest.raises(tessel.Error) as raised:
        mirror("raise", text)
    assert raised.value.identifier == "TESTS:mirror:asked"
    assert raised.value.message == str(raised.value) == text


@pytest.mark.parametrize("module, identifier", [
    ("no_such_module", "TESSEL:host:moduleNotFound"),
    ("./no_such_module.tsx", "TESSEL:host:moduleNotFound"),
    (__file__, "TESSEL:host:notAModule"),
    ("", "TESSEL:python:badModuleName"),
    (7, "TESSEL:python:badModuleName"),
])
def test_modules_that_cannot_be_loaded(module: Any, identifier: str) -> None:
    with pytest.raises(tessel.Error) as raised:
        tessel.load(module)
    assert raised.value.identifier == identifier


def test_arguments_have_no_names() -> None:
    with pytest.raises(tessel.Error):
        mirror("describe", value=1)
