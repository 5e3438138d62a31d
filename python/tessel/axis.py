# python/tessel/axis.py: what a coordinate's numbers mean: places, depths, times.
"""The axes of a variable: positions along a dimension, and how they are written."""

from __future__ import annotations

import contextlib
import warnings
from collections.abc import Callable, Iterator
from dataclasses import dataclass
from datetime import timedelta
from types import ModuleType
from typing import TYPE_CHECKING, Any

import numpy as np
from numpy.typing import NDArray

from tessel import wording
from tessel.dataset import Dataset, Dimension, Variable

if TYPE_CHECKING:
    import cftime

_EAST = {"degrees_east", "degree_east", "degrees_e", "degree_e", "degreese", "degreee"}
_NORTH = {"degrees_north", "degree_north", "degrees_n", "degree_n", "degreesn", "degreen"}


@contextlib.contextmanager
def calendars() -> Iterator[ModuleType]:
    """The library of calendars, for what makes dates: climatologies are written as the year zero,
    whether or not the calendar has one, and need no warning about it."""
    import cftime  # here, because files without times are shown without it

    with warnings.catch_warnings():
        warnings.simplefilter("ignore", cftime.CFWarning)
        yield cftime


@dataclass(frozen=True)
class Calendar:
    """Turns the numbers of a time axis into dates."""

    units: str
    calendar: str
    climatology: bool
    """Whether the dates belong to no year: the axis repeats."""

    @staticmethod
    def of(variable: Variable) -> Calendar | None:
        """The calendar of a time variable; None for other variables and for what cftime does not
        know."""
        units = variable.units
        if " since " not in units.lower():
            return None
        name = variable.text("calendar").lower() or "standard"
        made = Calendar(units, name, "modulo" in variable.attributes
                        or "climatology" in variable.attributes)
        return made if made.date(0) is not None else None

    def date(self, value: float) -> cftime.datetime | None:
        """The date of a number; None where there is none."""
        try:
            with calendars() as library:
                date = library.num2date(value, self.units, self.calendar, has_year_zero=True)
        except (ValueError, TypeError, ArithmeticError):
            return None
        return date if isinstance(date, library.datetime) else None

    def value(self, date: cftime.datetime) -> float:
        """The number of a date that `date` gave, or one near it."""
        with calendars() as library:
            return float(library.date2num(date, self.units, self.calendar, has_year_zero=True))

    def written(self, value: float) -> str:
        """A number as a date for people."""
        date = self.date(value)
        if date is None:
            return wording.with_units(wording.number(value), self.units)
        with calendars():
            date += timedelta(seconds=30)  # to the nearest minute
        text = f"{date.day} {date.strftime('%B')}"
        if self.climatology:
            return text
        clock = f", {date.hour:02}:{date.minute:02}" if date.hour or date.minute else ""
        return f"{text} {date.year}{clock}"


@dataclass(frozen=True)
class Axis:
    """The positions along one dimension."""

    dimension: Dimension
    values: NDArray[Any]
    """One number for each index; the indices themselves where the file gives no usable ones."""

    variable: Variable | None = None
    calendar: Calendar | None = None

    @staticmethod
    def of(dataset: Dataset, dimension: Dimension) -> Axis:
        """The axis of a dimension."""
        variable = dataset.coordinate(dimension)
        if variable is not None:
            values = dataset.values(variable)
            if values.size and not values.mask.any() and np.isfinite(values.data).all():
                return Axis(dimension, values.data.astype(float), variable, Calendar.of(variable))
        return Axis(dimension, np.arange(dimension.length, dtype=float))

    def _is(self, units: set[str], letter: str, name: str) -> bool:
        return self.variable is not None and (
            self.variable.units.lower() in units
            or self.variable.text("standard_name").lower() == name
            or (self.variable.text("axis").upper() == letter
                and self.variable.units.lower().startswith("degree")))

    @property
    def is_longitude(self) -> bool:
        """Whether the positions are degrees east."""
        return self._is(_EAST, "X", "longitude")

    @property
    def is_latitude(self) -> bool:
        """Whether the positions are degrees north."""
        return self._is(_NORTH, "Y", "latitude")

    @property
    def is_vertical(self) -> bool:
        """Whether the positions are heights or depths."""
        return self.variable is not None and (
            self.variable.text("positive").lower() in ("up", "down")
            or self.variable.text("axis").upper() == "Z")

    @property
    def points_down(self) -> bool:
        """Whether larger numbers lie deeper."""
        return self.variable is not None and self.variable.text("positive").lower() == "down"

    @property
    def is_monotonic(self) -> bool:
        """Whether the positions only rise or only fall."""
        steps = np.diff(self.values)
        return bool((steps > 0).all() or (steps < 0).all())

    @property
    def unwrapped(self) -> NDArray[Any]:
        """The positions; longitudes go on beyond the meridian where their count starts anew."""
        if not self.is_longitude:
            return self.values
        return np.unwrap(self.values, period=360)

    @property
    def label(self) -> str:
        """The name and, where there are any, the units."""
        name = self.dimension.name
        if self.variable is None or not self.variable.units:
            return name
        if self.calendar and self.calendar.climatology:
            return f"{name} (climatology)"
        return name if self.calendar else f"{name} ({self.variable.units})"

    @property
    def writer(self) -> Callable[[float], str]:
        """Writes one position for people."""
        if self.calendar is not None:
            return self.calendar.written
        if self.is_longitude:
            return longitude
        if self.is_latitude:
            return latitude
        units = self.variable.units if self.variable else ""
        return lambda value: wording.with_units(wording.number(value), units)

    def written(self, index: int) -> str:
        """The position at an index for people: its name and value."""
        value = self.writer(self.values[index])
        if self.variable is None:
            return f"{self.dimension.name} index {index}"
        return value if self.calendar else f"{self.dimension.name} {value}"

    def extent(self) -> str:
        """From where to where it reaches, for people; "" for a dimension without positions."""
        if self.variable is None or not self.values.size:
            return ""
        first, last = (self.writer(self.values[index]) for index in (0, -1))
        return first if self.values.size == 1 else f"{first} to {last}"


def longitude(value: float) -> str:
    """Degrees east as people write them: 190 is 170°W."""
    turned = (value + 180) % 360 - 180
    side = "" if turned in (0, -180) else "E" if turned > 0 else "W"
    return f"{wording.number(abs(turned))}°{side}"


def latitude(value: float) -> str:
    """Degrees north as people write them."""
    side = "" if value == 0 else "N" if value > 0 else "S"
    return f"{wording.number(abs(value))}°{side}"
