# examples/threads.py: files read by several threads while the main one computes.
"""Reads several files on threads, and computes with each as soon as it is there.

usage: threads.py [FOLDER]

Prints:

    0.nc: mean 0.5
    1.nc: mean 1.5
    2.nc: mean 2.5
    3.nc: mean 3.5
"""

import sys
import tempfile
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

import numpy

import tessel

FILES, LENGTH = 4, 1_000_000

nc = tessel.load("netcdf")


def write(path: Path, values: numpy.ndarray) -> Path:
    """A file with one variable."""
    ncid = nc.create(path, "CLOBBER")
    varid = nc.def_var(ncid, "v", nc.param("DOUBLE"), [nc.def_dim(ncid, "x", len(values))])
    nc.enddef(ncid)
    nc.put_var_double(ncid, varid, values)
    nc.close(ncid)
    return path


def read(path: Path) -> numpy.ndarray:
    """The variable of such a file. Any thread may do this, also on the same file."""
    ncid = nc.open(path, "NOWRITE")
    try:
        return nc.get_var_double(ncid, nc.inq_varid(ncid, "v"))
    finally:
        nc.close(ncid)


def main(folder: Path) -> None:
    paths = [folder / f"{i}.nc" for i in range(FILES)]
    # The library works for one thread at a time; the others compute meanwhile.
    with ThreadPoolExecutor() as threads:
        list(threads.map(write, paths, (numpy.linspace(i, i + 1, LENGTH) for i in range(FILES))))
        for path, values in zip(paths, threads.map(read, paths)):
            print(f"{path.name}: mean {values.mean():.1f}")


with tempfile.TemporaryDirectory() as made:
    main(Path(sys.argv[1] if len(sys.argv) > 1 else made))
