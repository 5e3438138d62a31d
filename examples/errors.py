# examples/errors.py: what a failure looks like, and how to catch it.
"""Provokes failures and catches them: by Python's own exceptions, and by the module's identifiers.

usage: errors.py [FOLDER]

Prints:

    no such file: TESSEL:netcdf:open:noSuchFileOrDirectory
    no such variable: variableNotFound, raised by inq_varid
    beyond the edge: startPlusCountExceedsDimensionBound
      in get_vara_double(ncid=65536, varid=0, start=[2], count=[5])
      ncid 65536: opened as 'errors.nc'
      varid 0: double v(x=3)
    not netCDF: notANetcdfFile
      in open(path='page.nc', mode='NOWRITE')
      file: page.nc
      it is a web page, perhaps what a server said instead of the file
"""

import os
import sys
import tempfile
import textwrap
from pathlib import Path

import tessel

nc = tessel.load("netcdf")


def show(what: str, error: tessel.Error) -> None:
    """Prints what happened, and the notes: what the bare message cannot know."""
    print(f"{what}: {error.word}")
    notes = "\n".join(error.__notes__).replace(f"{Path.cwd()}/", "")  # the same in any folder
    print(textwrap.indent(notes, "  "))


def main(folder: Path) -> None:
    os.chdir(folder)

    # Where Python has an exception for it, a tessel.Error is an instance of that as well.
    try:
        nc.open("none.nc", "NOWRITE")
    except FileNotFoundError as error:
        print("no such file:", error.identifier)

    ncid = nc.create("errors.nc", "CLOBBER")
    nc.def_var(ncid, "v", nc.param("DOUBLE"), [nc.def_dim(ncid, "x", 3)])
    nc.enddef(ncid)
    try:
        nc.inq_varid(ncid, "none")
    except tessel.Error as error:
        print(f"no such variable: {error.word}, raised by {error.operation}")
    try:
        nc.get_vara_double(ncid, 0, [2], [5])
    except IndexError as error:
        show("beyond the edge", error)
    nc.close(ncid)

    Path("page.nc").write_text("<!DOCTYPE html><title>Not found</title>")
    try:
        nc.open("page.nc", "NOWRITE")
    except tessel.Error as error:
        show("not netCDF", error)


with tempfile.TemporaryDirectory() as made:
    main(Path(sys.argv[1] if len(sys.argv) > 1 else made))
