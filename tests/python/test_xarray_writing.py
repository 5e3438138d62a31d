# tests/python/test_xarray_writing.py: datasets of xarray into files, and what must not get there.
"""tessel.xarray.to_netcdf: what the other engines read, exact types, no value that wraps around,
bounded memory, progress, and no half a file."""

from __future__ import annotations

import itertools
import subprocess
import sys
import textwrap
from collections.abc import Callable, Iterator
from pathlib import Path
from typing import Any

import dask
import dask.array as da
import numpy as np
import pandas as pd
import pytest
import tessel
import xarray as xr
from made_files import MIB, open_descriptors, run_tool
from tessel.new_dataset import NewDataset
from tessel.xarray import to_netcdf
from tessel.xarray.blocks import BlockWriter, Slot, _Open
from tessel.xarray.writing import Reopened

FORMATS = {"NETCDF3_CLASSIC": "classic", "NETCDF3_64BIT": "64-bit offset"}
ENGINES = ["netcdf4", "scipy", "tessel"]
PROCESSES = pytest.param("processes", marks=pytest.mark.without_sanitizers)
TYPES = ["i1", "i2", "i4", "f4", "f8"]


def everything() -> xr.Dataset:
    """Variables of every type, over no, one and several dimensions, with attributes of every
    type."""
    random = np.random.default_rng(1)
    made = xr.Dataset(attrs={
        "title": "everything, größer", "empty": "", "whole": 5, "many": [1, 2, 3], "part": 0.1,
        "single": np.float32(0.1), "short": np.int16(-5), "bytes": np.array([1, -1], np.int8)})
    for dtype in TYPES:
        for dims in [(), ("x",), ("time", "y", "x"), ("y", "x")]:
            shape = [{"time": 6, "y": 4, "x": 5}[each] for each in dims]
            values = (random.standard_normal(shape) * 40).astype(dtype)
            made[f"{dtype}_{len(dims)}"] = (dims, values, {"units": f"m{dtype}"})
    made["word"] = ("y", ["one", "", "drei", "größe"])
    made["bytes"] = ("y", np.array([b"a", b"bc", b"", b"def"]))
    made["letter"] = ((), "x")
    made["flag"] = ("x", [True, False, True, True, False])
    return made.assign_coords(time=pd.date_range("2001-01-01", periods=6, freq="6H"),
                              x=np.arange(5) * 1.5, height=((), 2.0))


def read(path: Path, engine: str, **options: Any) -> xr.Dataset:
    with xr.open_dataset(path, engine=engine, **options) as opened:
        return opened.load()


def chunked(dataset: xr.Dataset) -> xr.Dataset:
    return dataset.chunk({dim: 2 for dim in dataset.dims})


def dump(path: Path) -> str:
    """All of a file as text, without its name, the attributes of each variable in the order of the
    alphabet."""
    lines = run_tool("ncdump", "-n", "name", path).splitlines()
    groups = itertools.groupby(lines, lambda line: line.startswith("\t\t"))
    return "\n".join("\n".join(sorted(each) if sort else each) for sort, each in groups)


def header(path: Path) -> list[str]:
    return [line.strip() for line in run_tool("ncdump", "-h", path).splitlines()]


@pytest.fixture(autouse=True)
def nothing_left(tmp_path: Path) -> Iterator[None]:
    """Whatever a test does, nothing lies about and nothing is open after it."""
    yield
    assert not list(tmp_path.glob(".tessel*"))
    assert not [each for each in open_descriptors() if each.startswith(str(tmp_path))]


# What others read

@pytest.mark.parametrize("file_format", FORMATS)
@pytest.mark.parametrize("engine", ENGINES)
def test_what_other_engines_read(tmp_path: Path, file_format: str, engine: str) -> None:
    to_netcdf(everything(), tmp_path / "x.nc", format=file_format)
    assert run_tool("ncdump", "-k", tmp_path / "x.nc").strip() == FORMATS[file_format]
    actual = read(tmp_path / "x.nc", engine)
    xr.testing.assert_identical(actual, everything())
    for name in map("_".join, itertools.product(TYPES, "0123")):
        if name in actual:
            assert actual[name].encoding["dtype"] == np.dtype(name[:2])


@pytest.mark.parametrize("scheduler", ["synchronous", "threads", PROCESSES])
def test_dask_arrays_give_the_same_file(tmp_path: Path, scheduler: str) -> None:
    to_netcdf(everything(), tmp_path / "plain.nc", unlimited_dims="time")
    with dask.config.set(scheduler=scheduler):
        to_netcdf(chunked(everything()), tmp_path / "dask.nc", unlimited_dims="time")
    assert (tmp_path / "dask.nc").read_bytes() == (tmp_path / "plain.nc").read_bytes()


