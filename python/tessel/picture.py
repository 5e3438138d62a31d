# python/tessel/picture.py: a variable as a picture: a map, a section or a line.
"""Draws a variable over the axes that its file gives."""

from __future__ import annotations

import math
import os
import textwrap
import warnings
from collections.abc import Iterator, Mapping
from dataclasses import dataclass, replace
from datetime import timedelta
from typing import TYPE_CHECKING

import matplotlib
import numpy as np

import tessel
from tessel import describe, paths, wording
from tessel.aside import written_aside
from tessel.axis import Axis, Calendar, calendars, latitude, longitude
from tessel.dataset import Dataset, Variable

if TYPE_CHECKING:
    import cftime

matplotlib.use("Agg")

# pylint: disable=wrong-import-position
from matplotlib.axes import Axes  # noqa: E402
from matplotlib.axis import Axis as Ruler  # noqa: E402
from matplotlib.figure import Figure  # noqa: E402
from matplotlib.ticker import MaxNLocator  # noqa: E402

_DPI = 120
_WIDTH = 10.0
_MISSING_COLOUR = "0.82"
_MOST_CELLS = 1300  # along one side: about as many as the picture has pixels
_MOST_TICKS = 8
_LARGEST = 1e300  # Matplotlib counts a little beyond what it draws, and doubles end at 1.8e308


class NothingToDraw(Exception):
    """Why a variable makes no picture."""


@dataclass(frozen=True)
class Slice:
    """What of a variable is drawn: the last dimensions that are longer than one, at the position
    that was chosen along the others, or the first one that has values."""

    values: np.ma.MaskedArray
    axes: list[Axis]
    at: list[str]
    """The positions along the dimensions that are not drawn, for the title."""


def draw(dataset: Dataset, variable: Variable, values: np.ma.MaskedArray, path: str,
         chosen: Mapping[str, int] | None = None) -> str:
    """Draws a variable into a file, in the format that its name ends in, and says what the picture
    is; NothingToDraw when there is nothing that a picture would show. `chosen` has positions along
    dimensions, by their names; `values` are what `dataset.values` gives with it."""
    part = _slice(dataset, variable, values, chosen or {})
    figure = Figure(layout="constrained")
    ending = os.path.splitext(path)[1].lstrip(".").lower()
    if ending not in figure.canvas.get_supported_filetypes():
        raise tessel.Error("TESSEL:python:badFormat",
                           "The name of a picture ends in .png, .pdf, .svg or another format that "
                           "Matplotlib has.", path=paths.absolute(path))
    axes = figure.add_subplot()
    axes.tick_params(labelsize=10)
    if len(part.axes) == 1:
        kind = _line(figure, axes, variable, part)
    else:
        kind = _area(figure, axes, variable, part)
    _title(axes, variable, part)
    _footnote(axes, 0, _plain(os.path.basename(dataset.path)))
    with warnings.catch_warnings(), np.errstate(all="ignore"):
        warnings.filterwarnings("ignore", message="Glyph .* missing")
        with written_aside(path, overwrite=True, source=dataset.place) as temporary:
            figure.savefig(temporary, format=ending, dpi=_DPI, bbox_inches="tight", pad_inches=0.15)
    return kind


def _footnote(axes: Axes, side: int, text: str) -> None:
    """A small text below the label of the lower axis: at the left (0) or at the right (1)."""
    axes.annotate(text, (side, 0), (0, -44), xycoords="axes fraction",
                  textcoords="offset points", fontsize=8, color="0.4", va="top",
                  ha="right" if side else "left")


def _plain(text: str) -> str:
    """Text that is drawn as it is, not as a formula."""
    return wording.printable(text).replace("$", r"\$")


def _slice(dataset: Dataset, variable: Variable, values: np.ma.MaskedArray,
           chosen: Mapping[str, int]) -> Slice:
    if not values.size:
        raise NothingToDraw("it has no values")
    first = [chosen.get(dimension.name, 0) for dimension in variable.dimensions]
    usable = np.ma.MaskedArray(values.data, np.ma.getmaskarray(values) | ~np.isfinite(values.data))
    if usable.mask.all():
        raise NothingToDraw("all its values are missing")
    if usable.size == 1:
        raise NothingToDraw("it is a single value")

    axes = [Axis.of(dataset, dimension) for dimension in variable.dimensions]
    drawn = [i for i, length in enumerate(usable.shape) if length > 1][-2:]
    others = [i for i in range(len(axes)) if i not in drawn]
    parts = usable.transpose(others + drawn)
    at = next(index for index in np.ndindex(parts.shape[:len(others)])
              if not parts[index].mask.all())
    if float(np.abs(parts[at]).max()) > _LARGEST:
        raise NothingToDraw(f"it has values beyond {_LARGEST:g}")
    places = [axes[i].written(first[i] + index) for i, index in zip(others, at)
              if axes[i].variable is not None or axes[i].dimension.length > 1]
    return Slice(parts[at], [_drawable(axes[i]) for i in drawn], places)


