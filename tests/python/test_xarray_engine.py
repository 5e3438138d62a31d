# tests/python/test_xarray_engine.py: datasets through the engine "tessel" of xarray.
"""The engine beside xarray's own, and what happens to files while they are open."""

from __future__ import annotations

import ctypes
import gc
import io
import os
import pickle
import shutil
import signal
import subprocess
import sys
import threading
import types
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

import netCDF4
import numpy as np
import pytest
import tessel
import xarray
from made_files import EVERYTHING, generate, open_descriptors
from scipy.io import netcdf_file
from tessel import _faults
from tessel.xarray import TesselBackendEntrypoint, TesselDataStore, opening, planning, to_netcdf
from tessel.xarray.opening import OpenFile
from xarray.backends.plugins import guess_engine, list_engines

KINDS = ("classic", "64-bit offset")
OTHERS = ("netcdf4", "scipy")
DECODING = ({}, {"decode_times": False}, {"decode_cf": False},
            {"mask_and_scale": False, "concat_characters": False, "decode_times": False})

MORE = EVERYTHING.replace("variables:", """variables:
    char marked(wide) ;
        marked:_FillValue = "x" ;
    int time(record) ;
        time:units = "days since 2001-02-03" ;
    short packed(high) ;
        packed:scale_factor = 0.5 ; packed:add_offset = 10.f ; packed:_FillValue = -1s ;
        packed:missing_value = -1s ; packed:coordinates = "scalar" ;
    double empty(high) ;
        empty:summer = "SUMMER" ; empty:blank = " a \\n" ;
        empty:letter = "a" ; empty:a1 = -1b, 2b ; empty:a2 = 5 ; empty:a3 = 1.5f ;
        empty:a4 = 2.5, 3.5, NaN ; empty:a5 = 3s ; empty:a6 = 7b ; empty:a7 = 2.5 ;
""").replace("data:", """data:
    marked = "axbx" ; time = 1, 2, 4 ; packed = 1, -1, 3 ;
""").replace("SUMMER", "\u00e9t\u00e9".encode().decode("latin-1"))
"""Everything, and what CF conventions are about."""


def ferret_files() -> list[str]:
    """The files of the package ferret-datasets."""
    listed = subprocess.run(["dpkg", "-L", "ferret-datasets"], check=True, capture_output=True)
    return [each for each in listed.stdout.decode().split() if each.endswith((".cdf", ".nc"))]


def opened(path: str, engine: str, **options: object) -> xarray.Dataset | str:
    """A dataset in memory, or why xarray cannot decode it."""
    try:
        with xarray.open_dataset(path, engine=engine, **options) as dataset:
            return dataset.load()
    except ValueError as error:
        return str(error)


@pytest.fixture(params=KINDS)
def everything(request: pytest.FixtureRequest, tmp_path: Path) -> str:
    return generate(tmp_path / "everything.nc", MORE, request.param)


@pytest.fixture
def cubes(tmp_path: Path) -> list[str]:
    """Four files of records that follow each other."""
    paths = []
    for number in range(4):
        paths.append(str(tmp_path / f"cube{number}.nc"))
        with netcdf_file(paths[-1], "w", version=2) as file:
            for name, length in (("time", None), ("y", 30), ("x", 40)):
                file.createDimension(name, length)
            file.createVariable("time", "d", ("time",))[:] = np.arange(5.0) + 5 * number
            file.createVariable("v", "f", ("time", "y", "x"))[:] = \
                np.arange(5 * 30 * 40, dtype="f4").reshape(5, 30, 40) + 10000 * number
            file.variables["time"].units = "days since 2000-01-01"
    return paths


def python(code: str, *arguments: str) -> subprocess.CompletedProcess[str]:
    """A program in an interpreter of its own."""
    return subprocess.run([sys.executable, "-B", "-c", code, *arguments], text=True,
                          capture_output=True, check=False)


# Being found.


def test_xarray_finds_the_engine_by_itself() -> None:
    done = python("import sys, xarray\n"
                  "assert 'tessel' not in sys.modules\n"
                  "print(type(xarray.backends.list_engines()['tessel']))")
    assert done.stdout == "<class 'tessel.xarray.engine.TesselBackendEntrypoint'>\n", done.stderr
    assert "warn" not in done.stderr.lower()


