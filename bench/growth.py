# bench/growth.py: whether a call grows faster than its work, from what bench_scaling measured.
"""The short table of docs/measurements.md's section on growth."""

from __future__ import annotations

import json
import re
from math import inf
from pathlib import Path
from typing import NamedTuple

from results import of_benchmark

MOST = 1.5
"""How many times as large a ratio may become as it was with less of something. The work is what the
library's function takes for it, so that a call which grows with its work keeps its ratio or, where
much of it is the call itself, comes nearer to one. What grows with the square of its work is many
times beyond this."""


class Series(NamedTuple):
    """The same work with more and more of something."""

    what: str
    counted: str
    ratios: dict[int, float]
    """How many times the library's time ours is, by the count: of the shortest repetitions, because
    there are few of the longest reads."""

    @property
    def counts(self) -> str:
        return f"{min(self.ratios):,} to {max(self.ratios):,}"

    @property
    def first(self) -> float:
        return self.ratios[min(self.ratios)]

    @property
    def last(self) -> float:
        return self.ratios[max(self.ratios)]

    @property
    def growth(self) -> float:
        """How many times as large a ratio is as the smallest one with less, at most. A call that
        does all of its work takes no less time: a ratio below one is the machine's."""
        least, growth = inf, 1.0
        for _, ratio in sorted(self.ratios.items()):
            least = min(least, max(ratio, 1.0))
            growth = max(growth, ratio / least)
        return growth

    @property
    def grows(self) -> bool:
        return self.growth > MOST


def all_series(numbers: Path) -> list[Series]:
    """The series in the file of bench_scaling's numbers."""
    found: dict[tuple[str, str], dict[int, float]] = {}
    rows = of_benchmark(json.loads(numbers.read_text())["benchmarks"], "shortest")
    for name, sides in rows.items():
        what, counted, count = re.fullmatch(r"(.*), ([a-z ]+): (\d+)", name).groups()
        found.setdefault((what, counted), {})[int(count)] = sides["module"] / sides["reference"]
    return sorted(Series(*key, ratios) for key, ratios in found.items())


def table(series: list[Series]) -> str:
    lines = ["| what | with the number of | from, to | ratio at first | at last | times a smaller "
             "one's, at most | faster than its work |", "|---|---|---:|---:|---:|---:|---|"]
    lines += [f"| {each.what} | {each.counted} | {each.counts} | {each.first:.2f} | "
              f"{each.last:.2f} | {each.growth:.2f} | {'**yes**' if each.grows else 'no'} |"
              for each in series]
    return "\n".join(lines)
