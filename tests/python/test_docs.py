"""tests/python/test_docs.py: the examples in the documents and in the docstrings of modules run."""

import contextlib
import doctest
import importlib
import io
import re
import subprocess
from pathlib import Path

import numpy
import pytest
import tessel

ROOT = Path(__file__).parents[2]
DOCS = ROOT / "docs"


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


def squeezed(text: str) -> str:
    """The text without white space."""
    return "".join(text.split())


def snippets(document: Path, language: str) -> list[str]:
    """The pieces of code in a document."""
    return re.findall(rf"^```{language}\n(.*?)^```", document.read_text(), re.M | re.S)


@pytest.mark.parametrize("document, least", [("README.md", 1), ("docs/adding-an-operation.md", 7)])
def test_code_is_quoted_as_it_is(document: str, least: int) -> None:
    """Each piece of C++ in the documents stands somewhere in the project."""
    sources = [squeezed(file.read_text()) for folder in ("module", "tests/conformance", "examples")
               for file in (ROOT / folder).rglob("*.[ch]pp")]
    quoted = snippets(ROOT / document, "cpp")
    assert len(quoted) >= least
    for snippet in quoted:
        assert any(squeezed(snippet) in source for source in sources), snippet


def test_readme() -> None:
    """The examples in the README run, on the file that they are about."""
    plain, labelled = snippets(ROOT / "README.md", "python")
    files = subprocess.run(["dpkg", "-L", "ferret-datasets"], capture_output=True, check=True,
                           text=True).stdout.split()
    [path] = [file for file in files if file.endswith("/coads_climatology.cdf")]
    Path("coads_climatology.cdf").symlink_to(path)
    printed = io.StringIO()
    with contextlib.redirect_stdout(printed):
        exec(plain, {})  # it is the project's own
        exec(labelled, {})
    assert "TESSEL:netcdf:inqVarID:variableNotFound" in printed.getvalue()
    assert -3 < numpy.nanmin(tessel.read("mean.nc", "SST")) < 0


def test_a_wrong_example_fails() -> None:
    with pytest.raises(AssertionError, match="Expected:"):
        run(">>> 1 + 1\n3\n", "wrong", 1)
