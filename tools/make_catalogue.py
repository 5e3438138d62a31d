#!/usr/bin/env python3
"""tools/make_catalogue.py: writes python/tessel/catalogue.py, what a call can raise.

usage: tools/make_catalogue.py

The rows are read from module/call/catalogue.hpp and the words from module/call/status.cpp. What
each operation can raise is found by following its handler through the functions and constants that
it mentions, so that no list has to be kept beside the code. The errors of the host, of the guard
and of the Python package are read where they stand as well.
"""

from __future__ import annotations

import re
from collections.abc import Iterator
from dataclasses import dataclass
from pathlib import Path

ROOT = Path(__file__).resolve().parents[1]
MODULE = ROOT / "module"
TARGET = ROOT / "python" / "tessel" / "catalogue.py"
TYPES = ("double", "float", "int", "short", "schar", "uchar", "text")
TEXT = r'"((?:[^"\\]|\\.)*)"'

# What stands in the messages of the extension for an expression.
ONLY_THE_CALL_KNOWS = {
    'dtype.attr("name").cast<std::string>()': "<the dtype>",
    "array.className()": "<the class>",
    "std::to_string(deepest)": "<the most>",
    "std::to_string(mostDimensions)": "<the most>",
    "std::to_string(dims.size())": "<the number>",
    "typeName(value)": "<the type>",
    "typeName(key)": "<the type>",
    "+ given +": "<the names>",
}


def unescaped(text: str) -> str:
    """A C string as it is when the program runs."""
    return re.sub(r"\\(.)", r"\1", text)


def rows() -> dict[str, tuple[str, str]]:
    """The rows (identifier, message) by name; `NAME.failure` is a library failure, whose identifier
    ends before the status's word, and `NAME` of an operation the wrong number of arguments."""
    found = {}
    text = (MODULE / "call" / "catalogue.hpp").read_text()
    for group in re.findall(r"^inline constexpr (.*?);\n", text.partition("catalogue {")[2],
                            re.M | re.S):
        kind = group.split()[0]
        for name, inside in re.findall(r"^    (\w+)\s*= \{(.*)\},?$", group, re.M):
            words = [unescaped(each) for each in re.findall(TEXT, inside)]
            if kind == "LibraryFailure":
                words = ["", "", *words]
            if words[0]:
                start = words[0] if words[0].startswith("TESSEL:") else named(name, words[0])
                found[name] = (start, words[1])
            if len(words) == 4:
                found[f"{name}.failure"] = (f"TESSEL:netcdf:{words[2]}:",
                                            f'{words[3]}, library error message "%s"')
    return found


def named(row: str, rest: str) -> str:
    """The identifier of a row that embeds a name: that of the argument or of the operation."""
    sources = "\n".join(each.read_text() for each in MODULE.rglob("*.cpp"))
    [name] = set(re.findall(rf"raiseNamed\(([\w>-]+), catalogue::{row},", sources))
    return f"TESSEL:netcdf:{ {'argName': '{label}', 'entry->shortName': '{short}'}[name]}{rest}"


def statuses() -> dict[int, str]:
    """The words of the library's and the system's statuses."""
    text = (MODULE / "call" / "status.cpp").read_text()
    pairs = re.findall(r'^    (?:"(\w+)"|unknown),\s*// (-?\d+)$', text, re.M)
    [two] = re.findall(r'versionTwoStatus\) \{\s*return "(\w+)"', text)
    return {-1: two, **{int(status): word for word, status in pairs if word}}


def pairs(file: Path) -> dict[str, str]:
    """The rows of a table that has an identifier and a text in each."""
    found = re.findall(rf'= \{{"(TESSEL:\w+:\w+)",\s*{TEXT}\}}', file.read_text())
    return {identifier: unescaped(text) for identifier, text in found}


def host() -> dict[str, str]:
    """The host's errors: identifiers and messages."""
    return pairs(ROOT / "runtime" / "src" / "host_errors.hpp")


