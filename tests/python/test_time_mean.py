"""tests/python/test_time_mean.py: the file of the mean over time, against NumPy, read by SciPy,
ncdump and the module."""

from pathlib import Path

import numpy as np
import pytest
import tessel
from scipy.io import netcdf_file
from made_files import generate, run_tool
from tessel import show, time_mean
from tessel.dataset import Dataset

DIMENSIONS = """
dimensions:
    time = UNLIMITED ; lev = 2 ; lat = 3 ; lon = 4 ; two = 2 ; edge = 4 ; len = 5 ;
"""
COORDINATES = """
    double time(time) ; time:units = "days since 2001-01-01" ; time:bounds = "time_bnds" ;
    double time_bnds(time, two) ;
    float lat(lat) ; lat:units = "degrees_north" ; lat:edges = "latedges" ;
    float latedges(edge) ;
    short lon(lon) ; lon:units = "degrees_east" ; lon:bounds = "lon_bnds" ;
    int lon_bnds(lon, two) ;
    int cell(lat, lon) ; cell:long_name = "cell" ;
    char station(lat, len) ;
    double when(time) ;
"""
VALUES = """
    time = 0, 31, 59 ;
    lat = -1.5, 0, 1.5 ; latedges = -2, -1, 1, 2 ;
    lon = 10, 20, 30, 40 ; lon_bnds = 5, 15, 15, 25, 25, 35, 35, 45 ;
    cell = 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12 ;
    station = "ab", "c\\351", "12345" ;
"""


def field(tmp_path: Path, definition: str, values: str, kind: str = "classic") -> str:
    """A file with all the coordinates and one variable."""
    return generate(tmp_path / "field.nc", f"{DIMENSIONS}variables:{COORDINATES}{definition}\n"
                    f"data:\n{VALUES}{values}", kind)


def mean_of(path: str, name: str, target: Path) -> str:
    """Writes the mean, and returns over what."""
    with Dataset(path) as dataset:
        variable = dataset.find(name)
        return time_mean.write(dataset, variable, dataset.values(variable), str(target)).name


def attributes(variable: netcdf_file) -> dict:
    """The attributes of a SciPy variable."""
    return variable._attributes  # pylint: disable=protected-access


def test_mean_leaves_missing_values_out(tmp_path):
    data = np.arange(36, dtype=np.float32).reshape(3, 3, 4) * np.float32(0.1)
    data[0, 0, 0] = data[:, 1, 1] = data[1:, 2, 3] = -999
    data[1, 0, 1] = np.nan
    source = field(tmp_path, 'float t(time, lat, lon) ; t:_FillValue = -999.f ; t:units = "K" ; '
                   't:long_name = "temperature" ; t:valid_range = 0.f, 100.f ; '
                   't:coordinates = "cell station when nowhere" ; t:cell_methods = "area: mean" ;',
                   f"t = {', '.join(str(x).replace('nan', 'NaNf') for x in data.flat)};")
    target = tmp_path / "mean.nc"
    assert mean_of(source, "t", target) == "time"

    masked = np.ma.masked_invalid(np.ma.masked_equal(data, -999)).astype(float)
    expected = masked.mean(axis=0).astype(np.float32).filled(-999)
    with netcdf_file(target, mmap=False) as file:
        assert file.version_byte == 2
        assert file.dimensions == {"lat": 3, "lon": 4, "edge": 4, "two": 2, "len": 5}
        mean = file.variables["t"]
        assert mean.dimensions == ("lat", "lon")
        assert mean.data.dtype == ">f4"
        np.testing.assert_array_equal(mean.data, expected)
        assert list(attributes(mean)) == ["_FillValue", "units", "long_name", "valid_range",
                                          "coordinates", "cell_methods"]
        assert attributes(mean)["units"] == b"K"
        assert attributes(mean)["_FillValue"] == np.float32(-999)
        assert attributes(mean)["cell_methods"] == b"area: mean time: mean"
        assert set(file.variables) == {"t", "lat", "latedges", "lon", "lon_bnds", "cell", "station"}
        assert file.variables["lat"].data.tolist() == [-1.5, 0, 1.5]
        assert attributes(file.variables["lat"])["units"] == b"degrees_north"
        assert file.variables["latedges"].data.tolist() == [-2, -1, 1, 2]
        assert file.variables["lon"].data.dtype == ">i2"
        assert file.variables["lon_bnds"].data.tolist() == [[5, 15], [15, 25], [25, 35], [35, 45]]
        assert file.variables["cell"].data.ravel().tolist() == list(range(1, 13))
        assert file.variables["station"].data.tobytes() == b"ab\0\0\0c\xe9\0\0\x0012345"


def test_ncdump_reads_it(tmp_path):
    source = field(tmp_path, 'float t(time, lat, lon) ; t:missing_value = -1.f ;',
                   f"t = {', '.join('-1' if i % 12 == 5 else str(i) for i in range(36))} ;")
    target = tmp_path / "mean.nc"
    mean_of(source, "t", target)
    text = run_tool("ncdump", "-v", "t", target)
    assert "float t(lat, lon) ;" in text
    assert 't:cell_methods = "time: mean" ;' in text
    assert "t:missing_value = -1.f ;" in text
    assert "_FillValue" not in text
    assert text[text.index(" t =\n"):].split("=")[1].replace(";", "").replace("}", "").split() == \
        "12, 13, 14, 15, 16, -1, 18, 19, 20, 21, 22, 23".split()
    assert run_tool("ncdump", "-k", target).strip() == "64-bit offset"


