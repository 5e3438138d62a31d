"""tests/cost/calls.py: a fixed set of calls from Python, each of them marked for callgrind.

usage: calls.py MARKS, the library of marks.cpp
"""

from __future__ import annotations

import ctypes
import os
import sys
import tempfile
from collections.abc import Callable
from itertools import repeat

import numpy
import tessel

# As in calls.cpp.
UNMEASURED, MEASURED = 10, 50

marks = ctypes.CDLL(sys.argv[1])


def measure(name: str, work: Callable[[], object]) -> None:
    """Does it over and over; what it gives is let go of each time."""
    for _ in repeat(None, UNMEASURED):
        work()
    marks.costBegins()
    for _ in repeat(None, MEASURED):
        work()
    marks.costEnds(name.encode())


def refused() -> None:
    """A call that ends with an error."""
    try:
        nc("inq_varid", ncid, "nothing")
    except LookupError:
        return
    raise AssertionError("no error")


nc = tessel.load("netcdf", guard="on")  # what users have
with tempfile.TemporaryDirectory() as folder:
    ncid = nc.create(os.path.join(folder, "calls.nc"), "CLOBBER")
    x, y = nc.def_dim(ncid, "x", 10), nc.def_dim(ncid, "y", 10)
    varid = nc.def_var(ncid, "numbers", nc.param("NC_DOUBLE"), [x, y])
    nc.put_att_text(ncid, varid, "units", "metres per second")
    nc.enddef(ncid)
    ten = numpy.arange(10.0)
    measure("inq_varid, call", lambda: nc("inq_varid", ncid, "numbers"))
    measure("inq_varid, method", lambda: nc.inq_varid(ncid, "numbers"))
    measure("inq_var, method", lambda: nc.inq_var(ncid, varid))
    measure("get_att_text, call", lambda: nc("get_att_text", ncid, varid, "units"))
    measure("get_var1_double, call", lambda: nc("get_var1_double", ncid, varid, [0, 3]))
    measure("get_var1_double, method", lambda: nc.get_var1_double(ncid, varid, [0, 3]))
    measure("get_vara_double of 10, call",
            lambda: nc("get_vara_double", ncid, varid, [0, 3], [10, 1]))
    measure("put_var1_double, call", lambda: nc("put_var1_double", ncid, varid, [0, 3], 1.5))
    measure("put_vara_double of 10, call",
            lambda: nc("put_vara_double", ncid, varid, [0, 3], [10, 1], ten))
    measure("an error of the library", refused)
    nc.close(ncid)
print(f"times={MEASURED}")
