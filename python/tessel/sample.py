# python/tessel/sample.py: a small dataset for examples and tests.
"""The dataset that the examples of the operations read and write."""

from __future__ import annotations

import os
from typing import TYPE_CHECKING

import numpy

if TYPE_CHECKING:
    from tessel.netcdf import Netcdf

_IN_MEMORY = 8  # the mode bit that keeps a dataset from the disk

VARIABLES = {
    "byte": ("schar", numpy.dtype(numpy.int8)),
    "char": ("text", None),
    "short": ("short", numpy.dtype(numpy.int16)),
    "int": ("int", numpy.dtype(numpy.int32)),
    "float": ("float", numpy.dtype(numpy.float32)),
    "double": ("double", numpy.dtype(numpy.float64)),
}
"""The variables, each of the external type of its name; the member of the families and the dtype
that hold its values."""


def dataset(nc: Netcdf, path: str | os.PathLike[str] | None = None) -> int:
    """A new dataset, open for writing: in memory only, or in a file.

    It has the dimensions x (3), y (2) and time (unlimited, 2 records); a variable over x and y of
    every external type ("byte", "char", "short", "int", "float", "double") with the values 0 to 5
    ("a" to "f") and an attribute "range" of 0 and 5; a variable "series" over time with the values
    10.0 and 20.0; and the global attribute "title".
    """
    ncid = nc.create("sample" if path is None else path, _IN_MEMORY if path is None else "CLOBBER")
    x, y, time = nc.def_dim(ncid, "x", 3), nc.def_dim(ncid, "y", 2), nc.def_dim(ncid, "time", 0)
    for name, (member, dtype) in VARIABLES.items():
        xtype = nc.param(name)
        varid = nc.def_var(ncid, name, xtype, [x, y])
        if dtype is not None:
            limits = numpy.array([0, 5], dtype)
            getattr(nc, f"put_att_{member}")(ncid, varid, "range", xtype, limits)
    series = nc.def_var(ncid, "series", nc.param("double"), [time])
    nc.put_att_text(ncid, nc.param("GLOBAL"), "title", "A sample")
    nc.enddef(ncid)
    for name, (member, dtype) in VARIABLES.items():
        data = "abcdef" if dtype is None else numpy.arange(6, dtype=dtype)
        getattr(nc, f"put_var_{member}")(ncid, nc.inq_varid(ncid, name), data)
    nc.put_vara_double(ncid, series, [0], [2], [10.0, 20.0])
    return ncid
