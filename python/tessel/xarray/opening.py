# python/tessel/xarray/opening.py: files that are open for reading, and which files those may be.
"""A file as the engine has it open.

The library has it open twice. One way is for what is read once, in many places, when a dataset is
opened: through the smallest buffer. The other is for the data, from the first time that they are
asked for: mapped into memory, which makes every later access faster, most of all those of few
values in many places. What was measured is in docs/xarray.md.

Both have a trap: where a mapped file is cut off later, looking at what is gone ends the process,
and from behind the end of a file that is not mapped the library reads zeros. So

- a file must be as long as what is in it needs when it is opened (`tessel.check`);
- while a mapped file is being read, what is gone is zeros instead of the end of the process
  (`tessel._faults`), and such a read is an error, as is every one after it;
- after each read, the file must still be as long as it has to be.

A file that is overwritten in place is another trap: the library remembers where the values were. So
its header must be, after each read, what it was when it was opened.
"""

from __future__ import annotations

import operator
import os
import threading
from functools import cached_property
from typing import Any, NamedTuple

import tessel
from tessel import _faults, beginning, integrity
from tessel.dataset import Dataset

_LAYOUT_BEGIN, _LAYOUT_END = 8, 2**16
"""The bytes of a file that may not change while it is open: those of its header, without the number
of records at its beginning. Of a header that is longer, the rest is not compared."""

FORMATS = (b"CDF\1", b"CDF\2")
"""How the files begin that the engine opens: the classic format and the one of 64-bit offsets."""

MAPPED = 16
"""The library's mode flag for mapping the file (NC_MMAP), which is none of its named constants."""

SMALL_BUFFER = 512
"""The bytes of the library's buffer for what is read in many places."""