def test_the_package_itself_needs_no_xarray() -> None:
    done = python("import sys, tessel\nassert 'xarray' not in sys.modules")
    assert done.returncode == 0, done.stderr


def test_the_default_engines_stay_what_they_are(everything: str) -> None:
    engines = list(list_engines())
    assert "tessel" in engines
    assert all(engines.index(each) < engines.index("tessel") for each in ("netcdf4", *OTHERS))
    assert guess_engine(everything) == "netcdf4"


def test_the_engine_is_guessed_where_there_is_no_other(everything: str,
                                                       monkeypatch: pytest.MonkeyPatch) -> None:
    only = {"tessel": list_engines()["tessel"]}
    monkeypatch.setattr("xarray.backends.plugins.list_engines", lambda: only)
    with xarray.open_dataset(everything, decode_times=False) as dataset:
        assert dataset.title == "everything"


# What is in a file.


@pytest.mark.parametrize("options", DECODING, ids=str)
@pytest.mark.parametrize("path", ferret_files(), ids=os.path.basename)
def test_real_files_are_what_the_other_engines_say(path: str, options: dict[str, object]) -> None:
    ours = opened(path, "tessel", **options)
    for engine in OTHERS:
        theirs = opened(path, engine, **options)
        if isinstance(ours, str):
            assert ours == theirs
        else:
            xarray.testing.assert_identical(ours, theirs)
            same_details(ours, theirs, engine)


def same_details(ours: xarray.Dataset, theirs: xarray.Dataset, engine: str) -> None:
    """What `assert_identical` does not look at."""
    assert list(ours.variables) == list(theirs.variables)
    assert ours.encoding["unlimited_dims"] == theirs.encoding["unlimited_dims"]
    for name in ours.variables:
        mine, other = ours[name], theirs[name]
        assert mine.dtype == other.dtype and mine.dims == other.dims
        same_attributes(mine.attrs, other.attrs, engine)
        for key in ("source", "original_shape") if engine == "netcdf4" else ():
            assert mine.encoding[key] == other.encoding[key]
        for key in ("dtype", "_FillValue", "missing_value", "scale_factor", "add_offset", "units",
                    "calendar", "coordinates"):
            assert (key in mine.encoding) == (key in other.encoding), (name, key)
            np.testing.assert_equal(mine.encoding.get(key), other.encoding.get(key))
    same_attributes(ours.attrs, theirs.attrs, engine)


def same_attributes(ours: dict[str, object], theirs: dict[str, object], engine: str) -> None:
    assert list(ours) == list(theirs)
    for name, value in ours.items():
        other = theirs[name]
        np.testing.assert_equal(value, other)
        assert isinstance(value, np.ndarray) == isinstance(other, np.ndarray), name
        if engine == "netcdf4":  # SciPy leaves numbers in the byte order of the file
            assert type(value) is type(other), name
            assert getattr(value, "dtype", None) == getattr(other, "dtype", None), name


@pytest.mark.parametrize("options", DECODING, ids=str)
def test_everything_is_what_the_other_engines_say(everything: str,
                                                  options: dict[str, object]) -> None:
    ours = opened(everything, "tessel", **options)
    for engine in OTHERS:
        theirs = opened(everything, engine, **options)
        xarray.testing.assert_identical(ours, theirs)
        same_details(ours, theirs, engine)


def test_texts_that_are_not_utf8(tmp_path: Path) -> None:
    """Where others lose the bytes, they come as Latin-1; a text ends at its first zero byte."""
    path = generate(tmp_path / "latin.nc", """variables: int v ;
        v:latin = "\\351t\\351" ; v:ended = "a\\000b" ; v:none = "" ;""")
    with xarray.open_dataset(path, engine="tessel") as dataset:
        assert dataset.v.attrs == {"latin": "\u00e9t\u00e9", "ended": "a", "none": ""}


