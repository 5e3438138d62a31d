# examples/write_records.py: a file that grows by one record at a time.
"""Writes a file whose dimension time is unlimited, record by record, and appends to it later.

usage: write_records.py [FOLDER]

Prints:

    records.nc has 4 records
    time: 0.0 6.0 12.0 18.0 hours since 2001-01-01
    temperature at the second place: [11. 12. 13. 14.]
"""

import sys
import tempfile
from pathlib import Path

import numpy

import tessel

PLACES = 3

nc = tessel.load("netcdf")


def create(path: Path) -> None:
    """A new file without any record."""
    ncid = nc.create(path, nc.param("64BIT_OFFSET"))
    time = nc.def_dim(ncid, "time", nc.param("UNLIMITED"))
    place = nc.def_dim(ncid, "place", PLACES)
    hours = nc.def_var(ncid, "time", nc.param("DOUBLE"), [time])
    nc.put_att_text(ncid, hours, "units", "hours since 2001-01-01")
    # Dimensions are in host order, first dimension fastest, so the unlimited one is the last.
    nc.def_var(ncid, "temperature", nc.param("FLOAT"), [place, time])
    nc.close(ncid)  # ends define mode as well


def append(path: Path, hours: float, temperature: numpy.ndarray) -> None:
    """Writes one more record."""
    ncid = nc.open(path, "WRITE")
    try:
        record = nc.inq_dim(ncid, nc.inq_dimid(ncid, "time")).len
        nc.put_var1_double(ncid, nc.inq_varid(ncid, "time"), [record], hours)
        nc.put_vara_float(ncid, nc.inq_varid(ncid, "temperature"), [0, record], [PLACES, 1],
                          temperature.astype("float32"))
    finally:
        nc.close(ncid)


def show(path: Path) -> None:
    """Prints what is in the file now."""
    ncid = nc.open(path, "NOWRITE")
    time = nc.inq_varid(ncid, "time")
    hours = nc.get_var_double(ncid, time)[:, 0]
    temperature = nc.get_var_float(ncid, nc.inq_varid(ncid, "temperature"))
    print(f"{path.name} has {len(hours)} records")
    print("time:", *hours, nc.get_att_text(ncid, time, "units"))
    print("temperature at the second place:", temperature[1, :])
    nc.close(ncid)


def main(folder: Path) -> None:
    path = folder / "records.nc"
    create(path)
    for record in range(4):
        append(path, 6.0 * record, 10.0 + record + numpy.arange(PLACES))
    show(path)


with tempfile.TemporaryDirectory() as made:
    main(Path(sys.argv[1] if len(sys.argv) > 1 else made))