def _drawable(axis: Axis) -> Axis:
    """The axis with positions that go one way; by index where the file's do not."""
    unwrapped = replace(axis, values=axis.unwrapped)
    if unwrapped.is_monotonic and float(np.abs(unwrapped.values).max()) <= _LARGEST:
        return unwrapped
    return Axis(axis.dimension, np.arange(axis.dimension.length, dtype=float))


def _title(axes: Axes, variable: Variable, part: Slice) -> None:
    name = describe.heading(variable)
    lines = textwrap.wrap(f"{name} ({variable.units})" if variable.units else name, 72)
    axes.set_title("\n".join(map(_plain, lines + textwrap.wrap(", ".join(part.at), 72))),
                   loc="left", fontsize=13, linespacing=1.35)


def _line(figure: Figure, axes: Axes, variable: Variable, part: Slice) -> str:
    axis = part.axes[0]
    figure.set_size_inches(_WIDTH, 5)
    label = _plain(variable.units or variable.name)
    style = {"marker": "." if part.values.size <= 400 else None, "linewidth": 1.4, "color": "C0"}
    with matplotlib.rc_context({"agg.path.chunksize": 10000}):
        if axis.points_down:
            figure.set_size_inches(6, 7)
            axes.plot(part.values, axis.values, **style)
            _mark(axes, axes.yaxis, axis, (axis.values.min(), axis.values.max()))
            axes.invert_yaxis()
            axes.set_xlabel(label, fontsize=11)
        else:
            axes.plot(axis.values, part.values, **style)
            _mark(axes, axes.xaxis, axis, (axis.values.min(), axis.values.max()))
            axes.set_ylabel(label, fontsize=11)
    axes.grid(color="0.9")
    return "line"


def _area(figure: Figure, axes: Axes, variable: Variable, part: Slice) -> str:
    values, (slow, fast) = part.values, part.axes
    if _lies_flat(slow, fast):
        values, slow, fast = values.T, fast, slow
    rows, columns = (math.ceil(length / _MOST_CELLS) for length in values.shape)
    x, y = _edges(fast), _edges(slow)
    mesh = axes.pcolormesh(
        np.append(x[:-1:columns], x[-1]), np.append(y[:-1:rows], y[-1]),
        values[::rows, ::columns], **_colours(values))
    axes.set_facecolor(_MISSING_COLOUR)

    x_range, y_range = (x.min(), x.max()), (y.min(), y.max())
    axes.set_xlim(x_range)
    axes.set_ylim(y_range)
    _mark(axes, axes.xaxis, fast, x_range)
    _mark(axes, axes.yaxis, slow, y_range)
    if slow.points_down:
        axes.invert_yaxis()

    is_map = fast.is_longitude and slow.is_latitude
    height = 5.5
    if is_map:
        stretch = _stretch(x_range, y_range)
        width, tall = x_range[1] - x_range[0], (y_range[1] - y_range[0]) * stretch
        if 1 / 6 < tall / width < 3:
            axes.set_aspect(stretch)
            height = 0.8 * _WIDTH * tall / width + 1.3
    figure.set_size_inches(_WIDTH, min(max(height, 3.0), 10.0))

    bar = figure.colorbar(mesh, cax=axes.inset_axes((1.02, 0, 0.025, 1)),
                          extend=_extend(mesh.norm, values))
    bar.set_label(_plain(variable.units or variable.name), fontsize=11)
    bar.ax.tick_params(labelsize=10)
    if values.mask.any():
        _footnote(axes, 1, "grey: no value")
    return "map" if is_map else "section"


def _lies_flat(slow: Axis, fast: Axis) -> bool:
    """Whether the slow axis runs to the right, and not the fast one: longitude does so always, time
    beside anything else, and heights and depths never."""
    if slow.is_longitude or fast.is_longitude:
        return slow.is_longitude
    return slow.calendar is not None or (fast.is_vertical and not slow.is_vertical)


def _edges(axis: Axis) -> np.ndarray:
    """The borders of the cells around the positions."""
    centres = axis.values
    middles = (centres[:-1] + centres[1:]) / 2
    edges = np.concatenate([[2 * centres[0] - middles[0]], middles,
                            [2 * centres[-1] - middles[-1]]])
    return np.clip(edges, -90, 90) if axis.is_latitude else edges


