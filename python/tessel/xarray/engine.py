# python/tessel/xarray/engine.py: the entry point by which xarray opens files through the module.
"""The engine "tessel"."""

from __future__ import annotations

import os
from collections.abc import Iterable
from typing import Any

from xarray import Dataset
from xarray.backends import BackendEntrypoint
from xarray.backends.store import StoreBackendEntrypoint

from tessel.xarray.opening import is_ours
from tessel.xarray.store import TesselDataStore


class TesselBackendEntrypoint(BackendEntrypoint):
    """Opens netCDF files of the classic and of the 64-bit offset format."""

    description = "Open netCDF files of the classic formats through the module \"netcdf\""

    def guess_can_open(self, filename_or_obj: Any) -> bool:
        """Whether it is a local file that begins as one of the two formats does."""
        try:
            return is_ours(filename_or_obj)
        except OSError:
            return False

    def open_dataset(  # type: ignore[override]  # pylint: disable=arguments-differ
            self, filename_or_obj: str | os.PathLike[Any], *, mask_and_scale: bool = True,
            decode_times: bool = True, concat_characters: bool = True, decode_coords: bool = True,
            drop_variables: str | Iterable[str] | None = None, use_cftime: bool | None = None,
            decode_timedelta: bool | None = None) -> Dataset:
        """The dataset in a file. Its variables are read when their values are asked for."""
        store = TesselDataStore.open(filename_or_obj)
        try:
            return StoreBackendEntrypoint().open_dataset(
                store, mask_and_scale=mask_and_scale, decode_times=decode_times,
                concat_characters=concat_characters, decode_coords=decode_coords,
                drop_variables=drop_variables, use_cftime=use_cftime,
                decode_timedelta=decode_timedelta)
        except BaseException:
            store.close()
            raise
