# python/tessel/__init__.py: the package's public names, and what becomes what.
"""Modules of the host, called from Python.

    >>> import tessel
    >>> netcdf = tessel.load("netcdf")
    >>> ncid = netcdf("open", "sst.nc", "NOWRITE")
    >>> sst = netcdf("get_var_float", ncid, netcdf("inq_varid", ncid, "SST"))

The module "netcdf" has a method for every operation as well, `netcdf.open("sst.nc", "NOWRITE")`,
which takes and gives what a Python program expects: see `tessel.netcdf`. What follows is about the
call itself.

A call names an operation and gives the operation's own arguments. It returns None when the
operation has no result, the result when it has one, and a tuple when it has several, and raises
`tessel.Error`, with `.identifier` and `.message`, when the module, the host or a conversion refuses
(see `tessel.errors`).
Any number of threads may call; the calls themselves run one after the other, and the interpreter is
free meanwhile.

Arrays are the host's: at least two dimensions, first dimension fastest. A result takes over the
host's memory without a copy. An argument whose data are column-major, aligned and in the machine's
byte order is passed without a copy; every other array is copied once.

===================  ==================================  ==========================================
class of the host    from the host                       to the host
===================  ==================================  ==========================================
double               float64 array                       the same; float; int that is exact as a
                                                         double; list or tuple of such numbers
                                                         (1-by-n; empty: 0-by-0)
single               float32 array                       the same
int8, int16, int32,  array of that dtype                 the same; int that only 64 bits hold
int64, uint8,                                            exactly (int64, else uint64)
uint16, uint32,
uint64
complex double       complex128 array (copied)           the same (copied); complex
complex single       complex64 array (copied)            the same (copied)
logical              bool array                          the same; bool
char, 1-by-n         str (0-by-0: "")                    str (""  makes 1-by-0); bytes, one
                                                         character a byte; os.PathLike
char, other shapes   array of dtype "<U1" (copied)       the same (copied)
cell                 object array                        object array; list or tuple of anything
                                                         but plain numbers (1-by-n)
struct, 1-by-1       dict                                dict whose keys are str
struct, other shapes object array of dicts               object array of dicts with equal keys
function_handle      tessel.Function                     tessel.Function
unknown              tessel.Unknown                      tessel.Unknown
===================  ==================================  ==========================================

- A NumPy scalar and an array without dimensions become 1-by-1, an array of one dimension of length
  n becomes n-by-1. In a list, NumPy's real scalars are plain numbers too; bool is not.
- Codes (of set_fill, set_default_format and strerror) are doubles in the host. An int32 array is no
  error there, but the module reads its bytes as a double's, so that a single one counts as 0. The
  methods convert; in a call, give an int, a float or a float64 array.
- None stands for an element of a cell, or a field, that nothing was put into. It is no argument.
- A str is UTF-16 in the host: a character beyond U+FFFF is two of the host's, and half of such a
  pair stays what it is in both directions.
- An object array of nothing but dicts becomes a struct; for a cell of structs, use a list.
- What has no counterpart is refused and never converted in silence: other dtypes (float16,
  longdouble, datetime64, "<U2", structured ones), masked arrays, integers beyond 64 bits, integers
  in a list that no double holds exactly, values nested more than 256 levels deep or in themselves.
  The identifiers begin with "TESSEL:python:".
"""

from __future__ import annotations

import functools
import os
from typing import Literal, get_args, overload

from tessel import _runtime
from tessel._runtime import Module
from tessel.errors import Error
from tessel.integrity import check
from tessel.netcdf import Netcdf
from tessel.terminal import progress_bar
from tessel.transfer import copy, read
from tessel.values import Function, Unknown

__all__ = ["Error", "Function", "Module", "Netcdf", "Unknown", "check", "copy", "load",
           "progress_bar", "read"]

__version__: str = _runtime.version
"""The version of this package, as `tessel --version` says it."""

Guard = Literal["on", "remote", "off"]
"""How much the netCDF library is kept from: see `load`."""


@overload
def load(module: Literal["netcdf"], guard: Guard | None = None) -> Netcdf: ...
@overload
def load(module: str | os.PathLike[str], guard: Guard | None = None) -> Module: ...


def load(module: str | os.PathLike[str], guard: Guard | None = None) -> Module:
    """The module of a name ("netcdf"), or in a file (a str with a slash, or a path object).

    A name is looked up in the folders of the variable TESSEL_MODULE_PATH and among the modules that
    came with this package. A module whose file is called "netcdf.tsx" is a `tessel.Netcdf`, which
    has a method for every operation and a guard: it refuses the few calls that the netCDF library
    does not survive, and file names that are addresses, which the library would fetch
    (identifiers that begin with "TESSEL:guard:"). `guard` is "on", "remote" (addresses are
    allowed) or "off"; None takes it from the variable TESSEL_GUARD, and "on" without one. A name is
    looked up once: as long as the guard and the folders are the same, so is the object.
    """
    chosen = os.environ.get("TESSEL_GUARD", "on") if guard is None else guard
    if type(module) is type(chosen) is str and "/" not in module:
        return _kept(module, chosen, os.environ.get("TESSEL_MODULE_PATH"))
    return _guarded(_load(module), chosen)


@functools.lru_cache
def _kept(module: str, chosen: str, _folders: str | None) -> Module:
    """To find a module takes longer than to open a file, and whatever opens one loads it."""
    return _guarded(_load(module), chosen)


def _guarded(loaded: Module, chosen: str) -> Module:
    if loaded.file.name != "netcdf.tsx":
        return loaded
    if chosen not in get_args(Guard):
        raise Error("TESSEL:python:badGuard", f"A guard is one of {', '.join(get_args(Guard))}, "
                                              f"and not {chosen!r}.")
    return Netcdf(loaded if chosen == "off" else _runtime.guarded(loaded, chosen == "remote"))


def _load(module: str | os.PathLike[str]) -> Module:
    try:
        encoded = os.fsencode(module)
    except (TypeError, ValueError):
        encoded = b""
    if not encoded or b"\0" in encoded:
        raise Error("TESSEL:python:badModuleName",
                    "A module is given by a name or by the path of its file.")
    if b"/" in encoded or isinstance(module, os.PathLike):
        return _runtime.load_file(encoded)
    return _runtime.find(encoded)