def test_packed_integers_become_doubles_in_their_own_units(tmp_path):
    source = field(tmp_path, "short p(time, lat) ; p:scale_factor = 0.5 ; p:add_offset = 10. ; "
                   'p:_FillValue = -1s ; p:valid_min = 0s ; p:units = "m" ;',
                   "p = 0, 1, -1,  2, -1, -1,  4, 5, -1 ;")
    target = tmp_path / "mean.nc"
    mean_of(source, "p", target)
    with netcdf_file(target, mmap=False) as file:
        mean = file.variables["p"]
        assert mean.data.dtype == ">f8"
        fill = tessel.load("netcdf")("parameter", "NC_FILL_DOUBLE")[0, 0]
        assert mean.data.tolist() == [11, 11.5, fill]
        assert attributes(mean) == {"units": b"m", "cell_methods": b"time: mean",
                                    "_FillValue": fill}


def test_time_that_is_not_first_and_a_dimension_used_twice(tmp_path):
    path = generate(tmp_path / "late.nc", """
        dimensions: x = 2 ; t = 3 ;
        variables: double t(t) ; t:units = "hours since 1990-1-1" ; double v(x, t, t) ;
        data: t = 1, 2, 3 ; v = 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17 ;""")
    target = tmp_path / "mean.nc"
    assert mean_of(path, "v", target) == "t"
    with netcdf_file(target, mmap=False) as file:
        assert file.variables["v"].dimensions == ("x", "t")
        np.testing.assert_array_equal(file.variables["v"].data,
                                      np.arange(18.0).reshape(2, 3, 3).mean(axis=1))


def test_nothing_but_time_becomes_one_value(tmp_path):
    source = field(tmp_path, "double s(time) ;", "s = 1, 2, 6 ;")
    target = tmp_path / "mean.nc"
    mean_of(source, "s", target)
    with netcdf_file(target, mmap=False) as file:
        assert file.variables["s"].shape == ()
        assert file.variables["s"].getValue() == 3
        assert file.dimensions == {}


def test_types_that_the_format_lacks_are_kept_as_such_as_it_has(tmp_path):
    path = generate(tmp_path / "new.nc", """
        dimensions: t = 2 ; z = 3 ;
        variables: int64 t(t) ; t:units = "hours since 1990-1-1" ;
            int64 z(z) ; z:most = 7LL ; string z:note = "left out" ; ubyte kind(z) ;
            uint v(t, z) ; v:coordinates = "kind" ; v:_FillValue = 9U ; string v:units = "m" ;
        data: t = 0, 1 ; z = 5, 6, 4294967296 ; kind = 1, 2, 255 ;
            v = 1, 2, 9, 3, 9, 9 ;""", "netCDF-4")
    target = tmp_path / "mean.nc"
    mean_of(path, "v", target)
    with netcdf_file(target, mmap=False) as file:
        assert file.variables["v"].data[:2].tolist() == [2, 2]
        assert file.variables["v"].data[2] == attributes(file.variables["v"])["_FillValue"]
        assert file.variables["z"].data.tolist() == [5, 6, 4294967296]
        assert attributes(file.variables["z"]) == {"most": 7}
        assert file.variables["kind"].data.tolist() == [1, 2, 255]


@pytest.mark.parametrize(("definition", "values", "reason"), [
    ("double f(lat, lon) ;", "", "it has no dimension of time"),
    ("double g ;", "", "it has no dimension of time"),
])
def test_no_time(tmp_path, definition, values, reason):
    source = field(tmp_path, definition, values)
    with pytest.raises(time_mean.NoMean, match=reason):
        mean_of(source, definition.split()[1].partition("(")[0], tmp_path / "mean.nc")
    assert not (tmp_path / "mean.nc").exists()


def test_no_records(tmp_path):
    path = generate(tmp_path / "none.nc", """
        dimensions: t = UNLIMITED ; x = 2 ;
        variables: double t(t) ; t:units = "days since 2000-1-1" ; double v(t, x) ;""")
    with pytest.raises(time_mean.NoMean, match="it has no values"):
        mean_of(path, "v", tmp_path / "mean.nc")


def test_the_main_job_writes_and_shows_it(tmp_path, capsys):
    source = field(tmp_path, 'float t(time, lat, lon) ; t:evil = "\\033[31m" ;',
                   f"t = {', '.join(map(str, range(36)))} ;")
    folder = tmp_path / "out"
    assert show.main([source, "t", "--output", str(folder)]) == 0
    assert show.main([source, "t", "--output", str(folder)]) == 0  # over the first
    printed = capsys.readouterr().out
    assert sorted(each.name for each in folder.iterdir()) == ["field-t-time-mean.nc", "field-t.png"]
    assert f"The mean over time is in {folder}/field-t-time-mean.nc" in printed
    assert "float t(lat, lon) ;" in printed
    assert "\033" not in printed

    assert show.main([source, "cell", "--output", str(folder)]) == 0
    assert "\nNo mean over time: it has no dimension of time.\n" in capsys.readouterr().out
    assert not list(folder.glob("*cell*.nc"))
