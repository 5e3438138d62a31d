# python/tessel/xarray/array.py: a variable whose values are read when they are asked for.
"""The arrays that xarray indexes."""

from __future__ import annotations

import math
import operator
from typing import Any

import numpy as np
from numpy.typing import NDArray
from xarray.backends import BackendArray, CachingFileManager
from xarray.core import indexing

from tessel.dataset import Variable
from tessel.transfer import blocks
from tessel.xarray import planning
from tessel.xarray.opening import FileWasClosed, OpenFile, refusal

DTYPES = {"schar": "i1", "text": "S1", "short": "i2", "int": "i4", "float": "f4", "double": "f8"}
"""The dtype by the member of the typed families that reads a variable."""

# A character takes two bytes in the host, one in its buffer, and four in Python.
_MEMORY_OF_CHARACTER = 12

_LINE = 64
"""The bytes that the processor brings into its caches together."""

_AT_ONCE = 2048
"""So many lines that are fetched ahead are still in the inner caches when the library comes to
them. For fewer it is not worth it."""


class LazyArray(BackendArray):
    """A variable of a file: a `planning.Reader`. It reads from whatever open file the manager has
    for it, so it can be pickled, and the file can be closed and opened in between."""

    def __init__(self, manager: CachingFileManager, variable: Variable, mapped: bool) -> None:
        self._manager = manager
        self._file: OpenFile | None = None  # the last one, because asking the manager takes longer
        self._name = variable.name
        self._type = variable.type
        # xarray reads these when it opens the dataset, and keeps them.
        self._once = variable.is_coordinate
        self._place = self._name, self._once
        self._in_records = any(each.unlimited for each in variable.dimensions[:1])
        self.shape = variable.shape
        self.dtype = np.dtype(DTYPES[str(variable.type.member)])
        self.memory = _MEMORY_OF_CHARACTER if variable.is_text else self.dtype.itemsize
        self.costs = planning.COSTS[mapped, variable.is_text]
        self._strides = [math.prod(self.shape[each + 1:]) * self.dtype.itemsize
                         for each in range(len(self.shape))]
        if self._in_records:
            self._strides[0] = 0  # which depends on what else is in a record

    def __getstate__(self) -> dict[str, Any]:
        return {**self.__dict__, "_file": None}

    def __getitem__(self, key: indexing.ExplicitIndexer) -> NDArray[Any]:
        if isinstance(key, indexing.VectorizedIndexer):
            return indexing.explicit_indexing_adapter(
                key, self.shape, indexing.IndexingSupport.OUTER, self._read)
        return self._read(key.tuple)

    def _read(self, key: tuple[planning.Selector, ...]) -> NDArray[Any]:
        return planning.read(self, key)

    def block(self, start: list[int], count: list[int]) -> NDArray[Any]:
        """The values of a block."""
        if not count:
            return self._values(count, "get_var")
        if not self._is_scattered(count):
            return self._values(count, "get_vara", start, count)
        values = np.empty(count, self.dtype)
        for offset, part in blocks(count, _AT_ONCE):
            first = list(map(operator.add, start, offset))
            file = self._file  # which another thread may take away
            if file and self._place in file.varids:
                file.fetch(file.varids[self._place], first, part, self._strides)
            values[tuple(slice(a, a + n) for a, n in zip(offset, part))] = self._values(
                part, "get_vara", first, part)
        return values

    def _is_scattered(self, count: list[int]) -> bool:
        """Whether a block is many values that are far from each other in the file."""
        return (math.prod(count) > _AT_ONCE and count[-1] == 1
                and self.shape[-1] * self.dtype.itemsize >= 2 * _LINE
                and self.memory <= self.dtype.itemsize)

    def strided(self, start: list[int], count: list[int], step: list[int]) -> NDArray[Any]:
        """Every n-th value from a start on."""
        return self._values(count, "get_vars", start, count, step)

    def _values(self, count: list[int], family: str, *places: list[int]) -> NDArray[Any]:
        while True:
            file = self._file or self._manager.acquire()
            try:
                varid = file.varids.get(self._place)
                if varid is None:
                    varid = self._varid(file)
                values = file.read_with(f"{family}_{self._type.member}", varid, *places,
                                        once=self._once)
                self._file = file
                break
            except FileWasClosed:  # by the cache, for another one, or with the dataset
                self._file = None
        if self._type.member == "text":
            values = _bytes(values)
        return values.T.reshape(count)  # a view of what the module gave

    def _varid(self, file: OpenFile) -> int:
        """The number of the variable, which must be what it was: since the dataset was opened, the
        file may have been opened again, and be another one. More records do not matter."""
        place = file.place_of(*self._place)
        shape = place.shape
        if self._in_records and shape[:1] >= self.shape[:1]:
            shape = self.shape[:1] + shape[1:]
        if place.xtype != self._type.number or shape != self.shape:
            raise refusal("fileChanged", f"The variable {self._name} is not any more what it was "
                          "when the dataset was opened.", file.place)
        file.varids[self._place] = place.varid
        return place.varid


def _bytes(characters: str | NDArray[Any]) -> NDArray[Any]:
    """Characters as bytes: the low byte of a host character is the byte in the file."""
    if isinstance(characters, str):
        encoded = characters.encode("utf-16-le", "surrogatepass")
        codes = np.frombuffer(encoded, np.uint16)
    else:
        codes = characters.ravel(order="F").view(np.uint32)
    return codes.astype(np.uint8).view("S1").reshape(np.shape(characters) or -1, order="F")
