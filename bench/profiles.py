# bench/profiles.py: where the time of a row goes that misses what is expected of it.
"""Profiles by perf (Debian's linux-perf) of each row that was missed, and of its direct call.

A measuring program is started under perf with `--perf FOLDER`, and tells it by the pipes that are
there (`telling_perf` in measuring.py, `Perf` in pairs.cpp) when the work begins and ends: what it
makes ready is not in the profile. A sample is taken of the processor's clock, in the kernel as well,
and belongs to the file that the code was loaded from.
"""

from __future__ import annotations

import json
import os
import re
import subprocess
import sys
import tempfile
from pathlib import Path
from typing import NamedTuple

from expectations import Outcome, shown

PER_SECOND = 4999
FUNCTIONS = 4  # of each row
LEAST = 0.005  # what is less is not shown

OWNERS = {
    "netCDF library": r"libnetcdf\.so",
    "kernel": r"\[kernel|\[vdso",
    "C library": r"libc\.so|libstdc\+\+|ld-linux",
    "module": r"netcdf\.tsx",
    "host": r"libtessel\.so",
    "Python": r"_runtime\.|python3|libpython",
}
REST = "measuring"  # the program that makes the calls


class Profile(NamedTuple):
    """The shares of the time, of 1."""

    owners: dict[str, float]
    functions: dict[str, float]


def owner_of(file: str) -> str:
    return next((owner for owner, names in OWNERS.items() if re.match(names, file)), REST)


def parsed(report: str) -> Profile:
    """A profile of lines "12.34% |file |[.] function"."""
    owners = dict.fromkeys([*OWNERS, REST], 0.0)
    functions: dict[str, float] = {}
    for line in report.splitlines():
        if row := re.match(r"\s*([\d.]+)%\s*\|(\S+)\s*\|\[.\] (.+?)\s*$", line):
            share, owner = float(row[1]) / 100, owner_of(row[2])
            owners[owner] += share
            if not re.match(r"0x|__internal", row[3]):  # what has a name
                functions[row[3]] = functions.get(row[3], 0) + share
    if not sum(owners.values()) > 0.9:
        raise SystemExit(f"This is no profile:\n{report}")
    largest = sorted(functions.items(), key=lambda each: -each[1])
    return Profile(owners, dict(largest[:FUNCTIONS]))


def sides_of(outcome: Outcome) -> dict[str, float]:
    """The sides of a row that are profiled, and the time of each; netCDF4-python is not."""
    ours = {outcome.row.ours: outcome.ours}
    return ours if outcome.row.program.endswith(".py") else \
        {outcome.row.theirs: outcome.reference, **ours}


def command(outcome: Outcome, side: str, built: Path) -> list[str]:
    """What does one side of a row over and over."""
    row, here = outcome.row, Path(__file__).parent
    if row.program.endswith(".py"):
        return [sys.executable, "-B", str(here / row.program), f"--row={outcome.form}"]
    return [str(built / row.program), f"--benchmark_filter=^{outcome.form}/{side}/"]


def profile(outcome: Outcome, side: str, built: Path) -> Profile:
    """Runs a side of a row under perf."""
    with tempfile.TemporaryDirectory() as folder:
        for pipe in ("control", "answer"):
            os.mkfifo(f"{folder}/{pipe}")
        subprocess.run(
            ["perf", "record", "--quiet", "--event=cpu-clock", f"--freq={PER_SECOND}", "--delay=-1",
             f"--control=fifo:{folder}/control,{folder}/answer", f"--output={folder}/samples",
             *command(outcome, side, built), "--perf", folder],
            check=True, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        return parsed(subprocess.run(
            ["perf", "report", "--stdio", "--no-children", "--sort=dso,sym", "--field-separator=|",
             f"--input={folder}/samples"],
            check=True, capture_output=True, text=True).stdout)


def name_of(outcome: Outcome, side: str) -> str:
    what = outcome.row.what
    if outcome.row.together:  # of which one form is profiled
        what += f" ({outcome.form.split('/')[0]})"
    return what if side == outcome.row.ours else f"{what}: {outcome.row.reference}"


def table(missed: list[Outcome], profiles: dict[str, Profile]) -> str:
    """What of a row's time is whose, and its longest functions."""
    owners = [*OWNERS, REST]
    lines = [f"| what | time | {' | '.join(owners)} | most of it |",
             f"|---|{'---:|' * (len(owners) + 1)}---|"]
    for each in missed:
        for side, time in sides_of(each).items():
            name = name_of(each, side)
            found = profiles[name]
            times = " | ".join(shown(found.owners[owner] * time)
                               if found.owners[owner] >= LEAST else "–" for owner in owners)
            functions = ", ".join(f"`{function}` {100 * share:.0f} %"
                                  for function, share in found.functions.items())
            lines.append(f"| {name} | {shown(time)} | {times} | {functions} |")
    return "\n".join(lines)


def all_of(missed: list[Outcome], built: Path, file: Path, *, anew: bool) -> dict[str, Profile]:
    """The profiles of these rows: measured, or those of the last time where there are any."""
    found = {} if anew or not file.exists() else {
        name: Profile(*each) for name, each in json.loads(file.read_text()).items()}
    for each in missed:
        for side in sides_of(each):
            name = name_of(each, side)
            if name not in found:
                print(f"profile: {name}", flush=True)
                found[name] = profile(each, side, built)
    file.write_text(json.dumps(found, indent=1))
    return found
