# python/tessel/dataset.py: what is in a file, as Python objects; every datum comes from the module.
"""A netCDF file read through the module: its dimensions, attributes, variables and values."""

from __future__ import annotations

import os
import stat
from collections.abc import Iterator, Mapping, Sequence
from dataclasses import dataclass, field
from functools import cached_property
from types import TracebackType
from typing import Any

import numpy as np
from numpy.typing import NDArray

import tessel
from tessel import paths, wording

TEXT = 2
"""The number of the external type of text."""


@dataclass(frozen=True)
class ExternalType:
    """One of the library's types: its number and name, and how the module reads its values."""

    number: int
    name: str
    size: int = 0
    """The bytes of a value in a file of the classic formats; 0 for types without a fixed size."""

    member: str | None = None
    """The member of the typed families that reads it without loss; None when none does."""

    fill: str | None = None
    """The constant that stands for values never written."""


# The types beyond "double" are not of the classic formats; of those, numbers are read by the
# smallest member that holds them.
EXTERNAL_TYPES = {each.number: each for each in (
    ExternalType(1, "byte", 1, "schar"),
    ExternalType(TEXT, "char", 1, "text"),
    ExternalType(3, "short", 2, "short", "NC_FILL_SHORT"),
    ExternalType(4, "int", 4, "int", "NC_FILL_INT"),
    ExternalType(5, "float", 4, "float", "NC_FILL_FLOAT"),
    ExternalType(6, "double", 8, "double", "NC_FILL_DOUBLE"),
    ExternalType(7, "ubyte", 1, "uchar"),
    ExternalType(8, "ushort", 2, "int"),
    ExternalType(9, "uint", 4, "double"),
    ExternalType(10, "int64", 8, "double"),
    ExternalType(11, "uint64", 8, "double"),
    ExternalType(12, "string"),
)}


def external_type(number: int) -> ExternalType:
    """The type of that number; a nameless one for a type that a file defines for itself."""
    return EXTERNAL_TYPES.get(number, ExternalType(number, f"type {number}"))


@dataclass(frozen=True)
class Dimension:
    """A dimension of a file."""

    name: str
    length: int
    unlimited: bool = False

    def __str__(self) -> str:
        """Its name and length, and whether it grows."""
        return f"{self.name}={self.length}{' unlimited' if self.unlimited else ''}"


@dataclass(frozen=True)
class Attribute:
    """An attribute: `value` is a str, an array of numbers, or the error that reading it raised."""

    name: str
    type: ExternalType
    value: str | NDArray[Any] | tessel.Error


@dataclass(frozen=True)
class Variable:
    """A variable; its dimensions in the library's order, slowest first."""

    varid: int
    name: str
    type: ExternalType
    dimensions: tuple[Dimension, ...]
    attributes: dict[str, Attribute] = field(default_factory=dict)

    @property
    def shape(self) -> tuple[int, ...]:
        """The lengths of the dimensions."""
        return tuple(dimension.length for dimension in self.dimensions)

    def __str__(self) -> str:
        """What it is, with its dimensions in the host's order, in printable characters."""
        lengths = ", ".join(map(str, self.dimensions[::-1]))
        shape = f"({lengths})" if lengths else ", a single value"
        return wording.printable(f"{self.type.name} {self.name}{shape}")

    @property
    def is_text(self) -> bool:
        """Whether the values are characters."""
        return self.type.member == "text"

    @property
    def is_numeric(self) -> bool:
        """Whether the values are numbers that the module reads."""
        return self.type.member not in (None, "text")

    @property
    def is_coordinate(self) -> bool:
        """Whether it gives the positions along the dimension of its own name."""
        return len(self.dimensions) == 1 and self.dimensions[0].name == self.name

    def text(self, attribute: str) -> str:
        """A text attribute, without blanks around it; "" when there is none."""
        found = self.attributes.get(attribute)
        return found.value.strip() if found and isinstance(found.value, str) else ""

    def number(self, attribute: str, default: float) -> float:
        """The first number of an attribute."""
        numbers = self.numbers(attribute)
        return float(numbers[0]) if numbers.size else default

    def numbers(self, attribute: str) -> NDArray[Any]:
        """All numbers of an attribute; none when it is missing or no number."""
        found = self.attributes.get(attribute)
        value = found.value if found else None
        return value if isinstance(value, np.ndarray) else np.empty(0)

    @property
    def units(self) -> str:
        """The units, "" when the file gives none."""
        return self.text("units")

    @property
    def is_time(self) -> bool:
        """Whether the values are times."""
        return (" since " in self.units.lower() or self.text("standard_name").lower() == "time"
                or self.text("axis").upper() == "T")


