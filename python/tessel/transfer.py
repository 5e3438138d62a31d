# python/tessel/transfer.py: reading and copying of any size, in blocks that can be interrupted.
"""Moves data in blocks, so that memory is bounded, progress can be told, and Ctrl-C is heard."""

from __future__ import annotations

import math
import operator
from collections.abc import Callable, Iterable, Iterator, Sequence
from typing import Any

import numpy as np
from numpy.typing import NDArray

import tessel
from tessel import integrity, notes, wording
from tessel.aside import written_aside
from tessel.dataset import TEXT, Dataset, Variable, host_order
from tessel.new_dataset import FORMATS, NewDataset
from tessel.paths import Path
from tessel.terminal import ProgressBar, progress_bar

Progress = Callable[[int, int], object]
"""Is told the bytes of values that are done, and those that there are."""

BLOCK_BYTES = 16 * 2**20
"""The memory of a block, unless told otherwise."""

_DTYPES = {"double": "f8", "float": "f4", "int": "i4", "short": "i2", "schar": "i1", "uchar": "u1",
           "text": "U1"}

# A character on its way: up to eight bytes in the host and its buffers, and four here.
_MEMORY_OF_CHARACTER = 12

_FIRST_INEXACT = 2.0**53
_WIDE_INTEGERS = {"int64", "uint64"}


@notes.told
def read(path: Path, variable: str, start: Sequence[int] | None = None,
         count: Sequence[int] | None = None, *, out: NDArray[Any] | None = None,
         progress: Progress | None = None, block_bytes: int = BLOCK_BYTES,
         check: bool = True) -> Any:
    """All values of a variable, or `count` of them from `start` on, as the file stores them.

    Everything is in the host's order: `start` and `count` name the first, fastest dimension first,
    and the result is what get_var and get_vara of the module give: an array of at least two
    dimensions, the first one fastest (`.T` is the library's order), or a str for one row of
    characters. Types beyond the classic ones come in a class that holds them; a 64-bit integer
    that no double holds is an error.

    `out`, an array of the result's shape and dtype, takes the values, and is returned: with a
    numpy.memmap, a variable of any size needs no more than `block_bytes` of memory. `progress` is
    called with the bytes done and all bytes, before the first block and after each. Ctrl-C is
    heard between blocks. A file that was cut off is refused unless `check` is False; then zeros
    stand for what is gone.
    """
    size, tell = block_size(block_bytes), listener(progress)
    with Dataset(path) as dataset:
        if check:
            integrity.verify(dataset)
        return _read(dataset, dataset.find(variable), start, count, out, tell, size)


@notes.told
def copy(source: Path, target: Path,
         format: str | None = None, *, overwrite: bool = False,  # pylint: disable=redefined-builtin
         progress: Progress | None = None, block_bytes: int = BLOCK_BYTES,
         check: bool = True) -> None:
    """Copies a file of a classic format, into the `format` "classic" or "64bit-offset", which is
    the source's own unless given: all dimensions, variables and attributes in their order, and all
    values as they are.

    The target appears when it is complete, or not at all, whatever happens: it is written aside, in
    the same folder, and renamed. A target that exists is kept, unless `overwrite` is given; one
    that is the source is refused. What the format cannot hold is the module's error. A file that
    counts records and has no variable with records, which the library does not write but reads, is
    refused: there is nothing by which the copy could count them.

    `progress`, `block_bytes` and `check` are as in `read`. A copy of a file that was cut off is
    complete: nobody sees any more which of its zeros stand for what is gone.
    """
    size, tell = block_size(block_bytes), listener(progress)
    with Dataset(source) as dataset:
        own = integrity.format_of(dataset)
        if own is None:
            raise tessel.Error("TESSEL:python:notAClassicFile",
                               "Only files of the classic formats, 64-bit offset and 64-bit data "
                               "are copied; this one has another format, such as that of HDF5.",
                               path=dataset.place)
        if format is None and own not in FORMATS:
            raise tessel.Error("TESSEL:python:badFormat",
                               f"The file has the format {own}, which copies do not have: give one "
                               f"of {', '.join(FORMATS)}.", path=dataset.place)
        if check:
            integrity.verify(dataset)
        _judge_records(dataset)
        with written_aside(target, overwrite=overwrite, source=dataset.place) as temporary, \
                NewDataset(temporary, own if format is None else format) as made:
            _define(dataset, made)
            _copy_values(dataset, made, tell, size)


def _ignore(_done: int, _total: int) -> None:
    """The progress that nobody wants to know."""


_BAR_MAKERS: tuple[object, ...] = (progress_bar, ProgressBar)


def listener(progress: Progress | None) -> Progress:
    """Who is told the progress; an error for what cannot be told anything. What makes a progress bar
    stands for one."""
    if any(progress is each for each in _BAR_MAKERS):
        return progress_bar()
    if progress is not None and not callable(progress):
        raise _bad_type("progress", "a function of two numbers", progress)
    return progress or _ignore


