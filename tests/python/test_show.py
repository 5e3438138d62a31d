"""tests/python/test_show.py: the main job, on a real file and on odd ones, as a person runs it."""

from __future__ import annotations

import os
import subprocess
import sys
from pathlib import Path

import numpy as np
import pytest
from made_files import generate
from scipy.io import netcdf_file

PNG = b"\x89PNG\r\n\x1a\n"


def show(*arguments: object, folder: Path) -> subprocess.CompletedProcess[str]:
    """Runs the main job."""
    command = [sys.executable, "-m", "tessel.show", "--output", folder, *arguments]
    return subprocess.run([str(word) for word in command], capture_output=True, text=True,
                          check=False, cwd=folder)


def climatology() -> str:
    """The real file."""
    files = subprocess.run(["dpkg", "-L", "ferret-datasets"], capture_output=True, check=True,
                           text=True).stdout.split()
    [path] = [file for file in files if file.endswith("/coads_climatology.cdf")]
    return path


def test_the_real_file(tmp_path: Path) -> None:
    done = show(climatology(), folder=tmp_path)
    assert done.returncode == 0 and done.stderr == ""
    with netcdf_file(climatology(), mmap=False) as dataset:
        values = dataset.variables["SST"][:].astype(np.float64)
    values = np.ma.masked_equal(values, np.float32(-1e34).astype(np.float64))
    for text in ("COADSX  180", "TIME     12  unlimited", "float SST(TIME, COADSY, COADSX)",
                 "SEA SURFACE TEMPERATURE",
                 f"range    {values.min():.7g} to {values.max():.7g} Deg C",
                 f"mean     {values.mean():.7g} Deg C",
                 f"missing  {100 * values.mask.mean():.1f} %"):
        assert text in done.stdout, text
    assert (tmp_path / "coads_climatology-SST.png").read_bytes().startswith(PNG)
    assert (tmp_path / "coads_climatology-SST-time-mean.nc").read_bytes().startswith(b"CDF\x02")


@pytest.mark.parametrize("arguments, message", [
    (["no-such-file.nc"],
     'Unable to open netCDF file, library error message "No such file or directory"'),
    ([__file__], 'Unable to open netCDF file, library error message "NetCDF: Unknown file format"'),
    ([climatology(), "NOPE"],
     'Variable ID retrieval failed, library error message "NetCDF: Variable not found"'),
])
def test_errors_are_the_modules_own_message(tmp_path: Path, arguments: list[str],
                                            message: str) -> None:
    done = show(*arguments, folder=tmp_path)
    assert (done.returncode, done.stdout, done.stderr) == (1, "", message + "\n")
    assert list(tmp_path.iterdir()) == []


def test_a_file_that_was_cut_off_is_named(tmp_path: Path) -> None:
    """The message is not the module's, and nothing else says which file."""
    path = generate(tmp_path / "cut.nc", "dimensions: x = 9 ; variables: int v(x) ; data: v = 1 ;")
    size = Path(path).stat().st_size
    os.truncate(path, size - 8)
    done = show(path, folder=tmp_path)
    assert (done.returncode, done.stdout) == (1, "")
    assert done.stderr == (f"The file is cut off: it has {size - 8} bytes, and what is in it needs "
                           f"{size}: {path}\n")


def test_wrong_usage_is_one_line(tmp_path: Path) -> None:
    done = show("a", "b", "\033[31mc", folder=tmp_path)
    assert (done.returncode, done.stdout) == (1, "")
    assert done.stderr == ("tessel.show: unrecognized arguments: \\x1b[31mc; "
                           "try tessel.show --help\n")


ODD = {
    "no variables": ("dimensions: x = 2 ;", "No picture: the file has no variables."),
    "a scalar": ("variables: double v ; data: v = 2.5 ;", "No picture: it is a single value."),
    "text": ('dimensions: n = 3 ; variables: char v(n) ; data: v = "abc" ;',
             "No picture: its values are text."),
    "a line": ("dimensions: x = 3 ; variables: float v(x) ; data: v = 1, 2, 4 ;", "The line is in"),
    "all missing": ("dimensions: x = 3 ; variables: float v(x) ; v:_FillValue = 1.f ; "
                    "data: v = 1, 1, 1 ;", "No picture: all its values are missing."),
    "a missing scalar": ("variables: float v ; v:_FillValue = 1.f ; data: v = 1 ;",
                         "No picture: all its values are missing."),
    "values beyond what is drawn": ("dimensions: x = 3 ; variables: double v(x) ; "
                                    "data: v = -1e308, 0, 1e308 ;",
                                    "No picture: it has values beyond 1e+300."),
    "positions beyond what is drawn": ("dimensions: x = 3 ; variables: double x(x), v(x) ; "
                                       "data: x = -1e308, 0, 1e308 ; v = 1, 2, 3 ;",
                                       "The line is in"),
    "infinite values": ("dimensions: x = 3 ; variables: double v(x) ; "
                        "data: v = -Infinity, 1, Infinity ;", "The line is in"),
    "packed values": ("dimensions: x = 3 ; variables: short v(x) ; v:scale_factor = 0.5 ; "
                      "v:add_offset = 10. ; v:missing_value = -1s ; data: v = -1, 0, 4 ;",
                      "range    10 to 12"),
    "texts": ('dimensions: n = 2 ; w = 5 ; variables: char v(n, w) ; data: v = "ab", "cdefg" ;',
              '  "ab"\n  "cdefg"\n'),
    "signs of formulas": ("dimensions: x = 2 ; variables: float v(x) ; "
                          'v:long_name = "cost $x_{$ in $" ; data: v = 1, 2 ;', "The line is in"),
    "a time that is none": ("dimensions: time = 2 ; variables: double time(time), v(time) ; "
                            'time:units = "fortnights since yesterday" ; '
                            "data: time = 1, 2 ; v = 1, 2 ;", "The line is in"),
    "no records": ("dimensions: t = UNLIMITED ; x = 3 ; variables: float v(t, x) ;",
                   "No picture: it has no values."),
}


@pytest.mark.parametrize("cdl, last", ODD.values(), ids=ODD.keys())
def test_odd_files(tmp_path: Path, cdl: str, last: str) -> None:
    done = show(generate(tmp_path / "odd.nc", cdl), folder=tmp_path)
    assert done.returncode == 0 and done.stderr == ""
    assert last in done.stdout


def test_a_type_that_the_module_cannot_read(tmp_path: Path) -> None:
    path = generate(tmp_path / "odd.nc", 'dimensions: x = 2 ; variables: string s(x) ; '
                    'data: s = "a", "b" ;', "netCDF-4")
    done = show(path, folder=tmp_path)
    assert done.returncode == 1 and "string s(x)" in done.stdout
    assert done.stderr == ('Variable data retrieval failed, library error message '
                           '"NetCDF: Attempt to convert between text & numbers"\n')


def test_a_file_cannot_steer_the_terminal(tmp_path: Path) -> None:
    path = generate(tmp_path / "odd.nc", r'dimensions: x = 1 ; variables: float v(x) ; '
                    r'v:note = "\033[2J\007\r" ; data: v = 1 ;')
    done = show(path, folder=tmp_path)
    assert done.returncode == 0
    assert not [c for c in done.stdout if ord(c) < 32 and c != "\n"]
