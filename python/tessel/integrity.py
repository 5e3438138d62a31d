# python/tessel/integrity.py: whether a file is as long as what it says is in it.
"""Finds files that were cut off, which the library reads on as zeros without an error.

The layout of the classic formats is public, and what is in a file is known from inquiries, so the
header's length is known to the byte, and with it the places in the header that say where each
variable begins. The least size is where the last value ends. So a cut is seen wherever it takes a
value or a part of the header with it. One that takes nothing but padding, at most three bytes after
the last value or unused room behind it, is not, and does no harm.

Files that are built on HDF5 are not looked at: opening a shorter one than its own record of its
length is an error of the library.
"""

from __future__ import annotations

import math
import os
from dataclasses import dataclass
from typing import NamedTuple

import tessel
from tessel import notes, paths
from tessel.dataset import Dataset, external_type

_WORD = 4


@dataclass(frozen=True)
class _Form:
    """One of the classic formats: its name, and how many bytes of its headers hold a count, and a
    place in the file."""

    name: str
    count: int
    place: int

    @property
    def list_head(self) -> int:
        """The bytes before the elements of a list: what is listed, and how many there are."""
        return _WORD + self.count


_FORMS = {
    b"CDF\1": _Form("classic", 4, 4),
    b"CDF\2": _Form("64bit-offset", 4, 8),
    b"CDF\5": _Form("64bit-data", 8, 8),
}


@dataclass(frozen=True)
class _Variable:
    """What the inquiries say of a variable, and where the header says where it begins."""

    type: int
    size: int
    """The bytes of its values; of one record, for a variable of records."""

    in_records: bool
    entry: int
    """Where its type, its size and its beginning are in the header."""


def _form(path: str) -> _Form | None:
    """The classic format of a file; None for other formats, and for what is no file."""
    if not os.path.isfile(path):
        return None
    with open(path, "rb") as file:
        return _FORMS.get(file.read(_WORD))


def format_of(dataset: Dataset) -> str | None:
    """The name of the classic format of an open file; None for other formats."""
    form = _form(dataset.place)
    return form.name if form else None


@notes.told
def check(path: paths.Path) -> int | None:
    """Raises a tessel.Error, "TESSEL:python:fileTooShort", when a file is shorter than what is in
    it needs. Returns the least size in bytes that it must have, or None when its format is none of
    those that the library reads beyond their end: then there is nothing to check.
    """
    with Dataset(path) as dataset:
        return verify(dataset)


def verify(dataset: Dataset) -> int | None:
    """The same for an open file."""
    found = extent(dataset)
    return found.least if found else None


class Extent(NamedTuple):
    """How many bytes a file needs, and where in it they are."""

    header: int
    least: int
    """The least size that it must have, with all values."""

    begins: list[int | None]
    """Where each variable begins, by its number; None where the header does not tell."""

    record: int
    """From each record to the next."""

    counted: bool = True
    """Whether the header says how many records there are."""


def extent(dataset: Dataset) -> Extent | None:
    """The same, with what else is known then."""
    found, there = _measured(dataset)
    if found is not None and there < found.least:
        if not found.counted:
            raise tessel.Error("TESSEL:python:fileTooShort",
                               "The file does not say how many records it has: the number in its "
                               "header is -1, as in a stream that is still being written, and the "
                               "library would take that for as many as there can be.",
                               path=dataset.place)
        raise tessel.Error("TESSEL:python:fileTooShort",
                           f"The file is cut off: it has {there} bytes, and what is in it needs "
                           f"{found.least}.", path=dataset.place)
    return found


def missing(dataset: Dataset) -> int:
    """How many bytes of an open file were cut off, in whose place the library reads zeros."""
    found, there = _measured(dataset)
    return max(found.least - there, 0) if found is not None else 0