def block_size(block_bytes: int) -> int:
    """The memory of a block; an error for what is none."""
    size = _whole_number("block_bytes", block_bytes)
    if size < 1:
        raise tessel.Error("TESSEL:python:badBlockSize", "A block has at least one byte.")
    return size


def _whole_number(name: str, value: Any) -> int:
    try:
        return operator.index(value)
    except TypeError:
        raise _bad_type(name, "a whole number", value) from None


def _whole_numbers(name: str, values: Any) -> list[int]:
    if not isinstance(values, Iterable):
        raise _bad_type(name, "a sequence of whole numbers", values)
    return [_whole_number(f"each element of {name}", each) for each in values]


def _bad_type(name: str, wanted: str, value: object) -> tessel.Error:
    return tessel.Error("TESSEL:python:unsupportedType",
                        f"{name} is {wanted}, not of the type {type(value).__name__}.")


def _judge_records(dataset: Dataset) -> None:
    """Refuses records that no variable has."""
    for each in dataset.dimensions:
        if each.unlimited and each.length and not any(
                each in variable.dimensions for variable in dataset.variables.values()):
            raise tessel.Error("TESSEL:python:recordsWithoutVariables", wording.printable(
                f"The file counts {each.length} records along {each.name}, and no variable has "
                "any; a copy would count none."), path=dataset.place)


