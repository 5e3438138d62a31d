# python/tessel/time_mean.py: the mean of a variable over its time, as a file of its own.
"""Writes the mean over the first dimension of time, with its coordinates and attributes."""

from __future__ import annotations

from collections.abc import Iterable, Iterator

import numpy as np

from tessel import aside
from tessel.dataset import EXTERNAL_TYPES, Attribute, Dataset, Dimension, ExternalType, Variable
from tessel.new_dataset import NewDataset

_LAST_CLASSIC_TYPE = 6

# The type of the classic formats for what a member reads.
_KEPT_AS = {"schar": 1, "text": 2, "short": 3, "uchar": 3, "int": 4, "float": 5, "double": 6}

_MARKERS = ("_FillValue", "missing_value")
_PACKING = {"scale_factor", "add_offset"}

# What belongs to the stored numbers and not to what they stand for.
_OF_STORAGE = {"valid_min", "valid_max", "valid_range", "_Unsigned", *_PACKING, *_MARKERS}


class NoMean(Exception):
    """Why a variable has no mean over time."""


def write(dataset: Dataset, variable: Variable, values: np.ma.MaskedArray, path: str) -> Dimension:
    """Makes a 64-bit-offset file of the mean of the values, in place of any file of that name, and
    returns the dimension that it went over; NoMean where there is nothing to average.

    Missing values are left out; where nothing is there, the mean is missing. It is calculated in
    double precision, and stored as float when the values are, else as double.
    """
    place = _place_of_time(dataset, variable)
    over = variable.dimensions[place]
    if not values.size:
        raise NoMean("it has no values")
    mean = _mean(values, place)
    rest = [each for i, each in enumerate(variable.dimensions) if i != place]
    beside = {each.name: each for each in _coordinates(dataset, variable, over)}.values()

    with aside.written_aside(path, overwrite=True, source=dataset.place) as temporary, \
            NewDataset(temporary, "64bit-offset") as made:
        used = dict.fromkeys([*rest, *(each for one in beside for each in one.dimensions)])
        dimids = {each: made.define_dimension(each.name, each.length) for each in used}
        _copy_attributes(made, dataset.attributes.values(), dataset, -1, -1)
        copies = [_define_copy(made, dataset, each, dimids) for each in beside]
        varid, marker = _define_mean(made, dataset, variable, over, mean.dtype,
                                     [dimids[each] for each in rest])
        for each, copy in zip(beside, copies):
            made.put(f"put_var_{each.type.member}", copy, dataset.read(each).ravel())
        made.put(f"put_var_{_type_of(mean.dtype).member}", varid, _filled(mean, marker).ravel())
    return over


def _place_of_time(dataset: Dataset, variable: Variable) -> int:
    for place, dimension in enumerate(variable.dimensions):
        coordinate = dataset.coordinate(dimension)
        if coordinate is not None and coordinate.is_time:
            return place
    raise NoMean("it has no dimension of time")


def _mean(values: np.ma.MaskedArray, place: int) -> np.ma.MaskedArray:
    """The mean along one dimension, masked where nothing is there."""
    present = ~np.ma.getmaskarray(values)
    counts = present.sum(axis=place)
    with np.errstate(all="ignore"):
        means = np.sum(values.data, axis=place, dtype=float, where=present) / counts
    kind = np.float32 if values.dtype == np.float32 else float
    return np.ma.MaskedArray(means.astype(kind), counts == 0)


def _coordinates(dataset: Dataset, variable: Variable, over: Dimension) -> Iterator[Variable]:
    """The variables that say where the values of the mean lie, and the borders of their cells."""
    names = [each.name for each in variable.dimensions] + variable.text("coordinates").split()
    for place in filter(None, map(dataset.variables.get, names)):
        borders = (place.text(attribute) for attribute in ("bounds", "edges"))
        for each in (place, *filter(None, map(dataset.variables.get, borders))):
            if over not in place.dimensions and _is_copied(each, over):
                yield each


def _is_copied(variable: Variable, over: Dimension) -> bool:
    return (variable.type.member is not None and over not in variable.dimensions
            and 0 not in variable.shape)


def _define_copy(made: NewDataset, dataset: Dataset, variable: Variable,
                 dimids: dict[Dimension, int]) -> int:
    """Defines a variable as it is in the dataset; returns its number."""
    varid = made.define_variable(variable.name, _KEPT_AS[variable.type.member],
                                 [dimids[each] for each in variable.dimensions])
    _copy_attributes(made, variable.attributes.values(), dataset, variable.varid, varid)
    return varid


def _define_mean(made: NewDataset, dataset: Dataset, variable: Variable, over: Dimension,
                 dtype: np.dtype, dimids: list[int]) -> tuple[int, float]:
    """Defines the variable of the mean; returns its number and what stands for a missing value."""
    kind = _type_of(dtype)
    varid = made.define_variable(variable.name, kind.number, dimids)
    packed = variable.type != kind or not _PACKING.isdisjoint(variable.attributes)
    left_out = {"cell_methods", *(_OF_STORAGE if packed else ())}
    kept = {name: each for name, each in variable.attributes.items() if name not in left_out}
    _copy_attributes(made, kept.values(), dataset, variable.varid, varid)
    made.call("put_att_text", varid, "cell_methods",
              f"{variable.text('cell_methods')} {over.name}: mean".lstrip())
    markers = (variable.numbers(name) for name in _MARKERS if name in kept)
    marker = next((numbers[0] for numbers in markers if numbers.size), None)
    if marker is None:
        marker = made.parameter(kind.fill)
        made.call("put_att_double", varid, "_FillValue", kind.number, marker)
    return varid, float(marker)


def _filled(mean: np.ma.MaskedArray, marker: float) -> np.ndarray:
    with np.errstate(all="ignore"):
        return np.where(mean.mask, mean.dtype.type(marker), mean.data)


def _type_of(dtype: np.dtype) -> ExternalType:
    return EXTERNAL_TYPES[_KEPT_AS["float" if dtype == np.float32 else "double"]]


def _copy_attributes(made: NewDataset, attributes: Iterable[Attribute], dataset: Dataset,
                     from_varid: int, to_varid: int) -> None:
    """Copies attributes; numbers of types that the format lacks become such as it has, other values
    of such types are left out."""
    for attribute in attributes:
        if attribute.type.number <= _LAST_CLASSIC_TYPE:
            made.copy_attribute(dataset, from_varid, attribute.name, to_varid)
        elif isinstance(attribute.value, np.ndarray):
            made.call("put_att_double", to_varid, attribute.name,
                      _KEPT_AS[attribute.type.member], attribute.value.astype(float))