def test_markers_of_characters_beyond_ascii(tmp_path: Path) -> None:
    """A marker is the bytes that are in the file, whatever a text of these bytes would be."""
    path = str(tmp_path / "marked.nc")
    markers = {"plain": b"x", "high": b"\xff", "letter": b"\xe9", "two": b"\xc3\xa9",
               "latin": b"\xe9\xc3"}
    with netcdf_file(path, "w") as file:  # which lets a marker have two bytes
        file.createDimension("x", 3)
        for name, marker in markers.items():
            file.createVariable(name, "S1", ("x",))[:] = [b"a", marker[:1], b"\xe8"]
            file.variables[name]._FillValue = marker
    for engine in ("tessel", "scipy"):  # "netcdf4" cannot open such a file
        raw = opened(path, engine, decode_cf=False)
        assert {name: raw[name].attrs["_FillValue"] for name in raw} == markers
    masked = opened(path, "tessel", concat_characters=False)
    xarray.testing.assert_identical(masked, opened(path, "scipy", concat_characters=False))
    assert masked.high.isnull().values.tolist() == [False, True, False]
    copied = str(tmp_path / "copied.nc")
    to_netcdf(masked[["plain", "high", "letter"]], copied)
    again = opened(copied, "scipy", decode_cf=False)
    for name in again:
        assert again[name].attrs["_FillValue"] == markers[name]
        assert again[name].values.tobytes() == raw[name].values.tobytes()


def test_names_in_utf8(tmp_path: Path) -> None:
    path = str(tmp_path / "names.nc")
    with netCDF4.Dataset(path, "w", format="NETCDF3_CLASSIC") as file:
        file.createDimension("gr\u00f6\u00dfe", 2)
        variable = file.createVariable("\u6e29\u5ea6", "f4", ("gr\u00f6\u00dfe",))
        variable.setncattr("\u00e9t\u00e9", "\u00e9t\u00e9")
        variable[:] = 1, 2
    xarray.testing.assert_identical(opened(path, "tessel"), opened(path, "netcdf4"))


def test_values_are_read_when_they_are_asked_for(cubes: list[str],
                                                 monkeypatch: pytest.MonkeyPatch) -> None:
    read = []
    original = OpenFile.read_with

    def spy(self: OpenFile, operation: str, varid: int, *places: list[int],
            **options: bool) -> object:
        read.append((varid, *places))
        return original(self, operation, varid, *places, **options)

    monkeypatch.setattr(OpenFile, "read_with", spy)
    with xarray.open_dataset(cubes[0], engine="tessel", decode_times=False) as dataset:
        assert read == [(0, [0], [5])]  # the coordinate, which xarray makes an index of
        part = dataset.v.isel(time=2)[4:8]
        assert len(read) == 1
        part.load()
        assert read[1:] == [(1, [2, 4, 0], [1, 4, 40])]


def test_a_vectorised_selection(cubes: list[str]) -> None:
    points = {"y": xarray.DataArray([3, 1, 29, 3], dims="p"),
              "x": xarray.DataArray([0, 39, -1, 5], dims="p")}
    with xarray.open_dataset(cubes[0], engine="tessel") as ours, \
            xarray.open_dataset(cubes[0], engine="netcdf4") as theirs:
        xarray.testing.assert_identical(ours.isel(points).load(), theirs.isel(points).load())


def test_many_files_as_one(cubes: list[str]) -> None:
    for options in ({}, {"parallel": True}, {"chunks": {"time": 2, "x": 7}}):
        with xarray.open_mfdataset(cubes, engine="tessel", **options) as ours, \
                xarray.open_mfdataset(cubes, engine="netcdf4", **options) as theirs:
            assert ours.v.chunks and ours.sizes["time"] == 20
            xarray.testing.assert_identical(ours.mean("time").load(), theirs.mean("time").load())
            xarray.testing.assert_identical(ours.load(), theirs.load())


# Files that are not for the engine.


@pytest.mark.parametrize("beginning", [b"\x89HDF\r\n\x1a\n", b"CDF\5", b"CDF", b"", b"netcdf x {"])
def test_a_file_of_another_format(tmp_path: Path, beginning: bytes) -> None:
    path = tmp_path / "other.nc"
    path.write_bytes(beginning + bytes(100) if len(beginning) > 3 else beginning)
    assert not TesselBackendEntrypoint().guess_can_open(path)
    with pytest.raises(tessel.Error, match="The engine \"tessel\" opens files of the classic"):
        xarray.open_dataset(path, engine="tessel")
    assert str(path) not in open_descriptors()


def test_a_real_file_of_another_format(tmp_path: Path) -> None:
    path = tmp_path / "four.nc"
    with netCDF4.Dataset(path, "w") as file:
        file.title = "four"
    with pytest.raises(OSError, match=r"none of them: it begins like an HDF5 file \(as netCDF-4 "
                                      r"files do\) \(\d+ bytes\)\.$"):
        xarray.open_dataset(path, engine="tessel")
    with xarray.open_dataset(path) as dataset:
        assert dataset.title == "four"


