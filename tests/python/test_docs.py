"""tests/python/test_docs.py: the examples in the documents and in the docstrings of modules run."""

import doctest
import importlib
from pathlib import Path

import pytest

DOCS = Path(__file__).parents[2] / "docs"


def run(text: str, name: str, least: int) -> None:
    """Runs the examples of a text, of which there are at least so many."""
    test = doctest.DocTestParser().get_doctest(text, {}, name, None, None)
    assert len(test.examples) >= least
    shown: list[str] = []
    results = doctest.DocTestRunner().run(test, out=shown.append)
    assert results.failed == 0, "".join(shown)


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


def test_order() -> None:
    run((DOCS / "order.md").read_text(), "order.md", 20)


@pytest.mark.parametrize("module, least", [("tessel.errors", 4), ("tessel.netcdf", 10)])
def test_docstrings_of_modules(module: str, least: int) -> None:
    run(importlib.import_module(module).__doc__, module, least)


def test_a_wrong_example_fails() -> None:
    with pytest.raises(AssertionError, match="Expected:"):
        run(">>> 1 + 1\n3\n", "wrong", 1)
