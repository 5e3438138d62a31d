# python/tessel/xarray/array.py: a variable whose values are read when they are asked for.
"""The arrays that xarray indexes."""

from __future__ import annotations

from typing import Any

import numpy as np
from xarray.backends import BackendArray, CachingFileManager
from xarray.core import indexing

from tessel.dataset import Variable

DTYPES = {"schar": "i1", "text": "S1", "short": "i2", "int": "i4", "float": "f4", "double": "f8"}
"""The dtype by the member of the typed families that reads a variable."""


class LazyArray(BackendArray):
    """A variable of a file."""

    def __init__(self, manager: CachingFileManager, variable: Variable) -> None:
        self._manager = manager
        self._varid = variable.varid
        self._member = variable.type.member
        self.shape = variable.shape
        self.dtype = np.dtype(DTYPES[self._member])

    def __getitem__(self, key: indexing.ExplicitIndexer) -> np.ndarray:
        return indexing.explicit_indexing_adapter(
            key, self.shape, indexing.IndexingSupport.BASIC, self._read)

    def _read(self, key: tuple[Any, ...]) -> np.ndarray:
        start, count, step, dropped = [], [], [], []
        for axis, (each, length) in enumerate(zip(key, self.shape)):
            if not isinstance(each, slice):
                each = slice(int(each), int(each) + 1)
                dropped.append(axis)
            places = range(length)[each]
            start.append(places.start)
            count.append((len(places) - 1) * places.step + 1 if places else 0)
            step.append(slice(None, None, places.step))
        values = self._block(start, count)[tuple(step)]
        return values.squeeze(tuple(dropped))

    def _block(self, start: list[int], count: list[int]) -> np.ndarray:
        if 0 in count:
            return np.empty(count, self.dtype)
        while True:
            file = self._manager.acquire()
            with file.lock:
                if file.is_open:
                    break
        if count:
            values = file.call(f"get_vara_{self._member}", self._varid, start[::-1], count[::-1])
        else:
            values = file.call(f"get_var_{self._member}", self._varid)
        if self._member == "text":
            if isinstance(values, str):
                values = np.array(list(values), "U1")
            values = values.view(np.uint32).astype(np.uint8).view("S1")
        return values.reshape(count[::-1], order="F").T
