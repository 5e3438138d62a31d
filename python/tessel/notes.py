# python/tessel/notes.py: what an error's message cannot say: the call, the file, the variable.
"""The note of an error: what was called, on what.

The message is the module's and stays so. The note is attached to the exception (`__notes__`), and
Python shows it below the message. All of it is found out when the error is there, but for the
current folder, which the functions of this package look up when they begin; and nothing here can
fail a call in another way. What comes from a file is made harmless, because Python shows notes as
they are.
"""

from __future__ import annotations

import functools
import inspect
import os
import threading
from collections.abc import Callable, Iterator
from contextlib import suppress
from typing import Any, TypeVar

import numpy

from tessel import beginning, operations, paths, wording
from tessel.dataset import Dimension, Variable, external_type
from tessel.errors import SYSTEM_ERRORS, Error
from tessel.netcdf import Netcdf, path_of
from tessel.operation import Operation

_MOST = 12

_Function = TypeVar("_Function", bound=Callable[..., Any])

_busy = threading.local()
"""Set while this thread makes a note, which asks the module and may meet errors itself."""


def explain(error: Error, module: Any, arguments: tuple[Any, ...]) -> None:
    """Adds to an error what it was that failed."""
    if getattr(_busy, "now", False):
        return
    _busy.now = True
    try:
        with suppress(Exception):
            _add(error, _lines(error, module, arguments))
    finally:
        _busy.now = False


def _add(error: Error, lines: Iterator[str]) -> None:
    """Adds a note of these lines."""
    text = "\n".join(map(wording.printable, filter(None, lines)))
    if text:
        error.add_note(text)


def told(function: _Function) -> _Function:
    """Has a function of this package say in every error how it was called, and about which
    files."""
    signature = inspect.signature(function)
    public = f"{function.__module__.rpartition('.')[0]}.{function.__name__}"

    @functools.wraps(function)
    def telling(*given: Any, **named: Any) -> Any:
        folder = None
        with suppress(OSError):
            folder = os.getcwd()  # now, because what `progress` does may change it
        try:
            return function(*given, **named)
        except Error as error:
            with suppress(Exception):
                if error.operation is None:
                    error.operation = function.__name__
                values = signature.bind(*given, **named).arguments
                _add(error, _lines_of_function(error, public, values, folder))
            raise

    return telling  # type: ignore[return-value]


def _lines_of_function(error: Error, name: str, values: dict[str, Any],
                       folder: str | None) -> Iterator[str]:
    written = (f"{each}={wording.abridged(value)}" for each, value in values.items())
    yield f"in {name}({', '.join(written)})"
    before = "\n".join(getattr(error, "__notes__", ())).splitlines()
    for each, title in (("path", "file"), ("source", "source"), ("target", "target")):
        value = values.get(each)
        if value and isinstance(value, (str, bytes, os.PathLike)):
            line = f"{title}: {paths.absolute(os.fsdecode(value), folder)}"
            if wording.printable(line) not in before:
                yield line


def _lines(error: Error, module: Any, arguments: tuple[Any, ...]) -> Iterator[str]:
    if not arguments or not isinstance(arguments[0], (str, bytes)):
        return
    name, *given = arguments
    if isinstance(name, bytes):  # one character a byte, as for the module
        name = name.decode("latin-1")
    row = operations.find(name) if isinstance(module, Netcdf) else None
    error.operation = row.short if row else name
    yield f"in {_call(error.operation, row, given)}"
    if row is None and isinstance(module, Netcdf):
        yield operations.near(name)
    if row is not None:
        values = dict(zip((each.name for each in row.arguments), given))
        if "path" in values:
            yield from _file(error, values["path"])
        else:
            yield from _Subject(module, error, values).lines()


def _call(name: str, row: Operation | None, given: list[Any]) -> str:
    """The call as one might write it."""
    names = [f"{each.name}=" for each in row.arguments] if row else []
    names += [""] * (len(given) - len(names))
    values = (wording.abridged(paths.shown(each)) for each in given)
    return f"{name}({', '.join(map(str.__add__, names, values))})"


def _file(error: Error, path: Any) -> Iterator[str]:
    """About an operation that opens or creates."""
    if not isinstance(path, (str, bytes, os.PathLike)) or error.word == "badPath":
        return
    if isinstance(error, OSError):
        error.filename = os.fspath(path)
    absolute = paths.shown(paths.absolute(paths.taken(path)))
    if os.path.isabs(absolute):
        error.path = absolute
        yield f"file: {absolute}"
        yield from instead(error)


def instead(error: Error) -> Iterator[str]:
    """What there is in place of the dataset that an operation was to open or create."""
    path = error.path
    if path is None or error.operation not in _OPENING or not _blames_the_file(error):
        return
    if error.word == "noSuchFileOrDirectory":
        missing, folder = path, os.path.dirname(path)
        while not os.path.lexists(folder):
            missing, folder = folder, os.path.dirname(folder)
        if missing != path:
            yield f"there is no folder {missing}"
        elif os.path.islink(path):
            yield f"it is a link to {os.readlink(path)}, which is not there"
    elif os.path.isdir(path):
        yield "it is a folder"
    elif error.operation in ("open", "_open") and os.path.isfile(path):
        # What the system refuses is not due to what is in the file, unless that cannot be read.
        if error.word not in SYSTEM_ERRORS or not os.access(path, os.R_OK):
            yield f"it {beginning.described(path)}"


