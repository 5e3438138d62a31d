# python/tessel/xarray/planning.py: how a selection of values is read at the least cost.
"""Plans the calls for a selection, and carries them out.

A selection has for each dimension a whole number, a slice of any step, or an array of positions;
each dimension is selected from by itself, as in `numpy.ix_`. There are four ways to read it:

- *one block*, where it is contiguous in every dimension: one call, whose result is the final array;
- *block and pick*: what lies between the first and the last position is read, and the wanted values
  are picked out of it in memory;
- *runs of blocks*: one call for each position of a dimension, or for each group of neighbours;
- *the strided operation*: one call; the library reads each value by itself.

Block and pick in some dimensions goes together with runs in others. What is cheapest is computed
from the costs below, which `bench/access_costs.py` measures; all ways give the same values. What is
read to be picked from comes in pieces, so that it needs no more memory than `PIECE_BYTES`.
"""

from __future__ import annotations

import itertools
import math
import operator
from collections.abc import Iterator, Sequence
from dataclasses import dataclass
from typing import Any, NamedTuple, Protocol, Union

import numpy as np
from numpy.typing import NDArray

import tessel

Selector = Union[int, slice, NDArray[Any]]
"""What is selected of one dimension."""

PIECE_BYTES = 2**20
"""The most memory for values that are read to be picked from; small pieces stay in the caches."""

_MOST_COMPARED = 5
"""Of so many dimensions that are not contiguous, all combinations of the ways are compared."""


class Costs(NamedTuple):
    """What reading costs, in seconds."""

    call: float
    """A call of an operation, and what is done with its result."""

    run: float
    """A run of neighbouring values in the file."""

    byte: float
    """A byte that is read as part of a run."""

    picked: float
    """A byte that is picked or copied in memory."""

    strided: float
    """A value that the strided operation reads."""


COSTS = {
    (True, False): Costs(call=4e-6, run=75e-9, byte=0.4e-9, picked=0.13e-9, strided=35e-9),
    (True, True): Costs(call=6e-6, run=75e-9, byte=2e-9, picked=0.25e-9, strided=40e-9),
    (False, False): Costs(call=4e-6, run=450e-9, byte=0.3e-9, picked=0.12e-9, strided=40e-9),
    (False, True): Costs(call=5e-6, run=115e-9, byte=1.3e-9, picked=0.25e-9, strided=45e-9),
}
"""By whether the file is mapped, and whether the values are characters: what
`bench/access_costs.py` found, which fails when they are off by more than twice."""

_NEAR = 4096
"""Values that are so many bytes apart count as one run for the strided operation."""


class Reader(Protocol):
    """Reads a variable; everything in the library's order of dimensions."""

    shape: tuple[int, ...]
    dtype: np.dtype[Any]
    costs: Costs
    memory: int
    """The bytes that a value needs on its way, where that is more than the result."""

    def block(self, start: list[int], count: list[int]) -> NDArray[Any]:
        """The values of a block."""

    def strided(self, start: list[int], count: list[int], step: list[int]) -> NDArray[Any]:
        """Every n-th value from a start on."""


@dataclass(frozen=True)
class Axis:
    """The positions of a dimension that are wanted, each once and ascending."""

    length: int
    """Of the dimension."""

    first: int
    count: int
    step: int
    """From each position to the next; 0 where `places` has the positions."""

    places: NDArray[Any] | None = None
    back: Selector | None = None
    """What makes the selection of the values in ascending order; None where they are it."""

    def extent(self, begin: int, end: int) -> tuple[int, int]:
        """Where the positions of these numbers begin, and how much there is between them."""
        if self.places is None:
            return self.first + begin * self.step, (end - begin - 1) * self.step + 1
        start = int(self.places[begin])
        return start, int(self.places[end - 1]) + 1 - start

    def pick(self, begin: int, end: int) -> slice | NDArray[Any]:
        """The positions of these numbers among all that are between them."""
        if self.places is None:
            return slice(None, None, self.step)
        picked: NDArray[Any] = self.places[begin:end] - self.places[begin]
        return picked

    @property
    def contiguous(self) -> bool:
        """Whether nothing lies between the positions."""
        return self.step == 1 or self.count == 1


Groups = list[tuple[int, int]]
"""Positions that are read together, by their numbers: from the first up to the second."""