@pytest.mark.parametrize("seed", range(8))
def test_the_same_text_as_from_another_engine(tmp_path: Path, seed: int) -> None:
    random = np.random.default_rng(seed)
    made = xr.Dataset(attrs={"number": seed})
    dims = {f"d{i}": int(random.integers(1, 5)) for i in range(4)}
    for number in range(12):
        used = sorted(random.choice(list(dims), random.integers(0, 5), replace=False))
        values = np.asarray(random.standard_normal([dims[each] for each in used]) * 100)
        values = values.astype(random.choice([*TYPES, ">i4", "i8", ">f8"]))
        made[f"v{number}"] = (used, values, {"long_name": "n" * number, "valid_min": values.min()})
    unlimited = ["d0"] if seed % 2 else None
    made.to_netcdf(tmp_path / "other.nc", engine="netcdf4", format="NETCDF3_64BIT",
                    unlimited_dims=unlimited)
    to_netcdf(made if seed % 3 else chunked(made), tmp_path / "tessel.nc",
              unlimited_dims=unlimited)
    assert dump(tmp_path / "tessel.nc") == dump(tmp_path / "other.nc")


def test_everything_is_in_the_order_of_the_dataset(tmp_path: Path) -> None:
    made = xr.Dataset({"zz": (("b", "a"), [[1.5, 2.5]]), "aa": ("a", np.array([1, 2], "i2"))},
                      attrs={"z": "last letter", "a": 1, "m": 2.5})
    made.zz.attrs = {"units": "m", "code": np.int8(3)}
    made.zz.encoding["_FillValue"] = None
    to_netcdf(made, tmp_path / "x.nc", unlimited_dims=["b"])
    assert header(tmp_path / "x.nc") == [
        "netcdf x {", "dimensions:", "b = UNLIMITED ; // (1 currently)", "a = 2 ;", "variables:",
        "double zz(b, a) ;", 'zz:units = "m" ;', "zz:code = 3b ;", "short aa(a) ;", "",
        "// global attributes:", ':z = "last letter" ;', ":a = 1 ;", ":m = 2.5 ;", "}"]


def test_texts(tmp_path: Path) -> None:
    made = xr.Dataset({
        "named": ("x", np.array(["ab", "größe"], object), {}, {"char_dim_name": "width"}),
        "filled": ("x", np.array([b"ab", np.nan], object), {}, {"_FillValue": b"X", "dtype": "S1"}),
        "nothing": ("x", ["", ""]), "variable_length": ("x", ["a", "b"], {}, {"dtype": str})})
    to_netcdf(made, tmp_path / "x.nc")
    lines = header(tmp_path / "x.nc")
    assert {"width = 7 ;", "char named(x, width) ;", 'filled:_FillValue = "X" ;'} <= set(lines)
    actual = read(tmp_path / "x.nc", "netcdf4")
    assert actual.named.values.tolist() == ["ab", "größe"]
    assert actual.filled.values.tolist()[0] == b"ab"
    assert actual.nothing.values.tolist() == ["", ""]
    assert actual.variable_length.values.tolist() == ["a", "b"]


def test_names_beyond_ascii(tmp_path: Path) -> None:
    made = xr.Dataset({"größe": ("länge", [1.0], {"härte": "weich"})}, attrs={"tüte": "中"})
    to_netcdf(made, tmp_path / "ö.nc")
    for engine in ("netcdf4", "tessel"):  # "scipy" takes names for Latin-1
        xr.testing.assert_identical(read(tmp_path / "ö.nc", engine), made)


# Values that fit, and values that do not

LIMITS = [(np.dtype(external), limit) for external in ("i1", "i2", "i4")
          for limit in (np.iinfo(external).min, np.iinfo(external).max)]


@pytest.mark.parametrize("lazy", [False, True])
@pytest.mark.parametrize("dtype, limit", LIMITS)
@pytest.mark.parametrize("given", ["i8", "f8", "u4", ">i4"])
def test_the_last_value_fits_and_the_next_does_not(tmp_path: Path, dtype: np.dtype[Any], limit: int,
                                                   given: str, lazy: bool) -> None:
    beyond = limit + (1 if limit > 0 else -1)
    for value, fits in ((limit, True), (beyond, False)):
        if np.dtype(given).kind != "f" and not \
                np.iinfo(given).min <= value <= np.iinfo(given).max:
            continue
        made = xr.Dataset({"x": ("t", np.array([0, value, 1], given))})
        made = made.chunk({"t": 2}) if lazy else made
        made.x.encoding.update(dtype=dtype, _FillValue=None)
        path = tmp_path / f"{fits}.nc"
        if fits:
            to_netcdf(made, path)
            actual = read(path, "netcdf4", decode_cf=False).x.values
            assert (actual.dtype.newbyteorder("="), actual.tolist()) == (dtype, [0, value, 1])
        else:
            with pytest.raises(ValueError, match=f"could not safely cast .* the value {beyond}"):
                to_netcdf(made, path)
            assert not path.exists()


