#!/usr/bin/env python3
"""tools/mutate.py: changes module/ in one place at a time and shows that the suite notices.

usage: tools/mutate.py [--count N] [--seed S] [--only TEXT] [--list] [--write FILE]

Each mutant is a copy of the module with one comparison, constant, text, table row, order of checks,
argument or statement changed, but for what only the compiler runs. It is built, and the programs of
the conformance suite are run until something fails, which kills the mutant. What does not compile
is no mutant and not counted. The list is repeatable by its seed; survivors are printed with their
change. `--write` puts the result into a document, between the marks
"<!-- tools/mutate.py: begin -->" and "<!-- tools/mutate.py: end -->". With `--list` it writes
nothing, and fails when the document names other changes that are never made than are left out here.
"""

import argparse
import random
import re
import resource
import shutil
import subprocess
import sys
import tempfile
import textwrap
import time
from collections import Counter
from collections.abc import Iterator
from pathlib import Path
from typing import NamedTuple

ROOT = Path(__file__).resolve().parent.parent
sys.path.append(str(ROOT / "bench"))
from measuring import put_between_marks  # noqa: E402

COMPARISONS = {"==": "!=", "!=": "==", "<": "<=", ">": ">=", "<=": "<", ">=": ">", "&&": "||",
               "||": "&&"}


class Equivalent(NamedTuple):
    """Changes that nobody who calls the module could see, and which are therefore not tried: in the
    lines with `text` in them, of the files whose names match, those that make `old` (anything,
    where it is empty) into something else."""

    file: str
    kind: str
    text: str
    old: str
    reason: str


EQUIVALENT = (
    Equivalent("convert/number.hpp", "comparison", "value >= static_cast<T>(half)", ">=",
               "the one value between the two, 2^63, takes the other way to the same bits"),
    Equivalent("ops/schema/attributes.cpp", "order", "newName = unpackName", "",
               "both names are called \"attribute\" in the message, so that nobody can tell which "
               "was refused"),
    Equivalent("gateway/lookup.cpp", "comparison", "code >= 0x80", ">=",
               "`std::tolower` leaves the byte 0x80 as it is"),
    Equivalent("call/name_index.hpp", "constant", "std::rotl(hash, 5)", "5", "another hash"),
    Equivalent("call/name_index.hpp", "constant", "std::uint64_t hash = 0", "0", "another hash"),
    Equivalent("call/name_index.hpp", "constant", "8 * rows", "8", "more slots, or as many"),
    Equivalent("call/name_index.hpp", "constant", "(slot + 1) % slotCount", "1",
               "another order of the slots, for what is put in and for what is looked for"),
    Equivalent("convert/index_vector.hpp", "constant", "small_vector<T, 8>", "8",
               "room for one dimension more before memory is asked for"),
    Equivalent("convert/text.cpp", "comparison", "count >= large", ">=",
               "both ways of copying copy the same"),
    Equivalent("convert/text.cpp", "constant", "std::size_t{1} << 20U", "",
               "both ways of copying copy the same"),
    Equivalent("convert/text.cpp", "comparison", "at + step <= count", "<=",
               "the last step is left to the other way of copying"),
    Equivalent("convert/text.cpp", "removal", "_mm_sfence()", "",
               "the thread that copied sees what it wrote without it"),
    Equivalent("*.[ch]pp", "constant", "NC_MAX_NAME + 1", "1", "room for one character more"),
)


class Mutant(NamedTuple):
    """One change: the text of a file from `start` to `end` becomes `new`."""

    kind: str
    file: Path
    start: int
    end: int
    new: str


def code_only(text: str) -> str:
    """The text with comments, preprocessor lines and what only the compiler runs blanked out,
    position by position: a check that the compiler makes is none of the caller's."""
    blank = lambda match: re.sub(r"[^\n]", " ", match[0])
    code = re.sub(r"//[^\n]*|/\*.*?\*/|^[ \t]*#[^\n]*", blank, text, flags=re.S | re.M)
    return re.sub(r"^( *)consteval .*?^\1\}|\bstatic_assert\(.*?\);", blank, code,
                  flags=re.S | re.M)


def without_strings(code: str) -> str:
    """The same with the insides of strings and characters blanked out."""
    return re.sub(r'"(?:\\.|[^"\\\n])*"|\'(?:\\.|[^\'\\\n])+\'',
                  lambda m: m[0][0] + "_" * (len(m[0]) - 2) + m[0][-1], code)