def guard() -> dict[str, str]:
    """The same of the guard; the particulars come before the reason, which is always the same."""
    file = ROOT / "guard" / "src" / "refusals.hpp"
    [start, middle, end] = re.findall(TEXT, file.read_text().partition("throw Error(")[2])
    return {identifier: f"{start}<particulars>{middle}{reason}{end}"
            for identifier, reason in pairs(file).items()}


def refusals(*names: str) -> dict[str, str]:
    """What is refused in source files of the Python package's extension."""
    found: dict[str, str] = {}
    for name in names:
        text = (ROOT / "python" / "src" / name).read_text()
        for word, message in re.findall(r'\brefuse\(\s*"(\w+)",(.*?)\);', text, re.S):
            for expression, stands_for in ONLY_THE_CALL_KNOWS.items():
                message = message.replace(expression, f'"{stands_for}"')
            rest = re.sub(TEXT, "", message).replace("std::string()", "")
            assert not rest.strip(" +\n"), (name, rest)
            whole = unescaped("".join(re.findall(TEXT, message)))
            assert found.setdefault(f"TESSEL:python:{word}", whole) == whole, word
    return found


def package() -> tuple[str, ...]:
    """All identifiers of the Python package."""
    words = set()
    for file in (ROOT / "python").rglob("*"):
        if file != TARGET and file.suffix in (".py", ".cpp"):
            words |= set(re.findall(
                r'(?:"TESSEL:python:|\b(?:refuse|refusal|_error)\(\s*")(\w+)"', file.read_text()))
    return tuple(f"TESSEL:python:{word}" for word in sorted(words))


@dataclass(frozen=True)
class Piece:
    """A function, or a constant, of the module."""

    file: str
    name: str
    body: str
    text_only: bool
    """Whether it is the overload for text of what another piece does for numbers."""

    numbers_only: bool = False
    """The other one."""


def pieces() -> list[Piece]:
    """All of them, but for those of the gateway, which every call goes through."""
    found = []
    for file in sorted(MODULE.rglob("*.[ch]pp")):
        if file.parent.name in ("gateway", "call"):
            continue
        text = re.sub(r"//.*", "", file.read_text())
        # The rows of the families' table stand one under the other.
        for body in re.split(r"\n\n+(?=\S)|\n(?=inline constexpr Family<)", text):
            name = (re.search(r"^(?:inline )?constexpr [^=\n]*?(\w+) += ", body, re.M)
                    or re.search(r"^(?!#|template|using|struct)[\w\[].*?[ *&](\w+)\(", body, re.M))
            if name is not None and "{" in body:  # else it is only declared
                found.append(Piece(str(file.relative_to(MODULE)), name[1], body,
                                   "std::same_as<char> T" in body))
    texts = {(each.file, each.name) for each in found if each.text_only}
    return [Piece(each.file, each.name, each.body, each.text_only,
                  not each.text_only and (each.file, each.name) in texts) for each in found]


def reached(handler: str, text: bool, known: dict[str, list[Piece]]) -> Iterator[Piece]:
    """The pieces that a handler mentions, and those that these mention."""
    seen, waiting = set(), list(known[handler])
    while waiting:
        piece = waiting.pop()
        if piece in seen or (piece.numbers_only if text else piece.text_only):
            continue
        seen.add(piece)
        yield piece
        for word in set(re.findall(r"\b(?<!::)\w+\b", piece.body)) & known.keys():
            candidates = known[word]
            own = [each for each in candidates if each.file == piece.file]
            waiting.extend(own or candidates)


def raised(handler: str, text: bool, known: dict[str, list[Piece]],
           catalogue: dict[str, tuple[str, str]]) -> set[str]:
    """The names of the rows that a handler can raise."""
    found = set()
    for piece in reached(handler, text, known):
        for before, name, failure in re.findall(r"(checkCount\()?catalogue::(\w+)(\.failure)?",
                                                piece.body):
            if not failure:
                found.add(name)
            if not before:
                found.add(f"{name}.failure")
    return found & catalogue.keys()


