# bench/access_costs.py: what reading costs, for the plans of the engine for xarray.
"""Measures the costs that `tessel.xarray.planning` computes with.

usage: access_costs.py [--write DOCUMENT]

A file of 256 MB, in the system's cache, is read in ways that one of the costs decides alone: one
value (a call), a column of single values (a run), a block of a megabyte (a byte), every second and
every fifth value (the strided operation), and a copy in memory (a picked byte). A time is the
shortest of ten, because other work can only add to it.
"""

from __future__ import annotations

import argparse
import itertools
import tempfile
from collections.abc import Callable
from pathlib import Path

import netCDF4
import numpy as np
from measuring import put_between_marks, seconds
from tessel.xarray.array import DTYPES, LazyArray
from tessel.xarray.opening import OpenFile
from tessel.xarray.planning import COSTS, Costs
from xarray.backends import CachingFileManager

SHAPE = (512, 256, 512)
MEMBERS = {False: "float", True: "text"}


def shortest(work: Callable[[], object]) -> float:
    return min(seconds(work) for _ in range(10))


def write(path: str) -> None:
    """A file with a variable of numbers and one of characters."""
    with netCDF4.Dataset(path, "w", format="NETCDF3_64BIT_OFFSET") as file:
        for name, length in zip("tyx", SHAPE):
            file.createDimension(name, length)
        for member in MEMBERS.values():
            variable = file.createVariable(member, DTYPES[member], tuple("tyx"))
            variable.set_auto_maskandscale(False)
            for number in range(SHAPE[0]):
                variable[number] = np.full(SHAPE[1:], 65, "u1").astype("f4") \
                    if member == "float" else np.full(SHAPE[1:], b"A", "S1")


def measured(path: str, mapped: bool, text: bool) -> Costs:
    """The costs of one kind of file and values."""
    manager = CachingFileManager(OpenFile, path, kwargs={"mapped": mapped})
    array = LazyArray(manager, manager.acquire().variables[MEMBERS[text]], mapped)
    size = array.dtype.itemsize
    call = shortest(lambda: array.block([0, 0, 0], [1, 1, 1]))
    column = shortest(lambda: array.block([0, 0, 7], [*SHAPE[:2], 1]))
    rows = 2**20 // size // SHAPE[2]
    count = [rows // SHAPE[1] or 1, min(rows, SHAPE[1]), SHAPE[2]]
    # Each block is another one, which is not in the processor's caches.
    starts = itertools.cycle(range(0, SHAPE[0] - count[0], 2 * count[0]))
    block = shortest(lambda: [array.block([next(starts), 0, 0], count) for _ in range(6)]) / 6
    strided = min(shortest(lambda: array.strided([5, 0, 0], [1, 128, SHAPE[2] // step],
                                                 [1, 2, step])) / (128 * (SHAPE[2] // step))
                  for step in (2, 5))
    values = array.block([0, 0, 0], [4, *SHAPE[1:]])[:, :, ::2]
    room = np.empty(values.shape, values.dtype)

    def pick() -> None:
        room[...] = values

    return Costs(call, (column - call) / (SHAPE[0] * SHAPE[1]), (block - call) / 2**20,
                 shortest(pick) / room.nbytes, strided)


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--write", type=Path, metavar="DOCUMENT",
                        help="put the table between the marks in this document")
    options = parser.parse_args()
    lines = ["| file, values | | call | run | byte | picked byte | strided value |",
             "|---|---|---:|---:|---:|---:|---:|"]
    with tempfile.TemporaryDirectory() as folder:
        path = str(Path(folder, "costs.nc"))
        write(path)
        for (mapped, text), used in COSTS.items():
            kind = f"{'mapped' if mapped else 'buffered'}, {'text' if text else 'numbers'}"
            for title, costs in (("measured", measured(path, mapped, text)), ("used", used)):
                lines.append(f"| {kind} | {title} | {costs.call * 1e6:.1f} µs | "
                             f"{costs.run * 1e9:.0f} ns | {costs.byte * 1e9:.2f} ns | "
                             f"{costs.picked * 1e9:.2f} ns | {costs.strided * 1e9:.0f} ns |")
    print(text := "\n".join(lines))
    if options.write:
        put_between_marks(options.write, "bench/access_costs.py", text)


if __name__ == "__main__":
    main()
