"""tests/cost/cost.py: what calls cost in instructions, beside what they may cost.

usage: cost.py BUDGETS PROGRAM... [--update]

Runs a program that marks its calls (marks.cpp) under callgrind, and counts for each call

- the instructions of this project's own code, wherever it was loaded from: the program, the embedded
  host, the module, the extension for Python; and
- how often that code calls anything else: the netCDF library, the heap, the C library.

What those do in their turn depends on their versions, and is not counted. Instructions may be three
per cent above the budget, calls not at all; a call without a budget, and a budget without a call,
are failures too. --update makes what was measured the budgets.
"""

from __future__ import annotations

import argparse
import re
import subprocess
import sys
import tempfile
from collections.abc import Iterable, Mapping
from pathlib import Path
from typing import NamedTuple

MOST_MORE = 0.03


class Cost(NamedTuple):
    """What one call takes."""

    instructions: float
    others: float
    """Calls of other code."""


Costs = Mapping[str, Cost]


def is_ours(path: str) -> bool:
    """Whether a loaded file is this project's."""
    return re.fullmatch(r"cost_calls|netcdf\.tsx|libtessel\.so.*|_runtime\..*so",
                        path.rpartition("/")[2]) is not None


def counted(dump: Iterable[str]) -> Cost:
    """The instructions of our code in a dump of callgrind's, and its calls of other code."""
    instructions = others = 0
    ours = False
    callee_is_ours = False
    of_callee = False  # the next line with a cost says what the called function took
    for line in dump:
        key, _, value = line.partition("=")
        if key == "ob":
            ours = callee_is_ours = is_ours(value)
        elif key == "cob":
            callee_is_ours = is_ours(value)
        elif key == "calls":
            others += int(value.split()[0]) if ours and not callee_is_ours else 0
            callee_is_ours = ours  # of the next one, unless it says otherwise
            of_callee = True
        elif re.match(r"\d", line):
            instructions += int(line.split()[1]) if ours and not of_callee else 0
            of_callee = False
    return Cost(instructions, others)


def measure(program: list[str]) -> dict[str, Cost]:
    """The costs of the calls that the program marks."""
    with tempfile.TemporaryDirectory() as folder:
        finished = subprocess.run(
            ["valgrind", "--tool=callgrind", "--instr-atstart=no", "--compress-strings=no",
             "--compress-pos=no", f"--callgrind-out-file={folder}/dump", *program],
            capture_output=True, text=True, check=False)
        times = re.search(r"^times=(\d+)$", finished.stdout, re.MULTILINE)
        if finished.returncode != 0 or not times:
            raise SystemExit(f"{' '.join(program)}\n{finished.stdout}{finished.stderr}")
        costs = {}
        for dump in sorted(Path(folder).glob("dump.*"), key=lambda each: int(each.suffix[1:])):
            text = dump.read_text()
            if name := re.search(r"^desc: Trigger: Client Request: (.+)$", text, re.MULTILINE):
                total = counted(text.splitlines())
                costs[name[1]] = Cost(*(each / int(times[1]) for each in total))
    return costs


def read_budgets(file: Path) -> dict[str, Cost]:
    """The budgets of a file: a line "CALL  INSTRUCTIONS  OTHERS" each, and comments."""
    rows = (line.rsplit(maxsplit=2) for line in file.read_text().splitlines()
            if line and not line.startswith("#"))
    return {name: Cost(float(instructions), float(others)) for name, instructions, others in rows}


def write_budgets(file: Path, costs: Costs) -> None:
    """Replaces the budgets; the comments at the beginning stay."""
    comments = [line for line in file.read_text().splitlines() if line.startswith("#")]
    rows = [f"{name:<42}{cost.instructions:>8.0f}{cost.others:>9.0f}"
            for name, cost in costs.items()]
    file.write_text("\n".join([*comments, *rows]) + "\n")


def fault(budget: Cost | None, cost: Cost | None) -> str | None:
    """What is wrong with a call, if anything is."""
    if cost is None:
        return "was not measured"
    if budget is None:
        return "has no budget"
    if cost.instructions > budget.instructions * (1 + MOST_MORE):
        return "takes too many instructions"
    if round(cost.others) > budget.others:
        return "calls others more often"
    return None


def table(budgets: Costs, costs: Costs) -> tuple[str, bool]:
    """The table of all calls, and whether each keeps to its budget."""
    lines = [f"{'call':<42}{'budget':>8}{'measured':>10}{'':>8}{'others':>9}{'measured':>10}"]
    good = True
    none = Cost(float("nan"), float("nan"))
    for name in dict.fromkeys([*budgets, *costs]):
        budget, cost = budgets.get(name), costs.get(name)
        wrong = fault(budget, cost)
        good = good and not wrong
        may, does = budget or none, cost or none
        more = does.instructions / may.instructions - 1
        lines.append(f"{name:<42}{may.instructions:>8.0f}{does.instructions:>10.0f}{more:>+8.1%}"
                     f"{may.others:>9.0f}{does.others:>10.0f}"
                     + (f"  FAILED: {wrong}" if wrong else ""))
    return "\n".join(lines), good


def main() -> int:
    parser = argparse.ArgumentParser(description=(__doc__ or "").splitlines()[0])
    parser.add_argument("budgets", type=Path, help="the file of the budgets")
    parser.add_argument("program", nargs="+", help="what marks its calls, and its arguments")
    parser.add_argument("--update", action="store_true", help="make what is measured the budgets")
    options = parser.parse_args()
    costs = measure(options.program)
    text, good = table(read_budgets(options.budgets), costs)
    print(text)
    if options.update:
        write_budgets(options.budgets, costs)
        return 0
    if not good:
        print("\nWhat costs more for a good reason is accepted with --update.")
    return 0 if good else 1


if __name__ == "__main__":
    sys.exit(main())
