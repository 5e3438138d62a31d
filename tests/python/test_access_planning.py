# tests/python/test_access_planning.py: however a selection is read, it is what NumPy selects.
"""Selections of every kind, read in every way, beside NumPy on the whole array."""

from __future__ import annotations

import math
import random
import tracemalloc
from collections.abc import Iterator

import netCDF4
import numpy as np
import pytest
import tessel
from made_files import MEMBERS
from scipy.io import netcdf_file
from tessel.xarray import planning
from tessel.xarray.array import DTYPES, LazyArray
from tessel.xarray.opening import OpenFile
from tessel.xarray.planning import Costs, Selector
from xarray.backends import CachingFileManager

FREE, DEAR = 0.0, 1.0
# Costs by which one of the ways is always the cheapest, and those that were measured.
WAYS = {
    "measured": None,
    "block and pick": Costs(DEAR, FREE, FREE, FREE, DEAR),
    "runs": Costs(FREE, DEAR / 1e3, DEAR, FREE, DEAR * 1e6),
    "strided": Costs(DEAR, DEAR, DEAR, DEAR, FREE),
}
SHAPES = {"cube": (7, 5, 6), "deep": (3, 4, 2, 3, 5), "line": (40,), "records": (9, 4, 5),
          "alone": ()}


@pytest.fixture(scope="module", params=["NETCDF3_CLASSIC", "NETCDF3_64BIT_OFFSET"])
def path(request: pytest.FixtureRequest, tmp_path_factory: pytest.TempPathFactory) -> str:
    """A file with a variable of every type and shape, written by somebody else."""
    made = str(tmp_path_factory.mktemp("planning") / "made.nc")
    generator = np.random.default_rng(len(request.param))
    with netCDF4.Dataset(made, "w", format=request.param) as file:
        file.createDimension("record", None)
        for length in set(sum(SHAPES.values(), ())):
            file.createDimension(f"d{length}", length)
        for name, shape in SHAPES.items():
            for member in MEMBERS.values():
                dimensions = [f"d{each}" for each in shape]
                if name == "records":
                    dimensions[0] = "record"
                variable = file.createVariable(f"{name}_{member}", DTYPES[member], dimensions)
                variable.set_auto_maskandscale(False)
                variable[...] = values_for(generator, member, shape)
    return made


def values_for(generator: np.random.Generator, member: str, shape: tuple[int, ...]) -> np.ndarray:
    """Values of every kind that the type has."""
    dtype = np.dtype(DTYPES[member])
    codes = generator.integers(0, 256, (*shape, dtype.itemsize), np.uint8)
    if member == "text":
        return codes.view("S1").reshape(shape)
    if dtype.kind == "f":
        return generator.normal(0, 1e6, shape).astype(dtype)
    return codes.view(dtype).reshape(shape)


class Recorder(LazyArray):
    """An array that tells what was asked of the module."""

    def __init__(self, path: str, name: str, mapped: bool = True) -> None:
        manager = CachingFileManager(OpenFile, path, kwargs={"mapped": mapped})
        super().__init__(manager, manager.acquire().variables[name], mapped)
        self.asked: list[tuple[str, int]] = []

    def _values(self, count: list[int], family: str, *places: list[int]) -> np.ndarray:
        self.asked.append((family, math.prod(count)))
        return super()._values(count, family, *places)


def whole(path: str, name: str) -> np.ndarray:
    """The variable as SciPy reads it."""
    with netcdf_file(path, mmap=False) as file:
        values = np.array(file.variables[name].data)
    return values.astype(values.dtype.newbyteorder("="))


