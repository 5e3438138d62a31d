# python/tessel/xarray/writing.py: labelled arrays into netCDF files.
"""Writes datasets of xarray through the module."""

from __future__ import annotations

import os
import shutil
from collections.abc import Hashable, Iterable, Mapping, MutableMapping
from typing import Any

import xarray
from numpy.typing import NDArray
from xarray import Variable
from xarray.backends.common import AbstractWritableDataStore
from xarray.conventions import _update_bounds_encoding, cf_encoder

import tessel
from tessel import integrity, notes, paths, wording
from tessel.aside import written_aside
from tessel.dataset import Dataset
from tessel.new_dataset import NewDataset
from tessel.transfer import BLOCK_BYTES, Progress, block_size, blocks, listener
from tessel.xarray import elsewhere, fitting, opening
from tessel.xarray.blocks import BlockWriter, Slot

FORMATS = {"NETCDF3_64BIT": "64bit-offset", "NETCDF3_64BIT_OFFSET": "64bit-offset",
           "64BIT-OFFSET": "64bit-offset", "NETCDF3_CLASSIC": "classic", "CLASSIC": "classic"}
"""The names of the formats, those of xarray and those of `tessel.copy`."""


@notes.told
def to_netcdf(dataset: xarray.Dataset | xarray.DataArray, path: paths.Path, mode: str = "w",
              format: str | None = None, *,  # pylint: disable=redefined-builtin
              unlimited_dims: Hashable | Iterable[Hashable] | None = None,
              encoding: Mapping[Any, Mapping[str, Any]] | None = None,
              progress: Progress | None = None, block_bytes: int = BLOCK_BYTES) -> None:
    """Writes a dataset into a file of the classic or of the 64-bit offset format. A DataArray is
    written as xarray's own `to_netcdf` does it, for `xarray.open_dataarray` to read.

        >>> packed = {"dtype": "int16", "scale_factor": 0.01, "_FillValue": -999}
        >>> tessel.xarray.to_netcdf(dataset, "sst.nc", encoding={"sst": packed})

    `format` is "NETCDF3_64BIT", which it is unless given, or "NETCDF3_CLASSIC". `unlimited_dims`
    and `encoding` are those of `xarray.Dataset.to_netcdf`: of the unlimited dimensions there can be
    one, which is the first of each of its variables.

    The file appears when it is complete, or not at all: it is written aside and renamed, over one
    of that name. With the mode "a", the variables are added to a file that there is, or put into
    it where it has them, with the attributes that they have now in place of those of before; a copy
    of it is what is worked on.

    A value that the type in the file does not hold is an error. 64-bit and unsigned integers become
    the signed ones of 32 bits or fewer when all of them fit.

    Dask arrays are written block by block as they are computed, and what is still in a file is read
    in blocks of `block_bytes`. `progress` is told the bytes that are done, and all bytes, before
    the first block and after each.
    """
    whole = _dataset(dataset)
    elsewhere.validate(whole)
    _want_names(whole, encoding)
    form = _format(format)
    if mode not in ("w", "a"):
        raise tessel.Error("TESSEL:python:badMode",
                           f"The mode is w or a, not {wording.abridged(mode)}.")
    size, tell = block_size(block_bytes), listener(progress)
    target = paths.given(path)
    adding = mode == "a" and os.path.exists(target)
    if adding and os.path.isfile(target) and not opening.is_ours(target):
        raise opening.not_classic("Variables can be added to", target)
    writer = BlockWriter()
    with written_aside(target, overwrite=True) as temporary:
        if adding:
            shutil.copyfile(target, temporary)
        with Reopened(temporary) if adding else NewDataset(temporary, form) as made:
            store = WritingStore(made, size)
            whole.dump_to_store(store, writer=writer, encoding=encoding,
                                unlimited_dims=_unlimited(whole, unlimited_dims))
            writer.write(made, tell, size)


