# python/tessel/reference.py: the pages of the reference, one an operation.
"""Puts together what the table of operations, the module's catalogue and the meanings of words say.

`tessel ops NAME` prints a page as text, the methods have docstrings of the same; and
tools/make_reference.py writes manual pages and the pages of the book.
"""

from __future__ import annotations

import textwrap
from collections.abc import Iterable, Iterator
from dataclasses import dataclass
from functools import cache

from tessel.catalogue import CALLED, GIVEN, GUARD, HOST, RAISES, RETURNED, ROWS, STATUSES
from tessel.errors import built_in_of, word_of
from tessel.families import MEMBERS
from tessel.kinds import NAMES, SIZE
from tessel.meanings import MEANINGS
from tessel.operation import Argument, Operation, Result
from tessel.operations import EXAMPLE_BEGINNING

LIBRARY_TEXT = "<the library's text>"

# What stands at the conversions of a message, by row: the operation's names and labels in braces,
# and in brackets what only the call knows. Other rows with a conversion have the operation's name.
_FILLINGS: dict[str, tuple[str, ...]] = {
    **dict.fromkeys(("getVarsNumDims", "getVarsDimids", "putVar1Inquiry", "putVaraInquiry",
                     "putVarsInquiry"), (LIBRARY_TEXT,)),
    **dict.fromkeys(("putVar1StartLength", "putVaraStartLength", "putVaraCountLength",
                     "putVarsStartLength", "putVarsCountLength", "putVarsStrideLength"),
                    ("<the variable>", "<its number of dimensions>", "<the length>")),
    **dict.fromkeys(("putVaraDataSize", "putVarsDataSize"), ("<product>", "<number of elements>")),
    **dict.fromkeys(("emptySetID", "argumentWasNotChar", "emptySetSizeParameter",
                     "badSizeArgumentDatatype", "sizeArgumentIsInfOrNaN", "unhandledNumericType",
                     "negativeSize", "emptySingleton", "argumentIsEmpty", "argumentHasBadDatatype"),
                    ("{label}",)),
    "badIDDatatype": ("{label}", "<the class>"),
    "invalidOperation": ("<the name>",),
    "unrecognizedCharParameter": ("<the name>",),
    "unrecognizedFileMode": ("<the mode>",),
    "invalidNetcdfDatatype": ("<the value>",),
    "tooManyDimensions": ("1024",),
    "sizeNotRepresentable": ("<the size>",),
    "ndimsOutOfRange": ("<the variable>",),
    "badWriteDatatype": ("{short}", "{wanted}", "<the class>"),
}

_WANTED = {"double": "double precision", "single": "single precision"}

# Rows that the table of operations gives no cause for, because they speak of the host.
_CAUSES = {
    "readBufferFailure": "the host has no memory for the text",
    "writeBufferFailure": "the host has no memory for the text",
    "getVarsDimids": "the library cannot say which dimensions the variable has",
}

# What methods refuse before the module is called.
_OWN = {
    "TESSEL:python:badPath": "A path has no NUL in it. / The path is not UTF-8, and the module "
                             "takes no other: <the path>",
    "TESSEL:python:notExact": "<the number> is not exact as <the dtype>; pass an array of that "
                              "dtype to have it rounded.",
    "TESSEL:python:notOneByte": "<the character> is not one byte; give the bytes that the text is "
                                "to be, such as text.encode(\"latin-1\").",
    "TESSEL:python:notText": "The text has half of a surrogate pair.",
}

EVERY_CALL = ("tooFewArguments", "firstArgNotChar", "invalidOperation")
"""The rows that a call raises before it has found its operation."""

# What else a call raises before it has found its operation: the host in any language, and Python.
_BEFORE_THE_MODULE = {
    **{identifier: HOST[identifier] for identifier in (
        "TESSEL:host:nestedCall", "TESSEL:host:badOutputCount", "TESSEL:host:tooManyInputs",
        "TESSEL:host:missingInput")},
    **CALLED,
}

# Rows that are guards: the conditions before them leave them no case.
_NEVER = {"unhandledNumericType", "numberOfDimensionsOutOfBounds", "ndimsOutOfRange",
          "sizeNotRepresentable", "unhandledFuncstr", "nameExtractionFailure",
          "modeExtractionFailure"}