MISFITS: dict[str, tuple[Any, dict[str, Any]]] = {
    # what is wrong: the values, and their encoding
    "64-bit integers": ([2**31], {}),
    "32-bit unsigned integers": (np.array([2**31], "u4"), {}),
    "16-bit unsigned integers": (np.array([2**15], "u2"), {}),
    "8-bit unsigned integers": (np.array([200], "u1"), {}),
    "64-bit unsigned integers": (np.array([2**63], "u8"), {}),
    "single precision": ([1e39], {"dtype": "f4"}),
    "single precision, negative": ([-1e39], {"dtype": "f4"}),
    "packed": ([327.68], {"dtype": "i2", "scale_factor": 0.01, "_FillValue": -1}),
    "packed with an offset": ([0.0], {"dtype": "i1", "add_offset": 500.0, "_FillValue": -1}),
    "no number without a marker": ([np.nan], {"dtype": "i4", "_FillValue": None}),
    "infinite": ([np.inf], {"dtype": "i4", "_FillValue": -1}),
    "rounded over the limit": ([127.5], {"dtype": "i1", "_FillValue": -1}),
    "unsigned in the encoding": ([256.0], {"dtype": "i1", "_Unsigned": "true", "_FillValue": 255}),
    "negative as unsigned": ([-1.0], {"dtype": "i1", "_Unsigned": "true", "_FillValue": 255}),
    "a marker": ([1.0], {"dtype": "i2", "_FillValue": -99999}),
    "another marker": ([1.0], {"dtype": "i2", "missing_value": 40000}),
    "a fractional marker": ([1.0], {"dtype": "i2", "_FillValue": -1.5}),
    "another fractional marker": ([1], {"missing_value": 0.25}),
    "a fractional marker of unsigned values": ([1.0], {"dtype": "i1", "_Unsigned": "true",
                                                       "_FillValue": 254.5}),
    "a fractional marker of unsigned bits": ([1.0], {"dtype": "i1", "_Unsigned": "true",
                                                     "_FillValue": -0.5}),
    "a marker in single precision": ([1.0], {"dtype": "f4", "_FillValue": 1e300}),
    "a marker of unsigned values": ([1.0], {"dtype": "i1", "_Unsigned": "true",
                                            "_FillValue": 256}),
}

OBJECTS = {"objects": (np.array([70000], object), {"dtype": "i2"})}
"""As Dask arrays, xarray itself loads them."""


@pytest.mark.parametrize("wrong, lazy", [
    *itertools.product(MISFITS, [False, True]), *itertools.product(OBJECTS, [False])])
def test_what_does_not_fit_is_an_error(tmp_path: Path, wrong: str, lazy: bool) -> None:
    values, encoding = {**MISFITS, **OBJECTS}[wrong]
    (tmp_path / "x.nc").write_text("was there before")
    made = xr.Dataset({"good": ("x", np.arange(100.0)), "bad": ("t", values, {}, encoding)})
    with pytest.raises(tessel.Error, match="bad.*could not safely cast") as raised:
        to_netcdf(chunked(made) if lazy else made, tmp_path / "x.nc")
    assert isinstance(raised.value, ValueError)
    assert raised.value.identifier == "TESSEL:python:valueDoesNotFit"
    assert "in tessel.xarray.to_netcdf(" in raised.value.__notes__[-1]
    assert (tmp_path / "x.nc").read_text() == "was there before"


@pytest.mark.parametrize("scheduler", ["threads", PROCESSES])
def test_a_misfit_far_into_the_data(tmp_path: Path, scheduler: str) -> None:
    values = da.arange(1000, chunks=10).map_blocks(
        lambda block: np.where(block == 777, 2**40, block))
    with dask.config.set(scheduler=scheduler), pytest.raises(ValueError, match="could not safely"):
        to_netcdf(xr.Dataset({"x": ("t", values)}), tmp_path / "x.nc")
    assert not list(tmp_path.iterdir())


def test_a_marker_among_the_attributes_that_does_not_fit(tmp_path: Path) -> None:
    for marker in (1.5, -99999):
        made = xr.Dataset({"x": ("t", np.array([1, 2], "i2"), {"_FillValue": marker})})
        with pytest.raises(ValueError, match=f"_FillValue of .*'x'.* the value {marker}"):
            to_netcdf(made, tmp_path / "x.nc")


@pytest.mark.parametrize("marker", [-1.0, np.float32(-1), -1, np.int64(-1)])
def test_a_whole_marker_fits_whatever_its_type(tmp_path: Path, marker: Any) -> None:
    made = xr.Dataset({"x": ("t", [1.0, np.nan], {}, {"dtype": "i2", "_FillValue": marker})})
    to_netcdf(made, tmp_path / "x.nc")
    raw = read(tmp_path / "x.nc", "scipy", decode_cf=False).x
    assert (raw.values.tolist(), raw.attrs["_FillValue"]) == ([1, -1], -1)
    assert raw.attrs["_FillValue"].dtype.newbyteorder("=") == "i2"


@pytest.mark.parametrize("attribute", [2**31, [1, 2**40], np.uint8(200)])
def test_attributes_that_do_not_fit(tmp_path: Path, attribute: Any) -> None:
    for made in (xr.Dataset(attrs={"a": attribute}), xr.Dataset({"x": ((), 1, {"a": attribute})})):
        with pytest.raises(ValueError, match="attribute 'a'.*could not safely cast"):
            to_netcdf(made, tmp_path / "x.nc")


