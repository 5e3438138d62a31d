# tests/python/made_files.py: files for the tests, made by ncgen and through the module.
"""Small files of every kind, and sparse ones of any size."""

from __future__ import annotations

import os
import subprocess
from pathlib import Path

import numpy as np
import tessel

netcdf = tessel.load("netcdf")

CLASSIC, OFFSET64 = 0, 512
NOFILL = 256
MIB = 2**20
BYTE, CHAR, SHORT, INT, FLOAT, DOUBLE = range(1, 7)
MEMBERS = {BYTE: "schar", CHAR: "text", SHORT: "short", INT: "int", FLOAT: "float",
           DOUBLE: "double"}

EVERYTHING = """
dimensions:
    record = UNLIMITED ; wide = 5 ; high = 3 ; unused = 7 ;
variables:
    float first(high, wide) ;
        first:units = "K" ; first:range = 1.5f, 2.5f ; first:codes = 1b, 2b, 3b ;
    byte r1(record, wide) ;
        r1:_FillValue = -1b ;
    char text(high, wide) ;
    double scalar ;
        scalar:many = 1, 2, 3, 4, 5 ;
    short r2(record) ;
    char word(wide) ;
    char letter ;
    char rtext(record, high, wide) ;
        rtext:empty = "" ;
    int count(wide) ;
    double r3(record, high, wide) ;
    :title = "everything" ; :number = 1.25 ; :brief = -1s, 5s ;
data:
    first = 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, NaNf, -0.f, 13, 14, 15 ;
    r1 = 1, 2, 3, 4, 5, -1, -2, -3, -128, 127, 0, 0, 0, 0, 1 ;
    text = "ab", "\\351\\377", "12345" ;
    scalar = 0.1 ;
    r2 = 1, -32768, 32767 ;
    word = "a b" ;
    letter = "x" ;
    rtext = "one", "two", "three", "four", "five", "six", "seven", "eight", "nine" ;
    count = 1, 2, 3, 4, 2147483647 ;
    r3 = 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 1e300, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11,
        12, 13, 14, 15, 0.1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, NaN ;
"""
"""Fixed and record variables of every external type, in text form."""


def run_tool(*command: object) -> str:
    """What a tool of somebody else's prints. It runs without the libraries that a sanitizer has put
    before all others, which are not for it."""
    environment = {name: value for name, value in os.environ.items() if name != "LD_PRELOAD"}
    done = subprocess.run([str(word) for word in command], check=True, capture_output=True,
                          env=environment)
    return done.stdout.decode("latin-1")


def generate(path: Path, cdl: str, kind: str = "classic") -> str:
    """A file made by ncgen from its text form."""
    text = path.with_suffix(".cdl")
    text.write_text(f"netcdf made {{\n{cdl}\n}}\n", encoding="latin-1")
    run_tool("ncgen", "-k", kind, "-o", path, text)
    text.unlink()
    return str(path)


def sparse(path: Path, size: int) -> str:
    """A file with one variable "big" of so many bytes that take no room on the disk, but for its
    last value, 1."""
    length = size // 4 // 1024
    ncid = netcdf("create", path, OFFSET64)
    netcdf("set_fill", ncid, NOFILL)
    dimids = [netcdf("def_dim", ncid, "x", 1024), netcdf("def_dim", ncid, "y", length)]
    varid = netcdf("def_var", ncid, "big", INT, np.array([float(each[0, 0]) for each in dimids]))
    netcdf("enddef", ncid)
    netcdf("put_var1_int", ncid, varid, np.array([1023.0, length - 1.0]), np.array([1], np.int32))
    netcdf("close", ncid)
    return str(path)


def open_descriptors() -> set[str]:
    """The files that this process has open."""
    found = set()
    for each in Path("/proc/self/fd").iterdir():
        try:
            found.add(str(each.readlink()))
        except FileNotFoundError:  # the one that looked
            pass
    return found