STATUS_NOTE = (f"For any other status of the library, the identifier ends with that status's word, "
               f"one of {len(set(STATUSES.values())) + 1}; the index of errors explains them.")
AROUND_NOTE = ("Raised around the module: by the host (TESSEL:host:*), and by what makes its "
               "arrays of Python's values and the other way round (TESSEL:python:*):")
GUARDS_NOTE = "In the code, and reached by no call:"
REFUSED_NOTE = "Refused by the guard, which Python installs and C++ programs may:"


@dataclass(frozen=True)
class Raised:
    """An error that an operation can raise."""

    identifier: str
    message: str
    cause: str


@dataclass(frozen=True)
class Page:
    """What there is to say about the errors of an operation."""

    raised: tuple[Raised, ...]
    """What its arguments and the library's usual answers cause, in the order of the checks."""

    statuses: tuple[Raised, ...]
    """The failures of its library calls; a status's word follows each identifier."""

    around: tuple[Raised, ...]
    """What the host and the Python package raise themselves."""

    guards: tuple[Raised, ...]
    """What stands in the code and no call reaches."""

    refused: tuple[Raised, ...]
    """What the guard refuses before the module is called."""

    @property
    def others(self) -> Iterator[tuple[str, str, tuple[Raised, ...], str]]:
        """What there is beside `raised`: title, note, errors, and the end of each identifier."""
        for title, note, errors, end in (
                ("Other statuses", STATUS_NOTE, self.statuses, "<word>"),
                ("From the host and the Python package", AROUND_NOTE, self.around, ""),
                ("The guard", REFUSED_NOTE, self.refused, ""),
                ("Guards inside", GUARDS_NOTE, self.guards, "")):
            if errors:
                yield title, note, errors, end

def given_and_taken(operation: Operation
                    ) -> Iterator[tuple[str, tuple[Argument | Result, ...]]]:
    """The arguments and the results, each with a title, where there are any."""
    if operation.arguments:
        yield "Arguments", operation.arguments
    if operation.results:
        yield "Results", operation.results


def rows_of(operation: Operation) -> tuple[str, ...]:
    """The rows of the catalogue that the operation's handler reaches."""
    return RAISES[operation.short if operation.short in RAISES
                  else operation.short.rpartition("_")[0]]


def _labels(operation: Operation, template: str) -> list[str]:
    """The module's names for the arguments that raise the error."""
    return list(dict.fromkeys(
        each.label or each.name for each in operation.arguments
        if template in (identifier for identifier, _ in each.kind.errors)
        or "unhandledNumericType" in template and each.kind is SIZE))


def _one_of(labels: list[str]) -> str:
    """What stands in a message where the call decides which of these it is."""
    *most, last = labels or [""]
    return f"<{', '.join(most)} or {last}>" if most else last


def _messages(operation: Operation, row: str) -> Iterator[tuple[str, str]]:
    """The identifiers of a row, with their messages, as the operation raises them."""
    identifier, message = ROWS[row]
    fillings = ((LIBRARY_TEXT,) if row.endswith(".failure")
                else _FILLINGS.get(row, ("{short}",) if "%" in message else ()))
    if not fillings and "{" not in identifier:
        yield identifier, message
        return
    labels = _labels(operation, identifier)
    wanted = next((each.host_class for each in MEMBERS
                   if operation.short.endswith(f"_{each.suffix}")), "")
    for group in labels if "{label}" in identifier else [_one_of(labels)]:
        named = {"short": operation.short, "label": group, "wanted": _WANTED.get(wanted, wanted)}
        text = message
        for each in fillings:
            at = text.index("%")
            text = text[:at] + each.format(**named) + text[at + 2:]
        yield identifier.format(**named), text


def _is_guard(operation: Operation, row: str) -> bool:
    return (row in _NEVER or row.endswith("Foreign")
            or row == "emptyVariableData" and operation.short.startswith("put_att"))