def _stretch(x_range: tuple[float, float], y_range: tuple[float, float]) -> float:
    """How much longer than a degree of longitude a degree of latitude is drawn: as on the ground
    for a region, equal for a large part of the globe."""
    middle = sum(y_range) / 2
    if x_range[1] - x_range[0] > 120 or abs(middle) > 75:
        return 1.0
    return 1 / math.cos(math.radians(middle))


def _colours(values: np.ma.MaskedArray) -> dict[str, object]:
    """The colours and their limits: nearly all values, so that a few extremes do not flatten the
    rest; around zero for values of both signs."""
    low, high = np.percentile(values.compressed(), [0.5, 99.5])
    if low == high:
        low, high = low - 0.5, high + 0.5
    if low < 0 < high and min(-low, high) > max(-low, high) / 4:
        limit = max(-low, high)
        return {"cmap": "RdBu_r", "vmin": -limit, "vmax": limit}
    return {"cmap": "viridis", "vmin": low, "vmax": high}


def _extend(norm: matplotlib.colors.Normalize, values: np.ma.MaskedArray) -> str:
    """Which ends of the colour bar have values beyond them."""
    below, above = values.min() < norm.vmin, values.max() > norm.vmax
    return {(True, True): "both", (True, False): "min", (False, True): "max"}.get(
        (bool(below), bool(above)), "neither")


def _mark(axes: Axes, ruler: Ruler, axis: Axis, reach: tuple[float, float]) -> None:
    """Labels one side of the picture with what its positions are."""
    ruler.set_label_text(_plain(axis.label), fontsize=11)
    if axis.calendar is not None:
        with calendars():
            ticks = list(_time_ticks(axis.calendar, *reach))
        if len(ticks) >= 2:
            ruler.set_ticks([position for position, _ in ticks], [text for _, text in ticks])
            return
    if axis.is_longitude or axis.is_latitude:
        write = longitude if axis.is_longitude else latitude
        positions = _degree_ticks(*reach)
        ruler.set_ticks(positions, [write(position) for position in positions])
        return
    ruler.set_major_locator(MaxNLocator(_MOST_TICKS, integer=axis.variable is None))
    axes.ticklabel_format(axis=ruler.axis_name, useOffset=False)


def _degree_ticks(low: float, high: float) -> np.ndarray:
    """Round degrees within a reach."""
    steps = [s * 10.0**e for e in (-6, -5, -4, -3, -2, -1, 0) for s in (1, 2, 5)]
    steps += [10, 15, 30, 60, 90]
    step = next((s for s in steps if (high - low) / s <= _MOST_TICKS), 360.0)
    ticks = np.arange(math.ceil(low / step), math.floor(high / step) + 1) * step
    return np.round(ticks, 6)


_MONTH_STEPS = [1, 2, 3, 6, *(12 * n for n in (1, 2, 5, 10, 20, 50, 100, 200, 500, 1000))]
_SHORT_STEPS = [timedelta(minutes=n) for n in (1, 5, 15, 30)] + [
    timedelta(hours=n) for n in (1, 3, 6, 12)] + [timedelta(days=n) for n in (1, 2, 5, 10)]


def _time_ticks(calendar: Calendar, low: float, high: float) -> Iterator[tuple[float, str]]:
    """Positions and labels of round dates within a reach: the starts of years or months where
    enough of them lie in it, days or times of day otherwise."""
    first, last = calendar.date(low), calendar.date(high)
    if first is None or last is None:
        return
    months = 12 * (last.year - first.year) + last.month - first.month
    most = 12 if calendar.climatology else _MOST_TICKS
    if months >= 3:
        step = next((s for s in _MONTH_STEPS if months / s <= most), 12000)
        start = (12 * first.year + first.month - 1) // step * step
        for month in range(start, start + months + 2 * step, step):
            date = first.replace(year=month // 12, month=month % 12 + 1, day=1, hour=0, minute=0,
                                 second=0, microsecond=0)
            name = "%b" if calendar.climatology else "%b %Y"
            yield from _tick(calendar, date, str(date.year) if step % 12 == 0 else
                             date.strftime(name), (low, high))
        return
    step = next((s for s in _SHORT_STEPS if (last - first) / s <= _MOST_TICKS), _SHORT_STEPS[-1])
    date = first.replace(hour=0, minute=0, second=0, microsecond=0)
    while date <= last:
        day = f"{date.day} {date.strftime('%b')}"
        clock = f"{date.hour:02}:{date.minute:02}"
        yield from _tick(calendar, date, day if step >= timedelta(days=1) else f"{day}\n{clock}",
                         (low, high))
        date += step


def _tick(calendar: Calendar, date: cftime.datetime, text: str,
          reach: tuple[float, float]) -> Iterator[tuple[float, str]]:
    position = calendar.value(date)
    if reach[0] <= position <= reach[1]:
        yield position, text