LARGE_BUFFER = 8192
"""The bytes of the library's buffer for the data of a file that cannot be mapped."""


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

    `mapped` tells whether the data are read from memory that the file is mapped into, which is
    tried unless told not to.
    """

    def __init__(self, path: str, mapped: bool = True) -> None:
        self._lock = threading.RLock()
        self._ids: list[int] = []
        self._data: int | None = None
        self._gone = False
        self.varids: dict[tuple[str, bool], int] = {}
        """The numbers of the variables that were found to be what they are expected to be, by name
        and by whether they are read only once."""

        # A descriptor of our own: the path can lead to another file by now.
        self._descriptor = _descriptor_of(path)
        try:
            self.mapped = mapped
            self._layout_bytes = _LAYOUT_END - _LAYOUT_BEGIN
            self._layout = self._layout_now()  # before the library looks at it
            super().__init__(path)
            self._extent = self._extent_now()
            self._layout = self._layout[:max(self._extent.header - _LAYOUT_BEGIN, 0)]
            self._layout_bytes = len(self._layout)
            if not self._is_at_its_path():
                raise self._error("fileChanged", "The file was replaced while it was being opened.")
        except BaseException:
            self.close()
            raise

    def _extent_now(self) -> integrity.Extent:
        try:
            return integrity.extent(self) or integrity.Extent(0, 0, [], 0)
        except tessel.Error as error:
            if error.word == "fileTooShort":  # of many files, which one
                error.add_note(f"file: {self.place}")
            raise

    def _open(self) -> int:
        return self._opened("NOWRITE", SMALL_BUFFER)

    def _opened(self, mode: str | int, hint: int) -> int:
        """Another number of the library's for this very file."""
        path = self.path
        if not self._is_at_its_path():  # it was renamed or removed, but is still there for us
            path = f"/proc/self/fd/{self._descriptor}"
        _faults.begin()
        try:
            self._ids.append(self._netcdf._open(path, mode, hint).ncid)
        finally:
            self._gone |= _faults.end()
        return self._ids[-1]

    def _is_at_its_path(self) -> bool:
        try:
            return os.path.samestat(os.fstat(self._descriptor), os.stat(self.place))
        except OSError:
            return False

    @property
    def _id_for_data(self) -> int:
        """The library's number for reading the data, from the first time that they are read. It
        finds the values where the header of that time says."""
        if self._data is None:
            data = self._opened_for_data()
            self._want_all()  # it may have been another file since the last look
            self._data = data
        return self._data

    def _opened_for_data(self) -> int:
        if self.mapped:
            try:
                return self._opened(MAPPED, LARGE_BUFFER)
            except tessel.Error:
                self.mapped = False  # the file system, or what memory there is, does not have it
        return self._opened("NOWRITE", LARGE_BUFFER)

    @cached_property
    def _address(self) -> int | None:
        """Where the file is mapped to, from its beginning on; None where the system does not tell.
        Where it is mapped more than once, each of these places leads to the same memory."""
        inode = str(os.fstat(self._descriptor).st_ino)
        try:
            with open("/proc/self/maps", encoding="utf-8", errors="replace") as mappings:
                fields = [line.split(None, 5) for line in mappings]
        except OSError:
            return None
        return next((int(each[0].partition("-")[0], 16) for each in fields
                     if each[4] == inode and int(each[2], 16) == 0), None)

    def begin_of(self, varid: int) -> int | None:
        """Where a variable begins in the file; None where its header does not tell."""
        begins = self._extent.begins
        return begins[varid] if varid < len(begins) else None

    def fetch(self, varid: int, start: list[int], count: list[int], strides: list[int]) -> None:
        """Has the processor bring what is going to be read, in many places far from each other,
        into its caches: it does so for all of them at once, and the library asks for one after the
        other. `strides` has the bytes between the places along each dimension, and 0 for records.
        This is no access: nothing happens where there is no memory."""
        begin = self.begin_of(varid)
        with self._lock:
            address = self._address if self.mapped and self._data is not None else None
        if address is not None and begin is not None:
            steps = [each or self._extent.record for each in strides]
            first = address + begin + sum(map(operator.mul, start, steps))
            _faults.fetch(first, count, steps)

    def _error(self, word: str, message: str) -> tessel.Error:
        return refusal(word, message, self.place)

    def _id(self, once: bool) -> int:
        return self.ncid if once else self._id_for_data

    def read_with(self, operation: str, varid: int, *places: list[int], once: bool = False) -> Any:
        """What an operation that reads gives. The places are in the library's order. `once` is for
        what is not going to be read again; the number is that of `place_of` for the same."""
        method = getattr(self._netcdf, operation)
        with self._lock:
            if not self._ids:
                raise FileWasClosed
            self._want_length()  # a cut that was there before costs neither time nor memory
            ncid = self._id(once)
            in_host_order = [each[::-1] for each in places]
            _faults.begin()
            try:
                values = method(ncid, varid, *in_host_order)
            finally:
                self._gone |= _faults.end()
            self._want_all()
            return values

    def _layout_now(self) -> bytes:
        return os.pread(self._descriptor, self._layout_bytes, _LAYOUT_BEGIN)

    def _want_length(self) -> None:
        """Raises the error for a file that became shorter."""
        self._gone |= os.lseek(self._descriptor, 0, os.SEEK_END) < self._extent.least
        if self._gone:
            raise self._error("fileTooShort", "The file became shorter while it was open.")

    def _want_all(self) -> None:
        """Raises the error for a file that became shorter, or another one."""
        self._want_length()
        if self._layout_now() != self._layout:
            raise self._error("fileChanged", "The file was overwritten while it was open.")

    def place_of(self, name: str, once: bool = False) -> Place:
        """Where a variable is, for whoever reads it once, or more often."""
        with self._lock:
            if not self._ids:
                raise FileWasClosed
            self._want_all()
            ncid = self._id(once)
            varid = self._netcdf.inq_varid(ncid, name)
            found = self._netcdf.inq_var(ncid, varid)
            return Place(varid, found.xtype, tuple(self._netcdf.inq_dim(ncid, each).len
                                                   for each in reversed(found.dimids)))

    def close(self) -> None:
        """Closes the file after the calls in progress; more than once does no harm."""
        with self._lock:
            while self._ids:
                self._netcdf.close(self._ids.pop())
            if self._descriptor >= 0:
                os.close(self._descriptor)
                self._descriptor = -1


def _descriptor_of(path: str) -> int:
    """A descriptor of a file that is in one of the two formats."""
    if "://" in path or (os.path.exists(path) and not os.path.isfile(path)):
        raise _not_ours(path)
    descriptor = os.open(path, os.O_RDONLY)
    if os.pread(descriptor, len(FORMATS[0]), 0) not in FORMATS:
        os.close(descriptor)
        raise _not_ours(path)
    return descriptor


def _not_ours(path: str) -> tessel.Error:
    return not_classic("The engine \"tessel\" opens", path)


def not_classic(who_does_what: str, path: str) -> tessel.Error:
    """The error for a file that is in neither of the two formats, and what it is instead."""
    instead = ""
    if os.path.isdir(path):
        instead = ": it is a folder"
    elif os.path.isfile(path):
        instead = f": it {beginning.described(path, refused=False)}"
    return refusal("notAClassicFile", f"{who_does_what} files of the classic and of the 64-bit "
                   f"offset format, and this is none of them{instead}.", path)


def refusal(word: str, message: str, path: str) -> tessel.Error:
    """The error for what cannot be done with a file."""
    error = tessel.Error(f"TESSEL:python:{word}", message, path=path)
    error.add_note(f"file: {path}")
    return error
