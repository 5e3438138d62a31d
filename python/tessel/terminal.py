# python/tessel/terminal.py: what commands have in common on a terminal: errors, and progress.
"""Runs a command so that whatever fails is one line, and shows how far long work is."""

from __future__ import annotations

import argparse
import contextlib
import io
import os
import signal
import sys
import threading
import time
from collections.abc import Callable, Iterator
from types import TracebackType
from typing import NoReturn, TextIO

import tessel
from tessel import wording

_BAR = 40
_EVERY = 0.1  # seconds


class Parser(argparse.ArgumentParser):
    """A parser of which every error is one line too, and shows nothing that steers a terminal."""

    def error(self, message: str) -> NoReturn:
        """Ends the process."""
        line = wording.printable(f"{message}; try {self.prog} --help")
        self.exit(1, f"{self.prog.split()[0]}: {line}\n")


def with_file(message: str, path: str) -> str:
    """A message with the file that it is about."""
    return f"{message.rstrip('.')}: {path}"


def message_of(error: Exception) -> str:
    """What an error says: the module's own message alone, and all others with the file if one is
    known."""
    if isinstance(error, tessel.Error):
        if error.path is not None and error.identifier.startswith("TESSEL:python:"):
            return with_file(error.message, error.path)
        return error.message
    if isinstance(error, MemoryError):
        return "There is not enough memory."
    if isinstance(error, ModuleNotFoundError) and error.name:
        library = error.name.partition(".")[0]
        return (f"This needs {library}, which is not installed; Debian has it in the package "
                f"python3-{library}.")
    if isinstance(error, OSError) and error.strerror:
        name = error.filename
        return f"{error.strerror}: {os.fsdecode(name)}" if name else error.strerror
    return str(error)


class _Terminated(BaseException):
    """Somebody asked the process to end."""


@contextlib.contextmanager
def _terminable() -> Iterator[None]:
    """Has SIGTERM raise an exception within the `with` block, so that files that were begun are
    removed. Where it has been given another meaning, and in other threads, nothing changes."""
    if (threading.current_thread() is not threading.main_thread()
            or signal.getsignal(signal.SIGTERM) is not signal.SIG_DFL):
        yield
        return

    def terminate(_number: int, _frame: object) -> None:
        # Some send it twice, to the process and to its group; the second must not end the tidying.
        signal.signal(signal.SIGTERM, signal.SIG_IGN)
        raise _Terminated

    signal.signal(signal.SIGTERM, terminate)
    try:
        yield
    finally:
        signal.signal(signal.SIGTERM, signal.SIG_DFL)


def _ended_by(number: signal.Signals) -> int:
    """Ends the process as the signal ends others."""
    signal.signal(number, signal.SIG_DFL)
    os.kill(os.getpid(), number)
    return 128 + number


def run(command: Callable[[], object], line: Callable[[Exception], str] = message_of) -> int:
    """Runs a command and returns its exit status: 0, or 1 when it failed, which one `line` on the
    standard error says. Ctrl-C and SIGTERM end the process as they end others, after what was begun
    has been removed."""
    for stream in (sys.stdout, sys.stderr):  # never fail over a character that a terminal lacks
        if isinstance(stream, io.TextIOWrapper):
            stream.reconfigure(errors="backslashreplace")
    try:
        with _terminable():
            command()
        sys.stdout.flush()
        return 0
    except BrokenPipeError:  # whoever read has seen enough
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
        return 0
    except KeyboardInterrupt:
        return _ended_by(signal.SIGINT)
    except _Terminated:
        return _ended_by(signal.SIGTERM)
    except (tessel.Error, OSError, MemoryError, ImportError) as error:
        message = line(error)
    try:
        sys.stdout.flush()
    except OSError:  # it is what failed
        os.dup2(os.open(os.devnull, os.O_WRONLY), sys.stdout.fileno())
    print(wording.printable(message), file=sys.stderr)
    return 1


class ProgressBar:
    """Shows how far long work is: a line that is drawn anew, on a terminal only. It is what
    `progress` takes in `tessel.read` and `tessel.copy`."""

    def __init__(self, title: str, stream: TextIO) -> None:
        self._title = f"{wording.printable(title)} " if title else ""
        self._stream = stream
        self._shown = stream.isatty()
        self._next = 0.0
        self._open = False

    def __call__(self, done: int, total: int) -> None:
        """`done` of `total` bytes are done."""
        now = time.monotonic()
        if not self._shown or (now < self._next and done < total):
            return
        self._next = now + _EVERY
        share = done / total if total else 1.0
        bar = "#" * int(_BAR * share)
        self._stream.write(f"\r{self._title}[{bar:{_BAR}}] {100 * share:3.0f} % "
                           f"of {wording.size(total)}")
        self._open = True
        if done >= total:
            self.end()
        self._stream.flush()

    def end(self) -> None:
        """Ends the line, if one was begun."""
        if self._open:
            self._stream.write("\n")
            self._open = False

    def __enter__(self) -> ProgressBar:
        return self

    def __exit__(self, kind: type[BaseException] | None, error: BaseException | None,
                 traceback: TracebackType | None) -> None:
        self.end()


def progress_bar(title: str = "", stream: TextIO | None = None) -> ProgressBar:
    """A progress bar on a terminal, and nothing in a pipe or a file.

        >>> with tessel.progress_bar("copying") as progress:
        ...     tessel.copy("sst.nc", "copy.nc", progress=progress)

    Without `with`, a line that is cut short by an error is left as it is. `stream` is the standard
    error unless given.
    """
    return ProgressBar(title, sys.stderr if stream is None else stream)