def _dataset(given: Any) -> xarray.Dataset:
    """The dataset that is to be written."""
    if isinstance(given, xarray.Dataset):
        return given
    if not isinstance(given, xarray.DataArray):
        raise tessel.Error("TESSEL:python:unsupportedType",
                           "What is written is an xarray.Dataset or an xarray.DataArray, not of the "
                           f"type {type(given).__name__}.")
    # A variable that has no name, or that of one of its coordinates, gets one by which xarray knows
    # what it was called.
    if given.name is not None and given.name not in (*given.coords, *given.dims):
        return given.to_dataset()
    made = given.to_dataset(name=elsewhere.DATAARRAY_VARIABLE)
    if given.name is not None:
        made.attrs[elsewhere.DATAARRAY_NAME] = given.name
    return made


def _want_names(dataset: xarray.Dataset, encoding: Any) -> None:
    """Raises the error for an encoding of what is not there, or that is none."""
    given = {} if encoding is None else encoding
    if not isinstance(given, Mapping):
        raise tessel.Error("TESSEL:python:unsupportedType",
                           "encoding is a dict with a dict for each variable, as in "
                           '{"sst": {"dtype": "int16"}}.')
    for name, each in given.items():
        try:
            dict(each)
        except (TypeError, ValueError):
            raise tessel.Error("TESSEL:python:badEncoding",
                               f"The encoding of {name} must be castable to a dict, such as "
                               f'{{"dtype": "int16"}}, and is {wording.abridged(each)}.') from None
    missing = [each for each in given if each not in dataset.variables]
    if missing:
        raise tessel.Error("TESSEL:python:variableNotFound", "The dataset has no variables "
                           f"{wording.abridged(missing)}, for which there is an encoding.")


def _format(name: str | None) -> str:
    form = FORMATS.get("NETCDF3_64BIT" if name is None else str(name).upper())
    if form is None:
        raise tessel.Error("TESSEL:python:badFormat", "The format is one of NETCDF3_64BIT, "
                           f"NETCDF3_CLASSIC, not {wording.abridged(name)}.")
    return form


def _unlimited(dataset: xarray.Dataset, given: Any) -> list[Hashable]:
    """The unlimited dimensions: those asked for, or else those that the dataset had in its file and
    has still."""
    wanted = dataset.encoding.get("unlimited_dims", ()) if given is None else given
    wanted = [wanted] if isinstance(wanted, str) or not isinstance(wanted, Iterable) \
        else list(wanted)
    found = [each for each in wanted if each in dataset.dims]
    if given is not None and len(found) < len(wanted):
        missing = [each for each in wanted if each not in dataset.dims]
        raise tessel.Error("TESSEL:python:badDimensions",
                           f"The dataset has no dimensions {missing} that could be unlimited.")
    return found


class Reopened(NewDataset):
    """A file that there is already, to which definitions and values are added."""

    def __init__(self, path: str) -> None:  # pylint: disable=super-init-not-called
        with Dataset(path) as dataset:
            integrity.verify(dataset)
            self.dimensions = dataset.dimensions
            self.variables = dataset.variables
        self._netcdf = tessel.load("netcdf")
        self.path = path
        self.ncid = self._netcdf("open", path, "WRITE")
        self._defining = True
        self._closed = False
        try:
            self.call("redef")
        except BaseException:
            self._give_up()
            raise


