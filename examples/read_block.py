# examples/read_block.py: reads parts of a variable.
"""Reads one element, a block, and every second element of a variable.

usage: read_block.py [FOLDER]

Prints:

    one element: 120.0
    a block of shape (3, 2, 1), first dimension fastest
    its first row along x: [110. 111. 112.]
    every second element along x: [[100. 102.]]
    in the library's order: (1, 2, 3), a copy: False
"""

import sys
import tempfile
from pathlib import Path

import numpy

import tessel

X, Y, TIME = 4, 3, 2

nc = tessel.load("netcdf")


def make(path: Path) -> None:
    """A file with a variable "field" over x, y and time, whose value is 100 time + 10 y + x."""
    ncid = nc.create(path, "CLOBBER")
    dimids = [nc.def_dim(ncid, "x", X), nc.def_dim(ncid, "y", Y), nc.def_dim(ncid, "time", TIME)]
    field = nc.def_var(ncid, "field", nc.param("DOUBLE"), dimids)
    nc.enddef(ncid)
    x, y, time = numpy.meshgrid(range(X), range(Y), range(TIME), indexing="ij")
    nc.put_var_double(ncid, field, 100.0 * time + 10.0 * y + x)
    nc.close(ncid)


def main(folder: Path) -> None:
    path = folder / "block.nc"
    make(path)
    ncid = nc.open(path, "NOWRITE")
    field = nc.inq_varid(ncid, "field")

    # Positions are zero-based, and in host order: x, y, time, as the dimensions were defined.
    print("one element:", nc.get_var1_double(ncid, field, [0, 2, 1])[0, 0])

    block = nc.get_vara_double(ncid, field, start=[0, 1, 1], count=[3, 2, 1])
    print(f"a block of shape {block.shape}, first dimension fastest")
    print("its first row along x:", block[:, 0, 0])

    thinned = nc.get_vars_double(ncid, field, start=[0, 0, 1], count=[2, 1, 1], stride=[2, 1, 1])
    print("every second element along x:", thinned[:, :, 0].T)

    # The order that ncdump prints is the reverse one: the same memory, seen from the other side.
    view = block.T
    print(f"in the library's order: {view.shape}, a copy: {not numpy.shares_memory(view, block)}")
    nc.close(ncid)


with tempfile.TemporaryDirectory() as made:
    main(Path(sys.argv[1] if len(sys.argv) > 1 else made))
