# python/tessel/xarray/opening.py: files that are open for reading, and which files those may be.
"""A file as the engine has it open.

The library maps the file into memory (its mode flag 16), which makes every access faster, most of
all those of few values in many places; where it cannot, it reads through a small buffer. Both have
a trap: where a mapped file is cut off later, looking at what is gone ends the process, and from
behind the end of a file that is not mapped the library reads zeros. So

- a file must be as long as what is in it needs when it is opened (`tessel.check`),
- while a mapped file is being read, what is gone is zeros instead of the end of the process
  (`tessel._faults`), and such a read is an error, as is every one after it,
- after each read the file must still be as long as it has to be.
"""

from __future__ import annotations

import os
import threading
from collections.abc import Callable
from typing import Any, NamedTuple

import tessel
from tessel import _faults, integrity
from tessel.dataset import Dataset

FORMATS = (b"CDF\1", b"CDF\2")
"""How the files begin that the engine opens: the classic format and the one of 64-bit offsets."""

MAPPED = 16
"""The library's mode flag for mapping the file (NC_MMAP). It is none of the module's constants."""

BUFFER_HINT = 8192
"""The size of the library's buffer for a file that is not mapped; see docs/xarray.md."""


def is_ours(path: object) -> bool:
    """Whether it is the path of a file in one of the two formats."""
    if not isinstance(path, (str, os.PathLike)) or not os.path.isfile(path):
        return False
    with open(path, "rb") as file:
        return file.read(len(FORMATS[0])) in FORMATS


class FileWasClosed(Exception):
    """The file was closed by another thread, and is to be opened again."""


class Place(NamedTuple):
    """A variable of an open file."""

    varid: int
    xtype: int
    shape: tuple[int, ...]


class OpenFile(Dataset):
    """An open file that several threads may read, while another may close it.

    `mapped` tells whether the library has it mapped into memory, which is tried unless told not to.
    """

    def __init__(self, path: str, mapped: bool = True) -> None:
        self._lock = threading.RLock()
        self._is_open = False
        self._gone = False
        self._places: dict[str, Place] = {}
        # Beside the library's, a descriptor of our own: the path can lead to another file by now.
        self._descriptor = _descriptor_of(path)
        try:
            self.mapped = mapped
            super().__init__(path)
            self._is_open = True
            self._least = integrity.verify(self) or 0
            if not os.path.samestat(os.fstat(self._descriptor), os.stat(path)):
                raise self._error("fileChanged", "The file was replaced while it was being opened.")
        except BaseException:
            self.close()
            raise

    def _open(self) -> int:
        """The library's number for the file."""
        if self.mapped:
            try:
                return self._guarded(self._netcdf._open, self.path, MAPPED, BUFFER_HINT).ncid
            except tessel.Error:
                self.mapped = False  # as the file system cannot, or for what is named next
        return self._netcdf._open(self.path, "NOWRITE", BUFFER_HINT).ncid

    def _guarded(self, method: Callable[..., Any], *arguments: object) -> Any:
        """A call that may look at what is gone from a mapped file."""
        _faults.begin()
        try:
            return method(*arguments)
        finally:
            self._gone |= _faults.end()

    def _error(self, word: str, message: str) -> tessel.Error:
        return tessel.Error(f"TESSEL:python:{word}", message, path=self.place)

    def read(self, operation: str, varid: int, *places: list[int]) -> Any:
        """What an operation that reads gives. The places are in the library's order."""
        method = getattr(self._netcdf, operation)
        with self._lock:
            if not self._is_open:
                raise FileWasClosed
            values = self._guarded(method, self.ncid, varid, *(each[::-1] for each in places))
            self._gone |= os.fstat(self._descriptor).st_size < self._least
            if self._gone:
                raise self._error("fileTooShort", "The file became shorter while it was open.")
            return values

    def place_of(self, name: str) -> Place:
        """Where a variable is."""
        with self._lock:
            if not self._is_open:
                raise FileWasClosed
            if name not in self._places:
                varid = self._netcdf.inq_varid(self.ncid, name)
                found = self._netcdf.inq_var(self.ncid, varid)
                shape = tuple(self._netcdf.inq_dim(self.ncid, each).len
                              for each in reversed(found.dimids))
                self._places[name] = Place(varid, found.xtype, shape)
            return self._places[name]

    def close(self) -> None:
        """Closes the file after the calls in progress; more than once does no harm."""
        with self._lock:
            if self._is_open:
                self._is_open = False
                super().close()
            if self._descriptor >= 0:
                os.close(self._descriptor)
                self._descriptor = -1


def _descriptor_of(path: str) -> int:
    """A descriptor of a file that is in one of the two formats."""
    if not os.path.isfile(path) and os.path.exists(path):
        raise _not_ours(path)
    descriptor = os.open(path, os.O_RDONLY)
    if os.pread(descriptor, len(FORMATS[0]), 0) not in FORMATS:
        os.close(descriptor)
        raise _not_ours(path)
    return descriptor


def _not_ours(path: str) -> tessel.Error:
    return tessel.Error("TESSEL:python:notAClassicFile",
                        "The engine \"tessel\" opens files of the classic and of the 64-bit offset "
                        "format, and this is none of them.", path=path)
