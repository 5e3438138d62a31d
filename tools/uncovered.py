#!/usr/bin/env python3
"""tools/uncovered.py: how much of module/ was run, and why the rest was not.

usage: tools/uncovered.py COVERAGE.json [--write FILE]

Reads what gcovr has counted (tools/coverage makes it), and names each line and each branch that was
not run, with its reason from the table below. A line is known by its text, which stays the same
where its number does not. It is an error when too little was run, when what was not run has no
reason, and when a reason is left over. `--write` puts the result into a document, between marks.
"""

import argparse
import json
import sys
import textwrap
from pathlib import Path
from typing import NamedTuple

ROOT = Path(__file__).resolve().parent.parent
sys.path.append(str(ROOT / "bench"))
from measuring import put_between_marks  # noqa: E402

LEAST_LINES, LEAST_BRANCHES = 99.0, 95.0  # per cent

Place = tuple[str, str]
"""A file, and the text of a line."""

EXCEPTION = ("a way out that only an exception takes, which gcovr does not know for one where "
             "several objects have a copy of the function")

REASONS: dict[Place, str] = {
    ("call/error.hpp",
     'const std::string identifier = std::string("TESSEL:netcdf:") + name + error.identifier;'):
        f"no memory for an identifier of some forty characters: {EXCEPTION}",
    ("convert/number.hpp",
     "if (std::is_unsigned_v<Wide> && value >= static_cast<T>(half)) {"):
        "both are run in one object's copy of the function, and gcovr shows those of another's, "
        "which the linker left out",
    ("convert/number.hpp", "return boost::numeric_cast<To>(value);"):
        "the way out for a size that is no double: each is one, rounded",
    ("convert/number.hpp", "} catch (const boost::bad_numeric_cast &) {"):
        "another exception than the one that `numeric_cast` throws",
    ("convert/pack.cpp", "if (!number) {"): "a size that is no double: each is one, rounded",
    ("convert/pack.cpp", "raise(catalogue::sizeNotRepresentable, static_cast<unsigned>(value));"):
        "the same; the error is raised all the same where an implementation has other doubles",
    ("ops/data/read_variable.hpp", "check(nc_inq_varndims(ncid, varid, &ndims), failure);"):
        f"the library's function has no exceptions, and those of `check` are raised: {EXCEPTION}",
    ("ops/schema/variables.cpp", "if (!ndims) {"):
        "more dimensions than an `int` counts, after more than 1024 were refused",
    ("ops/schema/variables.cpp", "raise(catalogue::ndimsOutOfRange, name.c_str());"):
        "the same; it stays in case that limit does not",
}


class Missed(NamedTuple):
    """What was not run of a line of source: the line itself, or so many of its branches."""

    line: bool
    branches: int


class Counts(NamedTuple):
    """All that was counted."""

    lines: int
    branches: int
    missed: dict[Place, Missed]

    def missed_lines(self) -> int:
        """How many lines were not run."""
        return sum(each.line for each in self.missed.values())

    def missed_branches(self) -> int:
        """How many branches were not run."""
        return sum(each.branches for each in self.missed.values())


def counted(coverage: Path) -> Counts:
    """What gcovr says of each line."""
    lines = branches = 0
    missed: dict[Place, Missed] = {}
    for file in json.loads(coverage.read_text())["files"]:
        source = (ROOT / file["file"]).read_text().splitlines()
        for line in file["lines"]:
            if line["gcovr/noncode"]:
                continue
            lines += 1
            branches += len(line["branches"])
            unrun = Missed(line["count"] == 0, sum(not b["count"] for b in line["branches"]))
            if any(unrun):
                name = file["file"].removeprefix("module/")
                place = (name, source[line["line_number"] - 1].strip())
                before = missed.get(place, Missed(False, 0))
                missed[place] = Missed(before.line or unrun.line,
                                       before.branches + unrun.branches)
    return Counts(lines, branches, missed)


def percent(missed: int, of: int) -> float:
    """How much was run."""
    return 100 * (of - missed) / of


def report(counts: Counts) -> str:
    """The result as a document has it."""
    lines, branches = counts.missed_lines(), counts.missed_branches()
    text = [f"The last run: {counts.lines - lines} of {counts.lines} lines "
            f"({percent(lines, counts.lines):.1f} %), {counts.branches - branches} of "
            f"{counts.branches} branches ({percent(branches, counts.branches):.1f} %). What was "
            "not run:", ""]
    for place, missed in counts.missed.items():
        what = ["the line"] * missed.line
        if missed.branches:
            what.append("a branch" if missed.branches == 1 else f"{missed.branches} branches")
        text.append(f"- `{place[0]}`, {' and '.join(what)} of `{place[1]}`: "
                    f"{REASONS.get(place, 'NO REASON IS GIVEN')}")
    return "\n".join(textwrap.fill(each, 100, subsequent_indent="  ", break_long_words=False,
                                   break_on_hyphens=False) for each in text)


def main() -> int:
    """Prints the result; fails where it is not as it should be."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("coverage", type=Path)
    parser.add_argument("--write", type=Path, help="the document that the result is written into")
    options = parser.parse_args()
    counts = counted(options.coverage)
    result = report(counts)
    print(result)
    if options.write:
        put_between_marks(options.write, "tools/coverage", result)
    faults = [f"no reason is given for {place}" for place in counts.missed.keys() - REASONS.keys()]
    faults += [f"{place} was run" for place in REASONS.keys() - counts.missed.keys()]
    if percent(counts.missed_lines(), counts.lines) < LEAST_LINES:
        faults.append(f"less than {LEAST_LINES} % of the lines were run")
    if percent(counts.missed_branches(), counts.branches) < LEAST_BRANCHES:
        faults.append(f"less than {LEAST_BRANCHES} % of the branches were run")
    print(*faults, sep="\n", file=sys.stderr)
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
