# python/tessel/xarray/__init__.py: what this package is for users of xarray.
"""Labelled arrays from netCDF files: the engine "tessel" of xarray.

    >>> import xarray
    >>> dataset = xarray.open_dataset("sst.nc", engine="tessel")

xarray finds the engine by itself wherever this package is; nothing needs to be imported. It opens
files of the classic and of the 64-bit offset format. See docs/xarray.md.
"""

from tessel.xarray.engine import TesselBackendEntrypoint
from tessel.xarray.store import TesselDataStore

__all__ = ["TesselBackendEntrypoint", "TesselDataStore"]
