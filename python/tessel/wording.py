# python/tessel/wording.py: text for people: numbers, counts, and text from files made harmless.
"""How numbers and foreign text are written for people."""

from __future__ import annotations

import unicodedata
from typing import Any

import numpy as np

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
