#!/usr/bin/env python3
"""tools/make_reference.py: writes the reference as manual pages and as pages for the book.

usage: PYTHONPATH=build/release/python /usr/bin/python3 tools/make_reference.py man|rst FOLDER

Everything comes from the package's tables; what a page consists of is in tessel/reference.py.
"""

from __future__ import annotations

import argparse
import gzip
import re
import sys
from collections.abc import Callable, Iterable
from pathlib import Path

from tessel import command, reference
from tessel.catalogue import GUARD, HOST, PACKAGE, STATUSES
from tessel.errors import built_in_of, word_of
from tessel.meanings import GROUPS, MEANINGS
from tessel.operation import Operation
from tessel.operations import OPERATIONS
from tessel.reference import Raised

TITLE = "Tessel"
SUBJECTS: dict[str, Callable[[str], bool]] = {
    "Datasets": lambda short: short in (
        "open", "_open", "create", "_create", "close", "abort", "redef", "enddef", "end_def",
        "_enddef", "sync", "set_fill", "set_default_format", "inq"),
    "Dimensions and variables": lambda short: short in (
        "def_dim", "inq_dim", "inq_dimid", "rename_dim", "def_var", "inq_var", "inq_varid",
        "rename_var"),
    "Attributes": lambda short: "att" in short,
    "Reading data": lambda short: short.startswith("get_var"),
    "Writing data": lambda short: short.startswith("put_var"),
    "Constants, versions and texts": lambda short: True,
}
"""The headings of the list of operations, each with what is under it that no earlier one has."""


def by_subject() -> dict[str, list[Operation]]:
    """The operations under their headings."""
    found: dict[str, list[Operation]] = {each: [] for each in SUBJECTS}
    for operation in OPERATIONS:
        subject = next(name for name, has in SUBJECTS.items() if has(operation.short))
        found[subject].append(operation)
    return found


def one_line(text: str) -> str:
    """Text without line breaks."""
    return " ".join(text.split())


# Manual pages.

def roff(text: str) -> str:
    """Text as roff takes it literally."""
    text = text.replace("\\", "\\e").replace("-", "\\-").replace("'", "\\(aq").replace("`", "\\(ga")
    return re.sub(r"^\.", r"\\&.", text, flags=re.M)


def heading(name: str, section: int, purpose: str) -> str:
    """What a manual page begins with."""
    return (f'.TH "{roff(name.upper())}" {section} "" "{TITLE}" "{TITLE}"\n'
            f".SH NAME\n{roff(name)} \\- {roff(purpose[0].lower() + purpose[1:].rstrip('.'))}\n")


def literal(text: str) -> str:
    """Lines that stay as they are."""
    return f".PP\n.nf\n.RS 4\n{roff(text)}\n.RE\n.fi\n"


def entry(term: str, *texts: str) -> str:
    """A term and what there is to say about it."""
    return f".TP\n.B {roff(term)}\n" + "\n.br\n".join(roff(each) for each in texts if each) + "\n"


def man_errors(errors: Iterable[Raised], end: str = "") -> str:
    """Errors as a list."""
    return "".join(entry(reference.shown(each.identifier + end), f"{each.cause.rstrip('.')}:",
                         each.message) for each in errors)


def man_page(operation: Operation) -> str:
    """The manual page of an operation."""
    page = reference.page_of(operation)
    parts = [heading(f"tessel-{operation.short}", 3, operation.purpose),
             ".SH SYNOPSIS\nIn Python:\n",
             literal(f"nc = tessel.load(\"netcdf\")\n{reference.python_call(operation)}"),
             ".PP\nIn C++:\n", literal(reference.cpp_call(operation)),
             ".PP\nIn the host:\n", literal(reference.host_call(operation)),
             f".SH DESCRIPTION\n{roff(operation.purpose)}\n"]
    if operation.notes:
        parts.append(f".PP\n{roff(one_line(operation.notes))}\n")
    for name, entries in reference.given_and_taken(operation):
        parts.append(f".SH {name.upper()}\n" + "".join(
            entry(each.name, one_line(each.meaning),
                  f"In Python: {each.kind.wording}. In the host: {each.kind.host}.")
            for each in entries))
    parts.append(".SH ERRORS\n" + man_errors(page.raised))  # the host may always lack memory
    parts += [f".PP\n{roff(note)}\n" + man_errors(errors, end)
              for _, note, errors, end in page.others]
    parts += [".SH EXAMPLE\n", literal(reference.example_of(operation)),
              ".SH SEE ALSO\n.BR tessel (1),\n.BR tessel\\-errors (7)\n"]
    return "".join(parts)


def man_errors_page() -> str:
    """The manual page that explains every error."""
    parts = [heading("tessel-errors", 7, "What the errors mean and what to do."),
             ".SH DESCRIPTION\n" + roff(
                 "The last word of an error's identifier says what is wrong. In parentheses: the "
                 "exception of Python's own that the error also is.") + "\n"]
    for group, words in GROUPS.items():
        parts.append(f".SH {roff(group.upper())}\n" + "".join(
            entry(reference.shown(word), *texts) for word, texts in words.items()))
    return "".join([*parts, ".SH SEE ALSO\n.BR tessel (1)\n"])


