# bench/xarray_engine.py: the engine "tessel" of xarray beside the engines "netcdf4" and "scipy".
"""Measures three engines of xarray in one run, on the same file.

usage: xarray_engine.py [--write DOCUMENT] [--json FILE] [--quick]

The file has 1000 records of 256 by 512 floats, 524 MB, and a series of 8 million floats, in the
64-bit offset format, and is in the system's cache. Each row is one piece of work done through each
engine, on datasets that are open (but for opening) and keep no values. The engines take turns, in
another order in each repetition. A time is the shortest of all repetitions, which other work on the
machine disturbs least. Before anything is measured, the engines must give the same values.

--write puts the table between the marks in the document. --quick does everything once, on small
data: it shows that the program works, and measures nothing. Run it on a machine that does nothing
else.
"""

from __future__ import annotations

import itertools
import platform
import sys
import tempfile
from collections.abc import Callable
from pathlib import Path
from typing import NamedTuple

import dask
import distributed
import netCDF4
import numpy as np
import scipy
import xarray
from measuring import NOISE, Measured, give_out, leave, measure, options_of
from xarray.core import indexing

ENGINES = ("tessel", "netcdf4", "scipy")
TEN = 10
STEP = 1000
"""Through the long series."""

NETCDF4, SCIPY = ENGINES[1:]

AT_LEAST_EQUAL, WITHIN_THREE, AHEAD = 1, 1 / 3, 1

Use = Callable[[xarray.Dataset], object]


class Row(NamedTuple):
    """One piece of work, and how many times faster than the others ours shall be at least."""

    name: str
    use: Use
    netcdf4: float = AT_LEAST_EQUAL
    scipy: float = WITHIN_THREE
    times: int = 1  # how often one measurement does it
    in_chunks: bool = False
    quick: bool = False  # so quick that it is worth more repetitions


class Reason(NamedTuple):
    """Why a row is not as many times faster as was expected, and down to which times this
    explains it."""

    least: float
    text: str


_SELECTION = ("nearly all of the time is xarray's own selection, the same for every engine; the "
              "row of the engine's part alone is without it")
_EACH_VALUE = ("the library looks for each of the values by itself, and waits for memory each "
               "time; selecting from a mapping has no steps of a library in between")
_RUNS = ("the library's strided read takes longer for each value than a selection from a mapping, "
         "and to read all that is between takes longer still")

REASONS = {
    (f"{TEN} elements, anywhere", NETCDF4): Reason(1, _SELECTION),
    (f"{TEN} elements, anywhere", SCIPY): Reason(0.8, _SELECTION),
    (f"{TEN} elements, the engine's part", SCIPY): Reason(
        0.4, "each selection is a call of the module, and one from a mapping is none"),
    ("stride 10 along x", NETCDF4): Reason(
        3.5, "what lies between the values is read as well, which takes most of the time, and is "
             "the quickest of the ways that the library has"),
    (f"stride {STEP} of a long series", SCIPY): Reason(0.2, _RUNS),
    ("a column along time", NETCDF4): Reason(5, _SELECTION),
    ("a column along time and y", NETCDF4): Reason(3.5, _EACH_VALUE),
    ("a column along time and y", SCIPY): Reason(0.2, _EACH_VALUE),
}


