# python/tessel/netcdf.py: the module "netcdf" with a method for every operation.
"""The methods of the module "netcdf", made of the table in `tessel.operations`.

    >>> import tessel
    >>> nc = tessel.load("netcdf")
    >>> ncid = nc.create("new.nc", "CLOBBER")
    >>> x = nc.def_dim(ncid, "x", 3)
    >>> varid = nc.def_var(ncid, "length", nc.param("NC_DOUBLE"), [x])
    >>> nc.enddef(ncid)
    >>> nc.put_var_double(ncid, varid, [1.5, 2.5, 3.5])
    >>> nc.inq_var(ncid, varid)
    InqVar(name='length', xtype=6, dimids=(0,), natts=0)
    >>> nc.get_vara_double(ncid, varid, start=[1], count=[2])
    array([[2.5],
           [3.5]])
    >>> nc.close(ncid)

Every operation has a method under its short and its long name (`nc.open`, `nc.nc_open`), with the
library's names for the parameters: without the p of a pointer, and `data` for what is written. Ids,
counts and sizes are int, names are str, lists of dimensions are tuples, several results are a named
tuple, and data are the host's arrays, without a copy. What an argument may be is in
`tessel.arguments`.

The call form, `nc("open", "new.nc", "NOWRITE")`, gives the host's arrays as they are.
"""

from __future__ import annotations

from collections import namedtuple
from collections.abc import Sequence
from types import FunctionType
from typing import Any, SupportsIndex, Union

import numpy
from numpy import ndarray
from numpy.typing import NDArray

from tessel import errors, paths, reference
from tessel._runtime import Module, call, call_ints
from tessel.arguments import (attribute_text, code, file_path, identifiers, integer, numbers,
                              text_of_bytes, vector)
from tessel.operation import Operation
from tessel.operations import OPERATIONS

Indices = Union[SupportsIndex, Sequence[SupportsIndex], NDArray[Any]]
"""Positions, counts, strides, dimensions."""

Numbers = Union[float, Sequence[Any]]
"""Data as Python's own numbers."""


# The path of each open dataset, as a tuple of its own, for the notes of errors. By id, for the
# whole process, as the ids are: an id that others have closed and opened again may lead to the path
# that it had here. From the root on, so that it leads there from any folder; `path_of` tidies it.
_opened: dict[int, tuple[str]] = {}


def path_of(ncid: int) -> str | None:
    """The file that an open dataset was opened from, or made as, here."""
    found = _opened.get(ncid)
    return paths.absolute(found[0]) if found else None


def _remember(path: Any, result: Any) -> Any:
    """The result of an operation that opens."""
    ncid = result if type(result) is int else result.ncid
    _opened[ncid] = (_place(path),)
    return result


def _place(path: Any) -> str:
    try:
        text = paths.taken(path)
    except TypeError:  # an array of characters
        return repr(path)
    return text if text[:1] == "/" else paths.absolute(text)


def _known(ncid: Any) -> tuple[int, tuple[str] | None]:
    """A dataset's id, whatever it is given as, and what is remembered of it."""
    number = ncid if type(ncid) is int else _id(ncid)
    return number, _opened.get(number)


def _forget(before: tuple[int, tuple[str] | None], result: None) -> None:
    """For an operation that ended a dataset, of which this was known before."""
    ncid, known = before
    if known is not None and _opened.get(ncid) is known:  # not another one of the same id by now
        _opened.pop(ncid, None)


def _constant(value: ndarray[Any, Any]) -> int | float:
    number = float(value.item())
    return int(number) if abs(number) < 2**53 else number


def _opening(module: Module, *arguments: Any) -> Any:
    """A call by name of an operation that opens."""
    result = call(module, *arguments)
    ncid = result[-1] if type(result) is tuple else result
    _remember(arguments[1], int(ncid.item()))
    return result


def _ending(module: Module, *arguments: Any) -> None:
    """A call by name of an operation that ends a dataset."""
    before = _known(arguments[1]) if len(arguments) > 1 else (-1, None)
    _forget(before, call(module, *arguments))


_INSTEAD = {name: _opening if each.opens else _ending
            for each in OPERATIONS if each.opens or each.ends for name in each.names}