def comparisons(file: Path, plain: str) -> Iterator[Mutant]:
    for match in re.finditer(r" (==|!=|<=|>=|<|>|&&|\|\|) ", plain):
        yield Mutant("comparison", file, *match.span(1), COMPARISONS[match[1]])


def overwritten(plain: str, at: int) -> bool:
    """Whether the number there is what a variable begins with that is given another value, by the
    library or by an assignment, before it is read: then it may be any."""
    begun = re.search(r"^ +(?:int|std::size_t) (\w+) = $", plain[:at], re.M)
    following = begun and re.search(rf"(&?)\b{begun[1]}\b( = )?", plain[at:])
    return bool(following and (following[1] or following[2]))


def constants(file: Path, plain: str) -> Iterator[Mutant]:
    for match in re.finditer(r"(?<![\w.\[])(-?\d+)(?![\w.])", plain):
        if not overwritten(plain, match.start(1)):
            yield Mutant("constant", file, *match.span(1), str(int(match[1]) + 1))
    for old, new in (("true", "false"), ("false", "true"), ("std::size_t{1}", "std::size_t{2}")):
        for match in re.finditer(rf"\b{re.escape(old)}", plain):
            yield Mutant("constant", file, *match.span(), new)


def texts(file: Path, code: str) -> Iterator[Mutant]:
    for match in re.finditer(r'"((?:\\.|[^"\\\n])+)"', code):
        at = match.start(1) + len(match[1]) // 2
        letters = [i for i in range(at, match.end(1))
                   if code[i].isalnum() and code[i - 1] not in "%\\"]
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
    statement = r"^ +[\w:]+\([^\n]*\);\n|^    [\w\[\]]+ = [^\n]*;\n"
    for match in re.finditer(rf"{CHECK}|{statement}", plain, re.M):
        yield Mutant("removal", file, *match.span(), "")


def arguments(file: Path, plain: str) -> Iterator[Mutant]:
    """Another input, another slot, another start of an array."""
    for match in re.finditer(r"(prhs|plhs)\[(\d)\]", plain):
        yield Mutant("argument", file, *match.span(2), str(int(match[2]) + 1))
    for match in re.finditer(r"\bn - 1 - i\b", plain):
        yield Mutant("argument", file, *match.span(), "i")


def all_mutants() -> list[Mutant]:
    """All but the equivalent ones; each row of the list of these has to mean something."""
    found: list[Mutant] = []
    for file in sorted((ROOT / "module").rglob("*.[ch]pp")):
        code = code_only(file.read_text())
        plain = without_strings(code)
        relative = file.relative_to(ROOT)
        for make in (comparisons, constants, orders, removals, arguments):
            found += make(relative, plain)
        for make in (texts, rows):
            found += make(relative, code)
    found = list(dict.fromkeys(found))
    for equivalent in EQUIVALENT:
        meant = [m for m in found if is_meant(m, equivalent)]
        assert meant, equivalent
        found = [m for m in found if m not in meant]
    return found


def is_meant(mutant: Mutant, equivalent: Equivalent) -> bool:
    """Whether the row of the list means this change."""
    if not mutant.file.match(equivalent.file) or mutant.kind != equivalent.kind:
        return False
    text = (ROOT / mutant.file).read_text()
    lines = text[text.rfind("\n", 0, mutant.start) + 1:text.find("\n", mutant.end - 1)]
    return equivalent.text in lines and (not equivalent.old
                                         or text[mutant.start:mutant.end] == equivalent.old)


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
    return result[:count]


def describe(mutant: Mutant) -> str:
    text = (ROOT / mutant.file).read_text()
    line = text.count("\n", 0, mutant.start) + 1
    old = " ".join(text[mutant.start:mutant.end].split())
    new = "(exchanged)" if mutant.new.startswith("\0") else " ".join(mutant.new.split())
    return f"{mutant.file}:{line}: {mutant.kind}: {old[:90]!r} -> {new[:90]!r}"


PROGRAMS = ("inner_functions", "rows", "real_files")  # the quickest first


def limits() -> None:
    """A mutant may run for ever; the time of the processor does not depend on what else runs."""
    resource.setrlimit(resource.RLIMIT_CPU, (60, 60))


