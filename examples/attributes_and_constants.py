# examples/attributes_and_constants.py: what describes the data, and the library's constants.
"""Writes attributes of several types, and lists them with the help of the library's constants.

usage: attributes_and_constants.py [FOLDER]

Prints:

    the dataset: title = 'A buoy' (NC_CHAR)
    the dataset: position = [-30.5, 47.25] (NC_DOUBLE)
    depth: units = 'm' (NC_CHAR)
    depth: valid_range = [0, 4000] (NC_SHORT)
    the library has 69 constants; NC_FILL_SHORT is -32767
"""

import sys
import tempfile
from pathlib import Path

import numpy

import tessel

nc = tessel.load("netcdf")

GLOBAL = nc.param("NC_GLOBAL")  # with NC_ or without, in any case
TYPES = {nc.param(name): name for name in
         ("NC_BYTE", "NC_CHAR", "NC_SHORT", "NC_INT", "NC_FLOAT", "NC_DOUBLE")}


def make(path: Path) -> None:
    """A file with attributes of the dataset and of a variable."""
    ncid = nc.create(path, "CLOBBER")
    nc.put_att_text(ncid, GLOBAL, "title", "A buoy")
    nc.put_att_double(ncid, GLOBAL, "position", nc.param("NC_DOUBLE"), [-30.5, 47.25])
    depth = nc.def_var(ncid, "depth", nc.param("NC_SHORT"), [nc.def_dim(ncid, "depth", 4)])
    nc.put_att_text(ncid, depth, "units", "m")
    nc.put_att_short(ncid, depth, "valid_range", nc.param("NC_SHORT"),
                     numpy.array([0, 4000], "int16"))
    nc.close(ncid)


def show(ncid: int, varid: int, owner: str, count: int) -> None:
    """Prints the attributes of a variable or of the dataset."""
    for attnum in range(count):
        name = nc.inq_attname(ncid, varid, attnum)
        xtype = TYPES[nc.inq_att(ncid, varid, name).xtype]
        if xtype == "NC_CHAR":
            value = repr(nc.get_att_text(ncid, varid, name))
        elif xtype == "NC_SHORT":
            value = nc.get_att_short(ncid, varid, name).ravel().tolist()
        else:  # the library converts every number to double
            value = nc.get_att_double(ncid, varid, name).ravel().tolist()
        print(f"{owner}: {name} = {value} ({xtype})")


def main(folder: Path) -> None:
    path = folder / "attributes.nc"
    make(path)
    ncid = nc.open(path, "NOWRITE")
    dataset = nc.inq(ncid)
    show(ncid, GLOBAL, "the dataset", dataset.natts)
    for varid in range(dataset.nvars):
        variable = nc.inq_var(ncid, varid)
        show(ncid, varid, variable.name, variable.natts)
    nc.close(ncid)
    print(f"the library has {len(nc.get_constant_names())} constants; "
          f"NC_FILL_SHORT is {nc.param('NC_FILL_SHORT')}")


with tempfile.TemporaryDirectory() as made:
    main(Path(sys.argv[1] if len(sys.argv) > 1 else made))