class Netcdf(Module):
    """The module "netcdf". Every operation is a method; see `help(tessel.netcdf)`.

    Called with an operation's name, it takes and gives the host's arrays, unchanged.
    """

    def __new__(cls, module: Module) -> Netcdf:
        return super().__new__(cls, module, _INSTEAD)


def _ids(value: Any) -> tuple[int, ...]:
    """A list of ids, of which `call_ints` makes an int when it is one id."""
    return (value,) if type(value) is int else tuple(map(int, value.flat))


def _id(value: Any) -> int:
    """An id as the module reads it: the first element."""
    try:
        return int(numpy.asarray(value).real.flat[0])
    except (ValueError, TypeError, IndexError, OverflowError):
        return -1


_SCOPE: dict[str, Any] = {
    "Any": Any, "Indices": Indices, "NDArray": NDArray, "Numbers": Numbers,
    "PLAIN": (list, tuple, ndarray), "SupportsIndex": SupportsIndex, "__name__": __name__,
    "attribute_text": attribute_text, "call": call, "call_ints": call_ints, "code": code, "constant": _constant,
    "Error": errors.Error, "explained": errors.explained,
    "dtypes": {name: numpy.dtype(name) for name in
               ("float64", "float32", "int32", "int16", "int8", "uint8")},
    "file_path": file_path, "forget": _forget, "identifiers": identifiers, "ids": _ids,
    "integer": integer, "known": _known, "ndarray": ndarray, "numbers": numbers, "numpy": numpy,
    "paths": paths, "remember": _remember,
    "text_of_bytes": text_of_bytes, "vector": vector,
}


def _source(operation: Operation) -> str:
    """The method as source text."""
    made = {each.name: each.kind.conversion.format(name=each.name)
            for each in operation.arguments}
    lines = []
    if operation.opens:  # what is remembered is what was called
        lines.append(f"    path = {made['path']}")
        made["path"] = "path"
    given = "".join(f", {each}" for each in made.values())
    value = f"{'call_ints' if operation.counts else 'call'}(self, '{operation.short}'{given})"
    if len(operation.results) > 1:
        names = ", ".join(f"r{i}" for i in range(len(operation.results)))
        lines.append(f"    {names} = {value}")
        several = ", ".join(each.kind.conversion.format(value=f"r{i}")
                            for i, each in enumerate(operation.results))
        value = f"{operation.several}({several})"
    elif operation.results:
        value = operation.results[0].kind.conversion.format(value=value)
    if operation.opens:
        value = f"remember(path, {value})"
    elif operation.ends:
        value = f"forget(known(ncid), {value})"
    lines.append(f"    return {value}")
    if any(each.kind.refuses for each in operation.arguments):
        names = "".join(f", {each.name}" for each in operation.arguments)
        lines = ["    try:", *(f"    {line}" for line in lines),
                 "    except Error as error:",
                 f"        raise explained(error, self, ('{operation.short}'{names}))"]
    return "\n".join([f"def {operation.short}({operation.parameters}) -> {operation.returns}:",
                      *lines, ""])


def _add_methods() -> None:
    """Gives the class its methods and this module the classes of several results."""
    for each in OPERATIONS:
        if each.several:
            made = namedtuple(each.several,  # type: ignore[misc]
                              [result.name for result in each.results], module=__name__)
            made.__doc__ = f"The results of `{each.short}`."
            globals()[each.several] = _SCOPE[each.several] = made
    source = "from __future__ import annotations\n" + "\n".join(map(_source, OPERATIONS))
    exec(compile(source, "<the methods of tessel.netcdf.Netcdf>", "exec"), _SCOPE)
    for each in OPERATIONS:
        written = _SCOPE.pop(each.short)
        text = reference.docstring_of(each)
        for name in each.names:
            code = written.__code__.replace(co_name=name, co_qualname=f"Netcdf.{name}")
            method = FunctionType(code, _SCOPE, name)
            method.__doc__ = text
            method.__module__ = __name__
            method.__qualname__ = f"Netcdf.{name}"
            method.__annotations__ = written.__annotations__
            setattr(Netcdf, name, method)


_add_methods()