class Tree:
    """A copy of the project with a build tree of its own."""

    def __init__(self, folder: Path) -> None:
        self.source = folder / "source"
        self.build = folder / "build"
        shutil.copytree(ROOT, self.source, ignore=shutil.ignore_patterns("build", ".git", "output"))
        # A number that is converted where it does not fit would often come out right, and so would
        # one that is not there.
        subprocess.run(["cmake", "-S", self.source, "-B", self.build, "-G", "Ninja",
                        "-DCMAKE_BUILD_TYPE=Debug", "-DTESSEL_PYTHON=OFF", "-DTESSEL_BENCH=OFF",
                        "-DCMAKE_CXX_FLAGS_DEBUG=-O0",  # and nothing for a debugger
                        "-DCMAKE_CXX_FLAGS=-fsanitize=float-cast-overflow "
                        "-fno-sanitize-recover=all -D_GLIBCXX_ASSERTIONS"],
                       check=True, capture_output=True)

    def compiles(self) -> bool:
        """Builds the module and the programs."""
        done = subprocess.run(["cmake", "--build", self.build, "--target", "netcdf_module",
                               *PROGRAMS], capture_output=True, check=False)
        return done.returncode == 0

    def passes(self) -> bool:
        """True if nothing fails; each program ends with the first failure."""
        folder = self.build / "tests" / "conformance"
        return all(subprocess.run([folder / program, "--gtest_brief=1", "--gtest_fail_fast"],
                                  cwd=folder, capture_output=True, check=False,
                                  preexec_fn=limits).returncode == 0
                   for program in PROGRAMS)

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


def report(options: argparse.Namespace, possible: int, verdicts: dict[Mutant, str]) -> str:
    """The result as a document has it."""
    outcome = Counter(verdicts.values())
    judged = outcome["killed"] + outcome["survived"]
    survivors = [m for m, verdict in verdicts.items() if verdict == "survived"]
    command = f"tools/mutate.py --count {options.count} --seed {options.seed}"
    if options.only:
        command += f" --only {options.only}"
    lines = [f"The last run, of `{command}`, made {len(verdicts)} of {possible} possible changes.",
             f"{outcome['no mutant']} did not compile, and of the {judged} that were judged "
             f"{outcome['killed']} were killed ({100 * outcome['killed'] / max(judged, 1):.1f} %).",
             "The survivors:" if survivors else "None survived.", ""]
    lines += [f"- `{describe(mutant)}`" for mutant in survivors] + [""] * bool(survivors)
    return filled(lines) + "\n" + never_made()


def never_made() -> str:
    """What a document says of the changes that are not tried."""
    return filled(["Never made, since nobody who calls the module could see them:", "",
                   *(f"- `{each.file}`, {each.kind} in `{each.text.strip()}`"
                     f"{f', `{each.old}`' if each.old else ''}: {each.reason}"
                     for each in EQUIVALENT)])


def filled(lines: list[str]) -> str:
    return "\n".join(textwrap.fill(line, 100, subsequent_indent="  ", break_long_words=False,
                                   break_on_hyphens=False) for line in lines)


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--count", type=int, default=260, help="how many to try (default 260)")
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--only", default="", help="only those whose description has this in it")
    parser.add_argument("--list", action="store_true", help="show them, and do nothing")
    parser.add_argument("--write", type=Path, help="the document that the result is written into")
    options = parser.parse_args()
    possible = all_mutants()
    mutants = chosen([m for m in possible if options.only in describe(m)],
                     options.count, options.seed)
    if options.list:
        print(*map(describe, mutants), sep="\n")
        if options.write and never_made() not in options.write.read_text():
            print(f"{options.write} names other changes that are never made", file=sys.stderr)
            return 1
        return 0
    verdicts: dict[Mutant, str] = {}
    start = time.monotonic()
    with tempfile.TemporaryDirectory() as folder:
        tree = Tree(Path(folder))
        if not tree.compiles() or not tree.passes():
            print("the unchanged tree does not pass", file=sys.stderr)
            return 1
        # Those of one file one after the other: what is restored is then compiled with the next.
        for mutant in sorted(mutants, key=lambda m: (m.file, m.start)):
            verdicts[mutant] = tree.judge(mutant)
            print(f"{verdicts[mutant]:9}  {describe(mutant)}", flush=True)
    result = report(options, len(possible), verdicts)
    print(f"\n{result}\n{time.monotonic() - start:.0f} s")
    if options.write:
        put_between_marks(options.write, "tools/mutate.py", result)
    outcome = Counter(verdicts.values())
    judged = outcome["killed"] + outcome["survived"]
    return 0 if outcome["killed"] >= 0.98 * judged and judged else 1


if __name__ == "__main__":
    sys.exit(main())