def blocks(shape: Sequence[int], most: int) -> Iterator[tuple[list[int], list[int]]]:
    """Starts and counts that together cover an array of a shape in the library's order, one after
    the other as the values are stored; none has more than so many elements."""
    if 0 in shape:
        return
    whole = len(shape)  # from here on, dimensions are taken whole
    inner = 1
    while whole and inner * shape[whole - 1] <= most:
        whole -= 1
        inner *= shape[whole]
    if not whole:
        yield [0] * len(shape), list(shape)
        return
    cut = whole - 1
    step = max(most // inner, 1)
    for outer in np.ndindex(*shape[:cut]):
        for first in range(0, shape[cut], step):
            yield ([*outer, first] + [0] * (len(shape) - whole),
                   [1] * cut + [min(step, shape[cut] - first)] + list(shape[whole:]))


def _memory_of_value(variable: Variable) -> int:
    """The bytes that a value takes on its way."""
    if variable.type.number == TEXT:
        return _MEMORY_OF_CHARACTER
    return _dtype(variable).itemsize


def _dtype(variable: Variable) -> np.dtype[Any]:
    """What holds the values; what the module cannot read it refuses itself, whatever this is."""
    return np.dtype(_DTYPES[variable.type.member or "text"])


def _read_block(dataset: Dataset, variable: Variable, start: Sequence[int],
                count: Sequence[int]) -> Any:
    """The values of a block in the library's order, as the module gives them."""
    member = variable.type.member or "text"  # the module then says what is wrong
    if not variable.dimensions:
        return dataset.call(f"get_var_{member}", variable.varid)
    values = dataset.call(f"get_vara_{member}", variable.varid, host_order(start),
                          host_order(count))
    if variable.type.name in _WIDE_INTEGERS and (abs(values) >= _FIRST_INEXACT).any():
        raise dataset.refusal("TESSEL:python:notExact", wording.printable(
            f"{variable.name} has integers that no double holds exactly."), variable)
    return values


def _read(dataset: Dataset, variable: Variable, start: Sequence[int] | None,
          count: Sequence[int] | None, out: NDArray[Any] | None, progress: Progress,
          block_bytes: int) -> Any:
    first, counts = _selection(dataset, variable, start, count)
    total = math.prod(counts) * variable.type.size
    progress(0, total)
    most = 1 if variable.type.member is None else block_bytes // _memory_of_value(variable)
    if out is None and math.prod(counts) <= max(most, 1):
        values = _read_block(dataset, variable, first, counts)
        if total:
            progress(total, total)
        return values

    values = _room(dataset, variable, counts, out)
    done = 0
    for at, size in blocks(counts, most):
        block = _read_block(dataset, variable, list(map(operator.add, first, at)), size)
        _place(values, at, size, block)
        done += math.prod(size) * variable.type.size
        progress(done, total)
    if out is None and variable.type.number == TEXT and _is_row(values):
        return values.tobytes().decode("utf-32-le", "surrogatepass")
    return values


def _is_row(values: NDArray[Any]) -> bool:
    return values.ndim == 2 and values.shape[0] == 1


def _selection(dataset: Dataset, variable: Variable, start: Sequence[int] | None,
               count: Sequence[int] | None) -> tuple[list[int], list[int]]:
    """The selected block in the library's order."""
    lengths = variable.shape[::-1]
    name = wording.printable(variable.name)
    first = [0] * len(lengths) if start is None else _whole_numbers("start", start)
    counts = ([length - begin for length, begin in zip(lengths, first)] if count is None
              else _whole_numbers("count", count))
    for what, identifier, vector in (
            ("Start", "TESSEL:python:badStartLength", first),
            ("Count", "TESSEL:python:badCountLength", first if count is None else counts)):
        if len(vector) != len(lengths):
            raise dataset.refusal(identifier,
                                  f"{what} has {len(vector)} elements, and {name} "
                                  f"{len(lengths)} dimensions.", variable)
    if any(begin < 0 or many < 0 or begin + many > length
           for begin, many, length in zip(first, counts, lengths)):
        raise dataset.refusal("TESSEL:python:indexExceedsDimensionBound",
                              f"{name} has the lengths {tuple(lengths)}, and not "
                              f"{tuple(counts)} values from {tuple(first)} on.", variable)
    return first[::-1], counts[::-1]


def _room(dataset: Dataset, variable: Variable, counts: list[int],
          out: NDArray[Any] | None) -> NDArray[Any]:
    """The array that takes the values: `out`, if there is one and it fits."""
    shape = tuple(counts[::-1]) + (1,) * (2 - len(counts))
    dtype = _dtype(variable)
    if out is None:
        return np.empty(shape, dtype, order="F")
    if not isinstance(out, np.ndarray):
        raise _bad_type("out", "an array of NumPy's", out)
    if out.shape != shape:
        raise dataset.refusal("TESSEL:python:badShape",
                              f"The array for the values has the shape {out.shape}, not {shape}.",
                              variable)
    if out.dtype != dtype:
        raise dataset.refusal("TESSEL:python:unsupportedDtype",
                              f"The array for the values is of {out.dtype}, not {dtype}.", variable)
    if not out.flags.writeable:
        raise tessel.Error("TESSEL:python:readOnlyArray",
                           "The array for the values cannot be written to.")
    return out


def _place(values: NDArray[Any], at: list[int], size: list[int], block: Any) -> None:
    """Puts a block, whose place is in the library's order, into the host's array."""
    if isinstance(block, str):
        block = np.frombuffer(block.encode("utf-32-le", "surrogatepass"), "<U1")
    where = tuple(slice(first, first + many) for first, many in zip(at[::-1], size[::-1]))
    part = values[where]
    part[...] = block.reshape(part.shape, order="F")


def _define(dataset: Dataset, made: NewDataset) -> None:
    """Defines everything that is in the dataset; every variable gets the number that it has
    there."""
    dimids = {each.name: made.define_dimension(each.name, each.length, each.unlimited)
              for each in dataset.dimensions}
    for name in dataset.attributes:
        made.copy_attribute(dataset, -1, name, -1)
    for variable in dataset.variables.values():
        varid = made.define_variable(variable.name, variable.type.number,
                                     [dimids[each.name] for each in variable.dimensions])
        for name in variable.attributes:
            made.copy_attribute(dataset, variable.varid, name, varid)


def _copy_values(dataset: Dataset, made: NewDataset, progress: Progress, block_bytes: int) -> None:
    variables = list(dataset.variables.values())
    total = sum(math.prod(each.shape) * each.type.size for each in variables)
    done = 0
    progress(done, total)
    for variable, start, count in _plan(variables, block_bytes):
        values = _read_block(dataset, variable, start, count)
        if variable.dimensions:
            made.put(f"put_vara_{variable.type.member}", variable.varid, host_order(start),
                     host_order(count), values)
        else:
            made.put(f"put_var_{variable.type.member}", variable.varid, values)
        del values  # before the next block is read
        done += math.prod(count) * variable.type.size
        progress(done, total)


def _plan(variables: list[Variable],
          block_bytes: int) -> Iterator[tuple[Variable, list[int], list[int]]]:
    """The blocks of all variables in the order in which the file has them: the records' last, some
    records of every variable before the next ones."""
    def most(variable: Variable) -> int:
        return block_bytes // _memory_of_value(variable)

    def in_records(variable: Variable) -> bool:
        return bool(variable.dimensions) and variable.dimensions[0].unlimited

    for variable in variables:
        if not in_records(variable):
            yield from ((variable, *block) for block in blocks(variable.shape, most(variable)))
    recorded = list(filter(in_records, variables))
    if not recorded:
        return
    records = recorded[0].shape[0]
    record = sum(_memory_of_value(each) * math.prod(each.shape[1:]) for each in recorded)
    step = max(block_bytes // max(record, 1), 1)
    for first in range(0, records, step):
        for variable in recorded:
            shape = (min(step, records - first), *variable.shape[1:])
            for start, count in blocks(shape, most(variable)):
                yield variable, [first + start[0], *start[1:]], count