class Bench:
    """A file, open through each engine, with values and with chunks of Dask."""

    def __init__(self, folder: Path, shape: tuple[int, int, int], times: int) -> None:
        self.path = str(folder / "data.nc")
        self.shape = shape
        self.times = times
        self.lot = np.random.default_rng(1)
        write(self.path, shape)
        self.plain = {each: self.open(each, cache=False) for each in ENGINES}
        self.chunked = {each: self.open(each, chunks={"time": max(shape[0] // 20, 1)})
                        for each in ENGINES}

    def open(self, engine: str, **options: object) -> xarray.Dataset:
        return xarray.open_dataset(self.path, engine=engine, **options)

    def close(self) -> None:
        for each in (*self.plain.values(), *self.chunked.values()):
            each.close()

    def some(self, axis: int) -> np.ndarray:
        """Every sixth position of a dimension, anywhere, in order."""
        length = self.shape[axis]
        return np.sort(self.lot.choice(length, max(length // 6, 1), replace=False))

    def rows(self, client: distributed.Client) -> list[Row]:
        records, height, width = self.shape
        places = [tuple(self.lot.integers(0, room) for room in (records, height, width - TEN))
                  for _ in range(self.times)]

        def slices(dataset: xarray.Dataset) -> np.ndarray:
            variable = dataset.v
            for t, y, x in places:
                values = variable[t, y, x:x + TEN].values
            return values

        def alone(*keys: tuple[int | slice, ...]) -> Use:
            indexers = [indexing.BasicIndexer(each) for each in keys]

            def by_engine(dataset: xarray.Dataset) -> np.ndarray:
                array = array_of_engine(dataset.v)
                for each in indexers:
                    values = array[each]
                return values

            return by_engine

        def of(*key: object) -> Use:
            return lambda dataset: dataset.v[key].values

        def with_threads(dataset: xarray.Dataset) -> float:
            with dask.config.set(scheduler="threads"):
                return float(dataset.v.mean(dtype="f8"))

        different = itertools.count()

        def with_processes(dataset: xarray.Dataset) -> float:
            # Each time another sum, because the scheduler may still have the last one's result.
            added = next(different)
            found = client.compute(dataset.v.mean(dtype="f8") + added).result().item()
            return found - added

        every = slice(None)
        ten = slice(None, None, 10)
        two = slice(None, None, 2)
        y, x = height // 3, width // 7
        size = np.prod(self.shape) * 4 / 1e6
        return [
            Row(f"{TEN} elements, anywhere", slices, 3, AHEAD, self.times, quick=True),
            Row(f"{TEN} elements, the engine's part",
                alone(*((int(t), int(y), slice(int(x), int(x) + TEN)) for t, y, x in places)),
                3, AHEAD, self.times, quick=True),
            Row(f"whole, {size:.0f} MB", of(every, every, every)),
            Row("stride (1, 2, 2)", of(every, two, two), 5),
            Row("stride 10 along time", of(ten, every, every), 5),
            Row("stride 10 along y", of(every, ten, every), 5),
            Row("stride 10 along x", of(every, every, ten), 5),
            Row(f"stride {STEP} of a long series",
                lambda dataset: dataset.series[::STEP].values, 5, quick=True),
            Row("a column along time", of(every, y, x), 20, quick=True),
            Row("a column along time, the engine's part", alone((every, y, x)), 20, quick=True),
            Row("a column along time and y", of(every, every, x), 20),
            Row("a list along time", of(self.some(0), every, every)),
            Row("a list along y", of(every, self.some(1), every)),
            Row("a list along x", of(every, every, self.some(2))),
            Row("mean by Dask, threads", with_threads, in_chunks=True),
            Row("mean by Dask, two processes", with_processes, in_chunks=True),
        ]

    def sides(self, row: Row) -> list[Callable[[], object]]:
        datasets = self.chunked if row.in_chunks else self.plain
        return [lambda dataset=datasets[each]: row.use(dataset) for each in ENGINES]

    def opening(self) -> list[Callable[[], object]]:
        def open_and_close(engine: str) -> None:
            for _ in range(self.times // 10 or 1):
                self.open(engine).close()

        return [lambda engine=each: open_and_close(engine) for each in ENGINES]


def array_of_engine(variable: xarray.DataArray) -> indexing.ExplicitlyIndexed:
    """The array of the engine, below what xarray wraps around it."""
    array = variable.variable._data
    while isinstance(inner := getattr(array, "array", None), indexing.ExplicitlyIndexed):
        array = inner
    return array


def write(path: str, shape: tuple[int, int, int]) -> None:
    """The file."""
    with netCDF4.Dataset(path, "w", format="NETCDF3_64BIT_OFFSET") as file:
        file.set_fill_off()
        for name, length in zip(("time", "y", "x"), (None, *shape[1:])):
            file.createDimension(name, length)
            file.createVariable(name, "f8", (name,))
        length = int(np.prod(shape)) // 16
        file.createDimension("sample", length)
        file.createVariable("series", "f4", ("sample",))[:] = np.arange(length, dtype="f4")
        variable = file.createVariable("v", "f4", ("time", "y", "x"))
        record = np.arange(np.prod(shape[1:]), dtype="f4").reshape(shape[1:])
        for number in range(shape[0]):
            variable[number] = record + number
        for name, length in zip(("time", "y", "x"), shape):
            file[name][:] = np.arange(length)


def check(bench: Bench, rows: list[Row]) -> None:
    """All engines give the same values."""
    first, *others = (bench.open(each).load() for each in ENGINES)
    for each in others:
        xarray.testing.assert_identical(first, each)
    del first, others
    for row in rows:
        ours, *theirs = (side() for side in bench.sides(row))
        for each in theirs:
            np.testing.assert_allclose(ours, each, rtol=1e-12 if row.in_chunks else 0,
                                       err_msg=row.name)


def table(bench: Bench, rows: list[Row],
          repetitions: int) -> tuple[list[str], list[str], dict[str, dict[str, Measured]]]:
    """The rows as Markdown, with the reasons for what is slower than expected; what of that has no
    reason; and the numbers."""
    lines = ["| | tessel | netcdf4 | times faster | expected | scipy | times faster | expected |",
             "|---|---:|---:|---:|---:|---:|---:|---:|"]
    missed = {}
    numbers = {}
    opening = Row("open and close", lambda dataset: None, times=bench.times // 10 or 1, quick=True)
    for row in (opening, *rows):
        sides = bench.opening() if row is opening else bench.sides(row)
        measured = measure(sides, repetitions * (5 if row.quick else 1), row.times)
        numbers[row.name] = dict(zip(ENGINES, measured))
        ours, *theirs = (each.shortest for each in measured)
        line = f"| {row.name} | {shown(ours)} |"
        for engine, time, expected in zip(ENGINES[1:], theirs, (row.netcdf4, row.scipy)):
            met = time / ours >= expected * (1 - NOISE)
            line += (f" {shown(time)} | {time / ours:.3g} | {expected:.2g}"
                     f"{'' if met else ', **missed**'} |")
            if not met:
                missed[row.name, engine] = time / ours
        lines.append(line)
        print(lines[-1], file=sys.stderr)
    unexplained = [f"{name}, beside {engine}: {ratio:.3g} times, and no reason in REASONS"
                   for (name, engine), ratio in missed.items()
                   if (name, engine) not in REASONS or ratio < REASONS[name, engine].least]
    if missed:
        lines += ["", "Missed:", "", *(
            f"- **{name}**, beside {engine}: "
            f"{REASONS[name, engine].text if (name, engine) in REASONS else 'not explained yet'}"
            for name, engine in missed)]
    return lines, unexplained, numbers


def shown(time: float) -> str:
    """A time with its unit."""
    return f"{time * 1e3:.3g} ms" if time >= 1e-3 else f"{time * 1e6:.3g} µs"


def circumstances() -> str:
    """What was measured with."""
    version = netCDF4.getlibversion().split()[0]
    return (f"Python {platform.python_version()}, NumPy {np.__version__}, SciPy "
            f"{scipy.__version__}, Dask {dask.__version__.split('+')[0]}, netCDF4-python "
            f"{netCDF4.__version__}, netCDF library {version}.")


def main() -> None:
    options = options_of(__doc__)
    shape, times, repetitions = (1000, 256, 512), 200, 5
    if options.quick:
        shape, times, repetitions = (40, 16, 32), 1, 1
    with tempfile.TemporaryDirectory() as folder, \
            distributed.LocalCluster(n_workers=2, threads_per_worker=1, processes=True,
                                     dashboard_address=None, local_directory=folder) as cluster, \
            distributed.Client(cluster) as client:
        bench = Bench(Path(folder), shape, times)
        try:
            rows = bench.rows(client)
            check(bench, rows)
            lines, unexplained, numbers = table(bench, rows, repetitions)
        finally:
            bench.close()
    give_out(options, "bench/xarray_engine.py", "\n".join([*lines, "", circumstances()]), numbers)
    leave(options, unexplained)


if __name__ == "__main__":
    main()
