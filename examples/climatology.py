# examples/climatology.py: from many files to a picture of the seasons, cell by cell.
"""Makes a seasonal cycle of monthly winds, eleven years of them in as many files, and draws it.

usage: climatology.py [FOLDER]    (without FOLDER, nothing is kept)

The winds are those of the Debian package ferret-datasets. The program is made of cells, as editors
that know notebooks show them; each ends with what it found out.

Prints:

    132 months from 1982-01 to 1992-12, in 11 files of 0.5 MB
    climatology of 12 months, 73 latitudes and 144 longitudes, in blocks of one month
    weakest and strongest month, 30 to 60 degrees north: May 2.8 m/s, January 5.3 m/s
    weakest and strongest month, 30 to 60 degrees south: May 5.7 m/s, November 6.4 m/s
    the picture is in seasonal_cycle.png
"""

# %% What it needs. The engine "tessel" is found by xarray itself.
import calendar
import sys
import tempfile
from pathlib import Path

import matplotlib
import numpy as np
import xarray as xr

import tessel
import tessel.xarray

matplotlib.use("Agg")
from matplotlib import pyplot as plt  # noqa: E402  pylint: disable=wrong-import-position

WINDS = Path("/usr/share/ferret-vis/data/monthly_navy_winds.cdf")
SCRATCH = tempfile.TemporaryDirectory()
FOLDER = Path(sys.argv[1] if len(sys.argv) > 1 else SCRATCH.name)

# %% A file for each year, as such data usually come. Winds are packed into 16 bits; if one did not
# fit, that would be an error.
PACKED = {"dtype": "int16", "scale_factor": 0.01, "_FillValue": -32768}

with xr.open_dataset(WINDS, engine="tessel") as winds:
    winds = winds.rename(TIME="time", FNOCY="lat", FNOCX="lon")
    for year, months in winds.groupby("time.year"):
        path = FOLDER / f"winds-{year}.nc"
        with tessel.progress_bar(path.name) as progress:
            tessel.xarray.to_netcdf(months, path, unlimited_dims="time", progress=progress,
                                    encoding={"UWND": PACKED, "VWND": PACKED})
    first, last = np.datetime_as_string(winds.time.values[[0, -1]], unit="M")

FILES = sorted(FOLDER.glob("winds-*.nc"))
print(f"{winds.sizes['time']} months from {first} to {last}, "
      f"in {len(FILES)} files of {FILES[0].stat().st_size / 1e6:.1f} MB")

# %% All files as one dataset. Nothing is computed yet.
many = xr.open_mfdataset(FILES, engine="tessel", chunks={"time": 1})
speed = np.hypot(many.UWND, many.VWND)
speed.attrs = {"long_name": "speed of the monthly mean wind", "units": "m/s"}
climatology = speed.groupby("time.month").mean("time", keep_attrs=True).to_dataset(name="speed")

# %% It is computed while it is written, so no more than some blocks are in memory at a time.
CYCLE = FOLDER / "climatology.nc"
with tessel.progress_bar("climatology") as progress:
    tessel.xarray.to_netcdf(climatology, CYCLE, progress=progress)
many.close()
sizes = climatology.speed.sizes
print(f"climatology of {sizes['month']} months, {sizes['lat']} latitudes and {sizes['lon']} "
      "longitudes, in blocks of one month")

# %% Means of zones weigh every latitude by the area that it stands for.
with xr.open_dataset(CYCLE, engine="tessel") as cycle:
    speed = cycle.speed.load()
zonal = speed.mean("lon")
area = np.cos(np.deg2rad(speed.lat))
ZONES = {"30 to 60 degrees north": slice(30, 60), "15 south to 15 north": slice(-15, 15),
         "30 to 60 degrees south": slice(-60, -30)}
cycles = {name: zonal.sel(lat=zone).weighted(area.sel(lat=zone)).mean("lat")
          for name, zone in ZONES.items()}
for name in ("30 to 60 degrees north", "30 to 60 degrees south"):
    each = cycles[name]
    found = [f"{calendar.month_name[int(month)]} {float(each.sel(month=month)):.1f} m/s"
             for month in (each.idxmin(), each.idxmax())]
    print(f"weakest and strongest month, {name}: {', '.join(found)}")

# %% The picture: every latitude, and the three zones.
INITIALS = [calendar.month_abbr[month][0] for month in range(1, 13)]
figure, (above, below) = plt.subplots(2, 1, figsize=(8, 7.5), layout="constrained",
                                      height_ratios=(3, 2), sharex=True)
shown = above.pcolormesh(zonal.month, zonal.lat, zonal.transpose("lat", "month"), cmap="viridis",
                         shading="nearest")
figure.colorbar(shown, ax=[above, below], label="wind speed in m/s", shrink=0.6, anchor=(0, 1))
above.set_title("Speed of the monthly mean wind, 1982 to 1992, mean of all longitudes")
above.set_ylabel("latitude in degrees")
above.set_yticks(range(-90, 91, 30))
for (name, each), colour in zip(cycles.items(), ("tab:blue", "tab:orange", "tab:red")):
    below.plot(each.month, each, marker="o", color=colour, label=name)
below.set_ylabel("wind speed in m/s")
below.set_ylim(bottom=0)
below.set_xticks(range(1, 13), INITIALS)
below.grid(alpha=0.3)
below.legend(loc="lower center", ncols=3, frameon=False, fontsize="small")
figure.savefig(FOLDER / "seasonal_cycle.png", dpi=120)
print("the picture is in seasonal_cycle.png")

SCRATCH.cleanup()
