# tests/python/test_metadata.py: what the package's metadata say that it needs.
"""For whoever installs it by them, and for `importlib.metadata`."""

from __future__ import annotations

import platform
import re
from importlib import metadata
from pathlib import Path

import numpy as np
import tessel

COMPATIBILITY = Path(__file__).parents[2] / "docs" / "compatibility.md"


def required() -> dict[str, tuple[str, str]]:
    """The least version and the extra of each package, "" for none."""
    pattern = r'(\w+)(?: ?\(>=([\d.]+)\))?(?: ?; extra == "(\w+)")?'
    found = (re.fullmatch(pattern, each) for each in metadata.requires("tessel") or ())
    return {each[1]: (each[2] or "", each[3] or "") for each in found if each}


def test_what_is_imported() -> None:
    versions = {name: tuple(map(int, version.split("."))) for name, version in re.findall(
        r"^\| (NumPy|xarray) \| ([\d.]+) \|", COMPATIBILITY.read_text(), re.M)}
    needs = required()
    assert {name: extra for name, (_, extra) in needs.items()} == {
        "numpy": "", "cftime": "", "matplotlib": "plot", "xarray": "xarray", "dask": "dask"}
    assert tuple(map(int, needs["numpy"][0].split("."))) == versions["NumPy"]
    assert tuple(map(int, needs["xarray"][0].split("."))) == versions["xarray"]
    assert versions["NumPy"] <= tuple(map(int, np.__version__.split(".")))


def test_the_version() -> None:
    """The extension was compiled with the one that the metadata have."""
    assert tessel.__version__ == metadata.version("tessel")


def test_the_python_that_it_was_compiled_for() -> None:
    assert metadata.metadata("tessel")["Requires-Python"] == "==" + ".".join(
        platform.python_version_tuple()[:2]) + ".*"


def test_who_takes_it_away() -> None:
    """Not a tool for Python's packages, which would go by a list of files."""
    found = metadata.distribution("tessel")
    assert found.read_text("INSTALLER") == "cmake\n"
    assert found.read_text("RECORD") is None