def test_nothing_is_lost_between_precisions(tmp_path: Path) -> None:
    numbers = np.array([0.1, -0.0, np.inf, -np.inf, np.nan, 1e-45, 3.4e38], "f4")
    made = xr.Dataset({"same": ("t", numbers), "wider": ("t", numbers, {}, {"dtype": "f8"}),
                       "narrower": ("t", numbers.astype("f8"), {}, {"dtype": "f4"})})
    to_netcdf(made, tmp_path / "x.nc")
    for value in read(tmp_path / "x.nc", "scipy").values():
        assert value.values.astype("f4").tobytes() == numbers.tobytes()


@pytest.mark.parametrize("lazy", [False, True])
def test_unsigned_bits(tmp_path: Path, lazy: bool) -> None:
    encoding = {"dtype": "i1", "_Unsigned": "true", "_FillValue": 255}
    made = xr.Dataset({"x": ("t", np.append(np.arange(255.0), np.nan).astype("f4"), {}, encoding)})
    to_netcdf(chunked(made) if lazy else made, tmp_path / "x.nc")
    raw = read(tmp_path / "x.nc", "scipy", decode_cf=False).x
    assert raw.dtype == "i1"
    assert raw.values.view("u1").tolist() == list(range(256))
    assert (raw.attrs["_FillValue"], raw.attrs["_Unsigned"]) == (-1, "true")
    xr.testing.assert_equal(read(tmp_path / "x.nc", "netcdf4"), made)


def test_packed_values(tmp_path: Path) -> None:
    made = xr.Dataset({"x": ("t", [0.0, 1.25, np.nan, -3.5])})
    for dataset, name in ((made, "plain.nc"), (chunked(made), "dask.nc")):
        to_netcdf(dataset, tmp_path / name, encoding={
            "x": {"dtype": "i2", "scale_factor": 0.25, "add_offset": 1.0, "_FillValue": -99}})
        raw = read(tmp_path / name, "scipy", decode_cf=False).x
        assert (raw.dtype, raw.values.tolist()) == ("i2", [-4, 1, -99, -18])
        xr.testing.assert_equal(read(tmp_path / name, "tessel"), made)
    assert not made.x.encoding


@pytest.mark.parametrize("values", [
    np.array([1j]), np.array([1], "f2"), np.array([1], "longdouble")])
def test_types_that_there_are_none_for(tmp_path: Path, values: np.ndarray) -> None:
    with pytest.raises(TypeError, match="no type for"):
        to_netcdf(xr.Dataset({"x": ("t", values)}), tmp_path / "x.nc")
    with pytest.raises(TypeError, match="no type for"):
        to_netcdf(xr.Dataset(attrs={"x": values}), tmp_path / "x.nc")


# Dimensions

def test_unlimited_dimensions(tmp_path: Path) -> None:
    made = xr.Dataset({"x": (("t", "y"), np.ones((3, 2)))})
    for given, encoded in [("t", None), (["t"], None), (None, ["t"]), (None, {"t", "gone"}),
                           (("t",), ["y"]), (iter("t"), None), (None, iter(["t", "gone"]))]:
        made.encoding["unlimited_dims"] = encoded or ()  # an iterator is good for one look
        to_netcdf(made, tmp_path / "x.nc", unlimited_dims=given)
        assert "t = UNLIMITED ; // (3 currently)" in header(tmp_path / "x.nc")
        xr.testing.assert_identical(read(tmp_path / "x.nc", "netcdf4"), made)
    to_netcdf(made, tmp_path / "x.nc", unlimited_dims=[])
    assert "t = 3 ;" in header(tmp_path / "x.nc")


@pytest.mark.parametrize("unlimited, word", [
    (["t", "y"], "onlyOneUnlimitedDimensionAllowed"), ("y", "badDimensions"),
    ("z", "badDimensions"), (["t", "z"], "badDimensions"), (iter("tz"), "badDimensions")])
def test_unlimited_dimensions_that_cannot_be(tmp_path: Path, unlimited: Any, word: str) -> None:
    with pytest.raises(tessel.Error) as raised:
        to_netcdf(xr.Dataset({"x": (("t", "y"), np.ones((3, 2)))}), tmp_path / "x.nc",
                  unlimited_dims=unlimited)
    assert raised.value.word == word
    assert not list(tmp_path.iterdir())


@pytest.mark.parametrize(("made", "unlimited"), [
    (xr.Dataset({"x": (("t", "y"), np.ones((3, 2)))}), "y"),
    (xr.Dataset({"x": (("t", "y"), np.ones((3, 0)))}), None)], ids=["asked for", "no length"])
def test_the_dimension_that_must_be_the_first(tmp_path: Path, made: xr.Dataset,
                                              unlimited: str | None) -> None:
    with pytest.raises(tessel.Error) as raised:
        to_netcdf(made, tmp_path / "x.nc", unlimited_dims=unlimited)
    assert raised.value.message == "y is unlimited, and so must be the first dimension of x."
    to_netcdf(xr.Dataset({"v": ("y", [1.0])}), tmp_path / "x.nc", unlimited_dims="y")
    with pytest.raises(tessel.Error, match="must be the first dimension of w"):
        to_netcdf(xr.Dataset({"w": (("t", "y"), [[1.0], [2.0]])}), tmp_path / "x.nc", "a")