def test_what_is_no_file(tmp_path: Path) -> None:
    guess = TesselBackendEntrypoint().guess_can_open
    for each in (tmp_path, tmp_path / "missing.nc", "http://localhost/a.nc", b"CDF\1", None, 3,
                 "nul\0", object()):
        assert not guess(each)
    with pytest.raises(FileNotFoundError):
        xarray.open_dataset(tmp_path / "missing.nc", engine="tessel")
    for path in (tmp_path, "http://localhost/a.nc"):
        with pytest.raises(OSError) as raised:
            xarray.open_dataset(path, engine="tessel")
        assert raised.value.word == "notAClassicFile"
        assert str(raised.value).endswith(": it is a folder." if path is tmp_path else " of them.")
    page = tmp_path / "page.nc"
    page.write_text("<!DOCTYPE html><title>Not found")
    with pytest.raises(OSError, match="none of them: it is a web page, perhaps what a server"):
        xarray.open_dataset(page, engine="tessel")
    pipe = tmp_path / "pipe.nc"
    os.mkfifo(pipe)
    with pytest.raises(OSError, match=r"none of them\.$"):  # to read it would be to wait
        xarray.open_dataset(pipe, engine="tessel")
    for none in (3, io.BytesIO(b"CDF\1")):
        with pytest.raises(TypeError, match="A path is a str"):
            xarray.open_dataset(none, engine="tessel")


def test_a_file_that_must_not_be_read(everything: str) -> None:
    os.chmod(everything, 0)
    done = python("""
import os, sys
from tessel import _faults
from tessel.xarray import TesselBackendEntrypoint
if os.geteuid() == 0:  # who may read everything
    os.seteuid(65534)
engine = TesselBackendEntrypoint()
assert not engine.guess_can_open(sys.argv[1])
try:
    engine.open_dataset(sys.argv[1])
except PermissionError as error:
    print(error.filename)""", everything)
    assert done.stdout == f"{everything}\n", done.stderr


# Files that come and go.


def test_all_is_closed_with_the_dataset(cubes: list[str]) -> None:
    dataset = xarray.open_dataset(cubes[0], engine="tessel")
    dataset.v[0].load()
    assert cubes[0] in open_descriptors()
    dataset.close()
    assert cubes[0] not in open_descriptors()
    assert dataset.v[1, 2, 3] == 1200 + 83  # it is opened again where it is needed
    assert cubes[0] in open_descriptors()
    del dataset
    gc.collect()
    assert cubes[0] not in open_descriptors()


def test_a_pickled_dataset_is_read_elsewhere(cubes: list[str], tmp_path: Path) -> None:
    with xarray.open_dataset(cubes[1], engine="tessel") as dataset:
        data = pickle.dumps(dataset)
        assert len(data) < 20_000  # without the values
        xarray.testing.assert_identical(pickle.loads(data).load(), dataset.load())
    (tmp_path / "pickled").write_bytes(data)
    done = python("import pickle, sys\n"
                  "dataset = pickle.load(open(sys.argv[1], 'rb'))\n"
                  "print(float(dataset.v[4, 29, 39]))", str(tmp_path / "pickled"))
    assert done.stdout == "15999.0\n", done.stderr


def test_files_that_the_cache_drops_are_opened_again(cubes: list[str]) -> None:
    """Threads that read from four files, of which one at a time can be open."""
    with xarray.set_options(file_cache_maxsize=1):
        datasets = [xarray.open_dataset(path, engine="tessel", cache=False) for path in cubes]

        def read(turn: int) -> None:
            number = turn * 7 % 4
            values = datasets[number].v[turn % 5, :, ::3].values
            expected = np.arange(1200, dtype="f4").reshape(30, 40)[:, ::3] + 1200 * (turn % 5)
            np.testing.assert_array_equal(values, expected + 10000 * number)

        with ThreadPoolExecutor(6) as pool:
            list(pool.map(read, range(400)))
        assert len({each for each in open_descriptors() if each in cubes}) <= 1
        for dataset in datasets:
            dataset.close()


