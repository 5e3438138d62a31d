# python/tessel/values.py: what the host has and Python has not: two of its classes.
"""The values without a counterpart in Python or NumPy."""

from __future__ import annotations

from dataclasses import dataclass

from tessel.errors import Error


@dataclass(frozen=True)
class Function:
    """A handle of the host's function of that name."""

    name: str

    def __post_init__(self) -> None:
        if not isinstance(self.name, str):
            raise Error("TESSEL:python:badFunctionName", "The name of a function is a str.")


@dataclass(frozen=True)
class Unknown:
    """An array of the host's class "unknown", of which nothing but the shape is known."""

    shape: tuple[int, ...] = (0, 0)

    def __post_init__(self) -> None:
        if not isinstance(self.shape, tuple):
            raise Error("TESSEL:python:badShape", "A shape is a tuple of lengths.")