@pytest.mark.parametrize("lazy", [False, True])
def test_dimensions_without_length(tmp_path: Path, lazy: bool) -> None:
    made = xr.Dataset({"x": (("t", "y"), np.ones((0, 2))), "z": ("y", [1.0, 2.0]),
                       "w": ("t", np.array([], "i2"))})
    to_netcdf(made.chunk() if lazy else made, tmp_path / "x.nc")
    xr.testing.assert_identical(read(tmp_path / "x.nc", "netcdf4"), made)


def test_widths_of_texts_that_differ(tmp_path: Path) -> None:
    made = xr.Dataset({"a": ("x", ["abc"], {}, {"char_dim_name": "width"}),
                       "b": ("x", ["abcde"], {}, {"char_dim_name": "width"})})
    with pytest.raises(ValueError, match="width"):
        to_netcdf(made, tmp_path / "x.nc")


# What is refused

@pytest.mark.parametrize("made, options, error, message", [
    (xr.Dataset({"a/b": 1}), {}, ValueError, "illegal"),
    (xr.Dataset({5: 1}), {}, TypeError, "string"),
    (xr.Dataset(attrs={"": 1}), {}, ValueError, "string"),
    (xr.Dataset(attrs={"a": {}}), {}, TypeError, "Invalid value"),
    (xr.Dataset(attrs={"a": ["b", "c"]}), {}, TypeError, "no type for"),
    (xr.Dataset(attrs={"a": [[1, 2], [3, 4]]}), {}, ValueError, "1-dimensional"),
    (xr.Dataset({"x": 1}), {"format": "NETCDF4"}, ValueError, "NETCDF3_64BIT"),
    (xr.Dataset({"x": 1}), {"mode": "r"}, ValueError, "mode"),
    (xr.Dataset({"x": 1}), {"block_bytes": 0}, ValueError, "at least one byte"),
    (xr.Dataset({"x": 1}), {"progress": 1}, TypeError, "progress"),
    (xr.Dataset({"x": 1}), {"encoding": {"x": {"zlib": True}}}, ValueError, "unexpected encoding"),
    (xr.Dataset({"x": "a"}), {"encoding": {"x": {"dtype": str}}}, ValueError,
     "unexpected encoding"),
    (xr.Dataset({"x": 1}), {"encoding": {"y": {}}}, KeyError, "no variables"),
    (xr.Dataset({"x": (("a"), [b"b"], {"_FillValue": 1})}), {}, TypeError, "_FillValue"),
    (xr.Dataset({"x": (("a"), [b"b"], {"_FillValue": "XY"})}), {}, ValueError, "_FillValue"),
], ids=itertools.count())
def test_refused(tmp_path: Path, made: xr.Dataset, options: dict[str, Any],
                 error: type[Exception], message: str) -> None:
    with pytest.raises(error, match=message):
        to_netcdf(made, tmp_path / "x.nc", **options)
    assert not list(tmp_path.iterdir())


def test_a_target_that_is_no_file(tmp_path: Path) -> None:
    with pytest.raises(FileNotFoundError):
        to_netcdf(xr.Dataset({"x": 1}), tmp_path / "missing" / "x.nc")
    (tmp_path / "folder").mkdir()
    with pytest.raises(OSError, match="not a regular file"):
        to_netcdf(xr.Dataset({"x": 1}), tmp_path / "folder")


def test_too_large_for_the_classic_format(tmp_path: Path) -> None:
    huge = da.zeros((3, 2**28), chunks=(1, 2**20))
    with pytest.raises(tessel.Error, match="size"):
        to_netcdf(xr.Dataset({"x": (("a", "b"), huge), "y": ("a", [1, 2, 3])}), tmp_path / "x.nc",
                  format="NETCDF3_CLASSIC")
    assert not list(tmp_path.iterdir())


# Progress

@pytest.mark.parametrize("lazy", [False, True])
def test_progress(tmp_path: Path, lazy: bool) -> None:
    calls: list[tuple[int, int]] = []
    made = xr.Dataset({"x": ("t", np.arange(100.0)), "y": ((), 5),
                       "z": ("t", np.arange(100, dtype="i2"))})
    to_netcdf(made.chunk({"t": 10}) if lazy else made, tmp_path / "x.nc", block_bytes=80,
              progress=lambda done, total: calls.append((done, total)))
    assert calls[0] == (0, 1004)
    assert calls[-1] == (1004, 1004)
    steps = [after[0] - before[0] for before, after in itertools.pairwise(calls)]
    # The array without dimensions stays as it is; 16-bit integers are half as many as in 80 bytes.
    assert sorted(steps) == sorted([80] * 10 + [4] + ([20] * 10 if lazy else [80, 80, 40]))