def host_order(places: Sequence[int]) -> NDArray[Any]:
    """Places in the library's order as an argument, which is in the host's."""
    return np.array(places[::-1], float)


def _judge(path: str, place: str) -> None:
    """Refuses what is no name, and what whoever opens it would wait for."""
    if not path:
        raise tessel.Error("TESSEL:python:badPath", "The file has no name.")
    try:
        mode = os.stat(path).st_mode
    except OSError:  # the module says what is wrong
        return
    if not (stat.S_ISREG(mode) or stat.S_ISDIR(mode) or stat.S_ISBLK(mode)):
        raise tessel.Error("TESSEL:python:notARegularFile",
                           "The file is no regular file, but a pipe, a socket or a device.",
                           path=place)


class Dataset:
    """An open file. Close it, or use it in a `with` statement.

    `path` is the name that it was given, and `place` where that led from the folder of then.
    """

    def __init__(self, path: paths.Path) -> None:
        self._netcdf = tessel.load("netcdf")
        self.path = paths.given(path)
        self.place = paths.absolute(self.path)
        _judge(self.path, self.place)
        self.ncid = self._open()

    def _open(self) -> int:
        """Opens the file for reading."""
        return self._netcdf.open(self.path, "NOWRITE")

    def __enter__(self) -> Dataset:
        return self

    def __exit__(self, kind: type[BaseException] | None, error: BaseException | None,
                 traceback: TracebackType | None) -> None:
        self.close()

    def close(self) -> None:
        """Closes the file."""
        self._netcdf("close", self.ncid)

    def refusal(self, identifier: str, message: str, variable: Variable) -> tessel.Error:
        """The error for what cannot be done with a variable."""
        error = tessel.Error(identifier, message, path=self.place)
        error.add_note(str(variable))
        return error

    def call(self, operation: str, *arguments: object) -> Any:
        """An operation of the module on this file."""
        return self._netcdf(operation, self.ncid, *arguments)

    @cached_property
    def _counts(self) -> tuple[int, int, int, int]:
        dims, variables, attributes, unlimited = (int(n[0, 0]) for n in self.call("inq"))
        return dims, variables, attributes, unlimited

    def _dimension(self, dimid: int) -> Dimension:
        name, length = self.call("inq_dim", dimid)
        return Dimension(name, int(length[0, 0]), dimid == self._counts[3])

    @cached_property
    def dimensions(self) -> list[Dimension]:
        """All dimensions, in the file's order."""
        found = []
        for dimid in range(self._counts[0]):
            try:
                found.append(self._dimension(dimid))
            except tessel.Error:  # the number is taken by a dimension of a group in the file
                continue
        used = (each for variable in self.variables.values() for each in variable.dimensions)
        return list(dict.fromkeys([*found, *used]))

    @cached_property
    def attributes(self) -> dict[str, Attribute]:
        """The global attributes by name, in the file's order."""
        return self._attributes(-1, self._counts[2])

    @cached_property
    def variables(self) -> dict[str, Variable]:
        """The variables by name, in the file's order."""
        found = (self._variable(varid) for varid in range(self._counts[1]))
        return {variable.name: variable for variable in found}

    def _variable(self, varid: int) -> Variable:
        name, number, dimids, attributes = self.call("inq_var", varid)
        dimensions = (self._dimension(int(dimid)) for dimid in dimids.ravel()[::-1])
        return Variable(varid, name, external_type(int(number[0, 0])), tuple(dimensions),
                        self._attributes(varid, int(attributes[0, 0])))

    def _attributes(self, varid: int, count: int) -> dict[str, Attribute]:
        names = (self.call("inq_attname", varid, number) for number in range(count))
        return {name: self._attribute(varid, name) for name in names}

    def _attribute(self, varid: int, name: str) -> Attribute:
        try:
            kind = external_type(int(self.call("inq_att", varid, name)[0][0, 0]))
        except tessel.Error as error:  # a name that is not UTF-8 in the file cannot be asked for
            if error.word != "attributeNotFound":
                raise
            return Attribute(name, ExternalType(0, "type unknown"), error)
        try:
            value = self.call(f"get_att_{kind.member or 'text'}", varid, name)
        except tessel.Error as error:
            value = error
        return Attribute(name, kind, value.ravel() if isinstance(value, np.ndarray) else value)

    def find(self, name: str) -> Variable:
        """The variable of that name; the module's error when there is none."""
        return self._variable(int(self.call("inq_varid", name)[0, 0]))

    def coordinate(self, dimension: Dimension) -> Variable | None:
        """The variable that gives the positions along a dimension."""
        variable = self.variables.get(dimension.name)
        return variable if variable and variable.is_coordinate and variable.is_numeric else None

    def main_variable(self) -> Variable | None:
        """The one to show when none is asked for: of the numeric ones that are no coordinates, the
        first with the most dimensions; without such, any."""
        everything = list(self.variables.values())
        data = [each for each in everything if each.is_numeric and not each.is_coordinate]
        candidates = data or everything
        return max(candidates, key=lambda each: len(each.dimensions)) if candidates else None

    def read(self, variable: Variable, chosen: Mapping[str, int] | None = None) -> NDArray[Any]:
        """All values as the file stores them, in the library's order of dimensions: a view of the
        host's array, nothing is copied. Of the dimensions that `chosen` names, only that one
        position is read. The module's error where it cannot read the type."""
        member = variable.type.member or "text"
        shape = variable.shape
        if chosen:
            start, shape = self._block(variable, chosen)
            values = self.call(f"get_vara_{member}", variable.varid, host_order(start),
                               host_order(shape))
        else:
            values = self.call(f"get_var_{member}", variable.varid)
        if isinstance(values, str):  # one row of characters is a str
            values = np.array(list(values), dtype="U1")
        read: NDArray[Any] = values.reshape(shape[::-1], order="F").T
        return read

    def _block(self, variable: Variable,
               chosen: Mapping[str, int]) -> tuple[tuple[int, ...], tuple[int, ...]]:
        """Where the chosen part begins, and its lengths."""
        lengths = {each.name: each.length for each in variable.dimensions}
        for name, index in chosen.items():
            if name not in lengths:
                raise self.refusal("TESSEL:python:badIndex", wording.printable(
                    f"{variable.name} has no dimension {name}."), variable)
            if not 0 <= index < lengths[name]:
                raise self.refusal("TESSEL:python:badIndex", wording.printable(
                    f"{name} has {lengths[name]} positions, and none is {index}; the first is 0."),
                    variable)
        return (tuple(chosen.get(each.name, 0) for each in variable.dimensions),
                tuple(1 if each.name in chosen else each.length for each in variable.dimensions))

    def texts(self, variable: Variable) -> Iterator[str]:
        """The values of a text variable: one text for each run along the last dimension."""
        characters = self.read(variable)
        width = characters.shape[-1] if characters.ndim else 1
        # The low byte of a host character is the byte in the file.
        data = characters.astype("U1").view(np.uint32).astype(np.uint8).tobytes()
        for start in range(0, len(data), max(width, 1)):
            line = data[start:start + width].rstrip(b"\0 ")
            try:
                yield line.decode("utf-8")
            except UnicodeDecodeError:
                yield line.decode("latin-1")

    def values(self, variable: Variable,
               chosen: Mapping[str, int] | None = None) -> np.ma.MaskedArray[Any, Any]:
        """What `read` gives in the variable's own units: unpacked, and masked where it is
        missing."""
        stored = self.read(variable, chosen)
        missing = self._missing(variable, stored)
        if stored.dtype == np.int8 and variable.text("_Unsigned").lower() == "true":
            stored = stored.view(np.uint8)
        scale, offset = variable.number("scale_factor", 1), variable.number("add_offset", 0)
        if (scale, offset) != (1, 0):
            with np.errstate(all="ignore"):
                stored = stored * scale + offset
        return np.ma.MaskedArray(stored, missing)  # type: ignore[no-untyped-call]

    def _missing(self, variable: Variable, stored: NDArray[Any]) -> NDArray[np.bool_]:
        floating = stored.dtype.kind == "f"
        missing: NDArray[np.bool_] = (np.isnan(stored) if floating
                                      else np.zeros(stored.shape, bool))
        markers = [variable.numbers("missing_value"), variable.numbers("_FillValue")]
        if "_FillValue" not in variable.attributes and variable.type.fill:
            markers.append(self._netcdf("parameter", variable.type.fill).ravel())
        for marker in np.unique(np.concatenate(markers)):
            with np.errstate(all="ignore"):
                same = np.asarray(marker).astype(stored.dtype)
            if floating or same == marker:  # what the stored type cannot hold marks nothing
                missing |= stored == same
        return missing