def page_of(operation: Operation) -> Page:
    """The errors of an operation."""
    messages: dict[str, list[str]] = {}
    causes: dict[str, str] = dict(operation.all_errors)
    statuses, guards = [], []
    for row in rows_of(operation):
        for identifier, message in _messages(operation, row):
            if row.endswith(".failure"):
                statuses.append(Raised(identifier, message, "the library's call fails"))
            elif _is_guard(operation, row):
                guards.append(Raised(identifier, message, MEANINGS[word_of(identifier)][0]))
            else:
                messages.setdefault(identifier, []).append(message)
                causes.setdefault(identifier, _CAUSES.get(row, ""))
    raised = []
    for identifier, cause in causes.items():
        tag = identifier[:-len(word_of(identifier))]
        found = messages.get(identifier) or [each.message for each in statuses
                                             if each.identifier == tag]
        raised.append(Raised(identifier, _OWN.get(identifier) or " / ".join(found), cause))
    return Page(tuple(raised), tuple(statuses), _around(
        operation.short.startswith(("get_var_", "get_vara_", "get_vars_")),
        bool(operation.arguments)), tuple(guards), tuple(_refused(operation)))


@cache
def _explained(identifier: str, message: str) -> Raised:
    return Raised(identifier, message, MEANINGS[word_of(identifier)][0])


@cache
def _around(shaped: bool, given: bool) -> tuple[Raised, ...]:
    """What is raised by the host and by conversions: of arguments, which may be anything, and of a
    result that has the shape of a variable or of a block."""
    host = ["TESSEL:host:outOfMemory", *(["TESSEL:host:dimensionsTooLarge"] if shaped else [])]
    result = ["TESSEL:python:tooManyDimensions", "TESSEL:python:shapeTooLarge"] if shaped else []
    found = {**{each: HOST[each] for each in host}, **(GIVEN if given else {}),
             **{each: RETURNED[each] for each in result}}
    return tuple(_explained(*each) for each in found.items())


def _refused(operation: Operation) -> Iterator[Raised]:
    """What the guard looks for before the operation."""
    short = operation.short
    ends = short in ("enddef", "end_def", "_enddef", "close")  # definitions
    writes = short.startswith(("put_var1_", "put_vara_", "put_vars_"))
    words = {
        "remote": operation.opens, "mode": operation.opens,
        "mapping": operation.opens or ends or writes,
        "header": short in ("open", "_open", "sync", "redef") or ends,
        "alignment": short == "_enddef",
        "name": short.startswith(("def_", "rename_", "put_att_", "copy_att")),
        "lengths": short == "def_var",
        "redefinition": short == "redef",
        "position": ends or writes,
        "counts": short.startswith(("put_vara_", "put_vars_")),
        "records": writes,
        "closed": any(each.name.startswith("ncid") for each in operation.arguments),
    }
    for word, may in words.items():
        if may:
            yield _explained(f"TESSEL:guard:{word}", GUARD[f"TESSEL:guard:{word}"])


def every_call() -> tuple[Raised, ...]:
    """What a call raises before it has found its operation."""
    rows = {ROWS[row][0]: ROWS[row][1].replace("%s", "<the name>") for row in EVERY_CALL}
    return tuple(map(_explained, *zip(*(rows | _BEFORE_THE_MODULE).items())))


def host_call(operation: Operation) -> str:
    """The call in the host: the inputs and the output slots, position by position."""
    inputs = [("prhs[0]", f'"{operation.short}"', "char"),
              *((f"prhs[{i}]", each.name, each.kind.host)
                for i, each in enumerate(operation.arguments, 1))]
    outputs = [(f"plhs[{i}]", each.name, each.kind.host)
               for i, each in enumerate(operation.results)]
    width = max(len(name) for _, name, _ in (*inputs, *outputs))
    return "\n".join(f"{slot}  {name:{width}}  {shape}"
                     for slot, name, shape in (*inputs, *outputs))


def python_call(operation: Operation) -> str:
    """The call in Python."""
    results = ", ".join(each.name for each in operation.results)
    given = ", ".join(each.name for each in operation.arguments)
    return f"{results + ' = ' if results else ''}nc.{operation.short}({given})"


_EACH_NAME = """\
std::vector<std::string> names;
for (std::size_t i = 0; i < results[0].size(); ++i) {
    names.push_back(results[0].cellAt(i).utf8());
}"""

_TAKEN = {"int": ".number()", "str": ".utf8()", "Any": ".number()"}


