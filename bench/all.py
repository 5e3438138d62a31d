# bench/all.py: every measurement, one after the other, and the tables and the chart made of them.
"""Runs the measuring programs and rewrites what the documents show of them.

usage: bench/all [--quick | --tables] [--built FOLDER] [PROGRAM...]

bench/all is this program with the interpreter and the package of the build. Each measuring program
puts its table into its document, and its numbers into build/release/bench/results. From those come
docs/performance.md's tables, docs/performance.svg and the short table of growth. It takes most of
an hour; run it on a machine that does nothing else. PROGRAM runs only those named, --tables none at
all, and the rest of the numbers are those of the last time. --quick tries everything out and writes
no document. --built says where the programs in C++ are, if not in build/release/bench.
"""

from __future__ import annotations

import argparse
import subprocess
import sys
import time
from pathlib import Path
from typing import NamedTuple

import growth
import profiles
from chart import draw
from expectations import ROWS, furthest, missed_without_reason, outcomes, table
from measuring import UNEXPECTED, put_between_marks
from results import Results

PROJECT = Path(__file__).resolve().parent.parent
DOCS = PROJECT / "docs"
PICTURE = "![What calls and transfers cost, beside what is expected](performance.svg)"


class Program(NamedTuple):
    """A measuring program, and the document that has its table."""

    name: str
    document: str = "measurements.md"

    @property
    def in_python(self) -> bool:
        return self.name.endswith(".py")

    def numbers(self, folder: Path) -> Path:
        """The file of its numbers."""
        return folder / f"{Path(self.name).stem}.json"

    def command(self, built: Path, folder: Path, quick: bool) -> list[str]:
        """How it is run, from the project's folder."""
        numbers = self.numbers(folder)
        start = [sys.executable, "-B", str(PROJECT / "bench" / self.name)] if self.in_python else \
            [str(built / self.name)]
        return [*start, "--json", str(numbers),
                *(["--quick"] if quick else ["--write", str(DOCS / self.document)])]


PROGRAMS = [
    Program("bench_lookup"),
    Program("bench_calls"),
    Program("bench_families"),
    Program("bench_scaling"),
    Program("python_front.py"),
    Program("xarray_engine.py"),
    Program("access_costs.py", "xarray.md"),
    Program("open_modes.py", "xarray.md"),
]


def state() -> str:
    """Which state of the project is measured."""
    git = ["git", "-C", str(PROJECT)]
    commit = subprocess.run([*git, "rev-parse", "--short", "HEAD"], check=False, text=True,
                            capture_output=True).stdout.strip()
    changed = subprocess.run([*git, "diff", "--quiet", "HEAD", "--", ":!docs"], check=False)
    return (commit or "no commit") + (", changed" if changed.returncode else "")


def measured_at(program: Program, folder: Path) -> Path:
    """The file that says which state the program's numbers are of."""
    return program.numbers(folder).with_suffix(".state")


def states(folder: Path) -> str:
    """One line: the state that everything was measured in, or each program's."""
    found = {each.name: measured_at(each, folder).read_text() for each in PROGRAMS}
    if len(set(found.values())) == 1:
        return f"Measured at commit {found.popitem()[1]}."
    return "Measured at several commits: " + "; ".join(
        f"{name} at {commit}" for name, commit in found.items()) + "."


def run(programs: list[Program], built: Path, folder: Path, quick: bool) -> list[str]:
    """Runs them, with what they say in the folder as well; gives the names of those that measured
    what they must not."""
    folder.mkdir(parents=True, exist_ok=True)
    unexpected = []
    for program in programs:
        print(f"{program.name:20}", end="", flush=True)
        start = time.monotonic()
        with open(program.numbers(folder).with_suffix(".log"), "w+") as log:
            status = subprocess.run(program.command(built, folder, quick), cwd=PROJECT, check=False,
                                    stdout=log, stderr=subprocess.STDOUT).returncode
            if status not in (0, UNEXPECTED):
                log.seek(0)
                sys.exit(f"failed\n{log.read()}")
        print(f"{time.monotonic() - start:8.0f} s", flush=True)
        measured_at(program, folder).write_text(state())
        if status == UNEXPECTED:
            unexpected.append(f"{program.name}: see {log.name}")
    return unexpected


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    names = {each.name: each for each in PROGRAMS}
    parser.add_argument("program", nargs="*", help=", ".join(names))
    only = parser.add_mutually_exclusive_group()
    only.add_argument("--quick", action="store_true",
                      help="try everything out; the numbers say nothing and go to no document")
    only.add_argument("--tables", action="store_true",
                      help="measure nothing, and write docs/performance.* from the last numbers")
    parser.add_argument("--built", type=Path, default=PROJECT / "build/release/bench",
                        help="the folder of the programs in C++")
    options = parser.parse_args()
    for unknown in set(options.program) - set(names):
        parser.error(f"there is no {unknown}")
    chosen = [names[each] for each in options.program] or PROGRAMS
    folder = options.built / ("quick" if options.quick else "results")
    unexpected = run([] if options.tables else chosen, options.built, folder, options.quick)
    results = Results({each.name: each.numbers(folder) for each in PROGRAMS
                       if each.name in {row.program for row in ROWS}})
    text = f"{PICTURE}\n\n{states(folder)}\n\n{table(results)}"
    series = growth.all_series(names["bench_scaling"].numbers(folder))
    of_growth = growth.table(series)
    print(text, of_growth, sep="\n\n")
    if options.quick:
        draw(results, folder / "performance.svg")
        print("\nTried out only: these numbers are no measurement.")
        return 0
    put_between_marks(DOCS / "performance.md", "bench/all", text)
    put_between_marks(DOCS / "measurements.md", "bench/all, growth", of_growth)
    missed = [furthest(each.row, results) for each in outcomes(results) if not each.met]
    found = profiles.all_of(missed, options.built, folder / "profiles.json",
                            anew=not options.tables)
    put_between_marks(DOCS / "performance.md", "bench/all, profiles",
                      profiles.table(missed, found))
    draw(results, DOCS / "performance.svg")
    unexpected += [f"grows faster than its work: {each.what}, {each.counted}"
                   for each in series if each.grows]
    unexpected += [f"missed, and bench/expectations.py has no reason: {row}"
                   for row in missed_without_reason(results)]
    for each in unexpected:
        print(each, file=sys.stderr)
    return 1 if unexpected else 0


if __name__ == "__main__":
    sys.exit(main())