def _measured(dataset: Dataset) -> tuple[Extent | None, int]:
    """What a file needs, None for other formats, and the bytes that it has."""
    form = _form(dataset.place)
    if form is None:
        return None, 0
    header = _Header(dataset, form)
    with open(dataset.place, "rb") as file:
        return header.extent(file.read(header.length)), os.fstat(file.fileno()).st_size


def _padded(length: int) -> int:
    return length + -length % _WORD


class _Header:
    """The header of a file, put together from inquiries."""

    def __init__(self, dataset: Dataset, form: _Form) -> None:
        self._dataset = dataset
        self._form = form
        self._dimensions, variables, attributes, self._unlimited = (
            int(each[0, 0]) for each in dataset.call("inq"))
        self._lengths: list[int] = []
        self.length = _WORD + form.count + form.list_head
        for dimid in range(self._dimensions):
            name, length = dataset.call("inq_dim", dimid)
            self._lengths.append(int(length[0, 0]))
            self.length += self._name(name, "inq_dimid") + form.count
        self.length += self._attributes(-1, attributes) + form.list_head
        self._variables = [self._variable(varid) for varid in range(variables)]

    def _name(self, name: str, inquiry: str, *arguments: object) -> int:
        """The bytes of a name in the header."""
        try:
            self._dataset.call(inquiry, *arguments, name)
            length = len(name.encode("utf-8"))
        except (tessel.Error, UnicodeEncodeError):  # not UTF-8 in the file: it comes byte by byte
            length = len(name)
        return self._form.count + _padded(length)

    def _attributes(self, varid: int, count: int) -> int:
        """The bytes of a list of attributes."""
        return self._form.list_head + sum(
            self._attribute(varid, self._dataset.call("inq_attname", varid, number))
            for number in range(count))

    def _attribute(self, varid: int, name: str) -> int:
        try:
            number, count = (int(each[0, 0]) for each in
                             self._dataset.call("inq_att", varid, name))
        except tessel.Error:  # a name that cannot be asked for: at least it has no values
            number, count = 1, 0
        return (self._name(name, "inq_attid", varid) + _WORD + self._form.count
                + _padded(count * external_type(number).size))

    def _variable(self, varid: int) -> _Variable:
        name, number, dimids, attributes = self._dataset.call("inq_var", varid)
        places = [int(each) for each in dimids.ravel()[::-1]]
        self.length += (self._name(name, "inq_varid") + self._form.count
                        + len(places) * self._form.count
                        + self._attributes(varid, int(attributes[0, 0])))
        in_records = bool(places) and places[0] == self._unlimited
        kind = external_type(int(number[0, 0]))
        size = kind.size * math.prod(self._lengths[each] for each in places[in_records:])
        entry = self.length
        self.length += _WORD + self._form.count + self._form.place
        return _Variable(kind.number, size, in_records, entry)

    def extent(self, header: bytes) -> Extent:
        """What the file must have, given the bytes of its header."""
        records = self._lengths[self._unlimited] if self._unlimited >= 0 else 0
        recorded = [each.size for each in self._variables if each.in_records]
        # A single variable of records goes without padding between them.
        step = recorded[0] if len(recorded) == 1 else sum(map(_padded, recorded))
        total = self.length
        ends = [0]
        begins = [self._beginning(each, header) for each in self._variables]
        for variable, begin in zip(self._variables, begins):
            repeated = records if variable.in_records else 1
            total += repeated * variable.size
            if repeated and variable.size and begin is not None:
                ends.append(begin + (repeated - 1) * step + variable.size)
        return Extent(self.length, max(total, *ends), begins, step,
                      header[_WORD:_WORD + self._form.count] != b"\xff" * self._form.count)

    def _beginning(self, variable: _Variable, header: bytes) -> int | None:
        """Where a variable begins; None where the header is not as the inquiries say."""
        place = variable.entry + _WORD + self._form.count
        number = int.from_bytes(header[variable.entry:variable.entry + _WORD], "big")
        if number != variable.type or place + self._form.place > len(header):
            return None
        return int.from_bytes(header[place:place + self._form.place], "big")