def man_command() -> str:
    """The manual page of the command, from its parser."""
    parser = command.parser()
    parts = [heading("tessel", 1, "Look into netCDF files, draw, copy and check them."),
             ".SH SYNOPSIS\n.B tessel\nCOMMAND ...\n",
             f".SH DESCRIPTION\n{roff(parser.description or '')}\n.SH COMMANDS\n"]
    [commands] = [each for each in parser._actions if isinstance(each, argparse._SubParsersAction)]
    for name, sub in commands.choices.items():
        usage = one_line(sub.format_usage().removeprefix("usage: "))
        parts.append(f".SS {roff(name)}\n{roff(sub.description or '')}\n" + literal(usage))
        for action in sub._actions:
            if not isinstance(action, argparse._HelpAction):
                value = f" {action.metavar}" if action.option_strings and action.metavar else ""
                term = ", ".join(action.option_strings) or str(action.metavar)
                parts.append(entry(term + value, f"{action.help}."))
    parts.append(".SH EXIT STATUS\n" + roff(
        "0 if all is well, 1 if something failed or the command was used wrongly; errors are one "
        "line on standard error.") + "\n"
                 ".SH SEE ALSO\n.BR tessel\\-open (3),\n.BR tessel\\-errors (7)\n")
    return "".join(parts)


def man() -> dict[str, str]:
    """The manual pages by file."""
    return {"man1/tessel.1": man_command(), "man7/tessel-errors.7": man_errors_page(),
            **{f"man3/tessel-{each.short}.3": man_page(each) for each in OPERATIONS}}


# Pages of the book.

def rst(text: str) -> str:
    """Text with nothing in it that is markup, but for its code."""
    text = re.sub(r"([\\*_|])", r"\\\1", text)
    return re.sub(r"`([^`]*)`", r"``\1``", text)


def code(text: str) -> str:
    """Text as code in a line; runs of blanks and what encloses them stay."""
    return f"``{text}``"


def block(language: str, text: str) -> str:
    """Code of its own."""
    return f".. code-block:: {language}\n\n" + "".join(
        f"   {line}\n" if line else "\n" for line in text.splitlines()) + "\n"


def title(text: str, line: str) -> str:
    """A heading."""
    return f"{text}\n{line * max(len(text), 3)}\n\n"


def sentence(cause: str, names: Iterable[str] = ()) -> str:
    """A cause as a sentence; the name of an argument stays as it is."""
    first = cause.split()[0]
    begun = cause if first in names else cause[0].upper() + cause[1:]
    return rst(begun).rstrip(".") + "."


def rst_errors(errors: Iterable[Raised], end: str = "", names: Iterable[str] = ()) -> str:
    """Errors as a list, each with a link to what its word means."""
    parts = []
    for each in errors:
        word = "" if end else word_of(each.identifier)
        also = built_in_of(word)
        python = f"; in Python also {also.__name__}" if also else ""
        help_ = f" :term:`{word}` says what to do{python}." if word else ""
        parts.append(f"{code(each.identifier + end)}\n"
                     f"   {sentence(each.cause, names)}{help_}\n\n"
                     f"   {code(each.message)}\n\n")
    return "".join(parts)


def rst_page(operation: Operation) -> str:
    """The page of an operation."""
    page = reference.page_of(operation)
    also = f" Also called {code(operation.long)}." if operation.long != operation.short else ""
    parts = [f".. index:: {', '.join(operation.names)}\n\n.. _{anchor(operation)}:\n\n",
             title(rst(operation.short), "="), f"{rst(operation.purpose)}{also}\n\n"]
    if operation.notes:
        parts.append(f"{rst(one_line(operation.notes))}\n\n")
    parts += [title("Call", "-"),
              "In Python:\n\n", block("python", reference.python_call(operation)),
              "In C++:\n\n", block("cpp", reference.cpp_call(operation)),
              "In the host, input by input and output by output:\n\n",
              block("text", reference.host_call(operation))]
    for name, entries in reference.given_and_taken(operation):
        parts.append(title(name, "-") + "".join(
            f"{code(each.name)}\n   {rst(one_line(each.meaning))}\n\n"
            f"   | Python: {rst(each.kind.wording)}\n   | host: {rst(each.kind.host)}\n\n"
            for each in entries))
    parts.append(title("Errors", "-") + rst_errors(
        page.raised, names=[each.name for each in operation.arguments]))
    parts += [title(name, "~") + f"{rst(note)}\n\n" + rst_errors(errors, end)
              for name, note, errors, end in page.others]
    parts += [title("Example", "-"), block("pycon", reference.example_of(operation))]
    return "".join(parts)


def anchor(operation: Operation) -> str:
    """What links to the page of an operation say."""
    return f"operation-{operation.short.replace('_', '-')}"


def link(operation: Operation) -> str:
    """A link to the page of an operation."""
    return f":ref:`{rst(operation.short)} <{anchor(operation)}>`"


