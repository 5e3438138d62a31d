# bench/chart.py: the chart in docs/performance.md.
"""Draws what was measured beside what is expected."""

from __future__ import annotations

from collections.abc import Sequence
from pathlib import Path

import matplotlib

matplotlib.use("svg")

from expectations import Outcome, outcomes  # noqa: E402 (the drawing comes after its choice)
from matplotlib import pyplot  # noqa: E402
from matplotlib.axes import Axes  # noqa: E402
from results import Results  # noqa: E402

LIBRARY, MODULE, LIMIT = "#9aa5b1", "#2f6fb0", "#c2410c"
INK, GRID = "#111827", "#e5e7eb"

STYLE = {
    "font.size": 9, "axes.edgecolor": GRID, "axes.labelcolor": INK, "text.color": INK,
    "xtick.color": INK, "ytick.color": INK, "grid.color": GRID,
    "axes.axisbelow": True, "svg.hashsalt": "performance", "svg.fonttype": "none",
    "font.family": "DejaVu Sans",
}


def rows_of(axes: Axes, title: str, unit: str, labels: Sequence[str]) -> None:
    """What all panels have: rows from above, a title and the unit."""
    axes.set_title(title, loc="left", fontsize=10, fontweight="bold")
    axes.set_yticks(range(len(labels)), labels)
    axes.invert_yaxis()
    axes.set_xlabel(unit)
    axes.grid(axis="x")
    axes.tick_params(length=0)


def limits(axes: Axes, values: Sequence[float], which: str = "at most") -> None:
    """A mark on each row, at what is expected."""
    axes.scatter(values, range(len(values)), marker="|", s=170, linewidths=2, color=LIMIT,
                 label=f"expected {which}", zorder=3)


def calls(axes: Axes, rows: Sequence[Outcome]) -> None:
    """Calls: the library's time, what comes on top of it, and what may."""
    places = range(len(rows))
    library = [each.reference * 1e9 if each.row.reference else 0 for each in rows]
    axes.barh(places, library, color=LIBRARY, label="the library's function alone")
    axes.barh(places, [each.ours * 1e9 - below for each, below in zip(rows, library)],
              left=library, color=MODULE, label="added by the module and the host")
    limits(axes, [below + each.row.limit.value * 1e9 for each, below in zip(rows, library)])
    rows_of(axes, "A call", "nanoseconds",
            [each.row.what.removesuffix(", one element") for each in rows])
    axes.legend(loc="lower right", framealpha=1)


def blocks(axes: Axes, rows: Sequence[Outcome]) -> None:
    """Large transfers: how many times the library's time."""
    axes.barh(range(len(rows)), [each.value for each in rows], color=MODULE,
              label="through the module")
    axes.axvline(1, color=LIBRARY, linewidth=2, label="the library's function alone")
    limits(axes, [each.row.limit.value for each in rows])
    rows_of(axes, "Large transfers", "times the library's time", [each.row.what for each in rows])
    axes.legend(loc="lower right", framealpha=1)


def python(axes: Axes, rows: Sequence[Outcome]) -> None:
    """From Python: how many times faster than the other package."""
    axes.barh(range(len(rows)), [1 / each.value for each in rows], color=MODULE, label="Tessel")
    axes.axvline(1, color=LIBRARY, linewidth=2, label="netCDF4-python")
    limits(axes, [1 / each.row.limit.value for each in rows], "at least")
    axes.set_xscale("log")
    axes.set_xticks([1, 3, 10, 30], ["1", "3", "10", "30"])
    axes.minorticks_off()
    rows_of(axes, "From Python", "times faster than netCDF4-python",
            [each.row.what.removeprefix("Python: ") for each in rows])
    axes.legend(loc="lower right", framealpha=1)


def draw(results: Results, file: Path) -> None:
    """Draws all rows of the table, those of a kind in one panel."""
    all_rows = outcomes(results)
    from_python = [each for each in all_rows if each.row.program == "python_front.py"]
    others = [each for each in all_rows if each not in from_python]
    panels = (
        (calls, [each for each in others if "ns" in each.row.limit.text]),
        (blocks, [each for each in others if "times" in each.row.limit.text]),
        (python, from_python),
    )
    with pyplot.rc_context(STYLE):
        figure, axes = pyplot.subplots(
            len(panels), figsize=(9, 2.5 + 0.25 * len(all_rows)), layout="constrained",
            gridspec_kw={"height_ratios": [len(rows) + 1.5 for _, rows in panels]})
        for (panel, rows), place in zip(panels, axes):
            panel(place, rows)
        figure.savefig(file, metadata={"Date": None})
        pyplot.close(figure)