def read(reader: Reader, key: Sequence[Selector]) -> NDArray[Any]:
    """The selected values."""
    block = _block_of(reader.shape, key)
    if block is not None and _is_direct(reader, block[1]):
        start, count, shape = block
        return reader.block(start, count).reshape(shape)
    axes = [_axis(each, length, number)
            for number, (each, length) in enumerate(zip(key, reader.shape))]
    count = [each.count for each in axes]
    if 0 in count:
        values = np.empty(count, reader.dtype)
    elif all(each.contiguous for each in axes) and _is_direct(reader, count):
        values = reader.block([each.first for each in axes], count)
    else:
        values = _read_by_parts(reader, axes, count)
    return _turned_back(values, axes)


def _block_of(shape: tuple[int, ...],
              key: Sequence[Selector]) -> tuple[list[int], list[int], list[int]] | None:
    """Start and count of a key that selects one block, and the shape of what is selected; None for
    others. It does what `_axis` does for the commonest selections, in a tenth of the time."""
    start, count, kept = [], [], []
    for each, length in zip(key, shape):
        if type(each) is slice:
            first, stop, step = each.indices(length)
            many = stop - first
            if step != 1 or many <= 0:
                return None
            kept.append(many)
        elif isinstance(each, (int, np.integer)) and 0 <= each < length:
            first, many = int(each), 1
        else:
            return None
        start.append(first)
        count.append(many)
    return start, count, kept


def _axis(selector: Selector, length: int, number: int) -> Axis:
    if isinstance(selector, slice):
        places = range(length)[selector]
        count, step = len(places), places.step
        if step < 0 and count:
            return Axis(length, places[-1], count, -step, None, slice(None, None, -1))
        return Axis(length, places.start, count, step)
    if isinstance(selector, np.ndarray) and selector.ndim:
        return _listed(selector, length, number)
    place = operator.index(selector)
    if not -length <= place < length:
        raise _beyond(place, length, number)
    return Axis(length, place % length, 1, 1, None, 0)


def _listed(selector: NDArray[Any], length: int, number: int) -> Axis:
    if not selector.size:
        return Axis(length, 0, 0, 1)
    if selector.dtype.kind not in "iu":
        raise IndexError(f"Positions are whole numbers, not {selector.dtype}.")
    lowest, highest = int(selector.min()), int(selector.max())
    if lowest < -length or highest >= length:
        raise _beyond(lowest if lowest < -length else highest, length, number)
    places = selector.astype(np.int64)
    if lowest < 0:
        places = np.where(places < 0, places + length, places)
    back = None
    gaps = np.diff(places)
    if (gaps <= 0).any():
        places, back = np.unique(places, return_inverse=True)
        gaps = np.diff(places)
    first, count = int(places[0]), len(places)
    if count == 1 or (gaps == gaps[0]).all():
        return Axis(length, first, count, int(gaps[0]) if count > 1 else 1, None, back)
    return Axis(length, first, count, 0, places, back)


def _beyond(place: int, length: int, number: int) -> tessel.Error:
    return tessel.Error("TESSEL:python:indexExceedsDimensionBound",
                        f"Position {place} is beyond dimension {number}, which has the length "
                        f"{length}.")


def _is_direct(reader: Reader, count: list[int]) -> bool:
    """Whether the memory of a block is the result's, or what else it needs is little."""
    return (reader.memory <= reader.dtype.itemsize
            or reader.memory * math.prod(count) <= PIECE_BYTES)


def _turned_back(values: NDArray[Any], axes: list[Axis]) -> NDArray[Any]:
    """The values as they were selected, from those in ascending order."""
    simple: list[Selector] = []
    listed = []
    for each in axes:
        if isinstance(each.back, np.ndarray):
            listed.append((len([None for s in simple if not isinstance(s, int)]), each.back))
            simple.append(slice(None))
        else:
            simple.append(slice(None) if each.back is None else each.back)
    values = values[tuple(simple)]
    for number, back in listed:
        values = values.take(back, number)
    return values


def _read_by_parts(reader: Reader, axes: list[Axis], count: list[int]) -> NDArray[Any]:
    groups = _cheapest(reader, axes)
    if groups is None:
        return reader.strided([each.first for each in axes], count,
                              [max(each.step, 1) for each in axes])
    values = np.empty(count, reader.dtype)
    for part in itertools.product(*groups):
        places = [axis.extent(*group) for axis, group in zip(axes, part)]
        block = reader.block([start for start, _ in places], [extent for _, extent in places])
        picks = [axis.pick(*group) for axis, group in zip(axes, part)]
        block = block[tuple(each if isinstance(each, slice) else slice(None) for each in picks)]
        for number, each in enumerate(picks):
            if not isinstance(each, slice):
                block = block.take(each, number)
        values[tuple(slice(*group) for group in part)] = block
    return values