class WritingStore(AbstractWritableDataStore):
    """What xarray defines a dataset in: the file that is being made."""

    def __init__(self, made: NewDataset, block_bytes: int) -> None:
        self._made = made
        self._netcdf = tessel.load("netcdf")
        self._block_bytes = block_bytes
        there = made if isinstance(made, Reopened) else None
        self._variables = there.variables if there else {}
        self._lengths: dict[Any, int] = {}
        self._dimids: dict[Any, int] = {}
        self._growing: set[Any] = {each.name for each in there.dimensions if each.unlimited} \
            if there else set()
        for dimid, each in enumerate(there.dimensions if there else []):
            self._lengths[each.name] = each.length
            self._dimids[each.name] = dimid

    def encode(self, variables: MutableMapping[Any, Variable],
               attributes: Mapping[Any, Any]) -> tuple[dict[Any, Variable], dict[Any, Any]]:
        """Everything as the file can have it."""
        _update_bounds_encoding(variables)
        packed = {name: fitting.checked(self._in_blocks(each), name)
                  for name, each in variables.items()}
        encoded, attributes = cf_encoder(packed, attributes)
        return ({name: fitting.external(each, name) for name, each in encoded.items()},
                {name: fitting.attribute(each, f"attribute {name!r}")
                 for name, each in attributes.items()})

    def _in_blocks(self, variable: Variable) -> Variable:
        """A variable whose values are still in a file becomes a Dask array when it is large, so
        that it is read in blocks."""
        if variable._in_memory or variable.chunks is not None \
                or variable.nbytes <= self._block_bytes:
            return variable
        most = max(self._block_bytes // variable.dtype.itemsize, 1)
        _, first = next(blocks(variable.shape, most))
        return variable.chunk(dict(zip(variable.dims, first)))

    def get_dimensions(self) -> Mapping[str, int]:
        """The lengths of the dimensions that there are already."""
        return self._lengths

    def set_dimension(self, dim: Any, length: int | None,  # pylint: disable=arguments-differ
                      is_unlimited: bool = False) -> None:
        """Defines a dimension."""
        # The only dimension of length 0 that the formats have is the unlimited one.
        self._lengths[dim] = length or 0
        growing = is_unlimited or length == 0
        self._dimids[dim] = self._made.define_dimension(dim, self._lengths[dim], growing)
        if growing:
            self._growing.add(dim)

    def set_attribute(self, k: Any, v: Any) -> None:
        """Puts a global attribute."""
        self._put_attribute(-1, k, v)

    def _put_attribute(self, varid: int, name: Any, value: bytes | NDArray[Any]) -> None:
        if isinstance(value, bytes):
            self._netcdf.put_att_text(self._made.ncid, varid, name, value)
            return
        member, external = fitting.EXTERNAL[value.dtype.name]
        getattr(self._netcdf, f"put_att_{member}")(self._made.ncid, varid, name,
                                                   self._netcdf.param(external), value)

    def prepare_variable(self, name: str, variable: Variable, check_encoding: bool = False,
                         unlimited_dims: Any = None) -> tuple[Slot, Any]:
        """Defines a variable; gives where its values go, and where they come from."""
        left = {key: value for key, value in variable.encoding.items()
                if (key, value) != ("_FillValue", None)}
        if check_encoding and left:
            raise tessel.Error("TESSEL:python:badEncoding", "unexpected encoding for the "
                               f"variable {name}: {', '.join(map(str, left))}.")
        for dim, length in zip(variable.dims, variable.shape):
            if self._lengths[dim] != length:
                raise tessel.Error("TESSEL:python:badDimensions", f"The dimension {dim} of "
                                   f"{name} has the length {length}, and not "
                                   f"{self._lengths[dim]} as elsewhere.")
        for dim in variable.dims[1:]:
            if dim in self._growing:
                raise tessel.Error("TESSEL:python:badDimensions", f"{dim} is unlimited, and so "
                                   f"must be the first dimension of {name}.")
        varid = self._defined(name, variable)
        # Of a variable that was there, no attribute may say of the new values what the old ones
        # meant: their scale, their units, which of them were missing.
        for key in self._variables[name].attributes if name in self._variables else ():
            if key not in variable.attrs:
                self._made.call("del_att", varid, key)
        for key, value in variable.attrs.items():
            self._put_attribute(varid, key, value)
        return Slot(varid, variable.dtype, variable.shape), variable.data

    def _defined(self, name: str, variable: Variable) -> int:
        """The number of a variable that is there now, if it was not before."""
        number = int(self._netcdf.param(fitting.EXTERNAL[variable.dtype.name][1]))
        there = self._variables.get(name)
        if there is None:
            return self._made.define_variable(name, number,
                                              [self._dimids[each] for each in variable.dims])
        dims = tuple(each.name for each in there.dimensions)
        if (dims, there.type.number) != (variable.dims, number):
            raise tessel.Error("TESSEL:python:badShape",
                               f"The file has a variable {name} already, of the type "
                               f"{there.type.name} over {dims}, which cannot take {variable.dtype} "
                               f"over {variable.dims}.")
        return there.varid
