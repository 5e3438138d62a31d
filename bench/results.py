# bench/results.py: the numbers that the measuring programs wrote, in one form.
"""Reads the files of Google Benchmark and those of the programs in Python."""

from __future__ import annotations

import json
import re
from collections.abc import Mapping
from pathlib import Path

SECONDS = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3, "s": 1.0}


def of_benchmark(runs: list[dict], statistic: str = "median") -> dict[str, dict[str, float]]:
    """A statistic ("median" or "shortest") of each side of each row, in seconds of the processor.
    The name of a run is that of the row and the side, followed by how it was run."""
    rows: dict[str, dict[str, float]] = {}
    for run in runs:
        if run.get("aggregate_name") == statistic:
            name, side = re.match(r"(.*)/(reference|module|steps)/", run["run_name"] + "/").groups()
            rows.setdefault(name, {})[side] = run["cpu_time"] * SECONDS[run["time_unit"]]
    return rows


def of_python(rows: dict[str, dict[str, dict[str, float]]]) -> dict[str, dict[str, float]]:
    """The same. How sides compare is the median of what the repetitions say, so that the time of
    another side is given as that many times ours."""
    return {name: {side: measured["ratio"] * sides["tessel"]["time"]
                   for side, measured in sides.items()}
            for name, sides in rows.items() if "tessel" in sides}


class Results:
    """What each side of each row of each program took, in seconds."""

    def __init__(self, files: Mapping[str, Path]) -> None:
        self._rows: dict[str, dict[str, dict[str, float]]] = {}
        for program, file in files.items():
            read = json.loads(file.read_text())
            self._rows[program] = of_benchmark(read["benchmarks"]) if "benchmarks" in read \
                else of_python(read)

    def of(self, program: str, row: str) -> dict[str, float]:
        """The sides of a row."""
        return self._rows[program][row]