def _cheapest(reader: Reader, axes: list[Axis]) -> list[Groups] | None:
    """The groups of each dimension that are cheapest to read; None for the strided operation."""
    best = min((_in_pieces(reader, axes, groups) for groups in _combinations(reader, axes)),
               key=lambda groups: _cost(reader, axes, groups))
    if (any(each.places is not None for each in axes) or reader.memory > reader.dtype.itemsize
            or _cost(reader, axes, best) <= _cost_strided(reader, axes)):
        return best
    return None


def _combinations(reader: Reader, axes: list[Axis]) -> Iterator[list[Groups]]:
    """Block and pick in every dimension, or runs in some of them."""
    together = [[(0, each.count)] for each in axes]
    yield together
    # As many runs as cost more than all of it together are not even counted out.
    limit = _cost(reader, axes, _in_pieces(reader, axes, together))
    runs = {number: _neighbours(reader, axes, number, limit)
            for number, each in enumerate(axes) if not each.contiguous}
    others = [number for number, those in runs.items() if those]
    sizes = range(1, len(others) + 1) if len(others) <= _MOST_COMPARED else [1, len(others)]
    for size in sizes:
        for chosen in itertools.combinations(others, size):
            yield [runs[number] if number in chosen else each
                   for number, each in enumerate(together)]


def _neighbours(reader: Reader, axes: list[Axis], number: int, limit: float) -> Groups:
    """The positions of a dimension in groups, between which a call costs less than what it saves
    to read; none if their calls alone would cost more than the limit."""
    axis = axes[number]
    if axis.places is None:
        affordable = axis.count * reader.costs.call <= limit
        return [(each, each + 1) for each in range(axis.count)] if affordable else []
    inner = math.prod(each.count for each in axes[number + 1:])
    outer = math.prod(each.count for each in axes[:number])
    costs = reader.costs
    one = outer * (inner * reader.dtype.itemsize * costs.byte + costs.run * (inner > 1))
    ends = np.flatnonzero((np.diff(axis.places) - 1) * one > costs.call) + 1
    if (len(ends) + 1) * costs.call > limit:
        return []
    return list(zip([0, *ends.tolist()], [*ends.tolist(), axis.count]))


def _in_pieces(reader: Reader, axes: list[Axis], groups: list[Groups]) -> list[Groups]:
    """The same, with what is too large for the memory in pieces, cut in the outer dimensions."""
    memory = max(reader.memory, reader.dtype.itemsize)
    extents = [max(axis.extent(*each)[1] for each in those) for axis, those in zip(axes, groups)]
    made = []
    for number, (axis, those) in enumerate(zip(axes, groups)):
        most = max(PIECE_BYTES // (memory * math.prod(extents[number + 1:])), 1)
        made.append(those if extents[number] <= most
                    else [piece for each in those for piece in _cut(axis, *each, most)])
    return made


def _cut(axis: Axis, begin: int, end: int, most: int) -> Iterator[tuple[int, int]]:
    """A group in pieces that extend over no more than so many positions."""
    while begin < end:
        if axis.places is None:
            until = min(begin + (most - 1) // axis.step + 1, end)
        else:
            until = int(np.searchsorted(axis.places, axis.places[begin] + most))
            until = min(max(until, begin + 1), end)
        yield begin, until
        begin = until


def _cost(reader: Reader, axes: list[Axis], groups: list[Groups]) -> float:
    """The seconds that it takes to read the groups of each dimension."""
    costs = reader.costs
    calls = math.prod(map(len, groups))
    read_of = [sum(axis.extent(*each)[1] for each in those) for axis, those in zip(axes, groups)]
    # Values of the last dimensions, as long as these are read whole, are neighbours in the file.
    inner = len(axes)
    while inner > 1 and groups[inner - 1] == [(0, axes[inner - 1].length)]:
        inner -= 1
    runs = math.prod(read_of[:inner - 1]) * math.prod(map(len, groups[inner - 1:]))
    size = reader.dtype.itemsize
    wanted = math.prod(each.count for each in axes) * size
    return (calls * costs.call + runs * costs.run + math.prod(read_of) * size * costs.byte
            + wanted * costs.picked)


def _cost_strided(reader: Reader, axes: list[Axis]) -> float:
    """The seconds that the strided operation takes."""
    total = math.prod(each.count for each in axes)
    last = axes[-1]
    runs = total // last.count if last.step * reader.dtype.itemsize < _NEAR else total
    return reader.costs.call + total * reader.costs.strided + runs * reader.costs.run
