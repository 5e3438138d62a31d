# python/tessel/xarray/__init__.py: what this package is for users of xarray.
"""Labelled arrays from and into netCDF files: the engine "tessel" of xarray, and `to_netcdf`.

    >>> import xarray
    >>> dataset = xarray.open_dataset("sst.nc", engine="tessel")
    >>> tessel.xarray.to_netcdf(dataset, "copy.nc")

xarray finds the engine by itself wherever this package is; nothing needs to be imported for it. It
opens files of the classic and of the 64-bit offset format, and `to_netcdf` writes them. See
docs/xarray.md.
"""

from tessel.xarray.engine import TesselBackendEntrypoint
from tessel.xarray.store import TesselDataStore
from tessel.xarray.writing import to_netcdf

__all__ = ["TesselBackendEntrypoint", "TesselDataStore", "to_netcdf"]
