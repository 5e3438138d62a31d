"""tests/python/typed_example.py: a program with types, which mypy checks and the test runs."""

from __future__ import annotations

from pathlib import Path
from typing import assert_type

import numpy
import tessel
from numpy.typing import NDArray


def mean(path: Path, name: str) -> float:
    """The mean of a variable."""
    nc = tessel.load("netcdf")
    assert_type(nc, tessel.Netcdf)
    ncid = assert_type(nc.open(path, "NOWRITE"), int)
    try:
        varid = nc.inq_varid(ncid, name)
        found = nc.inq_var(ncid, varid)
        assert_type(found.dimids, tuple[int, ...])
        lengths = [nc.inq_dim(ncid, dimid).len for dimid in found.dimids]
        assert_type(lengths, list[int])
        values = nc.get_vara_double(ncid, varid, [0] * len(lengths), lengths)
        assert_type(values, NDArray[numpy.float64])
        return float(values.mean())
    finally:
        nc.close(ncid)


def write(path: Path) -> None:
    """A file to read."""
    nc = tessel.load("netcdf")
    ncid = nc.nc_create(path, "CLOBBER")
    x = nc.def_dim(ncid, "x", numpy.int64(3))
    varid = nc.def_var(ncid, "v", int(nc.param("DOUBLE")), (x,))
    nc.nc_enddef(ncid)
    nc.put_var_double(ncid, varid, [1, 2.5, 4])
    nc.put_vara_double(ncid, varid, numpy.array([0]), range(1, 2), numpy.ones(1))
    nc.close(ncid)


def word_of_failure(path: Path) -> str | None:
    """What is wrong with a file, in a word."""
    try:
        mean(path, "v")
    except tessel.Error as error:
        assert_type(error.operation, str | None)
        return assert_type(error.word, str)
    return None


def file_of(module: str) -> Path:
    """Where a module that need not be "netcdf" is."""
    loaded = tessel.load(module)
    assert_type(loaded, tessel.Module)
    return loaded.file


if __name__ == "__main__":
    write(Path("typed.nc"))
    print(mean(Path("typed.nc"), "v"), word_of_failure(Path("missing.nc")), file_of("netcdf").name)
