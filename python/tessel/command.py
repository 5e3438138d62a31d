# python/tessel/command.py: the command line: tessel info, plot, copy, check and ops.
"""Looks into netCDF files, draws, copies and checks them, and explains the module's operations."""

from __future__ import annotations

import argparse
import contextlib
import os
import platform
import sys
from collections.abc import Callable, Iterator
from typing import Any, get_args

import numpy as np
import tessel
from tessel import integrity, notes, operations, reference, show, terminal, wording
from tessel.dataset import Dataset
from tessel.new_dataset import FORMATS


def _open(options: argparse.Namespace) -> Dataset:
    dataset = Dataset(options.file)
    try:
        if options.check:
            integrity.verify(dataset)
        else:
            _tell_of_zeros(dataset)
    except BaseException:
        dataset.close()
        raise
    return dataset


def _tell_of_zeros(dataset: Dataset) -> None:
    """Whoever wants a file that was cut off is told what stands for the rest."""
    missing = integrity.missing(dataset)
    if missing:
        print(wording.printable(f"tessel: zeros stand for {missing} bytes that were cut off: "
                                f"{dataset.place}"), file=sys.stderr)


def _info(options: argparse.Namespace) -> None:
    with _open(options) as dataset:
        variable = (dataset.find(options.variable) if options.variable is not None
                    else dataset.main_variable())
        show.describe_file(dataset, variable)


def _plot(options: argparse.Namespace) -> None:
    from tessel import picture  # here, because it takes a second that the others need not wait for

    with _open(options) as dataset:
        variable = dataset.find(options.variable)
        try:
            if variable.is_text:
                raise picture.NothingToDraw("its values are text")
            chosen = dict(options.index)
            kind = picture.draw(dataset, variable, dataset.values(variable, chosen),
                                options.output, chosen)
        except picture.NothingToDraw as reason:
            raise tessel.Error("TESSEL:python:nothingToDraw",
                               f"No picture of {variable.name}: {reason}.",
                               path=dataset.place) from None
    print(f"The {kind} is in {wording.printable(options.output)}")


def _copy(options: argparse.Namespace) -> None:
    with tessel.progress_bar(os.path.basename(options.source)) as progress:
        tessel.copy(options.source, options.target, options.format, overwrite=options.overwrite,
                    progress=progress, check=options.check)
    if not options.check:
        with Dataset(options.source) as source:
            _tell_of_zeros(source)


def _check(options: argparse.Namespace) -> None:
    least = tessel.check(options.file)
    name = wording.printable(options.file)
    if least is None:
        print(f"{name}: nothing to check; the library itself finds cut-off files of this format")
    else:
        there = os.path.getsize(options.file)
        print(f"{name}: complete; it needs {least} bytes and has {there}")


def _ops(options: argparse.Namespace) -> None:
    if options.name is None:
        width = max(len(each.short) for each in operations.OPERATIONS)
        for each in operations.OPERATIONS:
            print(f"{each.short:{width}}  {each.purpose}")
        return
    operation = operations.find(options.name)
    if operation is None:
        near = operations.near(options.name)
        raise tessel.Error("TESSEL:python:unknownOperation",
                           f"There is no operation {options.name}; {near}{'; ' if near else ''}"
                           "tessel ops lists all.")
    print(reference.text_of(operation), end="")


def _position(text: str) -> tuple[str, int]:
    name, equals, index = text.rpartition("=")
    if not name or not equals or not index.isdecimal():
        raise argparse.ArgumentTypeError(f"not NAME=K, with K from 0 on: {text}")
    return name, int(index)


def _add_check(parser: argparse.ArgumentParser) -> None:
    parser.add_argument("--no-check", dest="check", action="store_false",
                        help="do not refuse a file that was cut off: zeros stand for what is "
                             "gone, in a copy as well, which is complete then")


def _add_guard(parser: argparse.ArgumentParser) -> None:
    parser.add_argument("--guard", choices=get_args(tessel.Guard),
                        help="what is refused: addresses given as file names and the few calls "
                             "that the netCDF library does not survive (on), only the latter "
                             "(remote), or nothing (off); else what TESSEL_GUARD says, or on")


def _plain(error: Exception) -> str:
    """What went wrong, where no file is concerned."""
    return f"tessel: {terminal.message_of(error)}"


