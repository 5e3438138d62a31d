# bench/open_modes.py: what reading takes in each way in which the library has a file open.
"""Measures the library's own calls on one file, opened with each buffer and mapped.

usage: open_modes.py [--write DOCUMENT] [--json FILE] [--quick]

The file has 1000 records of 256 by 512 floats, 524 MB, and is in the system's cache. The engine
"tessel" of xarray opens files as this table says. A time is the shortest of all repetitions, which
other work on the machine disturbs least. Each way must give the same values.

--write puts the table between the marks in the document. --quick does everything once, on a small
file: it shows that the program works, and measures nothing.
"""

from __future__ import annotations

import contextlib
import ctypes
import ctypes.util
import math
import tempfile
from collections.abc import Iterator
from pathlib import Path
from typing import NamedTuple

import numpy as np
from measuring import Measured, Work, give_out, options_of, seconds
from tessel.xarray.opening import LARGE_BUFFER, MAPPED, SMALL_BUFFER, OpenFile
from xarray_engine import shown, write

LIBRARY = ctypes.CDLL(ctypes.util.find_library("netcdf"))


class Way(NamedTuple):
    """A way to open a file."""

    name: str
    mode: int
    hint: int
    """The buffer that is asked for, in bytes; 0 leaves it to the library."""


WAYS = (
    Way("buffer as the library chooses", 0, 0),
    Way(f"buffer of {SMALL_BUFFER} bytes", 0, SMALL_BUFFER),
    Way(f"buffer of {LARGE_BUFFER // 1024} KiB", 0, LARGE_BUFFER),
    Way("buffer of 64 KiB", 0, 2**16),
    Way("buffer of 1 MiB", 0, 2**20),
    Way(f"mapped into memory (mode flag {MAPPED})", MAPPED, LARGE_BUFFER),
)

COLUMNS = ("one value anywhere", "column of all records", "everything",
           "the records' times, just opened")


def want(status: int) -> None:
    """Raises what a call of the library says."""
    if status:
        raise RuntimeError(f"the library says {status}")


class File:
    """The file, and the library's calls on it."""

    def __init__(self, path: str, shape: tuple[int, int, int], places: int) -> None:
        self.path = path.encode()
        self.shape = shape
        lot = np.random.default_rng(1)
        self.places = [self.sizes(*(int(lot.integers(0, each)) for each in shape))
                       for _ in range(places)]
        self.room = np.empty(shape, "f4")
        self.times = np.empty(shape[0])
        self.value = ctypes.c_float()
        with self.opened(WAYS[0]) as ncid:
            self.varid, self.time = (self.number_of(ncid, name) for name in ("v", "time"))

    @staticmethod
    def sizes(*numbers: int) -> ctypes.Array[ctypes.c_size_t]:
        return (ctypes.c_size_t * len(numbers))(*numbers)

    @staticmethod
    def number_of(ncid: int, name: str) -> int:
        number = ctypes.c_int()
        want(LIBRARY.nc_inq_varid(ncid, name.encode(), ctypes.byref(number)))
        return number.value

    @contextlib.contextmanager
    def opened(self, way: Way) -> Iterator[int]:
        ncid, hint = ctypes.c_int(), ctypes.c_size_t(way.hint)
        want(LIBRARY.nc__open(self.path, way.mode, ctypes.byref(hint), ctypes.byref(ncid)))
        try:
            yield ncid.value
        finally:
            want(LIBRARY.nc_close(ncid))

    def anywhere(self, ncid: int) -> float:
        """The sum of all values that are looked at."""
        found = 0.0
        for each in self.places:
            want(LIBRARY.nc_get_var1_float(ncid, self.varid, each, ctypes.byref(self.value)))
            found += self.value.value
        return found

    def column(self, ncid: int) -> np.ndarray:
        records, height, width = self.shape
        want(LIBRARY.nc_get_vara_float(
            ncid, self.varid, self.sizes(0, height // 3, width // 7), self.sizes(records, 1, 1),
            ctypes.c_void_p(self.room.ctypes.data)))
        return self.room.ravel()[:records]

    def everything(self, ncid: int) -> np.ndarray:
        want(LIBRARY.nc_get_var_float(ncid, self.varid, ctypes.c_void_p(self.room.ctypes.data)))
        return self.room

    def all_times(self, ncid: int) -> np.ndarray:
        want(LIBRARY.nc_get_var_double(ncid, self.time, ctypes.c_void_p(self.times.ctypes.data)))
        return self.times


def checked(file: File) -> None:
    """Every way gives the same values."""
    def seen(way: Way) -> list[object]:
        with file.opened(way) as ncid:
            return [file.anywhere(ncid), file.column(ncid).copy(), file.all_times(ncid).copy(),
                    float(file.everything(ncid).sum(dtype="f8"))]

    first, *others = map(seen, WAYS)
    for each in others:
        for ours, theirs in zip(first, each):
            np.testing.assert_array_equal(ours, theirs)


def measured(file: File, way: Way, repetitions: int) -> dict[str, float]:
    """The columns of a way, in seconds."""
    def shortest(work: Work) -> float:
        return min(seconds(work) for _ in range(repetitions))

    def just_opened() -> float:
        with file.opened(way) as ncid:
            return seconds(lambda: file.all_times(ncid))

    with file.opened(way) as ncid:
        found = (shortest(lambda: file.anywhere(ncid)) / len(file.places),
                 shortest(lambda: file.column(ncid)), shortest(lambda: file.everything(ncid)))
    return dict(zip(COLUMNS, (*found, min(just_opened() for _ in range(repetitions)))))


def looking(path: str, times: int) -> float:
    """What the engine takes to see that a file is still what it was."""
    file = OpenFile(path)
    try:
        return min(seconds(lambda: [file._want_all() for _ in range(times)])
                   for _ in range(5)) / times
    finally:
        file.close()


def main() -> None:
    options = options_of(__doc__)
    shape, places, repetitions = ((20, 16, 32), 10, 1) if options.quick else \
        ((1000, 256, 512), 1000, 5)
    lines = [f"| mode | {' | '.join(COLUMNS)} |", "|---|" + "---:|" * len(COLUMNS)]
    rows = {}
    with tempfile.TemporaryDirectory() as folder:
        path = str(Path(folder, "data.nc"))
        write(path, shape)
        file = File(path, shape, places)
        checked(file)
        for way in WAYS:
            found = measured(file, way, repetitions)
            rows[way.name] = {name: Measured(each, 1, each) for name, each in found.items()}
            lines.append(f"| {way.name} | {' | '.join(map(shown, found.values()))} |")
        took = looking(path, places)
        rows["looking"] = {"tessel": Measured(took, 1, took)}
        lines += ["", f"The file has {shape[0]} records of {shape[1]} by {shape[2]} floats, "
                      f"{math.prod(shape) * 4 / 1e6:.0f} MB. To see whether it is still what it "
                      f"was takes {shown(took)}."]
    give_out(options, "bench/open_modes.py", "\n".join(lines), rows)


if __name__ == "__main__":
    main()