def some_selector(chance: random.Random, length: int) -> Selector:
    """A selection along one dimension, of any kind."""
    kind = chance.randrange(9)
    if kind == 0:
        return chance.randrange(-length, length)
    if kind == 1:
        return np.int64(chance.randrange(length))
    if kind in (2, 3, 4):
        places = [None, *range(-length - 2, length + 3)]
        steps = [None, 1, 2, 3, length, -1, -2, -3, -length - 1]
        return slice(chance.choice(places), chance.choice(places), chance.choice(steps))
    if kind == 5:
        return slice(None)
    count = chance.randrange(length + 3)
    listed = [chance.randrange(-length, length) for _ in range(count)]
    if kind == 6:
        listed = sorted({each % length for each in listed})
    return np.array(listed, chance.choice(["i8", "i4"]))


def selected(values: np.ndarray, key: tuple[Selector, ...]) -> np.ndarray:
    """What NumPy selects, dimension by dimension."""
    number = 0
    for each in key:
        values = values[(slice(None),) * number + (each,)]
        number += not np.isscalar(each)
    return values


def keys(seed: int, shape: tuple[int, ...], count: int) -> Iterator[tuple[Selector, ...]]:
    chance = random.Random(seed)
    for _ in range(count):
        yield tuple(some_selector(chance, length) for length in shape)


@pytest.mark.parametrize("member", MEMBERS.values())
@pytest.mark.parametrize("way", WAYS)
def test_any_selection_is_what_numpy_selects(path: str, member: str, way: str,
                                             monkeypatch: pytest.MonkeyPatch) -> None:
    used = set()
    for seed, (name, shape) in enumerate(SHAPES.items()):
        expected = whole(path, f"{name}_{member}")
        for mapped in (True, False):
            array = Recorder(path, f"{name}_{member}", mapped)
            array.costs = WAYS[way] or array.costs
            for piece in (2**20, 90):
                monkeypatch.setattr(planning, "PIECE_BYTES", piece)
                for key in keys(seed, shape, 60):
                    found = planning.read(array, key)
                    there = selected(expected, key)
                    assert found.dtype == there.dtype and found.shape == there.shape, key
                    assert found.tobytes() == there.tobytes(), key
            used |= {family for family, _ in array.asked}
    # Text is never read by the strided operation, which needs too much memory for it.
    strided = way == "strided" and member != "text"
    assert used == {"get_var", "get_vara"} | ({"get_vars"} if strided else used & {"get_vars"})