def rst_list() -> str:
    """The list of the operations."""
    parts = [title("Operations", "="),
             "One page for each, with every error that it can raise and an example. In a terminal: "
             "``tessel ops NAME``, or ``man tessel-NAME``.\n\n"]
    for subject, operations in by_subject().items():
        parts.append(title(subject, "-") + "".join(
            f"{link(each)}\n   {rst(each.purpose)}\n\n" for each in operations))
    parts.append(".. toctree::\n   :hidden:\n\n" + "".join(
        f"   {each.short}\n" for operations in by_subject().values() for each in operations))
    return "".join(parts)


def raisers() -> dict[str, list[Operation]]:
    """The operations by the identifiers on their pages."""
    found: dict[str, list[Operation]] = {}
    for operation in OPERATIONS:
        page = reference.page_of(operation)
        for errors, end in ((page.raised, ""), *((errors, end)
                                                 for _, _, errors, end in page.others)):
            for each in errors:
                found.setdefault(each.identifier + end, []).append(operation)
    return {identifier: list(dict.fromkeys(each)) for identifier, each in found.items()}


def who(operations: list[Operation]) -> str:
    """Those operations, or what they have in common where they are nearly all."""
    if len(operations) == len(OPERATIONS):
        return "Every operation."
    if operations == [each for each in OPERATIONS if each.arguments]:
        return "Every operation that has arguments."
    return " ".join(map(link, operations))


def place_of(identifier: str) -> str:
    """What links to an identifier in the index of errors say."""
    return "error-" + re.sub(r"[\W_]+", "-", identifier).strip("-")


def advice(identifier: str) -> str:
    """What the word of an identifier means, and what to do."""
    meaning, remedy = MEANINGS[word_of(identifier)]
    return f"{rst(meaning)} What to do: {rst(remedy)}"


def meant(identifier: str) -> list[str]:
    """What the word of an identifier means, with a link to what to do; nothing where the word is
    appended."""
    word = word_of(identifier)
    return [f"{rst(MEANINGS[word][0])} :term:`{word}` says what to do."] if word in MEANINGS else []


def rst_index() -> str:
    """The index of all errors: every word explained, every identifier with who raises it."""
    parts = [title("Errors", "="),
             "The last word of an identifier says what is wrong, and means the same whichever "
             "operation raised it. In Python, an error is a ``tessel.Error``, and an instance of "
             "the built-in exception in parentheses as well.\n\n"]
    for group, words in GROUPS.items():
        parts.append(title(rst(group), "-") + ".. glossary::\n\n")
        for word, (meaning, remedy) in words.items():
            also = built_in_of(word)
            parts.append(f"   {word}\n      {f'*({also.__name__})* ' if also else ''}{rst(meaning)}"
                         f"\n\n      What to do: {rst(remedy)}\n\n")
    parts.append(title("All identifiers", "-") +
                 "Each with the operations that raise it, and with what its last word means; those "
                 "of the host, of the guard and of the Python package with what to do, too. Where "
                 "a ``<word>`` is, a status's word is appended: those of `What the netCDF library "
                 "refuses`_ and `What the system refuses`_.\n\n")
    said = {identifier: [advice(identifier)] for identifier in (*HOST, *GUARD, *PACKAGE)}
    for each in reference.every_call():
        said.setdefault(each.identifier, meant(each.identifier)).append(
            "Every call, before its operation is found.")
    for identifier, operations in raisers().items():
        said.setdefault(identifier, meant(identifier)).append(who(operations))
    parts += [f".. _{place_of(identifier)}:\n\n{code(identifier)}\n   " + "\n\n   ".join(texts)
              + "\n\n" for identifier, texts in sorted(said.items())]
    parts.append(title("All words of statuses", "-") + "".join(
        f"* {status}: :term:`{word}`\n" for status, word in sorted(STATUSES.items())))
    return "".join(parts)


def rst_pages() -> dict[str, str]:
    """The pages of the book by file."""
    return {"index.rst": rst_list(), "errors.rst": rst_index(),
            **{f"{each.short}.rst": rst_page(each) for each in OPERATIONS}}


def compressed(pages: dict[str, str]) -> dict[str, bytes]:
    """Pages as manual pages are installed, with nothing in them of when that was."""
    return {f"{name}.gz": gzip.compress(text.encode(), mtime=0) for name, text in pages.items()}


def encoded(pages: dict[str, str]) -> dict[str, bytes]:
    """Pages as they are."""
    return {name: text.encode() for name, text in pages.items()}


def write(files: dict[str, bytes], folder: Path) -> None:
    """Writes what is new or different, so that builds after this see what has changed."""
    for name, content in files.items():
        file = folder / name
        file.parent.mkdir(parents=True, exist_ok=True)
        if not file.exists() or file.read_bytes() != content:
            file.write_bytes(content)


if __name__ == "__main__":
    if len(sys.argv) != 3 or sys.argv[1] not in ("man", "rst"):
        sys.exit(__doc__)
    write(compressed(man()) if sys.argv[1] == "man" else encoded(rst_pages()), Path(sys.argv[2]))
