# tests/python/test_formats.py: the table of formats in docs/formats.md is so, cell by cell.
"""Each cell is a row here: the file is made, and what the cell is about is tried with it."""

import re
from collections.abc import Callable
from pathlib import Path

import pytest
import tessel
import tessel.xarray
import xarray
from made_files import generate
from tessel import command

nc = tessel.load("netcdf")
DOCUMENT = Path(__file__).parents[2] / "docs" / "formats.md"

SIMPLE = """
dimensions: x = 3 ; t = UNLIMITED ;
variables: float v(t, x) ; v:units = "K" ;
data: v = 1, 2, 3, 4, 5, 6 ;"""
MORE = """
types: compound pair { int a ; float b ; }
dimensions: x = 3 ; t = UNLIMITED ; u = UNLIMITED ;
variables: float v(t, x) ; string s(x) ; pair p(x) ; int64 near(x) ; uint64 far(x) ;
    ubyte small(x) ; ushort middle(x) ; uint large(x) ;
data: v = 1, 2, 3, 4, 5, 6 ; s = "a", "b", "c" ; near = 1, -2, 3 ; far = 1, 2, 9007199254740993 ;
    small = 1, 2, 255 ; middle = 1, 2, 65535 ; large = 1, 2, 4294967295 ;
group: inner { variables: float w ; data: w = 1 ; }"""
FILES = {
    "classic": ("classic", SIMPLE),
    "64-bit offset": ("64-bit offset", SIMPLE),
    "64-bit data": ("cdf5", SIMPLE),
    "netCDF-4 classic model, in HDF5": ("netCDF-4 classic model", SIMPLE),
    "netCDF-4, in HDF5": ("netCDF-4", MORE),
}
NOT_SHOWN = "\nGroups, which only files in HDF5 may have, are not shown.\n"


def operations(path: str) -> None:
    ncid = nc.open(path, "WRITE")
    varid = nc.inq_varid(ncid, "v")
    nc.put_var1_double(ncid, varid, [1, 0], 7.0)
    nc.close(ncid)
    ncid = nc.open(path, "NOWRITE")
    assert nc.get_var_double(ncid, varid).tolist() == [[1, 4], [7, 5], [3, 6]]
    nc.close(ncid)


def read(path: str) -> None:
    assert command.main(["info", path]) == 0
    assert tessel.read(path, "v").tolist() == [[1, 4], [2, 5], [3, 6]]


def copy(path: str) -> None:
    tessel.copy(path, "copy.nc")
    read("copy.nc")


def open_dataset(path: str) -> None:
    with xarray.open_dataset(path, engine="tessel") as dataset:
        assert dataset["v"].values.tolist() == [[1, 2, 3], [4, 5, 6]]


TRIED: dict[str, Callable[[str], None]] = {
    "operations": operations, "`tessel info`, `tessel.read`": read, "`tessel.copy`": copy,
    "xarray engine": open_dataset}


def cells() -> list[tuple[str, str, str]]:
    """The table's cells: format, what is tried, what is said."""
    head, _, *rows = [[cell.strip() for cell in line.strip("|").split("|")]
                      for line in DOCUMENT.read_text().splitlines() if line.startswith("|")]
    assert head[1:] == list(TRIED) and [row[0] for row in rows] == list(FILES)
    return [(row[0], what, said) for row in rows for what, said in zip(head[1:], row[1:])]


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


def made(form: str) -> str:
    """A file of the format."""
    kind, text = FILES[form]
    return generate(Path("made.nc").absolute(), text, kind)


@pytest.mark.parametrize("form, what, said", cells())
def test_cell(form: str, what: str, said: str) -> None:
    path = made(form)
    if said in ("yes", "root group"):
        TRIED[what](path)
    else:
        with pytest.raises(tessel.Error) as caught:
            TRIED[what](path)
        assert caught.value.word in ("notAClassicFile", "badFormat")
        assert caught.value.word in DOCUMENT.read_text()
    if said == "to another format":
        for number, target in enumerate(("classic", "64bit-offset")):
            tessel.copy(path, f"{number}.nc", target)
            read(f"{number}.nc")
    else:
        assert said in ("yes", "no", "root group")


@pytest.mark.parametrize("form", FILES)
def test_info_says_that_groups_are_not_shown(form: str, capsys: pytest.CaptureFixture[str]) -> None:
    """Of files in HDF5, which may have some, and of no other."""
    assert command.main(["info", made(form)]) == 0
    shown = capsys.readouterr().out
    assert (NOT_SHOWN in shown) == form.endswith("HDF5") and "inner" not in shown


def test_types_beyond_the_classic_ones(capsys: pytest.CaptureFixture[str]) -> None:
    path = made("netCDF-4, in HDF5")
    assert command.main(["info", path]) == 0
    shown = capsys.readouterr().out
    assert re.findall(r"^  (\w+) +\d+  unlimited$", shown, re.M) == ["t"]
    assert "  string s(x)\n" in shown and re.search(r"^  type \d+ p\(x\)$", shown, re.M)
    for name, values in (("small", [1, 2, 255]), ("middle", [1, 2, 65535]),
                         ("large", [1, 2, 4294967295]), ("near", [1, -2, 3])):
        assert tessel.read(path, name).ravel().tolist() == values
    for name, word in (("far", "notExact"), ("s", "attemptToConvertBetweenTextAndNumbers"),
                       ("p", "attemptToConvertBetweenTextAndNumbers")):
        with pytest.raises(tessel.Error) as caught:
            tessel.read(path, name)
        assert caught.value.word == word and f"`{word}`" in DOCUMENT.read_text()