@pytest.mark.parametrize("lazy", [False, True])
@pytest.mark.parametrize("at", [0, 3])
def test_nothing_is_left_when_progress_raises(tmp_path: Path, lazy: bool, at: int) -> None:
    made = xr.Dataset({"x": ("t", np.arange(100.0))})

    def progress(done: int, _total: int, calls: Iterator[int] = itertools.count()) -> None:
        if next(calls) == at:
            raise KeyboardInterrupt

    with pytest.raises(KeyboardInterrupt):
        to_netcdf(made.chunk({"t": 10}) if lazy else made, tmp_path / "x.nc", block_bytes=80,
                  progress=progress)
    assert not list(tmp_path.iterdir())


def test_blocks_that_come_too_late_go_nowhere(tmp_path: Path) -> None:
    with NewDataset(str(tmp_path / "x.nc"), "classic") as made:
        varid = made.define_variable("x", 6, [made.define_dimension("t", 2)])
        made.end_definitions()
        slot = Slot(varid, np.dtype("f8"), (2,))
        sink = _Open(made)
        sink((slot.varid, slot.member), [0], np.array([1.0, 2.0]))
        sink.end()
        sink((slot.varid, slot.member), [0], np.array([7.0, 7.0]))
    assert read(tmp_path / "x.nc", "scipy").x.values.tolist() == [1.0, 2.0]


# Graphs and memory

@pytest.mark.parametrize("scheduler", ["synchronous", "threads"])
def test_what_several_blocks_need_is_computed_once(tmp_path: Path, scheduler: str) -> None:
    seen: list[int] = []

    def count(block: np.ndarray) -> np.ndarray:
        seen.append(int(block[0]))
        return block

    values = da.arange(100.0, chunks=10).map_blocks(count, dtype=float, meta=np.empty(0))
    made = xr.Dataset({"x": ("t", values)})
    made["anomaly"] = made.x - made.x.mean()
    made["total"] = made.x.sum()
    with dask.config.set(scheduler=scheduler):
        to_netcdf(made, tmp_path / "x.nc")
    assert sorted(seen) == list(range(0, 100, 10))
    xr.testing.assert_identical(read(tmp_path / "x.nc", "scipy"), made.compute())


def peak(program: str, *arguments: object) -> int:
    """By how many bytes the memory of a process grew at most in the last part of a program; of a
    mapped file, which the system can take back at any time, nothing counts."""
    code = "import sys, threading, time\n" + textwrap.dedent(program) + textwrap.dedent("""
        def memory():
            with open("/proc/self/status") as status:
                return next(int(line.split()[1]) for line in status if line[:8] == "RssAnon:")

        def watch():
            while not over.wait(0.002):
                seen.append(memory())

        seen, over, watcher = [memory()], threading.Event(), threading.Thread(target=watch)
        watcher.start()
        last()
        over.set()
        watcher.join()
        print(1024 * (max(seen) - seen[0]))
    """)
    done = subprocess.run([sys.executable, "-B", "-c", code, *map(str, arguments)], check=True,
                          stdout=subprocess.PIPE, timeout=120)
    return int(done.stdout)


@pytest.mark.without_sanitizers
def test_memory_is_bounded(tmp_path: Path) -> None:
    """512 MiB, first out of Dask's blocks of 8 MiB and then out of the file, which is opened
    without Dask."""
    begin = """
        import dask, dask.array, numpy, xarray
        from tessel.xarray import to_netcdf
        to_netcdf(xarray.Dataset({"x": ("t", dask.array.ones(2**20, chunks=2**18))}), sys.argv[1])
        with xarray.open_dataset(sys.argv[1], engine="tessel", cache=False) as small:
            to_netcdf(small, sys.argv[1] + ".2", block_bytes=2**22)
    """
    path = tmp_path / "x.nc"
    assert peak(begin + """
        def last():
            x = dask.array.ones((512, 2**17), chunks=(8, 2**17)) * 1.5
            with dask.config.set(num_workers=2):
                to_netcdf(xarray.Dataset({"x": (("t", "y"), x)}), sys.argv[1])
    """, path) < 128 * MIB
    assert path.stat().st_size > 512 * MIB
    assert peak(begin.replace("sys.argv[1]", 'sys.argv[1] + ".1"') + """
        def last():
            with xarray.open_dataset(sys.argv[1], engine="tessel", cache=False) as opened, \\
                    dask.config.set(num_workers=2):
                to_netcdf(opened, sys.argv[1] + ".3", block_bytes=2**23)
    """, path) < 128 * MIB
    assert (tmp_path / "x.nc.3").read_bytes() == path.read_bytes()


# Adding to a file

