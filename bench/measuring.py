# bench/measuring.py: what the measuring programs in Python share.
"""The command line, taking turns, medians, tables between marks in a document, and files of
numbers."""

from __future__ import annotations

import argparse
import json
import random
import statistics
import sys
import time
from collections.abc import Callable, Iterator, Mapping, Sequence
from contextlib import contextmanager
from pathlib import Path
from typing import NamedTuple, NoReturn

Work = Callable[[], object]

# Where all sides leave nearly all of the work to the library, two measurements of the same side
# differ by as much as this, and a difference below it says nothing.
NOISE = 0.03


# The exit status of a program that measured, and found what it must not.
UNEXPECTED = 3


class Measured(NamedTuple):
    """A side of a row: how long it takes to do it once, and how many times faster the first is."""

    time: float
    ratio: float

    shortest: float
    """The shortest time, which other work on the machine disturbs least."""


def options_of(doc: str, more: Callable[[argparse.ArgumentParser], object] = lambda parser: None,
               ) -> argparse.Namespace:
    """The command line of a measuring program: what to write, and whether to measure at all; and
    what `more` adds to it."""
    parser = argparse.ArgumentParser(description=doc.splitlines()[0])
    parser.add_argument("--write", type=Path, metavar="DOCUMENT",
                        help="put the table between the marks in this document")
    parser.add_argument("--json", type=Path, metavar="FILE",
                        help="write the rows to this file, in seconds")
    parser.add_argument("--quick", action="store_true",
                        help="do everything once, on small data; the numbers say nothing")
    more(parser)
    options = parser.parse_args()
    if options.quick and options.write:
        parser.error("numbers that say nothing belong into no document")
    return options


def give_out(options: argparse.Namespace, program: str, text: str,
             rows: Mapping[str, Mapping[str, NamedTuple]]) -> None:
    """The results, to wherever they are wanted: the table of a program, and the numbers of each
    side of each row."""
    print(text)
    if options.quick:
        print("\nOnce, on small data: these numbers are no measurement.")
    if options.write:
        put_between_marks(options.write, program, text)
    if options.json:
        options.json.write_text(json.dumps(
            {name: {side: measured._asdict() for side, measured in sides.items()}
             for name, sides in rows.items()}, indent=1))


def leave(options: argparse.Namespace, unexpected: Sequence[str]) -> NoReturn:
    """Ends a program that has given out its results; with a status that says so if something in
    them must not be, unless the numbers say nothing."""
    if options.quick or not unexpected:
        sys.exit(0)
    print(*unexpected, sep="\n", file=sys.stderr)
    sys.exit(UNEXPECTED)


def seconds(work: Work) -> float:
    """How long it takes."""
    start = time.perf_counter()
    work()
    return time.perf_counter() - start


def measure(sides: Sequence[Work], repetitions: int, times: int = 1,
            before: Work = lambda: None) -> list[Measured]:
    """The sides of a row, which take turns, in another order in each repetition. One measurement
    does the work so many times. `before` comes before each, unmeasured."""
    taken: list[list[float]] = [[] for _ in sides]
    for work in sides:
        before()
        work()
    for _ in range(repetitions):
        for side in random.sample(range(len(sides)), len(sides)):
            before()
            taken[side].append(seconds(sides[side]) / times)
    return [Measured(statistics.median(each),
                     statistics.median(theirs / ours for theirs, ours in zip(each, taken[0])),
                     min(each))
            for each in taken]


@contextmanager
def telling_perf(folder: Path) -> Iterator[None]:
    """Lets perf look at what is done meanwhile (profiles.py)."""
    with (folder / "control").open("w") as control, (folder / "answer").open() as answer:
        def tell(what: str) -> None:
            control.write(what + "\n")
            control.flush()
            answer.readline()
        tell("enable")
        yield
        tell("disable")


def put_between_marks(document: Path, program: str, text: str) -> None:
    """Replaces what is between the marks of a program; at the end, with marks, when there are
    none."""
    begin, end = (f"<!-- {program}: {each} -->" for each in ("begin", "end"))
    old = document.read_text() if document.exists() else ""
    section = f"{begin}\n{text}\n{end}"
    if begin in old and end in old:
        before, rest = old.split(begin, 1)
        document.write_text(before + section + rest.split(end, 1)[1])
    else:
        document.write_text(old.rstrip("\n") + ("\n\n" if old else "") + section + "\n")
