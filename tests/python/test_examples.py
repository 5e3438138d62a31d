# tests/python/test_examples.py: each example prints what its docstring says.
"""Runs every Python program in examples/ and compares what it prints."""

from __future__ import annotations

import ast
import os
import subprocess
import sys
import textwrap
from pathlib import Path

import pytest

FOLDER = Path(__file__).resolve().parents[2] / "examples"
EXAMPLES = sorted(FOLDER.glob("*.py"))


def promised(program: Path) -> str:
    """What the docstring says is printed."""
    text = ast.get_docstring(ast.parse(program.read_text()))
    assert text, f"{program.name} has no docstring"
    _, printed = text.split("\nPrints:\n\n")
    return textwrap.dedent(printed) + "\n"


def run(program: Path, *arguments: str | Path, temporary: Path) -> str:
    done = subprocess.run([sys.executable, "-B", program, *arguments], text=True, check=True,
                          stdout=subprocess.PIPE, env={**os.environ, "TMPDIR": str(temporary)})
    return done.stdout


# Worker processes would load the sanitizers' libraries as well, and take very long.
@pytest.mark.parametrize("program", [
    pytest.param(each, id=each.stem, marks=[pytest.mark.without_sanitizers]
                 if each.stem.startswith("distributed") else []) for each in EXAMPLES])
def test_example(program: Path, tmp_path: Path) -> None:
    given, temporary = tmp_path / "given", tmp_path / "temporary"
    given.mkdir()
    temporary.mkdir()
    assert run(program, given, temporary=temporary) == promised(program)
    assert list(given.glob("*.nc")), "nothing was written into the folder that was given"
    assert run(program, temporary=temporary) == promised(program)
    assert not list(temporary.iterdir()), "something was left behind"


def test_there_are_examples() -> None:
    assert len(EXAMPLES) >= 5