def cpp_call(operation: Operation) -> str:
    """The call in C++, and how its results are taken."""
    given = "".join(f", {each.name}" for each in operation.arguments)
    call = f'netcdf("{operation.short}"{given});'
    if not operation.results:
        return call
    if operation.results[0].kind is NAMES:
        return f"const tessel::Results results = {call}\n{_EACH_NAME}"
    taken = {each.name for each in operation.arguments}
    return "\n".join([f"const tessel::Results results = {call}", *(
        f"const auto {each.name}{'_out' if each.name in taken else ''} = "
        f"results[{i}]{_taken(each.kind.annotation, each.kind.host)};"
        for i, each in enumerate(operation.results))])


_ELEMENTS = {"double": "double", "single": "float", "int32": "std::int32_t",
             "int16": "std::int16_t", "int8": "std::int8_t", "uint8": "std::uint8_t"}


def _taken(annotation: str, host: str) -> str:
    """The member function that gives what a result holds."""
    if annotation in _TAKEN:
        return _TAKEN[annotation]
    element = _ELEMENTS.get(host.partition(",")[0])
    return f".elements<{element}>()" if element else ".utf8()"


@cache
def shown(identifier: str) -> str:
    """An identifier, with the built-in exception that it also is in Python."""
    built_in = built_in_of(word_of(identifier))
    return f"{identifier} ({built_in.__name__})" if built_in else identifier


def example_of(operation: Operation) -> str:
    """The example, complete."""
    return EXAMPLE_BEGINNING + operation.example.strip()


def text_of(operation: Operation) -> str:
    """The page as text for a terminal."""
    page = page_of(operation)
    arguments = ", ".join(each.name for each in operation.arguments)
    parts = [f"{operation.short}({arguments})", operation.purpose]
    if operation.long != operation.short:
        parts.append(f"Also called {operation.long}.")
    if operation.notes:
        parts.append(_filled(operation.notes))
    parts.append(_section("In the host", host_call(operation)))
    parts.append(_section("In Python", f"nc = tessel.load(\"netcdf\")\n{python_call(operation)}"))
    parts.append(_section("In C++", cpp_call(operation)))
    for title, entries in given_and_taken(operation):
        parts.append(_section(title, "\n".join(
            f"{each.name}: {each.kind.wording}\n{_filled(each.meaning, '    ')}"
            for each in entries)))
    errors = [_listed(page.raised)] if page.raised else []
    errors += [f"{_filled(note)}\n{_listed(found, end)}" for _, note, found, end in page.others]
    if errors:
        parts.append(_section("Errors", "\n\n".join(errors)))
    parts.append(_section("Example", example_of(operation)))
    return "\n\n".join(parts) + "\n"


def docstring_of(operation: Operation) -> str:
    """The docstring of the operation's method: the page without the calls, and without the messages
    of errors."""
    page = page_of(operation)
    parts = [operation.purpose]
    if operation.notes:
        parts.append(_filled(operation.notes))
    for title, entries in given_and_taken(operation):
        parts.append(_section({"Arguments": "Parameters", "Results": "Returns"}[title], "\n".join(
            f"{each.name} : {each.kind.wording}\n{_filled(each.meaning, '    ')}"
            for each in entries)))
    errors = [_named(page.raised)]
    errors += [f"{_filled(note, '    ')}\n{_named(found, end)}"
               for _, note, found, end in page.others]
    parts.append(_section("Raises", "\n".join(["tessel.Error", *filter(None, errors)])))
    parts.append(_section("Examples", example_of(operation)))
    return "\n\n".join(parts) + "\n"


@cache
def _named(errors: tuple[Raised, ...], end: str = "") -> str:
    return "\n".join(_wrapped(f"{shown(each.identifier + end)}: {each.cause}", "    ", "        ")
                     for each in errors)


def _listed(errors: Iterable[Raised], end: str = "") -> str:
    return "\n".join(f"{shown(each.identifier + end)}\n{_filled(each.cause, '    ')}\n"
                     f"{_wrapped(each.message, '    ')}" for each in errors)


def _section(title: str, body: str) -> str:
    return f"{title}\n{'-' * len(title)}\n{body}"


def _joined(text: str) -> str:
    return " ".join(text.split())


def _filled(text: str, indent: str = "") -> str:
    return _wrapped(_joined(text), indent)


@cache
def _wrapped(text: str, indent: str, hanging: str | None = None) -> str:
    return textwrap.fill(text, 92, initial_indent=indent,
                         subsequent_indent=indent if hanging is None else hanging,
                         break_long_words=False, break_on_hyphens=False)
