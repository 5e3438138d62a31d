# tests/python/test_guard.py: the guard is there unless it is switched off.
"""What `tessel.load` gives is kept from the calls that the netCDF library does not survive."""

import os
import subprocess
import sys
from pathlib import Path

import pytest
import tessel

FATAL = """
import resource, sys, tessel
resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
try:
    {load}.create(sys.argv[1], 64)
except tessel.Error as error:
    print(error.identifier)
"""


def outcome(folder: Path, load: str, **variables: str) -> tuple[int, str]:
    """How a process ends that makes a call that is fatal to the library, and what it prints."""
    done = subprocess.run([sys.executable, "-B", "-c", FATAL.format(load=load),
                           folder / "new.nc"], capture_output=True, text=True, check=False,
                          env={**os.environ, **variables})
    return done.returncode, done.stdout.strip()


GUARDED = (0, "TESSEL:guard:mode")


@pytest.mark.parametrize(("load", "variable", "guarded"), [
    ("tessel.load('netcdf')", None, True),
    ("tessel.load('netcdf', 'on')", "off", True),
    ("tessel.load('netcdf')", "remote", True),
    ("tessel.load('netcdf')", "off", False),
    ("tessel.load('netcdf', guard='off')", "on", False),
    ("tessel.load(tessel.load('netcdf').file)", None, True),
])
def test_a_call_that_the_library_does_not_survive(tmp_path, load, variable, guarded):
    variables = {} if variable is None else {"TESSEL_GUARD": variable}
    found = outcome(tmp_path, load, **variables)
    if guarded:
        assert found == GUARDED
    else:
        assert found[0] != 0
        assert found[1] == ""


@pytest.mark.parametrize(("guard", "identifier"), [
    ("on", "TESSEL:guard:remote"),
    ("remote", "TESSEL:netcdf:open:"),
    ("off", "TESSEL:netcdf:open:"),
])
def test_addresses(guard, identifier):
    with pytest.raises(tessel.Error) as raised:
        tessel.load("netcdf", guard=guard).open("https://127.0.0.1:1/a.nc", "NOWRITE")
    assert raised.value.identifier.startswith(identifier)


@pytest.mark.parametrize(("argument", "variable"), [("none", "on"), (None, ""), (None, "On")])
def test_a_word_that_is_no_guard(monkeypatch, argument, variable):
    monkeypatch.setenv("TESSEL_GUARD", variable)
    with pytest.raises(tessel.Error) as raised:
        tessel.load("netcdf", argument)
    assert raised.value.identifier == "TESSEL:python:badGuard"
    assert "on, remote, off" in raised.value.message


def test_a_name_is_looked_up_once_for_each_guard_and_folder(tmp_path, monkeypatch):
    """And a path each time."""
    monkeypatch.delenv("TESSEL_GUARD", raising=False)
    on, off = tessel.load("netcdf"), tessel.load("netcdf", "off")
    assert on is not off and tessel.load("netcdf", "on") is on and tessel.load("netcdf") is on
    monkeypatch.setenv("TESSEL_GUARD", "off")
    assert tessel.load("netcdf") is off
    copy = tmp_path / "netcdf.tsx"
    copy.write_bytes(on.file.read_bytes())
    monkeypatch.setenv("TESSEL_MODULE_PATH", str(tmp_path))
    assert tessel.load("netcdf", "on").file == copy
    monkeypatch.undo()
    assert tessel.load("netcdf", "on") is on
    monkeypatch.chdir(tmp_path)  # where another folder could follow
    assert tessel.load("./netcdf.tsx") is not tessel.load("./netcdf.tsx")
    with pytest.raises(ValueError, match="A guard is one of"):
        tessel.load("netcdf", [])


def test_read_and_check_refuse_addresses_too():
    for call in (lambda: tessel.read("https://127.0.0.1:1/a.nc", "v"),
                 lambda: tessel.check("https://127.0.0.1:1/a.nc"),
                 lambda: tessel.copy("https://127.0.0.1:1/a.nc", "target.nc")):
        with pytest.raises(tessel.Error) as raised:
            call()
        assert raised.value.identifier == "TESSEL:guard:remote"


