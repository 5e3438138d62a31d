# python/tessel/new_dataset.py: a netCDF file being made, through the module.
"""Makes a file of one of the classic formats: its definitions first, then its values."""

from __future__ import annotations

import threading
from collections.abc import Sequence
from types import TracebackType
from typing import Any

import numpy as np

import tessel
from tessel import wording
from tessel.dataset import Dataset

FORMATS = {"classic": "NOCLOBBER", "64bit-offset": "64BIT_OFFSET"}
"""The formats that can be written, and the library's constants that create them."""

_default_format = threading.Lock()


class NewDataset:
    """A new file. Use it in a `with` statement: it is closed at the end, or given up on an error.

    Define everything first; the first value that is put ends that. Values that are never put are
    undefined.
    """

    def __init__(self, path: str, form: str) -> None:
        if not isinstance(form, str) or form not in FORMATS:
            raise tessel.Error("TESSEL:python:badFormat", f"The format is one of "
                               f"{', '.join(FORMATS)}, not {wording.abridged(form)}.")
        self._netcdf = tessel.load("netcdf")
        self._defining = True
        self._closed = False
        self.path = path
        self.ncid = self._create(FORMATS[form])

    def parameter(self, name: str) -> float:
        """One of the library's constants."""
        return float(self._netcdf("parameter", name)[0, 0])

    def _create(self, constant: str) -> Any:
        mode = int(self.parameter("NOCLOBBER")) | int(self.parameter(constant))
        if constant != "NOCLOBBER":
            return self._netcdf("create", self.path, mode)
        # A mode without a format stands for the default, which only few programs change; for them
        # it is set back. Two threads at it at once would set back each other's.
        with _default_format:
            before = self._netcdf("set_default_format", self.parameter("FORMAT_CLASSIC"))
            try:
                return self._netcdf("create", self.path, mode)
            finally:
                self._netcdf("set_default_format", before)

    def __enter__(self) -> NewDataset:
        return self

    def __exit__(self, kind: type[BaseException] | None, error: BaseException | None,
                 traceback: TracebackType | None) -> None:
        if kind is not None:
            self._give_up()
            return
        self.close()

    def close(self) -> None:
        """Ends the definitions and closes the file, or gives it up on an error. A file that was
        closed stays as it is."""
        if self._closed:
            return
        try:
            self.end_definitions()
            self.call("sync")  # what cannot be written shows here, where giving up is possible
        except BaseException:
            self._give_up()
            raise
        self._closed = True
        self.call("close")

    def _give_up(self) -> None:
        if self._closed:
            return
        self._closed = True
        try:
            self.call("abort")
        except tessel.Error:
            pass  # the file is closed all the same, and the first error says more

    def call(self, operation: str, *arguments: object) -> Any:
        """An operation of the module on this file."""
        return self._netcdf(operation, self.ncid, *arguments)

    def define_dimension(self, name: str, length: int, unlimited: bool = False) -> int:
        """Defines a dimension; returns its number."""
        return int(self.call("def_dim", name, 0 if unlimited else length)[0, 0])

    def define_variable(self, name: str, number: int, dimids: Sequence[int]) -> int:
        """Defines a variable of a type over dimensions in the library's order; returns its
        number."""
        return int(self.call("def_var", name, number, np.array(dimids[::-1], float))[0, 0])

    def copy_attribute(self, source: Dataset, from_varid: int, name: str, to_varid: int) -> None:
        """Copies an attribute as it is."""
        source.call("copy_att", from_varid, name, self.ncid, to_varid)

    def end_definitions(self) -> None:
        """Ends the definitions, if they have not been ended yet."""
        if self._defining:
            self.call("set_fill", self.parameter("NOFILL"))  # everything is put anyway
            self.call("enddef")
            self._defining = False

    def put(self, operation: str, *arguments: object) -> None:
        """Puts values."""
        self.end_definitions()
        self.call(operation, *arguments)
