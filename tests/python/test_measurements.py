# tests/python/test_measurements.py: what the measuring programs make of what they measured.
"""Invented numbers, and what has to come of them: what is missed, what grows, and what a reason may
account for. The programs in bench/ are tried out by python.bench."""

from __future__ import annotations

import json
import sys
from pathlib import Path

import pytest

sys.path.insert(0, str(Path(__file__).parents[2] / "bench"))

import expectations  # noqa: E402
import growth  # noqa: E402
import profiles  # noqa: E402
from results import Results  # noqa: E402


def runs(name: str, reference: float, module: float) -> list[dict]:
    """Two sides of a row in the form of Google Benchmark, in nanoseconds."""
    return [{"run_name": f"{name}/{side}/iterations:7/real_time", "aggregate_name": statistic,
             "cpu_time": time, "time_unit": "ns"}
            for side, time in (("reference", reference), ("module", module))
            for statistic in ("median", "shortest")]


def saved(folder: Path, rows: list[dict]) -> Path:
    file = folder / "numbers.json"
    file.write_text(json.dumps({"benchmarks": rows}))
    return file


@pytest.mark.parametrize(("ratios", "grows"), [
    ([1.0, 1.0, 1.0], False),
    ([5.0, 2.0, 1.0], False),  # what is the call itself at first
    ([1.0, 1.2, 1.45], False),  # noise
    ([1.0, 1.2, 1.6], True),
    ([1.0, 4.0, 1.0], True),  # whatever comes after it
    ([5.0, 1.0, 2.0], True),  # below the first one, which is the call itself
    ([5.0, 4.0, 5.5], False),
    ([2.0, 0.4, 1.1], False),  # what is less than the work was disturbed
    ([2.0, 0.4, 1.6], True),
    ([0.4, 1.1], False),
])
def test_growth(tmp_path: Path, ratios: list[float], grows: bool) -> None:
    rows = [run for count, ratio in enumerate(ratios)
            for run in runs(f"get, elements: {10 ** count}", 100, 100 * ratio)]
    series, = growth.all_series(saved(tmp_path, rows))
    assert (series.what, series.counted, series.grows) == ("get", "elements", grows)
    assert ("**yes**" in growth.table([series])) == grows


ROW = expectations.Row("a call", expectations.DIRECT, expectations.added(120), "program",
                       ("call_double", "call_text"), expectations.Reason("it is long", 150e-9))


@pytest.mark.parametrize(("double", "text", "form", "met", "explained"), [
    (210, 219, "call_text", True, True),
    (219, 210, "call_double", True, True),
    (210, 221, "call_text", False, True),  # one of its forms is enough
    (210, 251, "call_text", False, False),  # beyond what its reason accounts for
])
def test_outcome(tmp_path: Path, monkeypatch: pytest.MonkeyPatch, double: float, text: float,
                 form: str, met: bool, explained: bool) -> None:
    monkeypatch.setattr(expectations, "ROWS", (ROW,))
    results = Results({"program": saved(tmp_path, [*runs("call_double", 100, double),
                                                   *runs("call_text", 100, text)])})
    outcome, = expectations.outcomes(results)
    assert (outcome.form, outcome.met, outcome.explained) == (form, met, explained)
    assert expectations.missed_without_reason(results) == ([] if met or explained else ["a call"])
    table = expectations.table(results)
    assert ("**missed**" in table) == (not met)
    assert ("it is long" in table) == (not met and explained)
    assert ("not explained yet" in table) == (not met and not explained)


@pytest.mark.parametrize(("double", "text", "shown", "met"), [
    (102.0, 99.0, "1.005 times (0.990 to 1.020)", True),
    (104.0, 99.0, "1.015 times (0.990 to 1.040)", False),  # few of them are not enough
])
def test_outcome_of_all_together(tmp_path: Path, monkeypatch: pytest.MonkeyPatch, double: float,
                                 text: float, shown: str, met: bool) -> None:
    row = ROW._replace(limit=expectations.times(1.01), together=True, reason=None)
    monkeypatch.setattr(expectations, "ROWS", (row,))
    results = Results({"program": saved(tmp_path, [*runs("call_double", 100, double),
                                                   *runs("call_text", 100, text)])})
    outcome, = expectations.outcomes(results)
    assert (outcome.form, outcome.met) == ("", met)
    assert expectations.furthest(row, results).form == "call_double"
    assert f"| a call | {expectations.DIRECT} | 1.01 times | 100 ns |" in (
        table := expectations.table(results))
    assert f"| {shown} | {'met' if met else '**missed**'} |" in table


def test_which_count_together() -> None:
    """Blocks of numbers, whose ways are the same."""
    assert {each.what for each in expectations.ROWS if each.together} == \
        {f"{family}, numbers of 64 MiB" for family in expectations.BLOCKS}


@pytest.mark.parametrize(("row", "most"), [
    ("lookup of any name", "30 ns"),
    ("get_vars, one element", "+ 120 ns"),
    ("put_att, one element", "+ 120 ns"),
    ("inq_att", "+ 150 ns"),
    ("get_var, numbers of 64 MiB", "1.01 times"),
    ("put_att, text of 64 MiB", "1.25 times"),
    ("Python: one element, anywhere in the file, call", "1/30"),
    ("Python: ten elements, one after the other, method", "1/20"),
    ("Python: whole write, to a new file", "1 times"),
])
def test_what_is_expected(row: str, most: str) -> None:
    """None of it may be softened."""
    found, = (each for each in expectations.ROWS if each.what == row)
    assert found.limit.text == most


def test_profile() -> None:
    found = profiles.parsed(" 60.00% |libnetcdf.so.19 |[.] NC3_get_vara\n"
                            " 25.00% |netcdf.tsx |[.] tessel::netcdf::widen\n"
                            " 15.00% |[kernel.kallsyms] |[k] copy\n")
    assert {owner: share for owner, share in found.owners.items() if share} == \
        {"netCDF library": 0.6, "module": 0.25, "kernel": 0.15}
    assert list(found.functions) == ["NC3_get_vara", "tessel::netcdf::widen", "copy"]
    with pytest.raises(SystemExit, match="no profile"):
        profiles.parsed("nothing was seen")
