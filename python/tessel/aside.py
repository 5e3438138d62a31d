# python/tessel/aside.py: a new file that appears whole under its name, or not at all.
"""Files are written aside, in the folder of their target, and renamed when they are complete."""

from __future__ import annotations

import contextlib
import os
import secrets
import stat
from collections.abc import Iterator

import tessel


def _refused(identifier: str, why: str, target: str) -> tessel.Error:
    return tessel.Error(identifier, f"{why}: {target}")


def _judge(target: str, overwrite: bool, source: str | os.PathLike[str] | None) -> None:
    """Refuses a target that must not be replaced."""
    if not os.path.lexists(target):
        return
    if source is not None and os.path.exists(source) and os.path.exists(target) \
            and os.path.samefile(source, target):
        raise _refused("TESSEL:python:sameFile", "The target is the same file as the source",
                       target)
    if not overwrite:
        raise _refused("TESSEL:python:fileExists", "The target exists already", target)
    if os.path.exists(target) and not stat.S_ISREG(os.stat(target).st_mode):
        raise _refused("TESSEL:python:notARegularFile", "The target is not a regular file", target)


def _settle(temporary: str, target: str, overwrite: bool) -> None:
    """Gives the finished file its name, and has both on the disk."""
    with open(temporary, "rb") as written:
        os.fsync(written.fileno())
    if overwrite:
        os.replace(temporary, target)
    else:
        try:
            os.link(temporary, target)  # unlike a rename, never over a file made meanwhile
        except FileExistsError:
            raise _refused("TESSEL:python:fileExists", "The target exists already",
                           target) from None
        except OSError:  # a file system without links
            os.rename(temporary, target)
    folder = os.open(os.path.dirname(target), os.O_RDONLY | os.O_DIRECTORY)
    try:
        os.fsync(folder)
    finally:
        os.close(folder)


@contextlib.contextmanager
def written_aside(target: str | os.PathLike[str], *, overwrite: bool = False,
                  source: str | os.PathLike[str] | None = None) -> Iterator[str]:
    """Gives the name of a file to make and close; it becomes the target when the `with` block ends
    without an error, and is removed otherwise, by Ctrl-C too.

    A target that is there already is kept unless `overwrite` is given; one that is the same file as
    `source` is always refused. A target that is a link stays one: what it points to is replaced.
    """
    given = os.fspath(target)
    _judge(given, overwrite, source)
    real = os.path.realpath(given)
    temporary = os.path.join(os.path.dirname(real), f".tessel-{secrets.token_hex(8)}.part")
    try:
        yield temporary
        _settle(temporary, real, overwrite)
    except OSError as error:
        if error.filename == temporary:  # a name that says nothing to anyone
            error.filename = given
        raise
    finally:
        with contextlib.suppress(FileNotFoundError):
            os.unlink(temporary)
