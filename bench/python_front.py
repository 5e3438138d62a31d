# bench/python_front.py: what a call from Python costs, beside netCDF4-python and SciPy.
"""Measures tessel, netCDF4-python and SciPy (Debian's packages) in one run, on the same files.

usage: python_front.py [--write DOCUMENT] [--json FILE] [--quick]
       python_front.py --row NAME --perf FOLDER

Each row is one piece of work done by each side. The sides take turns, in another order in each
repetition. A time is the median of all repetitions; how many times faster one side is, is the
median of what each repetition says, so that what slows down both does not count. netCDF4-python is
measured as it comes, with masking and scaling, and without, as its users who want speed run it.
SciPy reads from a mapping of the file, which needs no call at all, and gives numbers in the file's
order of bytes; a whole read makes this machine's of them, as the others do.
Before anything is measured, the sides must give the same values and write the same file.

--write puts the table between the marks in the document. --quick does everything once, on small
data, and prints its table: it shows that the program works, and its numbers say nothing. Run it on
a machine that does nothing else. --row does our side of one row over and over, for profiles.py.
"""

from __future__ import annotations

import platform
import random
import tempfile
import time
from collections.abc import Callable
from functools import partial
from pathlib import Path
from typing import NamedTuple

import netCDF4
import numpy as np
import scipy
from scipy.io import netcdf_file

import tessel
from measuring import Measured, Work, give_out, measure, options_of, telling_perf

FORMAT = "NETCDF3_64BIT_OFFSET"
MAPPED = 16  # the library's mode flag for mapping a file, which is none of its named constants
TEN = 10
EXPECTED = {"call": 30, "method": 20}  # times faster, where the call itself is what costs
PROFILED = 2  # seconds

Places = list[tuple[int, int, int]]


class Row(NamedTuple):
    """One piece of work, by each side, and how many times faster ours shall be at least; None in
    rows that are there to be compared with others."""

    name: str
    unit: str
    expected: float | None
    tessel: Work
    netcdf4: Callable[[bool], Work]  # with masking and scaling or without
    scipy: Work
    times: int  # how often one measurement does it


