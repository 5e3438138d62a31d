#!/usr/bin/env python3
"""tools/mutate.py: changes module/ in one place at a time and shows that the suite notices.

usage: tools/mutate.py [--count N] [--seed S] [--only TEXT]

Each mutant is a copy of the module with one comparison, constant, text, table row, order of checks,
freeing or statement changed. It is built and the conformance suite and the structure tests are run
until something fails, which kills the mutant. What does not compile is no mutant and not counted.
The list is repeatable by its seed; survivors are printed with their change.
"""

import argparse
import random
import re
import shutil
import subprocess
import sys
import tempfile
import time
from collections import Counter
from collections.abc import Iterator
from pathlib import Path
from typing import NamedTuple

ROOT = Path(__file__).resolve().parent.parent

COMPARISONS = {"==": "!=", "!=": "==", "<": "<=", ">": ">=", "<=": "<", ">=": ">", "&&": "||",
               "||": "&&"}


class Mutant(NamedTuple):
    """One change: the text of a file from `start` to `end` becomes `new`."""

    kind: str
    file: Path
    start: int
    end: int
    new: str


def code_only(text: str) -> str:
    """The text with comments and preprocessor lines blanked out, position by position."""
    blank = lambda match: re.sub(r"[^\n]", " ", match[0])
    return re.sub(r"//[^\n]*|/\*.*?\*/|^[ \t]*#[^\n]*", blank, text, flags=re.S | re.M)


def without_strings(code: str) -> str:
    """The same with the insides of strings and characters blanked out."""
    return re.sub(r'"(?:\\.|[^"\\\n])*"|\'(?:\\.|[^\'\\\n])+\'',
                  lambda m: m[0][0] + "_" * (len(m[0]) - 2) + m[0][-1], code)


def comparisons(file: Path, plain: str) -> Iterator[Mutant]:
    for match in re.finditer(r" (==|!=|<=|>=|<|>|&&|\|\|) ", plain):
        yield Mutant("comparison", file, *match.span(1), COMPARISONS[match[1]])


def constants(file: Path, plain: str) -> Iterator[Mutant]:
    # What the library overwrites may begin with any value: to change it changes nothing.
    overwritten = {match.start(1) for match in
                   re.finditer(r"^ +(?:int|std::size_t) \w+ = (0);", plain, re.M)}
    for match in re.finditer(r"(?<![\w.])(-?\d+)(?![\w.])", plain):
        if match.start(1) not in overwritten:
            yield Mutant("constant", file, *match.span(1), str(int(match[1]) + 1))
    for old, new in (("true", "false"), ("false", "true"), ("std::size_t{1}", "std::size_t{2}")):
        for match in re.finditer(rf"\b{re.escape(old)}", plain):
            yield Mutant("constant", file, *match.span(), new)


def texts(file: Path, code: str) -> Iterator[Mutant]:
    for match in re.finditer(r'"((?:\\.|[^"\\\n])+)"', code):
        at = match.start(1) + len(match[1]) // 2
        letters = [i for i in range(at, match.end(1)) if code[i].isalnum() and code[i - 1] not in "%\\"]
        if letters:
            old = code[letters[0]]
            yield Mutant("text", file, letters[0], letters[0] + 1, "x" if old != "x" else "y")


def rows(file: Path, code: str) -> Iterator[Mutant]:
    """Neighbouring rows of a table exchanged."""
    pattern = re.compile(r"^ *\{ *-?[\w.+]+, *\"[^\n]*\},?$\n|^    \"\w+\", +// -?\d+$\n", re.M)
    found = list(pattern.finditer(code))
    for first, second in zip(found, found[1:]):
        if first.end() == second.start():
            yield Mutant("row", file, first.start(), second.end(), second[0] + first[0])


STATEMENT = r"^    [^\n{}]*\b(?:unpack|check|validate|tsFree|narrow)\w*\([^\n{}]*;\n"
CHECK = r"^    if \([^\n]*\) \{\n        raise[^;]*;\n    \}\n"


def orders(file: Path, plain: str) -> Iterator[Mutant]:
    """Neighbouring checks, unpackings or statements exchanged."""
    found = list(re.finditer(rf"{CHECK}|{STATEMENT}", plain, re.M))
    for first, second in zip(found, found[1:]):
        if first.end() == second.start():
            yield Mutant("order", file, first.start(), second.end(), "\0swap%d" % first.end())


def removals(file: Path, plain: str) -> Iterator[Mutant]:
    """A check, a freeing or a statement left out."""
    for match in re.finditer(rf"{CHECK}|^ +[\w:]+\([^\n]*\);\n|^    [\w\[\]]+ = [^\n]*;\n", plain, re.M):
        yield Mutant("removal", file, *match.span(), "")


