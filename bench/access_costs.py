# bench/access_costs.py: what reading costs, for the plans of the engine for xarray.
"""Measures the costs that `tessel.xarray.planning` computes with.

usage: access_costs.py [--write DOCUMENT] [--json FILE] [--quick]

A file of 256 MB, in the system's cache, is read in ways that one of the costs decides alone: one
value (a call), a column of single values (a run), a block of a megabyte (a byte), every second and
every fifth value (the strided operation), and a copy in memory (a picked byte). A time is the
shortest of ten, because other work can only add to it.

What a column consists of is shown as well: the same by one call of the library, without the module,
and by NumPy from a mapping of the file, which is the memory alone.
"""

from __future__ import annotations

import ctypes
import ctypes.util
import itertools
import tempfile
from collections.abc import Callable
from pathlib import Path

import netCDF4
import numpy as np
from measuring import give_out, leave, options_of, seconds
from tessel.xarray.array import DTYPES, LazyArray
from tessel.xarray.opening import MAPPED, OpenFile
from tessel.xarray.planning import COSTS, Costs
from xarray.backends import CachingFileManager

MOST_OFF = 2
"""How many times more or less than what is measured the plans may count with."""

MEMBERS = {False: "float", True: "text"}


def shortest(work: Callable[[], object]) -> float:
    return min(seconds(work) for _ in range(10))


def write(path: str, shape: tuple[int, ...]) -> None:
    """A file with a variable of numbers and one of characters."""
    with netCDF4.Dataset(path, "w", format="NETCDF3_64BIT_OFFSET") as file:
        for name, length in zip("tyx", shape):
            file.createDimension(name, length)
        for member in MEMBERS.values():
            variable = file.createVariable(member, DTYPES[member], tuple("tyx"))
            variable.set_auto_maskandscale(False)
            for number in range(shape[0]):
                variable[number] = np.full(shape[1:], 65, "u1").astype("f4") \
                    if member == "float" else np.full(shape[1:], b"A", "S1")


def measured(path: str, mapped: bool, text: bool) -> Costs:
    """The costs of one kind of file and values."""
    manager = CachingFileManager(OpenFile, path, kwargs={"mapped": mapped})
    array = LazyArray(manager, manager.acquire().variables[MEMBERS[text]], mapped)
    size = array.dtype.itemsize
    shape = array.shape
    call = shortest(lambda: array.block([0, 0, 0], [1, 1, 1]))
    column = shortest(lambda: array.block([0, 0, 7], [*shape[:2], 1]))
    rows = 2**20 // size // shape[2]
    count = [rows // shape[1] or 1, min(rows, shape[1]), shape[2]]
    # Each block is another one, which is not in the processor's caches.
    starts = itertools.cycle(range(0, shape[0] - count[0], 2 * count[0]))
    block = shortest(lambda: [array.block([next(starts), 0, 0], count) for _ in range(6)]) / 6
    strided = min(shortest(lambda: array.strided([5, 0, 0], [1, 128, shape[2] // step],
                                                 [1, 2, step])) / (128 * (shape[2] // step))
                  for step in (2, 5))
    values = array.block([0, 0, 0], [4, *shape[1:]])[:, :, ::2]
    room = np.empty(values.shape, values.dtype)

    def pick() -> None:
        room[...] = values

    return Costs(call, (column - call) / (shape[0] * shape[1]), (block - call) / 2**20,
                 shortest(pick) / room.nbytes, strided)


def column(path: str, shape: tuple[int, ...]) -> str:
    """What a column costs in three ways, in one line."""
    manager = CachingFileManager(OpenFile, path)
    file = manager.acquire()
    variable = file.variables[MEMBERS[False]]
    array = LazyArray(manager, variable, mapped=True)
    ours = shortest(lambda: array.block([0, 0, 7], [*shape[:2], 1]))

    library = ctypes.CDLL(ctypes.util.find_library("netcdf"))
    ncid = ctypes.c_int()
    places = [(ctypes.c_size_t * 3)(*each) for each in ((0, 0, 7), (*shape[:2], 1))]
    room = np.empty(shape[:2], "f4")

    def call() -> None:
        if library.nc_get_vara_float(ncid, variable.varid, *places, ctypes.c_void_p(
                room.ctypes.data)):
            raise RuntimeError("The library cannot read the column.")

    if library.nc_open(path.encode(), MAPPED, ctypes.byref(ncid)):
        raise RuntimeError("The library cannot open the file.")
    by_library = shortest(call)
    library.nc_close(ncid)

    begin = file.begin_of(variable.varid)
    values = np.memmap(path, ">f4", "r", begin, shape)
    by_numpy = shortest(lambda: values[:, :, 7].astype("f4"))
    np.testing.assert_array_equal(array.block([0, 0, 7], [*shape[:2], 1])[:, :, 0], room)
    np.testing.assert_array_equal(values[:, :, 7], room)
    return (f"A column of {room.size} numbers, mapped: {ours * 1e3:.1f} ms by the engine, "
            f"{by_library * 1e3:.1f} ms by one call of the library without the module, "
            f"{by_numpy * 1e3:.1f} ms by NumPy from a mapping.")


def main() -> None:
    options = options_of(__doc__)
    lines = ["| file, values | | call | run | byte | picked byte | strided value |",
             "|---|---|---:|---:|---:|---:|---:|"]
    rows = {}
    with tempfile.TemporaryDirectory() as folder:
        path = str(Path(folder, "costs.nc"))
        shape = (32, 256, 512) if options.quick else (512, 256, 512)
        write(path, shape)
        for (mapped, text), used in COSTS.items():
            kind = f"{'mapped' if mapped else 'buffered'}, {'text' if text else 'numbers'}"
            rows[kind] = {"measured": measured(path, mapped, text), "used": used}
            for title, costs in rows[kind].items():
                lines.append(f"| {kind} | {title} | {costs.call * 1e6:.1f} µs | "
                             f"{costs.run * 1e9:.0f} ns | {costs.byte * 1e9:.2f} ns | "
                             f"{costs.picked * 1e9:.2f} ns | {costs.strided * 1e9:.0f} ns |")
        lines += ["", column(path, shape)]
    give_out(options, "bench/access_costs.py", "\n".join(lines), rows)
    leave(options, [
        f"{kind}: {name} takes {getattr(sides['measured'], name):.3g} s, and the plans count with "
        f"{getattr(sides['used'], name):.3g} s"
        for kind, sides in rows.items() for name in Costs._fields
        if not 1 / MOST_OFF <= getattr(sides["used"], name) / getattr(sides["measured"], name)
        <= MOST_OFF])


if __name__ == "__main__":
    main()