class Bench:
    """A file with one variable of double, open on both sides."""

    def __init__(self, folder: Path, length: int, times: int) -> None:
        self.times = times
        self.path, self.new = folder / "data.nc", folder / "new.nc"
        self.nc = tessel.load("netcdf")
        self.unguarded = tessel.load("netcdf", guard="off")
        self.shape = (length, 256, 512)
        self.data = np.arange(float(np.prod(self.shape))).reshape(self.shape)
        self.write_netcdf4(True)
        self.path.unlink(missing_ok=True)
        self.write_tessel()
        self.ncid = self.nc.open(self.path, "NOWRITE")
        self.mapped = self.nc.open(self.path, MAPPED)
        self.varid = int(self.nc("inq_varid", self.ncid, "v")[0, 0])
        self.dataset = netCDF4.Dataset(self.path)
        self.variable = self.dataset["v"]
        self.scipy = netcdf_file(self.path, mmap=True)
        self.scipy_variable = self.scipy.variables["v"]
        # Ten elements begin at each place. One after the other, they are in the library's buffer
        # most of the time; anywhere, the library reads from the file for each.
        rooms = (*self.shape[:-1], self.shape[-1] - TEN)
        lot = random.Random(1)
        self.near = [(0, TEN * i // rooms[-1], TEN * i % rooms[-1]) for i in range(times)]
        self.anywhere = [tuple(lot.randrange(room) for room in rooms) for _ in range(times)]

    def close(self) -> None:
        self.dataset.close()
        del self.scipy_variable
        self.scipy.close()
        self.nc.close(self.ncid)
        self.nc.close(self.mapped)

    # One element and ten. The host's order of dimensions is the reverse of the library's.

    def element_tessel(self, places: Places) -> float:
        return self.element_of(self.ncid, places)

    def element_mapped(self, places: Places) -> float:
        return self.element_of(self.mapped, places)

    def element_of(self, ncid: int, places: Places) -> float:
        nc, varid = self.nc, self.varid
        for t, y, x in places:
            value = nc("get_var1_double", ncid, varid, [x, y, t])
        return value[0, 0]

    def element_method(self, places: Places) -> float:
        read, ncid, varid = self.nc.get_var1_double, self.ncid, self.varid
        for t, y, x in places:
            value = read(ncid, varid, [x, y, t])
        return value[0, 0]

    def element_netcdf4(self, places: Places) -> float:
        variable = self.variable
        for t, y, x in places:
            value = variable[t, y, x]
        return float(value)

    def element_scipy(self, places: Places) -> float:
        variable = self.scipy_variable
        for t, y, x in places:
            value = variable[t, y, x]
        return float(value)

    def block_tessel(self, places: Places) -> np.ndarray:
        nc, ncid, varid = self.nc, self.ncid, self.varid
        for t, y, x in places:
            values = nc("get_vara_double", ncid, varid, [x, y, t], [TEN, 1, 1])
        return values[:, 0, 0]

    def block_method(self, places: Places) -> np.ndarray:
        read, ncid, varid = self.nc.get_vara_double, self.ncid, self.varid
        for t, y, x in places:
            values = read(ncid, varid, [x, y, t], [TEN, 1, 1])
        return values[:, 0, 0]

    def block_netcdf4(self, places: Places) -> np.ndarray:
        variable = self.variable
        for t, y, x in places:
            values = variable[t, y, x:x + TEN]
        return np.asarray(values)

    def block_scipy(self, places: Places) -> np.ndarray:
        variable = self.scipy_variable
        for t, y, x in places:
            values = variable[t, y, x:x + TEN]
        return np.array(values, "f8")

    # The whole variable.

    def read_tessel(self) -> np.ndarray:
        return self.nc("get_var_double", self.ncid, self.varid).T

    def read_netcdf4(self) -> np.ndarray:
        return self.variable[:]

    def read_scipy(self) -> np.ndarray:
        """SciPy has the numbers as in the file; the others give them in this machine's order."""
        return self.scipy_variable[:].astype("f8")

    def write_tessel(self) -> None:
        """A new file each time. The transposed array is column-major, and so not copied."""
        nc = self.nc
        ncid = nc("create", self.path_of_new(), nc("parameter", "64BIT_OFFSET"))
        nc("set_fill", ncid, nc("parameter", "NOFILL"))
        dims = [nc("def_dim", ncid, name, n)[0, 0] for name, n in zip("tyx", self.shape)]
        varid = nc("def_var", ncid, "v", nc("parameter", "DOUBLE"), dims[::-1])
        nc("enddef", ncid)
        nc("put_var_double", ncid, varid, self.data.T)
        nc("close", ncid)

    def write_netcdf4(self, mask: bool) -> None:
        with netCDF4.Dataset(self.path_of_new(), "w", format=FORMAT) as dataset:
            dataset.set_fill_off()
            for name, n in zip("tyx", self.shape):
                dataset.createDimension(name, n)
            variable = dataset.createVariable("v", "f8", ("t", "y", "x"))
            variable.set_auto_maskandscale(mask)
            variable[:] = self.data

    def write_scipy(self) -> None:
        with netcdf_file(self.path_of_new(), "w", version=2) as dataset:
            for name, n in zip("tyx", self.shape):
                dataset.createDimension(name, n)
            dataset.createVariable("v", "f8", ("t", "y", "x"))[:] = self.data

    def path_of_new(self) -> Path:
        """Where a new file goes: first the one that is read, then one that comes and goes."""
        return self.new if self.path.exists() else self.path

    def remove_new(self) -> None:
        self.new.unlink(missing_ok=True)

    # Opening and closing.

    def open_tessel(self, nc: tessel.Netcdf) -> None:
        for _ in range(self.times):
            nc("close", nc("open", self.path, "NOWRITE"))

    def open_netcdf4(self) -> None:
        for _ in range(self.times):
            netCDF4.Dataset(self.path).close()

    def open_scipy(self) -> None:
        for _ in range(self.times):
            netcdf_file(self.path, mmap=True).close()

    def masked(self, work: Work) -> Callable[[bool], Work]:
        """The work of netCDF4-python on the open variable, with masking and scaling or without."""
        def chosen(mask: bool) -> Work:
            def run() -> object:
                self.variable.set_auto_maskandscale(mask)
                return work()
            return run
        return chosen

    def rows(self) -> list[Row]:
        small = [
            Row(f"{what}, {how}, {form}", "µs", EXPECTED[form], partial(ours, places),
                self.masked(partial(theirs, places)), partial(of_scipy, places), self.times)
            for what, theirs, of_scipy, forms in (
                ("one element", self.element_netcdf4, self.element_scipy,
                 {"call": self.element_tessel, "method": self.element_method}),
                ("ten elements", self.block_netcdf4, self.block_scipy,
                 {"call": self.block_tessel, "method": self.block_method}))
            for how, places in (("one after the other", self.near),
                                ("anywhere in the file", self.anywhere))
            for form, ours in forms.items()
        ]
        return [
            *small,
            Row("one element, anywhere in the file, mapped", "µs", None,
                partial(self.element_mapped, self.anywhere),
                self.masked(partial(self.element_netcdf4, self.anywhere)),
                partial(self.element_scipy, self.anywhere), self.times),
            *(Row(name, "µs", expected, partial(self.open_tessel, nc),
                  lambda mask: self.open_netcdf4, self.open_scipy, self.times)
              for name, expected, nc in (
                  ("open and close", 1, self.nc),
                  ("open and close, without the guard", None, self.unguarded))),
            Row("whole read", "ms", 1, self.read_tessel,
                self.masked(self.read_netcdf4), self.read_scipy, 1),
            Row("whole write, to a new file", "ms", 1, self.write_tessel,
                lambda mask: lambda: self.write_netcdf4(mask), self.write_scipy, 1),
        ]

    def check(self) -> None:
        """All sides give what was written, and write the same file."""
        for row in self.rows():
            ours = row.tessel()
            for mask in (True, False):
                np.testing.assert_array_equal(np.asarray(ours), np.asarray(row.netcdf4(mask)()))
            self.remove_new()
            np.testing.assert_array_equal(np.asarray(ours), np.asarray(row.scipy()))
        np.testing.assert_array_equal(self.read_tessel(), self.data)
        self.write_tessel()
        written = self.new.read_bytes()
        self.remove_new()
        for write in (lambda: self.write_netcdf4(False), self.write_scipy):
            write()
            assert written == self.new.read_bytes(), "the files differ"
            self.remove_new()


def table(bench: Bench, repetitions: int) -> tuple[list[str], dict[str, dict[str, Measured]]]:
    """The rows as Markdown, and as numbers."""
    scale = {"µs": 1e6, "ms": 1e3}
    lines = ["| | tessel | netCDF4, no masking | times faster | netCDF4, as it comes "
             "| times faster | expected | SciPy | times faster |",
             "|---|---:|---:|---:|---:|---:|---:|---:|---:|"]
    rows = {}
    for row in bench.rows():
        count = repetitions if row.unit == "µs" else max(repetitions // 3, 1)
        sides = [row.tessel, row.netcdf4(False), row.netcdf4(True), row.scipy]
        taken = measure(sides, count, row.times, bench.remove_new)
        ours, bare, masked, by_scipy = taken
        rows[row.name] = {"tessel": ours, "netcdf4": bare, "netcdf4, masked": masked,
                          "scipy": by_scipy}
        show = [f"{side.time * scale[row.unit]:.3g} {row.unit}" for side in taken]
        missed = row.expected and bare.ratio < row.expected
        lines.append(f"| {row.name} | {show[0]} | {show[1]} | {bare.ratio:.3g} | {show[2]} | "
                     f"{masked.ratio:.3g} | {row.expected or '–'}"
                     f"{', **missed**' if missed else ''} | {show[3]} | {by_scipy.ratio:.3g} |")
    return lines, rows


def circumstances(bench: Bench) -> str:
    """What was measured, and with what."""
    return (f"The whole variable is {bench.data.nbytes / 2**20:.0f} MiB. "
            f"Python {platform.python_version()}, NumPy {np.__version__}, SciPy "
            f"{scipy.__version__}, netCDF4-python {netCDF4.__version__}, netCDF library "
            f"{netCDF4.getlibversion().split()[0]}.")


def repeat(bench: Bench, name: str, folder: Path) -> None:
    """Our side of a row, for perf."""
    work = next(row.tessel for row in bench.rows() if row.name == name)
    bench.remove_new()
    with telling_perf(folder):
        end = time.monotonic() + PROFILED
        while time.monotonic() < end:
            work()
            bench.remove_new()


def main() -> None:
    options = options_of(__doc__, lambda parser: (
        parser.add_argument("--row", help="the row to be done over and over"),
        parser.add_argument("--perf", type=Path, metavar="FOLDER", help="the pipes of perf")))
    length, times, repetitions = (2, 10, 1) if options.quick else (256, 1000, 45)
    with tempfile.TemporaryDirectory() as folder:
        bench = Bench(Path(folder), length, times)
        try:
            if options.row:
                repeat(bench, options.row, options.perf)
                return
            bench.check()
            lines, rows = table(bench, repetitions)
            said = circumstances(bench)
        finally:
            bench.close()
    give_out(options, "bench/python_front.py", "\n".join([*lines, "", said]), rows)


if __name__ == "__main__":
    main()
