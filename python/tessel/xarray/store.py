# python/tessel/xarray/store.py: what is in a file, as xarray's variables and attributes.
"""The data store of the engine: variables that are read when their values are asked for."""

from __future__ import annotations

import os
from collections.abc import Mapping
from typing import Any

import numpy as np
from xarray import Variable as XarrayVariable
from xarray.backends import AbstractDataStore, CachingFileManager
from xarray.core import indexing
from xarray.core.utils import FrozenDict

import tessel
from tessel import paths
from tessel.dataset import Attribute, Variable
from tessel.xarray.array import LazyArray
from tessel.xarray.opening import OpenFile


def _opened(path: str, mode: str) -> OpenFile:  # pylint: disable=unused-argument
    """The open file. The mode is there because xarray gives one to a manager that was pickled,
    whether it had one or not."""
    return OpenFile(path)


class TesselDataStore(AbstractDataStore):
    """A file for xarray. It is opened again when xarray's cache of open files has dropped it."""

    def __init__(self, manager: CachingFileManager, path: str) -> None:
        self._manager = manager
        self._path = path

    @classmethod
    def open(cls, path: str | os.PathLike[Any]) -> TesselDataStore:
        """The store of a file."""
        given = paths.given(path)
        if "://" not in given:
            given = paths.absolute(os.path.expanduser(given))
        return cls(CachingFileManager(_opened, given, mode="r"), given)

    @property
    def file(self) -> OpenFile:
        """The open file."""
        return self._manager.acquire()

    def get_variables(self) -> Mapping[str, XarrayVariable]:
        """The variables by name, in the file's order."""
        return FrozenDict((name, self._variable(each))
                          for name, each in self.file.variables.items())

    def _variable(self, variable: Variable) -> XarrayVariable:
        array = LazyArray(self._manager, variable, self.file.mapped)
        attributes = _values(variable.attributes)
        fill = attributes.get("_FillValue")
        if variable.is_text and isinstance(fill, str):
            # Beside characters, which are bytes, it is the bytes that are in the file: a text that
            # has as many characters as bytes is one of Latin-1, or of ASCII.
            length = int(self.file.call("inq_att", variable.varid, "_FillValue")[1][0, 0])
            attributes["_FillValue"] = np.bytes_(fill.encode(
                "latin-1" if len(fill) == length else "utf-8"))
        encoding = {"source": self._path, "original_shape": array.shape, "dtype": array.dtype}
        return XarrayVariable([each.name for each in variable.dimensions],
                              indexing.LazilyIndexedArray(array), attributes, encoding)

    def get_attrs(self) -> Mapping[str, Any]:
        """The global attributes by name, in the file's order."""
        return FrozenDict(_values(self.file.attributes))

    def get_dimensions(self) -> Mapping[str, int]:
        """The lengths of all dimensions, in the file's order."""
        return FrozenDict((each.name, each.length) for each in self.file.dimensions)

    def get_encoding(self) -> dict[str, Any]:
        """Which dimensions are unlimited."""
        return {"unlimited_dims": {each.name for each in self.file.dimensions if each.unlimited}}

    def close(self) -> None:
        """Closes the file."""
        self._manager.close()


def _values(attributes: dict[str, Attribute]) -> dict[str, Any]:
    return {name: _value(each) for name, each in attributes.items()}


def _value(attribute: Attribute) -> Any:
    """A str, a number, or an array where there is not exactly one number."""
    value = attribute.value
    if isinstance(value, tessel.Error):
        raise value
    return value[0] if isinstance(value, np.ndarray) and value.size == 1 else value
