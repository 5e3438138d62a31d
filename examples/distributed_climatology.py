# examples/distributed_climatology.py: a climatology of many files, computed by several processes.
"""Computes the mean of every month over several files with Dask's distributed scheduler.

usage: distributed_climatology.py [FOLDER [SCHEDULER]]

Without a scheduler, one and two worker processes are started here. With the address of one, such
as tcp://192.0.2.1:8786, the workers that belong to it compute, on whatever hosts they are. They
must have this package, and see FOLDER under the same name: they open the files themselves, and put
what they have computed into the new one themselves.

Prints:

    6 files, 72 months, computed by 2 workers
    mean of the coldest month: 2.0 degrees, of the warmest: 18.0 degrees
    the same as computed by threads: True
"""

import sys
import tempfile
from pathlib import Path

import dask
import numpy as np
import pandas as pd
import xarray as xr
from distributed import Client, LocalCluster

import tessel
import tessel.xarray

LATS, LONS = 45, 90


def make(folder: Path) -> list[Path]:
    """A file for each of six years, with temperatures that have seasons and some noise."""
    random = np.random.default_rng(1)
    files = []
    for year in range(2001, 2007):
        time = pd.date_range(f"{year}-01-15", periods=12, freq=pd.DateOffset(months=1))
        seasons = 10 - 8 * np.cos(2 * np.pi * np.arange(12) / 12)
        noise = random.standard_normal((12, LATS, LONS))
        noise -= noise.mean(axis=(1, 2), keepdims=True)
        temperature = xr.DataArray(
            seasons[:, None, None] + noise, dims=("time", "lat", "lon"), name="temperature",
            coords={"time": time, "lat": np.linspace(-88, 88, LATS),
                    "lon": np.linspace(0, 356, LONS)}, attrs={"units": "degree_Celsius"})
        files.append(folder / f"temperature-{year}.nc")
        tessel.xarray.to_netcdf(temperature.to_dataset(), files[-1], unlimited_dims="time")
    return files


def compute(files: list[Path], target: Path) -> int:
    """Writes the climatology of the files by whatever scheduler is in use; returns how many months
    there are."""
    with xr.open_mfdataset(files, engine="tessel") as many, \
            tessel.progress_bar(target.name) as progress:
        climatology = many.groupby("time.month").mean("time")
        tessel.xarray.to_netcdf(climatology, target, progress=progress)
        return many.sizes["time"]


def main(folder: Path, scheduler: str | None) -> None:
    files = make(folder)
    if scheduler is None:
        cluster = LocalCluster(n_workers=2, threads_per_worker=1, dashboard_address=None,
                               local_directory=str(folder / "workers"))
    else:
        cluster = None
    with Client(cluster or scheduler) as client:  # from here on, it computes for Dask
        client.wait_for_workers(2)
        months = compute(files, folder / "climatology.nc")
        workers = len(client.scheduler_info()["workers"])
    if cluster:
        cluster.close()
    print(f"{len(files)} files, {months} months, computed by {workers} workers")

    with xr.open_dataset(folder / "climatology.nc", engine="tessel") as climatology:
        means = climatology.temperature.mean(("lat", "lon")).values
    print(f"mean of the coldest month: {means.min():.1f} degrees, "
          f"of the warmest: {means.max():.1f} degrees")

    with dask.config.set(scheduler="threads"):
        compute(files, folder / "by_threads.nc")
    same = (folder / "by_threads.nc").read_bytes() == (folder / "climatology.nc").read_bytes()
    print("the same as computed by threads:", same)


if __name__ == "__main__":  # worker processes import this file
    with tempfile.TemporaryDirectory() as made:
        main(Path(sys.argv[1] if len(sys.argv) > 1 else made),
             sys.argv[2] if len(sys.argv) > 2 else None)
