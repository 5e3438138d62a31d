# tests/python/test_paths.py: a name is the file that the system takes it for, and no other.
"""`..` behind a link is above the folder that the link leads to. At the place that one gets by
crossing out the link and the `..`, there is another file here, which nothing may touch."""

from __future__ import annotations

import os
from collections.abc import Callable
from pathlib import Path
from typing import NamedTuple

import pytest
import tessel
import xarray
from made_files import generate
from tessel import command, paths
from tessel.xarray import to_netcdf

NAMED, DECOY = 7, 3

CUT = 84
"""Bytes: the header, and one value of two."""


class Places(NamedTuple):
    """Two folders, and a way into the first that looks like one into the second."""

    real: Path
    decoy: Path
    given: str
    """What leads into `real`."""


@pytest.fixture(name="places", params=["absolute", "relative"])
def places_fixture(tmp_path, monkeypatch, request) -> Places:
    real, decoy = tmp_path / "real", tmp_path / "decoy"
    (real / "sub").mkdir(parents=True)
    decoy.mkdir()
    (decoy / "link").symlink_to("../real/sub")
    for folder, value in ((real, NAMED), (decoy, DECOY)):
        generate(folder / "a.nc", f"dimensions: x = 2 ; variables: int v(x) ; "
                                  f"data: v = {value}, {value} ;")
    monkeypatch.chdir(tmp_path)
    return Places(real, decoy, "decoy/link/.." if request.param == "relative"
                  else f"{decoy}/./link/./..")


def value_in(path: Path) -> int:
    return int(tessel.read(path, "v")[0, 0])


def opened_by_the_engine(path: str) -> int:
    with xarray.open_dataset(path, engine="tessel") as dataset:
        return int(dataset["v"][0])


@pytest.mark.parametrize("read", [value_in, opened_by_the_engine])
def test_reading(places, read):
    assert read(f"{places.given}/a.nc") == NAMED


def run(*arguments: str) -> None:
    assert command.main(list(arguments)) == 0


LOOKS: dict[str, Callable[[str], object]] = {
    "read": lambda path: tessel.read(path, "v"),
    "check": tessel.check,
    "copy": lambda path: tessel.copy(path, "copy.nc"),
    "open_dataset": opened_by_the_engine,
}


@pytest.mark.parametrize("look", LOOKS.values(), ids=LOOKS.keys())
def test_the_file_that_is_looked_at_is_the_one_that_was_named(places, look):
    """One that is cut off; the other one is whole."""
    os.truncate(places.real / "a.nc", CUT)
    with pytest.raises(tessel.Error, match="cut off: it has 84 bytes") as raised:
        look(f"{places.given}/a.nc")
    assert raised.value.path == str(places.real / "a.nc")


@pytest.mark.parametrize("arguments", [["info"], ["check"], ["plot", "v", "-o", "a.png"]],
                         ids=lambda each: each[0])
def test_on_the_command_line(places, arguments, capsys):
    name, *others = arguments
    run(name, f"{places.given}/a.nc", *others)
    os.truncate(places.real / "a.nc", CUT)
    assert command.main([name, f"{places.given}/a.nc", *others]) == 1
    assert capsys.readouterr().err.endswith(f": {places.real}/a.nc\n")


WRITERS: dict[str, tuple[str, Callable[[str], object]]] = {
    "copy": ("new.nc", lambda path: tessel.copy("source.nc", path)),
    "copy, overwrite": ("a.nc", lambda path: tessel.copy("source.nc", path, overwrite=True)),
    "tessel copy --overwrite": ("a.nc", lambda path: run("copy", "source.nc", path, "--overwrite")),
    "plot": ("a.png", lambda path: run("plot", "source.nc", "v", "-o", path)),
    "to_netcdf": ("a.nc", lambda path: to_netcdf(xarray.Dataset({"w": 5}), path)),
    "to_netcdf, mode a": ("a.nc", lambda path: to_netcdf(xarray.Dataset({"w": 5}), path, "a")),
}


@pytest.mark.parametrize(("name", "write"), WRITERS.values(), ids=WRITERS.keys())
def test_the_file_that_is_written_is_the_one_that_was_named(places, name, write):
    generate(Path("source.nc"), "dimensions: x = 2 ; variables: int v(x) ; data: v = 5, 5 ;")
    decoy = (places.decoy / name)
    decoy.write_bytes(b"kept")
    before = (places.real / "a.nc").read_bytes()
    write(f"{places.given}/{name}")
    assert decoy.read_bytes() == b"kept"
    assert sorted(os.listdir(places.real)) == sorted({"a.nc", "sub", name})
    assert (places.real / name).read_bytes() != before


def test_the_source_by_another_name_is_no_target(places):
    with pytest.raises(tessel.Error) as raised:
        tessel.copy(places.real / "a.nc", f"{places.given}/a.nc", overwrite=True)
    assert raised.value.identifier == "TESSEL:python:sameFile"
    tessel.copy(places.real / "a.nc", places.decoy / "a.nc", overwrite=True)
    assert value_in(places.decoy / "a.nc") == NAMED


def test_above_a_folder_that_is_not_there(places):
    """The system has no such place, even if there is one without `missing/..`."""
    before = (places.decoy / "a.nc").read_bytes()
    for target in ("decoy/missing/../a.nc", "decoy/missing/../new.nc", "decoy/a.nc/../new.nc"):
        with pytest.raises(OSError, match="No such file or directory|Not a directory"):
            tessel.copy(places.real / "a.nc", target, overwrite=True)
    assert (places.decoy / "a.nc").read_bytes() == before
    assert sorted(os.listdir(places.decoy)) == ["a.nc", "link"]
    with pytest.raises(FileNotFoundError) as raised:
        tessel.check("decoy/missing/../a.nc")
    assert raised.value.path == f"{places.decoy}/missing/../a.nc"


@pytest.mark.parametrize(("path", "leads_to"), [
    ("a.nc", "{folder}/a.nc"),
    ("./decoy//a.nc", "{folder}/decoy/a.nc"),
    ("decoy/../a.nc", "{folder}/a.nc"),
    ("decoy/link/..", "{folder}/real"),
    ("decoy/link/../../a.nc", "{folder}/a.nc"),
    ("real/sub/../../decoy/link/./../a.nc", "{folder}/real/a.nc"),
    ("decoy/link/a..nc", "{folder}/decoy/link/a..nc"),
    ("decoy/link/...", "{folder}/decoy/link/..."),
    ("decoy/a.nc/../a.nc", "{folder}/decoy/a.nc/../a.nc"),
    ("loop/../a.nc", "{folder}/loop/../a.nc"),
    ("missing/../../a.nc", "{folder}/missing/../../a.nc"),
    ("/../a.nc", "/a.nc"),
    ("https://example.org/../a.nc", "https://example.org/../a.nc"),
    ("", ""),
])
def test_where_a_path_leads(places, path, leads_to):
    folder = places.real.parent
    (folder / "loop").symlink_to("loop")
    for given in {path, os.path.join(folder, path)} if "://" not in path and path else {path}:
        assert paths.absolute(given) == leads_to.format(folder=folder)
        assert paths.absolute(given, str(folder)) == leads_to.format(folder=folder)
