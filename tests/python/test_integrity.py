# tests/python/test_integrity.py: a file that was cut off is found, and a complete one is not.
"""Files of many makers, complete and cut at every length."""

from __future__ import annotations

import os
import subprocess
from collections.abc import Callable
from pathlib import Path

import numpy as np
import pytest
import tessel
from made_files import (BYTE, CHAR, DOUBLE, EVERYTHING, FLOAT, INT, MEMBERS, NOFILL, OFFSET64,
                        SHORT, generate, netcdf, run_tool)
from scipy.io import netcdf_file
from tessel import wording
from tessel.dataset import Dataset

TOO_SHORT = "TESSEL:python:fileTooShort"


def contents(path: str) -> dict[str, bytes]:
    """The values of all variables, read without a check."""
    with Dataset(path) as dataset:
        return {name: dataset.read(variable).tobytes()
                for name, variable in dataset.variables.items()}


def of_everything(kind: str) -> Callable[[Path], str]:
    return lambda path: generate(path, EVERYTHING, kind)


def of_cdl(cdl: str, kind: str = "classic") -> Callable[[Path], str]:
    return lambda path: generate(path, cdl, kind)


def single_record_variable(kind: int) -> Callable[[Path], str]:
    """Records of three values without padding between them."""
    values = '"abc", "defghi"' if kind == CHAR else ", ".join(map(str, range(1, 16)))
    name = ["byte", "char", "short", "int", "float", "double"][kind - 1]
    return of_cdl(f"""dimensions: r = UNLIMITED ; x = 3 ;
        variables: short fixed(x) ; {name} only(r, x) ;
        data: fixed = 1, 2, 3 ; only = {values} ;""")


def with_room(path: Path) -> str:
    """Unused room after the header, before the records and, from a longer header, in the middle."""
    ncid = netcdf("create", path, OFFSET64)
    netcdf("set_fill", ncid, NOFILL)
    x, r = netcdf("def_dim", ncid, "x", 3), netcdf("def_dim", ncid, "r", 0)
    netcdf("put_att_text", ncid, -1, "history", "long" * 20)
    fixed = netcdf("def_var", ncid, "fixed", SHORT, x)
    records = netcdf("def_var", ncid, "records", BYTE, np.array([x[0, 0], r[0, 0]]))
    netcdf("_enddef", ncid, 300, 64, 200, 128)
    netcdf("put_var_short", ncid, fixed, np.array([1, 2, 3], np.int16))
    netcdf("put_vara_schar", ncid, records, np.zeros(2), np.array([3.0, 2.0]),
           np.arange(1, 7, dtype=np.int8))
    netcdf("redef", ncid)
    netcdf("del_att", ncid, -1, "history")
    netcdf("close", ncid)
    return str(path)


def of_scipy(version: int) -> Callable[[Path], str]:
    """Another implementation's file."""
    def make(path: Path) -> str:
        with netcdf_file(path, "w", version=version) as file:
            file.title = "by another"
            file.createDimension("r", None)
            file.createDimension("x", 3)
            file.createVariable("a", "b", ("r",))[:] = np.array([1, 2, 3], "i1")
            file.createVariable("b", "h", ("x",))[:] = np.array([7, 8, 9], "i2")
            file.createVariable("c", "d", ("r", "x"))[:] = np.arange(1.0, 10.0).reshape(3, 3)
        return str(path)
    return make


def of_nco(path: Path) -> str:
    """A file that NCO has worked on."""
    source = generate(path.with_name("source.nc"), EVERYTHING)
    run_tool("ncks", "-O", "-h", "--fl_fmt=64bit_offset", "--hdr_pad=100", "-v", "r2,count,r3",
             source, path)
    return str(path)


def wide(path: Path) -> str:
    """Types that only 64-bit data have."""
    source = generate(path.with_name("source.nc"), """dimensions: x = 3 ;
        variables: int64 a(x) ; ushort b(x) ; ubyte c(x) ; :n = 5LL, 6LL ; :u = 3US ;
        data: a = 1, 2, 3 ; b = 4, 5, 6 ; c = 7, 8, 9 ;""", "netCDF-4")
    subprocess.run(["nccopy", "-k", "cdf5", source, path], check=True)
    return str(path)


def names_in_utf8(path: Path) -> str:
    return generate(path, """dimensions: größe = 3 ;
        variables: short überall(größe) ; überall:maß = 1s ; data: überall = 1, 2, 3 ;"""
                    .encode().decode("latin-1"))


