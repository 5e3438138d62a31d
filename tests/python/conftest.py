# tests/python/conftest.py: a mark for tests that a build with sanitizers cannot run.
"""`without_sanitizers` marks them. ctest has them as a test of their own, which it counts as not run
in such a build; a test that is skipped inside of another would not be seen."""

from __future__ import annotations

import os

import pytest


def pytest_configure(config: pytest.Config) -> None:
    """Makes the mark known."""
    config.addinivalue_line("markers", "without_sanitizers: it would fail, or take very long, in a "
                                       "build with sanitizers")


def pytest_collection_modifyitems(items: list[pytest.Item]) -> None:
    """Skips them there, for whoever runs pytest by hand."""
    if "libasan" in os.environ.get("LD_PRELOAD", ""):
        for item in items:
            if item.get_closest_marker("without_sanitizers"):
                item.add_marker(pytest.mark.skip(reason="not in a build with sanitizers"))
