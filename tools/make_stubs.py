#!/usr/bin/env python3
"""tools/make_stubs.py: writes the type stubs of the package from its tables and the extension.

usage: PYTHONPATH=build/release/python /usr/bin/python3 tools/make_stubs.py
"""

from __future__ import annotations

import builtins
from pathlib import Path

from tessel import errors
from tessel.errors import CLASSES
from tessel.operation import Operation
from tessel.operations import OPERATIONS

FOLDER = Path(__file__).parents[1] / "python" / "tessel"

RUNTIME = '''
from collections.abc import Callable
from pathlib import Path
from typing import Any

version: str

class Module:
    def __new__(
        cls, module: Module, instead: dict[str, Callable[..., Any]] = ...
    ) -> Module: ...
    def __call__(self, *arguments: Any) -> Any: ...
    @property
    def file(self) -> Path: ...

def call(module: Module, /, *arguments: Any) -> Any: ...
def call_ints(module: Module, /, *arguments: Any) -> Any: ...
def find(name: bytes | str) -> Module: ...
def guarded(module: Module, remote: bool) -> Module: ...
def load_file(path: bytes | str) -> Module: ...
'''

FAULTS = '''
def begin() -> None: ...
def end() -> bool: ...
def fetch(address: int, counts: list[int], steps: list[int]) -> None: ...
'''

ERRORS = '''
import builtins
from typing import Any

BUILT_INS: dict[type[builtins.Exception], str]
SYSTEM_ERRORS: dict[str, int]
WITHOUT_BUILT_IN: list[str]
CLASSES: dict[str, type[Error]]

class Error(Exception):
    identifier: str
    message: str
    operation: str | None
    path: str | None
    def __new__(
        cls, identifier: str, message: str, operation: str | None = ..., *, path: str | None = ...
    ) -> Error: ...
    def __init__(
        self, identifier: str, message: str, operation: str | None = ..., *, path: str | None = ...
    ) -> None: ...
    @property
    def word(self) -> str: ...
    def __reduce__(self) -> tuple[Any, ...]: ...

def word_of(identifier: str) -> str: ...
def built_in_of(word: str) -> type[builtins.Exception] | None: ...
def raised(
    module: object, arguments: tuple[object, ...], identifier: str, message: str
) -> Error: ...
def explained(error: Error, module: object, arguments: tuple[object, ...]) -> Error: ...

'''

NETCDF = '''
from collections.abc import Sequence
from typing import Any, NamedTuple, SupportsIndex

import numpy
from numpy.typing import NDArray

from tessel import paths
from tessel._runtime import Module

Indices = SupportsIndex | Sequence[SupportsIndex] | NDArray[Any]
Numbers = float | Sequence[Any]

def path_of(ncid: int) -> str | None: ...

'''


def heading(name: str) -> str:
    """What a stub begins with."""
    return f"# python/tessel/{name}: written by tools/make_stubs.py; change the tables instead.\n"


def several(operation: Operation) -> str:
    """The class of an operation's results."""
    fields = "".join(f"    {each.name}: {each.kind.annotation}\n" for each in operation.results)
    return f"class {operation.several}(NamedTuple):\n{fields}\n"


def method(operation: Operation, name: str) -> str:
    """One method."""
    line = f"    def {name}({operation.parameters}) -> {operation.returns}: ...\n"
    if len(line) <= 100:
        return line
    inner = "".join(f"        {each},\n" for each in operation.parameters.split(", "))
    return f"    def {name}(\n{inner}    ) -> {operation.returns}: ...\n"


def made() -> dict[str, str]:
    """The stubs by the name of the file."""
    classes = dict.fromkeys(CLASSES.values())
    doubles = "".join(f"class {each.__name__}(Error, builtins.{each.__name__}): ...\n"
                      for each in classes)
    for each in classes:
        assert getattr(errors, each.__name__) is each and hasattr(builtins, each.__name__)
    results = "".join(several(each) for each in OPERATIONS if each.several)
    methods = "".join(method(each, name) for each in OPERATIONS for name in each.names)
    netcdf = "class Netcdf(Module):\n    def __new__(cls, module: Module) -> Netcdf: ...\n"
    return {
        "_faults.pyi": heading("_faults.pyi") + FAULTS,
        "_runtime.pyi": heading("_runtime.pyi") + RUNTIME,
        "errors.pyi": heading("errors.pyi") + ERRORS + doubles,
        "netcdf.pyi": heading("netcdf.pyi") + NETCDF + results + netcdf + methods,
    }


if __name__ == "__main__":
    for file, text in made().items():
        (FOLDER / file).write_text(text)
        print(FOLDER / file)
