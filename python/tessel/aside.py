# python/tessel/aside.py: a new file that appears whole under its name, or not at all.
"""Files are written aside, in the folder of their target, and renamed when they are complete."""

from __future__ import annotations

import contextlib
import errno
import os
import secrets
import stat
from collections.abc import Iterator

import tessel
from tessel import paths


def _judge(target: str, overwrite: bool, source: paths.Path | None) -> None:
    """Refuses a target that must not be replaced."""
    if not os.path.lexists(target):
        return
    if source is not None and os.path.exists(source) and os.path.exists(target) \
            and os.path.samefile(source, target):
        raise tessel.Error("TESSEL:python:sameFile", "The target is the same file as the source.",
                           path=target)
    if not overwrite:
        raise _exists(target)
    if os.path.exists(target) and not stat.S_ISREG(os.stat(target).st_mode):
        raise tessel.Error("TESSEL:python:notARegularFile", "The target is not a regular file.",
                           path=target)


def _exists(target: str) -> tessel.Error:
    return tessel.Error("TESSEL:python:fileExists", "The target exists already.", path=target)


def _settle(temporary: str, real: str, target: str, overwrite: bool) -> None:
    """Gives the finished file its name, and has both on the disk."""
    with open(temporary, "rb") as written:
        os.fsync(written.fileno())
    if overwrite:
        os.replace(temporary, real)
    else:
        try:
            os.link(temporary, real)  # unlike a rename, never over a file made meanwhile
        except FileExistsError:
            raise _exists(target) from None
        except OSError:  # a file system without links
            os.rename(temporary, real)
    folder = os.open(os.path.dirname(real), os.O_RDONLY | os.O_DIRECTORY)
    try:
        os.fsync(folder)
    finally:
        os.close(folder)


@contextlib.contextmanager
def written_aside(target: paths.Path, *, overwrite: bool = False,
                  source: paths.Path | None = None) -> Iterator[str]:
    """Gives the name of a file to make and close; it becomes the target when the `with` block ends
    without an error, and is removed otherwise, by Ctrl-C too.

    A target that is there already is kept unless `overwrite` is given; one that is the same file as
    `source` is always refused. A target that is a link stays one: what it points to is replaced.
    Errors name the target, never the file that is there meanwhile.
    """
    given = paths.given(target)
    if not given:
        raise tessel.Error("TESSEL:python:badPath", "The target has no name.")
    if paths.is_address(given):
        raise tessel.Error("TESSEL:python:badPath",
                           f"The target is an address, and no file can be made there: {given}")
    wanted = paths.absolute(given)
    _judge(wanted, overwrite, source)
    # Where the folder is not there, `realpath` makes up another; the name that was given then fails
    # as it should.
    real = paths.given(os.path.realpath(wanted) if os.path.isdir(os.path.dirname(wanted))
                       else wanted)
    if os.path.islink(real):
        raise OSError(errno.ELOOP, os.strerror(errno.ELOOP), given)
    temporary = os.path.join(os.path.dirname(real), f".tessel-{secrets.token_hex(8)}.part")
    try:
        with paths.called(temporary, wanted):
            yield temporary
            _settle(temporary, real, wanted, overwrite)
    except OSError as error:
        if error.filename == temporary:
            error.filename = given
        raise
    finally:
        with contextlib.suppress(FileNotFoundError):
            os.unlink(temporary)
