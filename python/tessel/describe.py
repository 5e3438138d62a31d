# python/tessel/describe.py: a file and a variable in words.
"""What is in a file, and what the values of a variable are like, as text for people."""

from __future__ import annotations

import textwrap
from collections.abc import Iterable, Iterator, Mapping
from typing import Any

import numpy as np

import tessel
from tessel import integrity, wording
from tessel.axis import Axis
from tessel.dataset import Attribute, Dataset, Dimension, Variable

_LINE = 100
_LONGEST_TEXT = 2000
_MOST_NUMBERS = 12
_MOST_TEXTS = 20


def listing(dataset: Dataset) -> str:
    """The dimensions, variables and attributes of a file; of one with groups, those of the root."""
    sections = [
        ("Dimensions", _dimensions(dataset)),
        ("Variables", _variables(dataset)),
        ("Attributes of the file", _attributes(dataset.attributes, "  ")),
    ]
    lines = [wording.printable(dataset.path)]
    for heading, content in sections:
        lines += ["", heading, *(list(content) or ["  none"])]
    if integrity.format_of(dataset) is None:
        lines += ["", "Groups, which only files in HDF5 may have, are not shown."]
    return "\n".join(lines)


def _columns(rows: list[tuple[str, ...]], right: Iterable[int] = ()) -> Iterator[str]:
    """Rows as aligned columns; those in `right` flush right."""
    widths = [max(map(len, column)) for column in zip(*rows)]
    for row in rows:
        cells = (cell.rjust(width) if i in right else cell.ljust(width)
                 for i, (cell, width) in enumerate(zip(row, widths)))
        yield ("  " + "  ".join(cells)).rstrip()


def _dimensions(dataset: Dataset) -> Iterator[str]:
    def extent(dimension: Dimension) -> str:
        """Nothing without coordinates, and as many indices as the dimension is long are not made."""
        known = dataset.coordinate(dimension) is not None
        return wording.printable(Axis.of(dataset, dimension).extent()) if known else ""

    return _columns([
        (wording.printable(each.name), str(each.length), "unlimited" if each.unlimited else "",
         extent(each))
        for each in dataset.dimensions], right=[1])


def _variables(dataset: Dataset) -> Iterator[str]:
    for variable in dataset.variables.values():
        names = ", ".join(dimension.name for dimension in variable.dimensions)
        head = f"  {variable.type.name} {variable.name}" + (f"({names})" if names else "")
        yield wording.printable(head)
        yield from _attributes(variable.attributes, "      ")


def _attributes(attributes: Mapping[str, Attribute], indent: str) -> Iterator[str]:
    names = [wording.printable(name) for name in attributes]
    width = min(max(map(len, names), default=0), 24)
    for name, attribute in zip(names, attributes.values()):
        head = f"{indent}{name:{width}}  "
        room = max(_LINE - len(head), 40)
        lines = [piece for line in _value(attribute).splitlines() or [""]
                 for piece in textwrap.wrap(line, room) or [""]]
        yield (head + lines[0]).rstrip()
        yield from (" " * len(head) + line for line in lines[1:])


def _value(attribute: Attribute) -> str:
    """The value of an attribute; only its own line ends begin new lines."""
    value = attribute.value
    if isinstance(value, tessel.Error):
        return f"({attribute.type.name}) {wording.printable(value.message)}"
    if isinstance(value, np.ndarray):
        shown = ", ".join(map(wording.stored_number, value[:_MOST_NUMBERS]))
        more = f", … ({wording.count(value.size)} numbers)" if value.size > _MOST_NUMBERS else ""
        return shown + more or "(no numbers)"
    if not value.strip():
        return f'"{wording.printable(value)}"'
    lines = wording.shortened(value, _LONGEST_TEXT).replace("\r\n", "\n").split("\n")
    return "\n".join(map(wording.printable, lines))


def heading(variable: Variable) -> str:
    """The name of a variable and what it stands for."""
    meaning = variable.text("long_name") or variable.text("standard_name")
    return wording.printable(f"{variable.name}: {meaning}" if meaning else variable.name)


def _shape(variable: Variable) -> str:
    total = wording.count(int(np.prod(variable.shape, dtype=object)))
    sizes = " × ".join(f"{each.name} {each.length}" for each in variable.dimensions)
    return wording.printable(f"{total} ({sizes})" if sizes else total)


def statistics(variable: Variable, values: np.ma.MaskedArray[Any, Any]) -> str:
    """How many values there are, their range, mean and share of missing ones."""
    present = values.compressed()  # type: ignore[no-untyped-call]
    rows: list[tuple[str, ...]] = [("values", _shape(variable))]
    if values.size == 1 and present.size:
        rows.append(("value", wording.with_units(wording.number(present[0]), variable.units)))
    elif present.size:
        with np.errstate(all="ignore"):
            mean = present.mean(dtype=float)
        extremes = f"{wording.number(present.min())} to {wording.number(present.max())}"
        rows += [("range", wording.with_units(extremes, variable.units)),
                 ("mean", wording.with_units(wording.number(mean), variable.units))]
    if values.size:
        missing = values.size - present.size
        rows.append(("missing", f"{100 * missing / values.size:.3g} % "
                                f"({wording.count(missing)} of {wording.count(values.size)})"))
    return "\n".join([heading(variable), *_columns(rows)])


def texts(variable: Variable, found: Iterable[str]) -> str:
    """The values of a text variable."""
    lines = [wording.printable(wording.shortened(text, _LONGEST_TEXT)) for text in found]
    more = [f"  … ({wording.count(len(lines))} texts)"] if len(lines) > _MOST_TEXTS else []
    return "\n".join([heading(variable), *_columns([("characters", _shape(variable))]),
                      *(f'  "{line}"' for line in lines[:_MOST_TEXTS]), *more])
