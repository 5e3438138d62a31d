# python/tessel/show.py: the command that shows a file: python3 -m tessel.show FILE [VARIABLE].
"""Prints what is in a netCDF file and what the values of a variable are like, draws it, and writes
its mean over time."""

from __future__ import annotations

import os
import re
import subprocess
import sys
from typing import Any

import numpy as np

from tessel import describe, integrity, terminal, time_mean, wording
from tessel.dataset import Dataset, Variable


def output_path(folder: str, path: str, variable: str, ending: str) -> str:
    """The file for something made of a variable of a file."""
    stem = os.path.splitext(os.path.basename(path))[0]
    name = re.sub(r"[^\w.-]", "_", f"{stem}-{variable}").lstrip(".")
    return os.path.join(folder, f"{name[:80]}{ending}")


def describe_file(dataset: Dataset,
                  variable: Variable | None) -> np.ma.MaskedArray[Any, Any] | None:
    """Prints what is in a file, and what the values of a variable are like; returns them when they
    are numbers."""
    print(describe.listing(dataset))
    if variable is None:
        return None
    print()
    if variable.is_text:
        print(describe.texts(variable, dataset.texts(variable)))
        return None
    values = dataset.values(variable)
    print(describe.statistics(variable, values))
    return values


def _show_picture(dataset: Dataset, variable: Variable, values: np.ma.MaskedArray[Any, Any],
                  path: str) -> None:
    from tessel import picture  # here, because it takes a second that errors need not wait for

    try:
        kind = picture.draw(dataset, variable, values, path)
    except picture.NothingToDraw as reason:
        print(f"\nNo picture: {reason}.")
    else:
        print(f"\nThe {kind} is in {wording.printable(path)}")


def _show_time_mean(dataset: Dataset, variable: Variable, values: np.ma.MaskedArray[Any, Any],
                    path: str) -> None:
    try:
        over = time_mean.write(dataset, variable, values, path)
    except time_mean.NoMean as reason:
        print(f"No mean over time: {reason}.")
        return
    print(f"The mean over {wording.printable(over.name)} is in {wording.printable(path)}")
    try:
        shown = subprocess.run(["ncdump", "-h", path], capture_output=True, check=True).stdout
    except FileNotFoundError:
        print("ncdump, which would show it, is not installed.")
        return
    print("\nncdump -h says of it:\n")
    for line in shown.decode("utf-8", "replace").splitlines():
        print(f"  {wording.printable(line.expandtabs(4))}".rstrip())


def show(path: str, name: str | None, folder: str) -> None:
    """Shows a file and one of its variables."""
    with Dataset(path) as dataset:
        integrity.verify(dataset)
        variable = dataset.find(name) if name is not None else dataset.main_variable()
        values = describe_file(dataset, variable)
        if variable is None:
            print("\nNo picture: the file has no variables.")
        elif values is None:
            print("\nNo picture: its values are text.")
        else:
            os.makedirs(folder, exist_ok=True)
            _show_picture(dataset, variable, values,
                          output_path(folder, path, variable.name, ".png"))
            _show_time_mean(dataset, variable, values,
                            output_path(folder, path, variable.name, "-time-mean.nc"))


def main(arguments: list[str] | None = None) -> int:
    """The command; returns its exit status."""
    parser = terminal.Parser(prog="tessel.show", description=__doc__)
    parser.add_argument("file", metavar="FILE", help="the netCDF file")
    parser.add_argument("variable", metavar="VARIABLE", nargs="?",
                        help="the variable to show; else the first with the most dimensions")
    parser.add_argument("--output", metavar="FOLDER", default="output",
                        help="the folder of the picture and of the mean (%(default)s)")
    options = parser.parse_args(arguments)
    return terminal.run(lambda: show(options.file, options.variable, options.output))


if __name__ == "__main__":
    sys.exit(main())