def test_another_file_in_its_place(cubes: list[str], tmp_path: Path) -> None:
    """While it is open, it is read on; when it has to be opened again, the other one is found."""
    path = str(tmp_path / "place.nc")
    shutil.copy(cubes[0], path)
    dataset = xarray.open_dataset(path, engine="tessel", cache=False)
    os.replace(generate(tmp_path / "other.nc", "dimensions: y = 2; variables: float v(y);"), path)
    assert dataset.v[1, 0, 0] == 1200
    os.remove(path)
    assert dataset.v[2, 0, 0] == 2400
    dataset.close()
    generate(Path(path), "dimensions: y = 2; variables: float v(y);")
    with pytest.raises(OSError, match="v is not any more what it was"):
        dataset.v[1, 0, 0].load()
    dataset.close()


def test_a_file_that_grew(cubes: list[str]) -> None:
    dataset = xarray.open_dataset(cubes[0], engine="tessel", cache=False)
    with netcdf_file(cubes[0], "a") as file:
        file.variables["v"][7] = np.full((30, 40), 5, "f4")
    assert dataset.v[4, 0, 0] == 4800
    dataset.close()
    assert dataset.v[4, 0, 0] == 4800 and dataset.v.shape == (5, 30, 40)
    dataset.close()


LAYOUTS = {  # other places of the same variables, and the same places of others
    "another order": "variables: float other(y); float v(y); float y(y);",
    "more before": "variables: float more(y); float y(y); float v(y); float other(y);",
    "another length": "variables: float y(y); float v(z); float other(y);",
    "another type": "variables: float y(y); int v(y); float other(y);",
    "other names": "variables: float y(y); float other(y); float v(y);",
    "another meaning": "variables: float y(y); float v(y); float other(y); v:scale_factor = 2.f;",
}


@pytest.mark.parametrize("read_before", [False, True])
@pytest.mark.parametrize("layout", LAYOUTS)
def test_a_file_that_is_overwritten_in_place(tmp_path: Path, layout: str,
                                             read_before: bool) -> None:
    """What is where the values were is never taken for them."""
    dimensions = "dimensions: y = 4; z = 2;"
    path = generate(tmp_path / "place.nc", dimensions + "variables: float y(y); float v(y); "
                    "float other(y); data: y = 1, 2, 3, 4; v = 5, 6, 7, 8; other = 9, 9, 9, 9;")
    other = generate(tmp_path / "other.nc", dimensions + LAYOUTS[layout])
    store = TesselDataStore.open(path)
    variables = store.get_variables()
    if read_before:
        assert variables["v"][1:3].values.tolist() == [6, 7]
    with open(path, "r+b") as file:
        file.write(Path(other).read_bytes().ljust(os.path.getsize(path), b"\0"))
    for name in ("v", "y", "v", "y"):  # read with the other data, and at once, as coordinates are
        with pytest.raises(OSError, match="The file was overwritten while it was open") as error:
            variables[name][:].values
        assert error.value.word == "fileChanged" and error.value.path == path
    store.close()


def test_a_file_that_is_overwritten_while_it_is_opened(tmp_path: Path,
                                                       monkeypatch: pytest.MonkeyPatch) -> None:
    """Between the first look of the library and the second, and between ours and the library's."""
    path = generate(tmp_path / "place.nc", "dimensions: y = 4; variables: float y(y); float v(y); "
                    "data: y = 1, 2, 3, 4; v = 5, 6, 7, 8;")
    first = Path(path).read_bytes()
    second = Path(generate(tmp_path / "other.nc", "dimensions: y = 4; variables: float v(y); "
                           "float y(y); data: y = 1, 2, 3, 4; v = 5, 6, 7, 8;")).read_bytes()
    original = OpenFile._opened
    for turn in (1, 2):
        Path(path).write_bytes(first)
        turns = iter(range(1, 4))

        def overwrite_and_open(self: OpenFile, mode: str | int, hint: int) -> int:
            if next(turns) == turn:
                with open(path, "r+b") as file:
                    file.write(second)
            return original(self, mode, hint)

        monkeypatch.setattr(OpenFile, "_opened", overwrite_and_open)
        with TesselDataStore.open(path) as store:
            for _ in range(2):
                with pytest.raises(OSError, match="The file was overwritten while it was open"):
                    store.get_variables()["v"][:].values