@pytest.mark.parametrize(("options", "variable", "refused"), [
    ([], None, True),
    (["--guard", "on"], "off", True),
    (["--guard", "remote"], None, False),
    (["--guard", "off"], None, False),
    ([], "remote", False),
])
def test_addresses_on_the_command_line(options, variable, refused):
    variables = {} if variable is None else {"TESSEL_GUARD": variable}
    done = subprocess.run([sys.executable, "-B", "-m", "tessel", "info", *options,
                           "https://127.0.0.1:1/a.nc"], capture_output=True, text=True,
                          check=False, env={**os.environ, **variables})
    assert done.returncode == 1
    assert done.stdout == ""
    *others, line = done.stderr.splitlines()
    assert line.startswith("tessel: ")
    assert ("is an address" in line) == refused
    assert bool(others) != refused  # what the library says of its attempt


UNCLOSABLE = """
import sys, tessel
nc = tessel.load("netcdf", sys.argv[2])
ncid = nc.create(sys.argv[1], "CLOBBER")
nc.def_var(ncid, "v", 4, [nc.def_dim(ncid, "x", 3)])
nc.put_att_double(ncid, 0, "_FillValue", 4, [1, 2])
try:
    nc.close(ncid)
except tessel.Error as error:
    print(error.identifier, flush=True)
"""


@pytest.mark.parametrize("guard", ["on", "off"])
def test_nothing_is_asked_of_a_dataset_that_could_not_be_closed(tmp_path, guard):
    done = subprocess.run([sys.executable, "-B", "-c", UNCLOSABLE, tmp_path / "a.nc", guard],
                          capture_output=True, text=True, check=False)
    assert (done.returncode, done.stdout) == (0, "TESSEL:netcdf:close:invalidDataType\n")


HOSTILE = b"CDF\1" + bytes(4) + b"\0\0\0\x0a" + b"\x7f\xff\xff\xff" + bytes(16)
"""A header that claims two thousand million dimensions."""

ADDRESS = "https://127.0.0.1:1/a.nc"

WAYS = {
    "read": "tessel.read(path, 'v')",
    "copy": "tessel.copy(path, 'new.nc')",
    "check": "tessel.check(path)",
    "tessel info": "main(['info', path])",
    "tessel plot": "main(['plot', path, 'v', '-o', 'a.png'])",
    "tessel copy": "main(['copy', path, 'new.nc'])",
    "tessel check": "main(['check', path])",
    "tessel.show": "show.main([path])",
    "to_netcdf": "xarray.to_netcdf(Dataset({'w': 1}), path, 'a')",
    "open_dataset": "open_dataset(path, engine='tessel')",
}

SEEN = """
import sys, tessel
from tessel import show, xarray
from tessel.command import main
from xarray import Dataset, open_dataset
path = sys.argv[1]
try:
    {way}
except tessel.Error as error:
    print(error.identifier.rpartition(":")[2], file=sys.stderr)
"""


GUARDED_BY_DEFAULT = {name: value for name, value in os.environ.items() if name != "TESSEL_GUARD"}


def said(way: str, path: str, folder: Path) -> str:
    """The one line of the command, or the last word of the error."""
    done = subprocess.run([sys.executable, "-B", "-c", SEEN.format(way=way), path], cwd=folder,
                          text=True, capture_output=True, check=False, timeout=60,
                          env=GUARDED_BY_DEFAULT)
    [line] = done.stderr.splitlines()
    return line


@pytest.mark.parametrize("way", WAYS.values(), ids=WAYS.keys())
def test_a_header_that_cannot_be_believed(tmp_path, way):
    """It is the guard that refuses it, wherever a file is opened."""
    (tmp_path / "hostile.nc").write_bytes(HOSTILE)
    line = said(way, "hostile.nc", tmp_path)
    assert line == "header" or "the library would trust the header" in line, line
    assert os.listdir(tmp_path) == ["hostile.nc"]


@pytest.mark.parametrize("way", WAYS.values(), ids=WAYS.keys())
def test_addresses_everywhere(tmp_path, way):
    """None of them is asked for; xarray's engine opens no address whatever the guard says."""
    line = said(way, ADDRESS, tmp_path)
    assert line in ("remote", "notAClassicFile", "badPath") or "is an address" in line, line
    assert os.listdir(tmp_path) == []