@pytest.mark.parametrize("member", MEMBERS.values())
def test_what_is_not_the_result_needs_little_memory(path: str, member: str,
                                                    monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.setattr(planning, "PIECE_BYTES", 200)
    array = Recorder(path, f"cube_{member}")
    array.costs = WAYS["block and pick"]
    most = 200 // array.memory
    assert planning.read(array, (slice(None), slice(None, None, 2), slice(None))).size == 7 * 3 * 6
    assert len(array.asked) > 1
    assert max(count for _, count in array.asked) <= most
    array.asked.clear()
    planning.read(array, (slice(None),) * 3)
    if member == "text":
        assert max(count for _, count in array.asked) <= most
    else:
        assert array.asked == [("get_vara", 7 * 5 * 6)]


def test_the_ways_that_there_are(path: str) -> None:
    array = Recorder(path, "cube_int")
    every_other = (slice(None), slice(None, None, 2), slice(None, None, 2))

    def calls(way: str) -> list[tuple[str, int]]:
        array.costs = WAYS[way] or array.costs
        array.asked.clear()
        planning.read(array, every_other)
        return array.asked

    assert calls("block and pick") == [("get_vara", 7 * 5 * 5)]
    assert calls("strided") == [("get_vars", 7 * 3 * 3)]
    assert calls("runs") == [("get_vara", 7)] * 9


def test_neighbours_in_a_list_are_read_together(path: str) -> None:
    array = Recorder(path, "line_double")
    array.costs = Costs(call=10, run=0, byte=1, picked=0, strided=100)  # a call is worth ten bytes
    found = planning.read(array, (np.array([1, 2, 3, 5, 20, 21, 39]),))
    assert array.asked == [("get_vara", 3), ("get_vara", 1), ("get_vara", 2), ("get_vara", 1)] \
        or array.asked == [("get_vara", 5), ("get_vara", 2), ("get_vara", 1)]
    np.testing.assert_array_equal(found, whole(path, "line_double")[[1, 2, 3, 5, 20, 21, 39]])


def test_a_contiguous_selection_is_the_memory_that_the_module_gave(path: str) -> None:
    array = Recorder(path, "cube_float")
    given = []
    block = array.block
    array.block = lambda *places: given.append(block(*places)) or given[-1]
    found = planning.read(array, (slice(2, 6), 3, slice(None, None, -1)))
    assert len(given) == 1 and np.shares_memory(found, given[0])


@pytest.mark.parametrize("key", [(7, 0, 0), (0, -6, 0), (np.array([0, 7]), 0, 0),
                                 (0, 0, np.array([-7]))])
def test_positions_beyond_a_dimension(path: str, key: tuple[Selector, ...]) -> None:
    array = Recorder(path, "cube_int")
    with pytest.raises(IndexError):
        selected(whole(path, "cube_int"), key)
    with pytest.raises(IndexError) as error:
        planning.read(array, key)
    assert isinstance(error.value, tessel.Error)
    assert error.value.word == "indexExceedsDimensionBound"
    assert not array.asked


def test_positions_that_are_no_numbers(path: str) -> None:
    with pytest.raises(IndexError):
        planning.read(Recorder(path, "line_int"), (np.array([1.5]),))
    with pytest.raises(TypeError):
        planning.read(Recorder(path, "line_int"), ("1",))


@pytest.mark.parametrize("way", WAYS)
def test_the_error_of_the_operation_comes_through(path: str, way: str) -> None:
    """The plan is for more records than there are: the module says so, as it does of any read."""
    array = Recorder(path, "records_int")
    array.costs = WAYS[way] or array.costs
    array.shape = (12, 4, 5)
    file = array._manager.acquire()
    file.varids["records_int", False] = file.place_of("records_int").varid
    with pytest.raises(IndexError) as error:
        planning.read(array, (slice(None, None, 3), slice(None, None, 2), slice(None, None, 3)))
    assert isinstance(error.value, tessel.Error)
    tag = {"get_vara": "getVara", "get_vars": "getVars"}[array.asked[-1][0]]
    assert error.value.identifier.startswith(f"TESSEL:netcdf:{tag}:")
    assert error.value.word in ("indexExceedsDimensionBound", "startPlusCountExceedsDimensionBound")


class Series:
    """A long series of bytes, which are their positions."""

    dtype = np.dtype("u1")
    memory = 1

    def __init__(self, length: int, costs: Costs) -> None:
        self.shape = (length,)
        self.costs = costs

    @staticmethod
    def block(start: list[int], count: list[int]) -> np.ndarray:
        return np.arange(start[0], start[0] + count[0]).astype("u1")

    @staticmethod
    def strided(start: list[int], count: list[int], step: list[int]) -> np.ndarray:
        return (start[0] + np.arange(count[0]) * step[0]).astype("u1")


@pytest.mark.parametrize("step", [2, 10, 1000])
@pytest.mark.parametrize("listed", [False, True])
def test_a_long_series_needs_little_memory(path: str, step: int, listed: bool) -> None:
    """The positions of a long series are not counted out, one by one, to be dismissed."""
    length = 10**7
    series = Series(length, Recorder(path, f"line_{next(iter(MEMBERS.values()))}").costs)
    # Some positions are missing, so that the list is no slice.
    key = np.delete(np.arange(0, length, step), [3, 5]) if listed else slice(None, None, step)
    tracemalloc.start()
    try:
        found = planning.read(series, (key,))
        most = tracemalloc.get_traced_memory()[1]
    finally:
        tracemalloc.stop()
    expected = np.arange(length)[key].astype("u1")
    assert found.tobytes() == expected.tobytes()
    # The pieces are made of positions of eight bytes here, and a list is looked at as numbers.
    assert most < 64 * len(expected) * listed + len(expected) + 32 * planning.PIECE_BYTES