MAKERS = {
    "everything, classic": of_everything("classic"),
    "everything, 64-bit offset": of_everything("64-bit offset"),
    "everything, 64-bit data": of_everything("cdf5"),
    **{f"single record variable of {MEMBERS[kind]}": single_record_variable(kind)
       for kind in (BYTE, CHAR, SHORT, INT, FLOAT, DOUBLE)},
    "no records": of_cdl("""dimensions: r = UNLIMITED ; x = 3 ;
        variables: short a(x) ; double b(r, x) ; data: a = 1, 2, 3 ;"""),
    "records only": of_cdl("""dimensions: r = UNLIMITED ; x = 3 ;
        variables: byte a(r) ; short b(r, x) ; data: a = 1, 2 ; b = 1, 2, 3, 4, 5, 6 ;"""),
    "no variables": of_cdl('dimensions: x = 3 ; variables: :title = "nothing" ;'),
    "a scalar": of_cdl("variables: byte a ; data: a = 5 ;"),
    "64-bit types": wide,
    "room": with_room,
    "SciPy, version 1": of_scipy(1),
    "SciPy, version 2": of_scipy(2),
    "NCO": of_nco,
    "names in UTF-8": names_in_utf8,
}


@pytest.mark.parametrize("make", MAKERS.values(), ids=MAKERS.keys())
def test_cut_at_every_length(tmp_path, make):
    path = make(tmp_path / "whole.nc")
    data = Path(path).read_bytes()
    least = tessel.check(path)
    assert len(data) - 3 <= least <= len(data)
    values = contents(path)
    cut = tmp_path / "cut.nc"
    cut.write_bytes(data)
    for length in reversed(range(len(data) + 1)):
        os.truncate(cut, length)
        if length < least:
            with pytest.raises(tessel.Error):
                tessel.check(cut)
        else:  # nothing but padding is gone
            assert tessel.check(cut) == least
            assert contents(str(cut)) == values


def test_nothing_at_all(tmp_path):
    path = Path(generate(tmp_path / "nothing.nc", ""))
    assert tessel.check(path) == 32
    path.write_bytes(path.read_bytes()[:32])  # the library had written a whole block
    assert tessel.check(path) == 32
    path.write_bytes(path.read_bytes()[:31])
    with pytest.raises(tessel.Error):
        tessel.check(path)


def test_more_than_needed_is_no_error(tmp_path):
    path = generate(tmp_path / "longer.nc", EVERYTHING)
    least = tessel.check(path)
    with open(path, "ab") as file:
        file.write(b"more")
    assert tessel.check(path) == least


def datasets() -> list[str]:
    """The files of a Debian package."""
    listed = subprocess.run(["dpkg", "-L", "ferret-datasets"], capture_output=True, check=True,
                            text=True).stdout.splitlines()
    return [each for each in listed if each.endswith((".cdf", ".nc"))]


def test_real_files_are_complete():
    files = datasets()
    assert len(files) >= 10
    for path in files:
        assert Path(path).stat().st_size - 3 <= tessel.check(path) <= Path(path).stat().st_size


@pytest.mark.parametrize("missing", [1, 2, 3, 4, 1000, 64799, 64800, 5000000])
def test_real_file_cut(tmp_path, missing):
    [path] = [each for each in datasets() if each.endswith("/coads_climatology.cdf")]
    data = Path(path).read_bytes()
    cut = tmp_path / "cut.nc"
    cut.write_bytes(data[:-missing])
    with pytest.raises(tessel.Error) as raised:
        tessel.check(cut)
    assert raised.value.identifier == TOO_SHORT
    assert raised.value.message == (f"The file is cut off: it has {len(data) - missing} bytes, and "
                                    f"what is in it needs {len(data)}.")
    assert raised.value.path == str(cut) and raised.value.operation == "check"
    assert raised.value.__notes__ == [f"in tessel.check(path={wording.abridged(cut)})\nfile: {cut}"]


def stream(folder: Path, kind: str, count: int) -> tuple[Path, bytearray]:
    """A file whose count of records, of so many bytes, is -1; and its content."""
    path = Path(generate(folder / "f.nc", """dimensions: t = UNLIMITED ; x = 3 ;
        variables: double a(t, x) ; short b(x) ; data: a = 1, 2, 3, 4, 5, 6 ; b = 7, 8, 9 ;""", kind))
    data = bytearray(path.read_bytes())
    data[4:4 + count] = b"\xff" * count
    path.write_bytes(data)
    return path, data


def test_a_stream_of_64_bit_data(tmp_path):
    """The library would take it for a count of more records than can be found."""
    path, _ = stream(tmp_path, "cdf5", 8)
    for refused in (lambda: tessel.check(path), lambda: tessel.read(path, "b", check=False)):
        with pytest.raises(tessel.Error, match="claims data that end behind 2\\^63 bytes") as raised:
            refused()
        assert raised.value.identifier == "TESSEL:guard:header"