def test_adding(tmp_path: Path) -> None:
    path = tmp_path / "x.nc"
    first = xr.Dataset({"x": ("t", [1.0, 2.0]), "z": ("t", [5, 6])}, attrs={"title": "first"})
    second = xr.Dataset({"y": (("t", "u"), [[1, 2, 3], [4, 5, 6]]), "x": ("t", [8.0, 9.0])},
                        attrs={"title": "second", "more": 1})
    to_netcdf(first, path, mode="a")  # there is none yet
    to_netcdf(chunked(second), path, mode="a")
    xr.testing.assert_identical(read(path, "netcdf4"), first.merge(second, compat="override")
                                .assign(x=second.x).assign_attrs(second.attrs))
    before = path.read_bytes()
    for wrong, message in [
            (xr.Dataset({"w": ("t", [1.0])}), "Unable to update size"),
            (xr.Dataset({"x": ("t", np.array([1, 2], "i2"))}), "a variable x already"),
            (xr.Dataset({"x": ("t", [1, 2**40])}), "could not safely cast"),
            (xr.Dataset({"x": 1.0}), "a variable x already")]:
        with pytest.raises(ValueError, match=message):
            to_netcdf(wrong, path, mode="a")
        assert path.read_bytes() == before


BEFORE = {"packed": ([1.0, 2.0], {}, {"dtype": "i2", "scale_factor": 0.5, "_FillValue": 7}),
          "shifted": ([1.0, 2.0], {}, {"dtype": "i2", "add_offset": 5.0, "missing_value": 7}),
          "times": (np.array([0, 1], "M8[D]").astype("M8[ns]"), {}, {"dtype": "i2"}),
          "bits": ([255.0, 1.0], {}, {"dtype": "i1", "_Unsigned": "true"}),
          "flags": ([True, False], {}, {}),
          "described": ([1, 2], {"units": "m", "valid_min": 0}, {"dtype": "i2"})}


@pytest.mark.parametrize("lazy", [False, True])
@pytest.mark.parametrize("name", BEFORE)
def test_what_is_put_in_the_place_of_values_means_what_it_says(tmp_path: Path, name: str,
                                                              lazy: bool) -> None:
    """Nothing is left of how the values were packed that were there before."""
    path = tmp_path / "x.nc"
    to_netcdf(xr.Dataset({name: ("t", *BEFORE[name]), "other": ("t", [1.0, 2.0], {"units": "K"})}),
              path)
    dtype = read(path, "scipy", decode_cf=False)[name].dtype.newbyteorder("=")
    after = xr.Dataset({name: ("t", np.array([7, -1], dtype), {"long_name": "new"})})
    to_netcdf(chunked(after) if lazy else after, path, mode="a")
    actual = read(path, "netcdf4")
    xr.testing.assert_identical(actual[[name]], after)
    assert actual[name].dtype == dtype and actual.other.attrs == {"units": "K"}


def test_values_are_packed_again_in_another_way(tmp_path: Path) -> None:
    path = tmp_path / "x.nc"
    made = xr.Dataset({"x": ("t", [1.0, np.nan])})
    to_netcdf(made, path, encoding={"x": {"dtype": "i2", "scale_factor": 0.5, "_FillValue": 7}})
    with xr.open_dataset(path, engine="tessel") as opened:
        to_netcdf(opened, path, mode="a")  # as the dataset says, which has it from the file
    raw = read(path, "scipy", decode_cf=False).x
    assert (raw.values.tolist(), raw.attrs) == ([2, 7], {"scale_factor": 0.5, "_FillValue": 7})
    to_netcdf(made, path, mode="a", encoding={"x": {"dtype": "i2", "add_offset": 5.0,
                                                    "missing_value": 9}})
    raw = read(path, "scipy", decode_cf=False).x
    assert (raw.values.tolist(), raw.attrs) == ([-4, 9], {"add_offset": 5.0, "missing_value": 9})
    with pytest.raises(ValueError, match="a variable x already.*cannot take float64"):
        to_netcdf(made, path, mode="a")  # not packed


@pytest.mark.parametrize("file_format", ["NETCDF4", "NETCDF4_CLASSIC"])
def test_adding_to_a_file_of_another_format(tmp_path: Path, file_format: str) -> None:
    path = tmp_path / "x.nc"
    xr.Dataset({"x": ("t", [1])}).to_netcdf(path, engine="netcdf4", format=file_format)
    before = path.read_bytes()
    with pytest.raises(OSError, match="Variables can be added to files of the classic") as raised:
        to_netcdf(xr.Dataset({"y": ("t", [1])}), path, mode="a")
    assert raised.value.word == "notAClassicFile" and raised.value.path == str(path)
    assert path.read_bytes() == before


def test_a_file_that_cannot_be_added_to_is_closed(tmp_path: Path,
                                                  monkeypatch: pytest.MonkeyPatch) -> None:
    path = tmp_path / "x.nc"
    to_netcdf(xr.Dataset({"x": 1.0}), path)
    before = path.read_bytes()
    original = Reopened.call

    def call(self: Reopened, operation: str, *arguments: object) -> Any:
        if operation == "redef":
            raise MemoryError
        return original(self, operation, *arguments)

    monkeypatch.setattr(Reopened, "call", call)
    with pytest.raises(MemoryError):
        to_netcdf(xr.Dataset({"y": 1.0}), path, mode="a")
    assert path.read_bytes() == before  # and `nothing_left` sees that nothing is open


