# python/tessel/wording.py: text for people: numbers, counts, and text from files made harmless.
"""How numbers and foreign text are written for people."""

from __future__ import annotations

import reprlib
import unicodedata
from collections.abc import Mapping
from typing import Any

import numpy as np

_LONGEST_VALUE = 60
_MOST_ELEMENTS = 12
_UNPRINTABLE = {"Cc", "Cf", "Cs", "Co", "Cn", "Zl", "Zp"}


def printable(text: str) -> str:
    """The text with control and invisible characters written as escapes, so that nothing that
    comes from a file can steer a terminal."""
    return "".join(
        character.encode("unicode_escape").decode() if unicodedata.category(character)
        in _UNPRINTABLE else character for character in text)


def shortened(text: str, length: int) -> str:
    """At most so many characters of the text, and how many there are when that is not all."""
    if len(text) <= length:
        return text
    return f"{text[:length]}… ({count(len(text))} characters)"


class _Short(reprlib.Repr):
    """Writes values, but never all of a large one."""

    def repr_int(self, value: int, level: int) -> str:
        """An int; Python itself refuses to write one of thousands of digits."""
        bits = value.bit_length()
        return super().repr_int(value, level) if bits < 200 else f"<int of {bits} bits>"

    def repr_instance(self, value: Any, level: int) -> str:
        """What has dimensions by name, such as a dataset of xarray's, by those; and what Python
        writes on several lines, on one."""
        sizes = getattr(value, "sizes", None)
        if not isinstance(sizes, Mapping):
            return " ".join(super().repr_instance(value, level).split())
        lengths = ", ".join(f"{name}: {length}" for name, length in sizes.items())
        return f"<{type(value).__name__} ({lengths})>"


_short = _Short()
_short.maxlevel = 2
_short.maxlist = _short.maxtuple = _short.maxdict = _MOST_ELEMENTS
_short.maxstring = _LONGEST_VALUE - 10
_short.maxother = _LONGEST_VALUE


def abridged(value: Any) -> str:
    """A value as Python writes it, on one line, and not all of it if it is long."""
    if isinstance(value, np.ndarray):
        if value.dtype.kind in "biuf" and value.size == 1:
            return str(value.item())
        what = f"{value.dtype.name} array of shape {value.shape}"
        few = 0 < value.size <= 4
        return f"<{what}: {_short.repr(value.ravel().tolist())}>" if few else f"<{what}>"
    if isinstance(value, (str, bytes)):
        return repr(value if len(value) <= _LONGEST_VALUE else value[:_LONGEST_VALUE]) + (
            f"... ({len(value)} characters)" if len(value) > _LONGEST_VALUE else "")
    if isinstance(value, (list, tuple)) and len(value) > _MOST_ELEMENTS:
        return f"<{type(value).__name__} of {len(value)}>"
    text = _short.repr(value)
    return text if len(text) <= _LONGEST_VALUE else text[:_LONGEST_VALUE] + "..."


def number(value: float | np.number[Any]) -> str:
    """A number as short as seven significant digits allow; integers in full."""
    if np.asarray(value).dtype.kind in "iu":
        return str(value)
    return f"{float(value):.7g}"


def stored_number(value: np.generic) -> str:
    """A number of a file as exactly as its type holds it: 0.1 in 32 bits is 0.1."""
    return str(value).removesuffix(".0")


def count(value: int) -> str:
    """A count with its digits in groups."""
    return f"{value:,}"


def size(value: int) -> str:
    """A number of bytes."""
    amount = float(value)
    for unit in ("bytes", "KiB", "MiB", "GiB", "TiB"):
        if amount < 1024 or unit == "TiB":
            break
        amount /= 1024
    return f"{amount:.4g} {unit}"


def with_units(text: str, units: str) -> str:
    """A value and its units."""
    return f"{text} {printable(units)}" if units else text
