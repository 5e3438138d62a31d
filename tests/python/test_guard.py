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