def test_a_file_is_replaced_while_it_is_read(tmp_path: Path) -> None:
    path = tmp_path / "x.nc"
    to_netcdf(everything(), path)
    with xr.open_dataset(path, engine="tessel") as opened:
        to_netcdf(opened.assign(new=opened["f8_3"] * 2), path)
    expected = everything()
    xr.testing.assert_identical(read(path, "netcdf4"),
                                expected.assign(new=expected["f8_3"] * 2))


@pytest.mark.parametrize("array", [
    xr.DataArray([1.0, 2.0], dims="x", name="speed"),
    xr.DataArray([1.0, 2.0], dims="x"),  # without a name
    xr.DataArray([1.0, 2.0], dims="x", name="x"),
    xr.DataArray([1.0, 2.0], {"height": 2.0}, "x", name="height"),
    xr.DataArray([3, 4], {"x": [3, 4]}, "x", name="x")], ids=lambda each: None)
def test_an_array_with_labels(tmp_path: Path, array: xr.DataArray) -> None:
    """As xarray itself writes it, and reads it back, name and all."""
    ours, theirs = tmp_path / "ours.nc", tmp_path / "theirs.nc"
    to_netcdf(array, ours)
    array.to_netcdf(theirs, engine="netcdf4", format="NETCDF3_64BIT")
    assert dump(ours) == dump(theirs)
    for engine in ENGINES:
        with xr.open_dataarray(ours, engine=engine) as back:
            assert back.name == array.name
            xr.testing.assert_identical(back.load(), array)
    assert array.attrs == {}


def test_an_array_with_an_encoding(tmp_path: Path) -> None:
    array = xr.DataArray([1.5, 2.5], dims="x", name="speed")
    to_netcdf(array, tmp_path / "x.nc", unlimited_dims="x",
              encoding={"speed": {"dtype": "i2", "scale_factor": 0.5, "_FillValue": -9}})
    raw = read(tmp_path / "x.nc", "scipy", decode_cf=False)
    assert raw.speed.values.tolist() == [3, 5] and raw.encoding["unlimited_dims"] == {"x"}


@pytest.mark.parametrize("wrong", [{"a": 1}, np.arange(3), None, xr.Variable("x", [1]),
                                   pd.Series([1])], ids=lambda each: type(each).__name__)
def test_what_is_no_dataset(tmp_path: Path, wrong: Any) -> None:
    with pytest.raises(TypeError, match="is an xarray.Dataset or an xarray.DataArray") as raised:
        to_netcdf(wrong, tmp_path / "x.nc")
    assert isinstance(raised.value, tessel.Error) and type(wrong).__name__ in str(raised.value)
    assert not list(tmp_path.iterdir())


@pytest.mark.parametrize("wrong, word, message", [
    ({"zz": {}, "x": {}, "yy": {"dtype": "i2"}}, "variableNotFound", r"no variables \['zz', 'yy'\]"),
    ({"x": 3}, "badEncoding", "encoding of x must be castable to a dict, .* and is 3"),
    ({"x": "foo"}, "badEncoding", "and is 'foo'"),
    (["x"], "unsupportedType", "a dict with a dict for each variable")], ids=lambda each: None)
def test_an_encoding_of_what_is_not_there(tmp_path: Path, wrong: Any, word: str,
                                          message: str) -> None:
    made = xr.Dataset({"x": (("t", "u"), [[1, 2]])})
    with pytest.raises(tessel.Error, match=message) as raised:
        to_netcdf(made, tmp_path / "x.nc", encoding=wrong)
    assert raised.value.word == word and not list(tmp_path.iterdir())
    [note] = raised.value.__notes__
    assert note.startswith("in tessel.xarray.to_netcdf(dataset=<Dataset (t: 1, u: 2)>, path=")


def test_a_value_that_is_the_marker_is_missing(tmp_path: Path) -> None:
    """Whoever fills values in beforehand wants that, so it is no error."""
    made = xr.Dataset({"x": ("t", [-9.0, 1.0, np.nan])})
    to_netcdf(made, tmp_path / "x.nc", encoding={"x": {"dtype": "i2", "_FillValue": -9}})
    for engine in ENGINES:
        np.testing.assert_array_equal(read(tmp_path / "x.nc", engine).x, [np.nan, 1, np.nan])


def test_the_writer_takes_numbers_in_any_layout(tmp_path: Path) -> None:
    values = np.arange(24.0).reshape(2, 3, 4)
    layouts: dict[str, Callable[[], np.ndarray]] = {
        "fortran": lambda: np.asfortranarray(values),
        "strided": lambda: np.repeat(values, 2, 1)[:, ::2],
        "backwards": lambda: values[::-1, :, ::-1].copy()[::-1, :, ::-1],
        "swapped": lambda: values.astype(">f8"), "turned": lambda: values.T.copy().T}
    made = xr.Dataset({name: (("a", "b", "c"), make()) for name, make in layouts.items()})
    to_netcdf(made, tmp_path / "x.nc", block_bytes=40)
    actual = read(tmp_path / "x.nc", "scipy")
    for name in layouts:
        assert (actual[name].values == values).all()


def test_the_writer_knows_nothing_before_it_is_told() -> None:
    assert BlockWriter()._arrays == BlockWriter()._graphs == []