SPARSE_COLUMN = """
import os, sys, threading
from tessel import _faults
from tessel.xarray import opening
path, when = sys.argv[1:]
file = opening.OpenFile(path)
file.read_with("get_vara_float", 0, [0, 0], [1, 3])

class Cutting:  # after the engine has looked whether the file is whole, and before the library does
    end = _faults.end
    def begin():
        os.truncate(path, 4096)
        _faults.begin()

cutter = threading.Timer(0.02, os.truncate, (path, 4096))
if when == "before":
    os.truncate(path, 4096)
elif when == "begin":
    opening._faults = Cutting
else:
    cutter.start()
mappings = len(open("/proc/self/maps").readlines())
try:
    file.read_with("get_vara_float", 0, [0, 5], [70000, 1])
    print("all of it")
except OSError as error:
    print(error.word)
if when == "within":
    cutter.join()
assert len(open("/proc/self/maps").readlines()) < mappings + 100
"""


@pytest.mark.without_sanitizers
@pytest.mark.parametrize("when", ["before", "begin", "within"])
def test_a_file_that_is_cut_off_around_a_call_in_many_places(tmp_path: Path, when: str) -> None:
    """A page for each place that is gone would be more mappings than a process may have."""
    path = str(tmp_path / "sparse.nc")
    nc = tessel.load("netcdf")
    ncid = nc.create(path, 512)
    rows, columns = nc.def_dim(ncid, "row", 70000), nc.def_dim(ncid, "column", 2048)
    nc.def_var(ncid, "v", 5, [columns, rows])
    nc.set_fill(ncid, 256)
    nc.enddef(ncid)
    nc.put_var1_float(ncid, 0, [2047, 69999], 1)  # the file is long, and has hardly any blocks
    nc.close(ncid)
    done = python(SPARSE_COLUMN, path, when)
    assert done.returncode == 0, done.stderr
    # A cut that was there before the library looked is seen in any case.
    assert done.stdout in ["fileTooShort\n"] + ["all of it\n"] * (when == "within")


@pytest.mark.parametrize("mapped", [True, False])
def test_a_file_that_is_cut_off(cubes: list[str], mapped: bool) -> None:
    size = os.path.getsize(cubes[0])
    file = OpenFile(cubes[0], mapped)
    assert file.read_with("get_vara_float", 1, [4, 29, 30], [1, 1, 10])[-1] == 5999
    os.truncate(cubes[0], size - 5000)
    for once in (False, True):
        for start in (4, 0):
            with pytest.raises(OSError, match="became shorter while it was open") as error:
                file.read_with("get_vara_float", 1, [start, 29, 30], [1, 1, 10], once=once)
            assert error.value.word == "fileTooShort" and error.value.path == cubes[0]
            assert error.value.__notes__ == [f"file: {cubes[0]}"]
    os.truncate(cubes[0], size)  # what is there now are zeros, which nobody wrote
    with pytest.raises(OSError, match="became shorter while it was open"):
        file.read_with("get_vara_float", 1, [4, 29, 30], [1, 1, 10])
    assert file.mapped is mapped
    file.close()
    os.truncate(cubes[0], size - 5000)
    with pytest.raises(tessel.Error, match="cut off") as error:
        OpenFile(cubes[0], mapped)
    assert error.value.__notes__ == [f"file: {cubes[0]}"]


def test_a_file_that_is_cut_off_while_it_is_read(tmp_path: Path) -> None:
    """In the middle of a call, too, it is an error, in every mapped page that is gone."""
    path = tmp_path / "long.nc"
    with netcdf_file(path, "w", version=2) as made:
        made.createDimension("x", 50_000_000)
        made.createVariable("v", "b", ("x",))[:] = 1
    size = os.path.getsize(path)
    for _ in range(5):
        with OpenFile(str(path)) as file:
            file.read_with("get_vara_schar", 0, [0], [1])
            cutter = threading.Timer(0.003, os.truncate, (path, 4096))
            cutter.start()
            try:
                values = file.read_with("get_vara_schar", 0, [0], [50_000_000])
                assert values.all()  # the call was over before
            except OSError as error:
                assert "became shorter" in str(error)
            cutter.join()
            with pytest.raises(OSError, match="became shorter"):
                file.read_with("get_vara_schar", 0, [0], [50_000_000])
        path.write_bytes(path.read_bytes() + bytes([1]) * (size - 4096))