@pytest.mark.parametrize("kind, count", [("classic", 4), ("64-bit offset", 4)])
def test_a_stream_that_does_not_count_its_records(tmp_path, kind, count):
    """It is not cut off, and the size that so many records would need tells nobody anything."""
    path, data = stream(tmp_path, kind, count)
    for refused in (lambda: tessel.check(path), lambda: tessel.read(path, "b")):
        with pytest.raises(tessel.Error) as raised:
            refused()
        assert raised.value.identifier == TOO_SHORT and raised.value.path == str(path)
        assert raised.value.message.startswith("The file does not say how many records it has: the "
                                               "number in its header is -1, as in a stream")
    assert tessel.read(path, "b", check=False).ravel().tolist() == [7, 8, 9]
    data[4:4 + count] = (1000).to_bytes(count, "big")  # a count like any other
    path.write_bytes(data)
    with pytest.raises(tessel.Error, match="The file is cut off: it has"):
        tessel.check(path)


def test_what_the_library_does_with_a_cut_file_and_who_refuses_it(tmp_path):
    path = Path(generate(tmp_path / "f.nc", """dimensions: x = 4 ; variables: int a(x) ;
        data: a = 1, 2, 3, 4 ;"""))
    path.write_bytes(path.read_bytes()[:-4])
    target = tmp_path / "copy.nc"
    assert tessel.read(path, "a", check=False).ravel().tolist() == [1, 2, 3, 0]
    for refused in (lambda: tessel.read(path, "a"), lambda: tessel.copy(path, target)):
        with pytest.raises(tessel.Error) as raised:
            refused()
        assert raised.value.identifier == TOO_SHORT
    assert not target.exists()
    tessel.copy(path, target, check=False)
    assert tessel.read(target, "a").ravel().tolist() == [1, 2, 3, 0]


def test_records_that_were_never_written(tmp_path):
    path = Path(generate(tmp_path / "f.nc", """dimensions: r = UNLIMITED ;
        variables: int a(r) ; data: a = 1, 2, 3, 4 ;"""))
    data = bytearray(path.read_bytes())
    data[4:8] = (5).to_bytes(4, "big")  # the count of records
    path.write_bytes(data)
    with pytest.raises(tessel.Error) as raised:
        tessel.check(path)
    assert raised.value.identifier == TOO_SHORT


@pytest.mark.parametrize("name", [b"z\xe9z", b"\xff\xfe\xfd", b"e\xcc\x81", b"z\x1bz", b"z\0z"])
def test_names_that_cannot_be_asked_for_are_no_cut(tmp_path, name):
    path = Path(generate(tmp_path / "f.nc", """dimensions: zzz = 3 ;
        variables: short yyy(zzz) ; yyy:xxx = 1, 2, 3 ; data: yyy = 1, 2, 3 ;"""))
    data = path.read_bytes()
    for old in (b"xxx", b"yyy", b"zzz"):
        path.write_bytes(data.replace(old, name))
        assert tessel.check(path) <= len(data)


def test_a_header_that_is_longer_than_the_inquiries_say(tmp_path):
    path = Path(generate(tmp_path / "f.nc", """dimensions: x = 300 ;
        variables: short longer_name(x) ; short other(x) ; data: longer_name = 1 ; other = 2 ;"""))
    data = path.read_bytes().replace(b"longer_name", b"l\0nger_name")  # asked for, it is "l"
    path.write_bytes(data)
    least = tessel.check(path)
    assert 1200 < least <= len(data)
    os.truncate(path, least)
    assert tessel.check(path) == least
    os.truncate(path, least - 1)
    with pytest.raises(tessel.Error) as raised:
        tessel.check(path)
    assert raised.value.identifier == TOO_SHORT


@pytest.mark.parametrize("kind", ["netCDF-4", "netCDF-4 classic model"])
def test_other_formats_have_nothing_to_check(tmp_path, kind):
    path = generate(tmp_path / "f.nc", EVERYTHING, kind)
    assert tessel.check(path) is None
    data = Path(path).read_bytes()
    Path(path).write_bytes(data[:-1])  # as the library sees by itself
    with pytest.raises(tessel.Error):
        tessel.check(path)


def test_a_missing_file_is_the_modules_error(tmp_path):
    with pytest.raises(tessel.Error) as raised:
        tessel.check(tmp_path / "missing.nc")
    assert raised.value.identifier == "TESSEL:netcdf:open:noSuchFileOrDirectory"