def operations() -> dict[str, tuple[str, ...]]:
    """The rows of every operation by its short name; those of a family's numeric members, which are
    the same, by the family's name."""
    text = (MODULE / "gateway" / "operation_table.hpp").read_text()
    catalogue = rows()
    known: dict[str, list[Piece]] = {}
    for piece in pieces():
        known.setdefault(piece.name, []).append(piece)
    order = list(catalogue)
    found: dict[str, tuple[str, ...]] = {}
    for short, handler in re.findall(r'^    \{ *\d+, "\w+", +"(\w+)", +(\w+)\},', text, re.M):
        family, _, suffix = short.rpartition("_")
        member = suffix in TYPES and family in {f"{way}_{form}" for way in ("get", "put")
                                                for form in ("att", "var", "var1", "vara", "vars")}
        mine = tuple(sorted(raised(handler, suffix == "text", known, catalogue), key=order.index))
        name = family if member and suffix != "text" else short
        assert found.setdefault(name, mine) == mine, short
    return found


def made() -> str:
    """The text of the file."""
    def wrapped(words: tuple[str, ...]) -> str:
        lines, line = [], "       "
        for word in words:
            if len(line) + len(word) + 4 > 100:
                lines.append(line)
                line = "       "
            line += f' "{word}",'
        return "\n".join([*lines, line])

    def literal(text: str) -> str:
        return repr(text) if '"' in text else f'"{text}"'

    def row(name: str, identifier: str, message: str) -> str:
        line = f'    "{name}": (\n        "{identifier}",\n        {literal(message)}),'
        return line if max(map(len, line.splitlines())) <= 100 else line.replace(
            literal(message), parts(message))

    def parts(message: str) -> str:
        if len(message) < 88:
            return literal(message)
        at = message.rindex(" ", 0, 80) + 1
        return f"{literal(message[:at])}\n        {parts(message[at:])}"

    def table(name: str, what: str, found: dict[str, str]) -> list[str]:
        return [f"{name}: dict[str, str] = {{",
                *(f'    "{identifier}":\n        {parts(message)},'
                  for identifier, message in found.items()),
                "}", f'"""{what}"""', ""]

    return "\n".join([
        "# python/tessel/catalogue.py: written by tools/make_catalogue.py; change the sources.",
        '"""The errors of the module, with the words of statuses and who raises what; and those of',
        'the host, the guard and this package."""',
        "",
        "ROWS: dict[str, tuple[str, str]] = {",
        *(row(name, *each) for name, each in rows().items()),
        "}",
        '"""Identifier and message; after a ":" at the end comes the word of a status."""',
        "",
        "STATUSES: dict[int, str] = {",
        *(f'    {status}: "{word}",' for status, word in statuses().items()),
        "}",
        '"""The words by status; every other status is "unknownErrorStatus"."""',
        "",
        "RAISES: dict[str, tuple[str, ...]] = {",
        *(f'    "{name}": (\n{wrapped(each)}\n    ),' if each else f'    "{name}": (),'
          for name, each in operations().items()),
        "}",
        '"""The rows of an operation, or of the numeric members of a family."""',
        "",
        *table("HOST", "The host's errors, each with the beginning of its message.", host()),
        *table("GUARD", "What the guard refuses.", guard()),
        *table("CALLED", "What Python makes no call of.", refusals("module_object.cpp")),
        *table("GIVEN", "What Python makes no argument of.",
               refusals("to_host.cpp", "python_classes.cpp")),
        *table("RETURNED", "What Python makes nothing of that a call gives.",
               refusals("to_python.cpp")),
        "PACKAGE: tuple[str, ...] = (",
        *(f'    "{each}",' for each in package()),
        ")",
        '"""Every identifier of the Python package."""',
    ]) + "\n"


if __name__ == "__main__":
    TARGET.write_text(made())
    print(TARGET)
