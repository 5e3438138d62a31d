# tests/python/conftest.py: marks for tests that cannot run everywhere, and what each test restores.
"""`without_sanitizers` marks what a build with sanitizers cannot run, and `separate_hosts` what needs
networks of its own. ctest has each of them as a test of its own, which it counts as not run where
that is so; a test that is skipped inside of another would not be seen."""

from __future__ import annotations

import os
from collections.abc import Iterator

import pytest
import tessel
from xarray.backends import api

collect_ignore = [] if hasattr(api, "to_netcdf") else ["test_xarray_own.py"]
"""xarray's own tests are those of its version, and what this puts into the place of xarray's
functions is known for the oldest that is supported."""


def pytest_configure(config: pytest.Config) -> None:
    """Makes the marks known."""
    config.addinivalue_line("markers", "separate_hosts: it needs the kernel's network namespaces, "
                                       "which only root may make")
    config.addinivalue_line("markers", "without_sanitizers: it would fail, or take very long, in a "
                                       "build with sanitizers")


def pytest_collection_modifyitems(items: list[pytest.Item]) -> None:
    """Skips them there, for whoever runs pytest by hand."""
    preloaded = os.environ.get("LD_PRELOAD", "")
    if "libasan" in preloaded or "libtsan" in preloaded:
        for item in items:
            if item.get_closest_marker("without_sanitizers"):
                item.add_marker(pytest.mark.skip(reason="not in a build with sanitizers"))


@pytest.fixture(autouse=True)
def default_format() -> Iterator[None]:
    """netCDF4-python changes the format that new files get, in the library that it shares with us,
    whenever it makes a file. Each test leaves it as it should be."""
    yield
    tessel.load("netcdf")("set_default_format", 1)