def arguments(file: Path, plain: str) -> Iterator[Mutant]:
    """Another input, another slot, another start of an array."""
    for match in re.finditer(r"(prhs|plhs)\[(\d)\]", plain):
        yield Mutant("argument", file, *match.span(2), str(int(match[2]) + 1))
    for match in re.finditer(r"\bn - 1 - i\b", plain):
        yield Mutant("argument", file, *match.span(), "i")


def all_mutants() -> list[Mutant]:
    found: list[Mutant] = []
    for file in sorted((ROOT / "module").rglob("*.[ch]pp")):
        code = code_only(file.read_text())
        plain = without_strings(code)
        relative = file.relative_to(ROOT)
        for make in (comparisons, constants, orders, removals, arguments):
            found += make(relative, plain)
        for make in (texts, rows):
            found += make(relative, code)
    return found


def changed(text: str, mutant: Mutant) -> str:
    new = mutant.new
    if new.startswith("\0swap"):
        middle = int(new[5:])
        new = text[middle:mutant.end] + text[mutant.start:middle]
    return text[:mutant.start] + new + text[mutant.end:]


def chosen(mutants: list[Mutant], count: int, seed: int) -> list[Mutant]:
    """A repeatable order in which every kind comes up as often as it can."""
    generator = random.Random(seed)
    by_kind: dict[str, list[Mutant]] = {}
    for mutant in mutants:
        by_kind.setdefault(mutant.kind, []).append(mutant)
    for of_kind in by_kind.values():
        generator.shuffle(of_kind)
    result: list[Mutant] = []
    while any(by_kind.values()) and len(result) < count:
        result += [of_kind.pop() for of_kind in by_kind.values() if of_kind]
    return result


def describe(mutant: Mutant) -> str:
    text = (ROOT / mutant.file).read_text()
    line = text.count("\n", 0, mutant.start) + 1
    old = text[mutant.start:mutant.end].strip().replace("\n", " ")
    new = "(exchanged)" if mutant.new.startswith("\0") else mutant.new.strip().replace("\n", " ")
    return f"{mutant.file}:{line}: {mutant.kind}: {old[:90]!r} -> {new[:90]!r}"


class Tree:
    """A copy of the project with a build tree of its own."""

    def __init__(self, folder: Path) -> None:
        self.source = folder / "source"
        self.build = folder / "build"
        shutil.copytree(ROOT, self.source, ignore=shutil.ignore_patterns("build", ".git", "output"))
        subprocess.run(["cmake", "-S", self.source, "-B", self.build, "-G", "Ninja",
                        "-DCMAKE_BUILD_TYPE=Debug", "-DCMAKE_CXX_FLAGS=-O0 -g0",
                        "-DTESSEL_PYTHON=OFF", "-DTESSEL_BENCH=OFF"],
                       check=True, capture_output=True)

    def compiles(self) -> bool:
        targets = ["netcdf_module", "rows", "inner_functions", "real_files", "list_operations"]
        done = subprocess.run(["cmake", "--build", self.build, "--target", *targets],
                              capture_output=True, check=False)
        return done.returncode == 0

    def passes(self) -> bool:
        """True if nothing fails; a run that hangs is one that fails."""
        command = ["ctest", "--test-dir", self.build, "--stop-on-failure", "--timeout", "120",
                   "-j", "2", "-R", "^conformance|^structure.(arrows|operations)"]
        return subprocess.run(command, capture_output=True, check=False).returncode == 0

    def judge(self, mutant: Mutant) -> str:
        """"killed", "survived" or "no mutant"."""
        file = self.source / mutant.file
        original = file.read_text()
        file.write_text(changed(original, mutant))
        try:
            if not self.compiles():
                return "no mutant"
            return "survived" if self.passes() else "killed"
        finally:
            file.write_text(original)


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--count", type=int, default=240, help="how many to try (default 240)")
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--only", default="", help="only those whose description has this in it")
    options = parser.parse_args()
    mutants = [m for m in all_mutants() if options.only in describe(m)]
    outcome: Counter[str] = Counter()
    survivors = []
    start = time.monotonic()
    with tempfile.TemporaryDirectory() as folder:
        tree = Tree(Path(folder))
        if not tree.compiles() or not tree.passes():
            print("the unchanged tree does not pass", file=sys.stderr)
            return 1
        for mutant in chosen(mutants, options.count, options.seed):
            verdict = tree.judge(mutant)
            outcome[verdict] += 1
            print(f"{verdict:9}  {describe(mutant)}", flush=True)
            if verdict == "survived":
                survivors.append(mutant)
    tried = outcome["killed"] + outcome["survived"]
    print(f"\n{len(mutants)} possible, {sum(outcome.values())} tried, {outcome['no mutant']} did not "
          f"compile; {outcome['killed']} of {tried} killed "
          f"({100 * outcome['killed'] / max(tried, 1):.1f} %), {time.monotonic() - start:.0f} s")
    for mutant in survivors:
        print("survivor:", describe(mutant))
    return 0 if outcome["killed"] >= 0.98 * tried and tried else 1


if __name__ == "__main__":
    sys.exit(main())
