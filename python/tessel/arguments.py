# python/tessel/arguments.py: what the methods make of their arguments before the module sees them.
"""The rules by which a method's arguments become the host's.

- A path may be a str, bytes or a path object, and is that very file: of bytes by the encoding of
  file names, and with the blanks that it begins with. What the library would take for another file
  is refused ("TESSEL:python:badPath").
- A whole number (an id, a size, a code, a mode) may be anything that Python takes for an index:
  int, a NumPy integer of any width, an IntEnum.
- A vector of positions, and a list of dimension ids, may be any iterable of whole numbers.
- Data: an array of NumPy's, and a scalar of NumPy's, go to the module unchanged, and it accepts
  exactly the member's class. Python's own numbers have no such class: an int, a float, and a list
  or tuple of them, nested like the array that `numpy.array` makes of it, become the member's class
  when that is exact. Where a digit would be lost, the call is refused ("TESSEL:python:notExact")
  and says how to round on purpose.
- Text: a str that an attribute is to hold becomes UTF-8, which is what reading one decodes. In a
  variable a character is one byte, so text for one may have the characters of ASCII, and those that
  reading gives for bytes above 127; others, of which the module would store the low byte, are
  refused ("TESSEL:python:notOneByte"), as they are in arrays of characters. bytes are what they are.

Everything else, bool included, goes on as it is, and the module judges it.
"""

from __future__ import annotations

import operator
import os
import re
from collections.abc import Iterable
from typing import Any

import numpy

from tessel import paths, wording
from tessel.errors import Error

_NO_BYTE = re.compile("[^\0-\x7f\uff80-\uffff]")
"""A character that is neither one of ASCII nor what reading a variable gives for a byte."""


def file_path(value: Any) -> Any:
    """The text of a path; else the value itself."""
    return paths.given(value) if isinstance(value, (str, bytes, os.PathLike)) else value


def integer(value: Any) -> Any:
    """An int for whatever is a whole number; else the value itself."""
    if isinstance(value, bool):
        return value
    try:
        return operator.index(value)
    except TypeError:
        return value


def code(value: Any) -> Any:
    """A whole number, which the host wants as a double: the module would read the bytes of an int32
    as a double's."""
    if isinstance(value, numpy.ndarray) and value.dtype.kind in "iu":
        return value.astype(float)
    return integer(value)


def vector(value: Any) -> Any:
    """A list for an iterable that is no array; else the value itself."""
    if isinstance(value, (numpy.ndarray, str, bytes)) or not isinstance(value, Iterable):
        return value
    return [integer(each) for each in value]


def identifiers(value: Any) -> Any:
    """A list of ids, which the host wants as doubles."""
    if isinstance(value, numpy.ndarray):
        return code(value)
    value = vector(value)
    return [integer(value)] if not isinstance(value, list) else value


def numbers(value: Any, dtype: numpy.dtype[Any]) -> Any:
    """An array of exactly this dtype for Python's own numbers; else the value itself."""
    if type(value) not in (int, float, list, tuple):
        return value
    try:
        objects = numpy.array(value, object)
    except ValueError:  # lists of different lengths that are no array at all
        return value
    flat = [each.item() if isinstance(each, numpy.number) else each
            for each in objects.ravel().tolist()]
    if not {type(each) for each in flat} <= {int, float}:
        return value
    made = numpy.empty(len(flat), dtype)
    with numpy.errstate(all="ignore"):
        for i, each in enumerate(flat):
            if not _put(made, i, each):
                raise Error("TESSEL:python:notExact",
                            f"{wording.abridged(each)} is not exact as {dtype.name}; pass an array "
                            "of that dtype to have it rounded.")
    return made.reshape(objects.shape)


def attribute_text(value: Any) -> Any:
    """The bytes of text for an attribute; else the value itself, if no character of it is lost."""
    if not isinstance(value, str):
        return text_of_bytes(value)
    try:
        return value.encode()
    except UnicodeEncodeError:
        raise Error("TESSEL:python:notText",
                    "The text has half of a surrogate pair.") from None


def text_of_bytes(value: Any) -> Any:
    """The value itself; an error for text and arrays of characters of which one is no byte."""
    lost = _lost(value)
    if lost is None:
        return value
    raise Error("TESSEL:python:notOneByte",
                f"{lost!r} (U+{ord(lost):04X}) is not one byte; give the bytes that the text is to "
                'be, such as text.encode("latin-1").')


def _lost(value: Any) -> str | None:
    """A character that would not be itself any more as one byte."""
    if isinstance(value, str):
        found = _NO_BYTE.search(value)
        return found[0] if found else None
    if isinstance(value, numpy.ndarray) and value.dtype.kind == "U" and value.itemsize == 4:
        points = value.view(f"{value.dtype.byteorder}u4")
        wrong = points[(points > 0x7f) & ((points < 0xff80) | (points > 0xffff))]
        return chr(wrong.flat[0]) if wrong.size else None
    return None


def _put(made: numpy.ndarray[Any, Any], i: int, value: float) -> bool:
    """Whether the element could be set to exactly this value."""
    if made.dtype.kind in "iu":
        limits = numpy.iinfo(made.dtype)
        if not limits.min <= value <= limits.max or value != int(value):
            return False
        value = int(value)
    try:
        made[i] = value
    except OverflowError:  # an int beyond the largest double
        return False
    return bool(made[i].item() == value or value != value)
