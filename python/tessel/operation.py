# python/tessel/operation.py: what one operation of the module is, and how that reads.
"""The columns of the table of operations: arguments, results and errors of an operation."""

from __future__ import annotations

from dataclasses import dataclass

Errors = tuple[tuple[str, str], ...]
"""Pairs of an identifier (or the end of one) and what causes it."""


@dataclass(frozen=True)
class Kind:
    """What an argument may be."""

    annotation: str
    """The type, as signatures and stubs write it."""

    wording: str
    """The type, as documents write it."""

    host: str
    """The class and shape of the host array that the module takes."""

    conversion: str
    """The expression that a method hands on; {name} is the argument's name."""

    errors: Errors
    """What the module raises for a bad one; {label} is the module's name for the argument. What
    begins with "TESSEL:python:" is raised by the conversion."""

    @property
    def refuses(self) -> bool:
        """Whether the conversion itself can raise."""
        return any(identifier.startswith("TESSEL:python:") for identifier, _ in self.errors)


@dataclass(frozen=True)
class Argument:
    """An argument of an operation."""

    name: str
    kind: Kind
    meaning: str
    label: str = ""
    """The module's name for it in errors, where that is not `name`."""


@dataclass(frozen=True)
class ResultKind:
    """What a result is."""

    annotation: str
    wording: str

    host: str
    """The class and shape of the host array that the module gives."""

    conversion: str
    """The expression that makes it of {value}, what the call form gives; or `call_ints`, for a
    count."""

    count: bool = False
    """Whether it is made of ints."""


@dataclass(frozen=True)
class Result:
    """A result of an operation."""

    name: str
    kind: ResultKind
    meaning: str


@dataclass(frozen=True)
class Operation:
    """One operation of the module."""

    short: str
    long: str
    purpose: str
    arguments: tuple[Argument, ...]
    results: tuple[Result, ...]
    errors: Errors
    """Identifiers and causes, without those of the arguments."""

    example: str
    """Lines for Python's doctest, to be run after operations.EXAMPLE_BEGINNING."""

    notes: str = ""
    several: str = ""
    """The name of the class of the results, where there are several."""

    opens: bool = False
    """Whether it gives a new dataset."""

    ends: bool = False
    """Whether the dataset is gone when it has succeeded."""

    @property
    def names(self) -> tuple[str, ...]:
        """The names that it has, each once."""
        return (self.short,) if self.short == self.long else (self.short, self.long)

    @property
    def counts(self) -> bool:
        """Whether it gives counts; none gives counts and data."""
        return any(each.kind.count for each in self.results)

    @property
    def returns(self) -> str:
        """The annotation of what the method returns."""
        if not self.results:
            return "None"
        return self.several or self.results[0].kind.annotation

    @property
    def parameters(self) -> str:
        """The parameters as a signature has them."""
        return ", ".join(["self", *(f"{each.name}: {each.kind.annotation}"
                                    for each in self.arguments)])

    @property
    def all_errors(self) -> Errors:
        """Identifiers and causes; first the number of arguments, then the arguments, then what
        the operation looks for itself and what the library refuses."""
        blamed: dict[tuple[str, str], list[str]] = {}
        for argument in self.arguments:
            for identifier, cause in argument.kind.errors:
                full = identifier.format(label=argument.label or argument.name)
                blamed.setdefault((full, cause), []).append(argument.name)
        arguments = ((identifier, f"{' or '.join(dict.fromkeys(names))} {cause}")
                     for (identifier, cause), names in blamed.items())
        return *self.errors[:1], *arguments, *self.errors[1:]