@pytest.mark.without_sanitizers  # which answer signals themselves
@pytest.mark.parametrize("before", ["", "faulthandler.enable()\n"])
@pytest.mark.parametrize("after", ["", "faulthandler.enable()\n"])
def test_signals_of_others_stay_what_they_are(tmp_path: Path, before: str, after: str) -> None:
    """A look at what is gone from somebody else's mapping still ends the process."""
    done = python(f"""
import faulthandler, mmap, os, sys
from tessel import _faults
{before}
_faults.begin(); assert not _faults.end()
{after}
with open(sys.argv[1], "w+b") as file:
    file.truncate(8192)
    mapping = mmap.mmap(file.fileno(), 8192)
    file.truncate(0)
    mapping[5000]
print("survived")""", str(tmp_path / "mapped"))
    assert done.returncode == -signal.SIGBUS and "survived" not in done.stdout
    assert ("Bus error" in done.stderr) == bool(before or after)
    sent = python("import os, signal\nfrom tessel import _faults\n_faults.begin()\n"
                  "os.kill(os.getpid(), signal.SIGBUS)\nprint('survived')")
    assert sent.returncode == -signal.SIGBUS and not sent.stdout


def test_a_file_that_cannot_be_mapped(cubes: list[str], monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.setattr(opening, "MAPPED", 16 | 64)  # a mode that the library refuses
    with OpenFile(cubes[0]) as file:
        values = file.read_with("get_vara_float", 1, [0, 0, 0], [5, 30, 40])
        assert not file.mapped
    np.testing.assert_array_equal(values.T.ravel(), np.arange(6000))


@pytest.mark.parametrize("name", ["fixed", "recorded"])
def test_columns_are_fetched_ahead_from_where_they_are(tmp_path: Path, name: str,
                                                       monkeypatch: pytest.MonkeyPatch) -> None:
    """What the processor is told to fetch is what the library then reads, in the same order."""
    path = str(tmp_path / "column.nc")
    values = np.random.default_rng(2).normal(size=(90, 45, 60)).astype("f4")
    with netcdf_file(path, "w", version=2) as file:
        for dim, length in zip(("record", "t", "y", "x"), (None, *values.shape)):
            file.createDimension(dim, length)
        file.createVariable("fixed", "f", ("t", "y", "x"))[:] = values
        file.createVariable("between", "b", ("record",))[:] = np.ones(90, "i1")
        file.createVariable("recorded", "f", ("record", "y", "x"))[:] = values
    fetched: list[float] = []

    def fetch(address: int, counts: list[int], steps: list[int]) -> None:
        _faults.fetch(address, counts, steps)
        for place in np.ndindex(*counts):
            data = ctypes.string_at(address + int(np.dot(place, steps)), 4)
            fetched.append(float(np.frombuffer(data, ">f4")[0]))

    watched = types.SimpleNamespace(begin=_faults.begin, end=_faults.end, fetch=fetch)
    monkeypatch.setattr(opening, "_faults", watched)
    with xarray.open_dataset(path, engine="tessel", cache=False) as dataset:
        np.testing.assert_array_equal(dataset[name][:20, :, 7], values[:20, :, 7])
        assert not fetched  # which is too little
        np.testing.assert_array_equal(dataset[name][5:, :, 7], values[5:, :, 7])
        assert fetched == values[5:, :, 7].ravel().tolist()
        fetched.clear()
        np.testing.assert_array_equal(dataset[name][::-1, 3:, -1], values[::-1, 3:, -1])
        assert sorted(fetched) == sorted(values[:, 3:, -1].ravel().tolist())
        fetched.clear()
        for key in np.s_[:, :, 7:9], np.s_[3], np.s_[:, 9], np.s_[:, ::2, 5]:
            np.testing.assert_array_equal(dataset[name][key], values[key])


def test_nothing_is_fetched_where_there_is_nothing() -> None:
    _faults.fetch(8, [3, 2], [2**40, 5])
    _faults.fetch(2**63, [0, 2], [1, 1])
    with pytest.raises(ValueError, match="As many counts as steps"):
        _faults.fetch(0, [1], [])


def test_the_costs_are_those_of_the_file(cubes: list[str]) -> None:
    with xarray.open_dataset(cubes[0], engine="tessel") as dataset:
        array = dataset.v.variable._data
        while not hasattr(array, "costs"):
            array = array.array
        assert array.costs is planning.COSTS[True, False]
