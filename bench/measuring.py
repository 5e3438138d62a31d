# bench/measuring.py: what the measuring programs in Python share.
"""Taking turns, medians, and tables between marks in a document."""

from __future__ import annotations

import random
import statistics
import time
from collections.abc import Callable, Sequence
from pathlib import Path
from typing import NamedTuple

Work = Callable[[], object]

# Where all sides leave nearly all of the work to the library, two measurements of the same side
# differ by as much as this, and a difference below it says nothing.
NOISE = 0.03


class Measured(NamedTuple):
    """A side of a row: how long it takes to do it once, and how many times faster the first is."""

    time: float
    ratio: float

    shortest: float
    """The shortest time, which other work on the machine disturbs least."""


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