_OPENING = {each.short: each for each in operations.OPERATIONS if each.opens}
_OF_ARGUMENTS = {identifier for each in _OPENING.values() for identifier, _ in (
    each.errors[0], *(error for argument in each.arguments for error in argument.kind.errors))}


def _blames_the_file(error: Error) -> bool:
    """Whether an operation that opens failed over the file, and not over its arguments."""
    return error.word == "header" or (error.identifier.startswith("TESSEL:netcdf:")
                                      and error.identifier not in _OF_ARGUMENTS)


class _Subject:
    """The dataset, variable, dimension that a call names, as the module knows them."""

    def __init__(self, module: Any, error: Error, values: dict[str, Any]) -> None:
        self._module = module
        self._error = error
        self._values = values

    def lines(self) -> Iterator[str]:
        """A line for each that is there."""
        pairs = [("ncid", "varid"), ("ncid_in", "varid_in"), ("ncid_out", "varid_out")]
        for ncid_name, varid_name in pairs:
            ncid = self._number(ncid_name)
            if ncid is None:
                continue
            yield self._dataset(ncid_name, ncid)
            varid = self._number(varid_name)
            if varid is not None:
                yield from self._ask(self._variable, varid_name, ncid, varid)
        ncid = self._number("ncid")
        if ncid is not None:
            yield from self._dimensions(ncid)
            yield from self._known(ncid)

    def _number(self, name: str) -> int | None:
        with suppress(Exception):
            return int(numpy.asarray(self._values[name]).flat[0].real)
        return None

    @staticmethod
    def _ask(about: Callable[..., Any], *arguments: Any) -> Iterator[Any]:
        """What an inquiry tells; nothing if it is refused as well."""
        with suppress(Exception):
            yield about(*arguments)

    def _dataset(self, name: str, ncid: int) -> str:
        path = paths.shown(path_of(ncid))
        if path is None:
            return f"{name} {ncid}: no dataset that was opened here is known by this id"
        self._error.path = path  # of two datasets, the one that is written, which comes last
        return f"{name} {ncid}: opened as {path!r}"

    def _variable(self, name: str, ncid: int, varid: int) -> str:
        if varid == -1:
            return f"{name} -1: the dataset itself"
        found = self._module.inq_var(ncid, varid)
        dimensions = (self._dimension(ncid, dimid) for dimid in found.dimids[::-1])
        variable = Variable(varid, found.name, external_type(found.xtype), tuple(dimensions))
        return f"{name} {varid}: {variable}"

    def _dimension(self, ncid: int, dimid: int) -> Dimension:
        name, length = self._module.inq_dim(ncid, dimid)
        return Dimension(name, length, self._module.inq(ncid).unlimdimid == dimid)

    def _dimensions(self, ncid: int) -> Iterator[str]:
        """The dimensions that the call names."""
        dimids = self._values.get("dimids", self._values.get("dimid"))
        if dimids is not None:
            for dimid in map(int, numpy.asarray(dimids).real.flat[:_MOST]):
                for dimension in self._ask(self._dimension, ncid, dimid):
                    yield f"dimid {dimid}: {dimension}"

    def _known(self, ncid: int) -> Iterator[str]:
        """What there is instead of what was not found."""
        word = self._error.word
        # Nothing is asked of a dataset without need: one whose closing failed does not survive it.
        if word not in _KINDS:
            return
        with suppress(Exception):
            inq = self._module.inq(ncid)
            if word == "variableNotFound":
                yield _list(_KINDS[word], inq.nvars,
                            lambda i: str(self._module.inq_var(ncid, i).name))
            elif word == "invalidDimensionIdOrName":
                yield _list(_KINDS[word], inq.ndims, lambda i: str(self._dimension(ncid, i)))
            elif word == "attributeNotFound":
                varid = self._number("varid")
                count = inq.natts if varid == -1 else self._module.inq_var(ncid, varid).natts
                yield _list(_KINDS[word], count,
                            lambda i: str(self._module.inq_attname(ncid, varid, i)))


_KINDS = {"variableNotFound": "variables", "invalidDimensionIdOrName": "dimensions",
          "attributeNotFound": "attributes"}
"""Of what kind is what was not found, by the word of the error."""


def known(error: Error) -> Iterator[str]:
    """What the notes of an error list in place of what was not found."""
    kind = _KINDS.get(error.word)
    for line in "\n".join(getattr(error, "__notes__", ())).splitlines():
        if kind is not None and line.startswith((f"{kind}: ", f"there are no {kind}")):
            yield line


def _list(what: str, count: int, name: Callable[[int], str]) -> str:
    """Some of the names, and how many more there are."""
    if not count:
        return f"there are no {what}"
    names = ", ".join(map(name, range(min(count, _MOST))))
    more = f" and {count - _MOST} more" if count > _MOST else ""
    return f"{what}: {names}{more}"
