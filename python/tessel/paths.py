# python/tessel/paths.py: names of files: as they were given, where they lead, what to call them.
"""Paths for the module, and for people.

The module takes a path as text and makes UTF-8 of it. A name that cannot make that way unchanged
would lead to another file, so it is refused here.
"""

from __future__ import annotations

import contextlib
import os
import re
import stat
from collections.abc import Iterator
from typing import Any, Union

from tessel.errors import Error

Path = Union[str, bytes, os.PathLike[str], os.PathLike[bytes]]

_UP = re.compile(r"/+\.\.(?:/+|\Z)")
"""The first of these in a path is where it leads upwards."""

_SCHEME = re.compile(r"(?:\[[^]]*\])*[A-Za-z0-9.+-]+://")
"""What an address begins with, behind any parameters in brackets."""

_BLANKS = "".join(map(chr, range(1, 33)))
"""What the library skips at the beginning of a path."""

_called: dict[str, str] = {}
"""Files that have a name for the time being only, and the name that they are to have."""


def given(path: Any) -> str:
    """A path as text: of str, bytes and path objects; an error for everything else, and for what
    the module would take for another path."""
    try:
        text = os.fsdecode(path)
    except TypeError:
        raise Error("TESSEL:python:unsupportedType",
                    "A path is a str, bytes or a path object, not of the type "
                    f"{type(path).__name__}.") from None
    if "\0" in text:
        raise Error("TESSEL:python:badPath", "A path has no NUL in it.")
    try:
        text.encode()
    except UnicodeEncodeError:
        raise Error("TESSEL:python:badPath", "The path is not UTF-8, and the module takes no "
                    f"other: {text!r}", path=absolute(text)) from None
    return f"./{text}" if text[:1] in _BLANKS and text else text


def is_address(path: str) -> bool:
    """Whether the library would take a path for an address."""
    return _SCHEME.match(path) is not None


def taken(path: Any) -> str:
    """The file that the library takes for a path that a call of the module is given: bytes are a
    character each there, blanks at the beginning are skipped, and a NUL is the end."""
    text: str | bytes = os.fspath(path)
    if isinstance(text, bytes):
        text = text.decode("latin-1")
    return text.partition("\0")[0].lstrip(_BLANKS)


def absolute(path: str, folder: str | None = None) -> str:
    """Where a path leads from a folder, the current one unless given; what is no path of a file
    stays as it is.

    It leads where the system goes: `..` behind a link is above the folder that the link leads to,
    and behind what is no folder it is nowhere.
    """
    if not path or "\0" in path or "://" in path:
        return path
    try:
        whole = os.path.join(os.getcwd() if folder is None else folder, path)
    except OSError:  # the current folder has been removed
        return path
    while _UP.search(whole):
        before, after = _UP.split(whole, 1)
        above = _above(os.path.normpath(before or os.sep))
        if above is None:  # whoever opens it is told so
            return whole
        whole = os.path.join(above, after)
    return os.path.normpath(whole)


def _above(folder: str) -> str | None:
    """Where `..` leads from a folder; None where there is none."""
    try:
        if stat.S_ISDIR(os.lstat(folder).st_mode):
            return os.path.dirname(folder)
    except OSError:
        return None
    # A link: it is followed to the end.
    return os.path.dirname(os.path.realpath(folder)) if os.path.isdir(folder) else None


@contextlib.contextmanager
def called(temporary: str, target: str) -> Iterator[None]:
    """While the `with` block runs, notes call the file `temporary` by the name of its target."""
    _called[temporary] = target
    try:
        yield
    finally:
        del _called[temporary]


def shown(path: Any) -> Any:
    """What to call a file; what is none stays as it is."""
    return _called.get(path, path) if isinstance(path, str) else path