class _Version(argparse.Action):
    """Prints what runs here, for those who report an error."""

    def __call__(self, parser: argparse.ArgumentParser, *_others: Any) -> None:
        parser.exit(terminal.run(self._print, _plain))

    @staticmethod
    def _print() -> None:
        library = tessel.load("netcdf", guard="off").inq_libvers().partition(" ")[0]
        print(f"tessel {tessel.__version__}, netCDF library {library}, NumPy {np.__version__}, "
              f"Python {platform.python_version()}")


def parser() -> argparse.ArgumentParser:
    """The command line as its arguments are read; the manual page is made of it as well."""
    whole = terminal.Parser(prog="tessel", description=__doc__)
    whole.add_argument("--version", action=_Version, nargs=0,
                       help="print the versions of what runs here")
    commands = whole.add_subparsers(metavar="COMMAND", required=True)

    def command(name: str, action: Callable[[argparse.Namespace], None],
                text: str) -> argparse.ArgumentParser:
        made = commands.add_parser(name, help=text, description=f"{text[0].upper()}{text[1:]}.")
        made.set_defaults(action=action)
        return made

    info = command("info", _info, "print what is in a file, and what a variable's values are like")
    info.add_argument("file", metavar="FILE", help="the netCDF file")
    info.add_argument("variable", metavar="VARIABLE", nargs="?",
                      help="the variable; else the first with the most dimensions")
    _add_check(info)

    plot = command("plot", _plot, "draw a variable: a map, a section or a line, whatever fits")
    plot.add_argument("file", metavar="FILE", help="the netCDF file")
    plot.add_argument("variable", metavar="VARIABLE", help="the variable")
    plot.add_argument("-o", "--output", metavar="PICTURE", required=True,
                      help="the file of the picture, whose name ends in .png, .pdf or .svg")
    plot.add_argument("--index", metavar="NAME=K", type=_position, action="append", default=[],
                      help="the position along a dimension, counted from 0, instead of the first "
                           "one with values; can be given for several dimensions")
    _add_check(plot)

    copy = command("copy", _copy, "copy a file of a classic format, value for value")
    copy.add_argument("source", metavar="SOURCE", help="the netCDF file")
    copy.add_argument("target", metavar="TARGET", help="the file to make")
    copy.add_argument("--format", choices=sorted(FORMATS, reverse=True),
                      help="the format of the new file; else the same")
    copy.add_argument("--overwrite", action="store_true", help="replace TARGET if it is there")
    _add_check(copy)

    check = command("check", _check, "find out whether a file was cut off")
    check.add_argument("file", metavar="FILE", help="the netCDF file")

    for each in (info, plot, copy, check):
        _add_guard(each)

    ops = command("ops", _ops, "explain the operations of the module")
    ops.add_argument("name", metavar="NAME", nargs="?", help="the operation; else all are listed")
    return whole


# What an error is called that a call for the file raised, even if its path is none of a file.
_OF_A_FILE = ("TESSEL:netcdf:", "TESSEL:guard:")


def _line(error: Exception, options: argparse.Namespace) -> str:
    """What went wrong, with which file, and what is there instead of a dataset."""
    message = terminal.message_of(error)
    if isinstance(error, tessel.Error):
        path = error.path
        if path is None and error.identifier.startswith(_OF_A_FILE):
            path = getattr(options, "file", getattr(options, "source", None))
        if path:
            message = ": ".join([terminal.with_file(error.message, path),
                                 *notes.instead(error), *notes.known(error)])
    return f"tessel: {message}"


@contextlib.contextmanager
def _guarded(guard: str | None) -> Iterator[None]:
    """Has everything in the `with` block load the module with this guard, if one is given."""
    before = os.environ.get("TESSEL_GUARD")
    if guard is not None:
        os.environ["TESSEL_GUARD"] = guard
    try:
        yield
    finally:
        if before is not None:
            os.environ["TESSEL_GUARD"] = before
        elif guard is not None:
            del os.environ["TESSEL_GUARD"]


def main(arguments: list[str] | None = None) -> int:
    """The command line; returns its exit status."""
    options = parser().parse_args(arguments)
    with _guarded(getattr(options, "guard", None)):
        return terminal.run(lambda: options.action(options), lambda error: _line(error, options))
