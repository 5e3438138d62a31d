# bench/expectations.py: what calls and transfers are expected to cost at most, and what they do.
"""The rows of the table in docs/performance.md."""

from __future__ import annotations

from collections.abc import Callable
from statistics import geometric_mean
from typing import NamedTuple

from results import Results

NUMBERS = ("double", "float", "int", "short", "schar", "uchar")
TYPES = (*NUMBERS, "text")
FAMILIES = ("get_var", "get_var1", "get_vara", "get_vars", "get_att",
            "put_var", "put_var1", "put_vara", "put_vars", "put_att")
BLOCKS = tuple(each for each in FAMILIES if not each.endswith("var1"))
INQUIRIES = ("inq_libvers", "inq", "inq_dim", "inq_dimid, inputs at hand", "inq_varid", "inq_var",
             "inq_att", "inq_attid", "inq_attname")


class Limit(NamedTuple):
    """How a time is compared with that of its reference, and what may come out at most."""

    text: str
    value: float
    of: Callable[[float, float], float]
    shown: Callable[[float], str]


def nanoseconds(most: int) -> Limit:
    return Limit(f"{most} ns", most * 1e-9, lambda ours, reference: ours,
                 lambda value: f"{value * 1e9:.0f} ns")


def added(most: int) -> Limit:
    return Limit(f"+ {most} ns", most * 1e-9, lambda ours, reference: ours - reference,
                 lambda value: f"{value * 1e9:+.0f} ns")


def times(most: float) -> Limit:
    return Limit(f"{most:g} times", most, lambda ours, reference: ours / reference,
                 lambda value: f"{value:.3f} times")


def one_of(most: int) -> Limit:
    return Limit(f"1/{most}", 1 / most, lambda ours, reference: ours / reference,
                 lambda value: f"1/{1 / value:.1f}")


class Reason(NamedTuple):
    """Why a row may miss its expectation, and how far: what is beyond that has another reason."""

    text: str
    most: float


class Row(NamedTuple):
    """Something measured, in all of its forms, of which the table shows the one that is furthest
    from its expectation or nearest to it; or, where the module does the same for all of them, what
    they come to together: the geometric mean."""

    what: str
    reference: str
    limit: Limit
    program: str
    forms: tuple[str, ...]
    reason: Reason | None = None

    ours: str = "module"
    theirs: str = "reference"
    together: bool = False


DIRECT = "direct call"
LIKE_MEMORY = "direct call into like memory"

MORE_FUNCTIONS = ("the operation asks the library more than the reference does, and what remains "
                  "against all steps is the call itself; see [One element](#one-element)")
ELSEWHERE = ("the library's function takes longer after other code than in a loop of its own, and "
             "what remains is the call itself; see [One element](#one-element)")
TWICE = ("the library looks the attribute up by its name once for its type and length and once for "
         "its values; see [One element](#one-element)")
STRIDED = MORE_FUNCTIONS + "; the library's strided functions take longer after other code"
NAMED = "the guard looks at the name of the operation, too; see [With the guard](#with-the-guard)"
WATCHED = ("the guard finds the dataset, and whether the variable has records, in what it knows, "
           "before the module sees the call; see [With the guard](#with-the-guard)")
ZEROS = ("the library's bytes go through a buffer, and both the buffer and the characters, which "
         "are twice as large, are zeros before they are anything else; to widen them takes longer "
         "than the quarter by itself; see [Blocks of text](#blocks-of-text)")
UNCOPIED = ("nothing is copied or added on this way, and ratios lie on either side of one; see "
            "[Blocks of numbers](#blocks-of-numbers)")

NOISE = ("both sides leave nearly all of the work to the library, and a difference below 3 % is "
         "noise")
NEW_PAGES = ("both sides leave nearly all of the work to the library and to the system, which "
             "finds new pages for the file: where it is short of them, either side may be the "
             "longer one")

FILLED = ("for each call, the library moves in the file twice and fills its buffer of 8 KiB, which "
          "takes longer than the rest and is more than a twentieth of the other side's time by "
          "itself; see [From Python](measurements.md#from-python)")

REASONS = {
    **{f"{each}, one element": Reason(MORE_FUNCTIONS, 140e-9) for each in FAMILIES},
    "put_att, one element": Reason(ELSEWHERE, 170e-9),
    "get_vars, one element": Reason(STRIDED, 330e-9),
    "put_vars, one element": Reason(STRIDED, 330e-9),
    "get_att, one element": Reason(TWICE, 420e-9),
    "get_var1_double, guarded": Reason(NAMED, 160e-9),
    "put_var1_double, guarded": Reason(WATCHED, 180e-9),
    **{f"Python: {each}, anywhere in the file, {form}": Reason(FILLED, 1 / 9)
       for each in ("one element", "ten elements") for form in ("call", "method")},
    "Python: whole read": Reason(NOISE, 1.03),
    "Python: whole write, to a new file": Reason(NEW_PAGES, 1.15),
    **{f"{each}, text of 64 MiB": Reason(ZEROS, 2.3) for each in ("get_var", "get_vara")},
    "get_att, text of 64 MiB": Reason(ZEROS, 3.2),
    **{f"{each}, text of 64 MiB": Reason(ZEROS, 1.45)
       for each in ("put_var", "put_vara", "put_att")},
    **{f"{each}, numbers of 64 MiB": Reason(UNCOPIED, 1.03) for each in BLOCKS},
    "get_var_double of 256 MiB": Reason(UNCOPIED, 1.03),
}


def of_family(family: str, size: str, types: tuple[str, ...], limit: Limit,
              reference: str = DIRECT) -> Row:
    kind = "one element" if size == "one" else \
        "text of 64 MiB" if types == ("text",) else "numbers of 64 MiB"
    what = f"{family}, {kind}"
    return Row(what, reference, limit, "bench_families",
               tuple(f"{family}_{each}/{size}" for each in types), REASONS.get(what),
               together=kind == "numbers of 64 MiB")


def from_python(what: str, limit: Limit) -> Row:
    return Row(f"Python: {what}", "netCDF4-python", limit, "python_front.py", (what,),
               REASONS.get(f"Python: {what}"), "tessel", "netcdf4")


ROWS = (
    Row("lookup of any name", "", nanoseconds(30), "bench_lookup",
        ("lookup, in lower case", "lookup, in capitals")),
    *(of_family(each, "one", TYPES, added(120)) for each in FAMILIES),
    *(Row(each.split(",")[0], DIRECT, added(150), "bench_calls", (each,))
      for each in INQUIRIES),
    *(Row(what, DIRECT, added(most), "bench_calls", (what,), REASONS.get(what))
      for what, most in (("inq_varid, guarded", 150), ("get_var1_double, guarded", 120),
                         ("put_var1_double, guarded", 120))),
    Row("get_var_double of 256 MiB", LIKE_MEMORY, times(1.01), "bench_calls",
        ("get_var_double of 256 MiB",), REASONS["get_var_double of 256 MiB"]),
    *(of_family(each, "64MiB", NUMBERS, times(1.01), LIKE_MEMORY) for each in BLOCKS),
    *(of_family(each, "64MiB", ("text",), times(1.25)) for each in BLOCKS),
    from_python("one element, one after the other, call", one_of(30)),
    from_python("one element, one after the other, method", one_of(20)),
    from_python("ten elements, one after the other, call", one_of(30)),
    from_python("ten elements, one after the other, method", one_of(20)),
    *(from_python(f"{each}, anywhere in the file, {form}", one_of(most))
      for each in ("one element", "ten elements")
      for form, most in (("call", 30), ("method", 20))),
    from_python("whole read", times(1)),
    from_python("whole write, to a new file", times(1)),
)


class Outcome(NamedTuple):
    """What was measured of a row: in one form, or in all of them together."""

    row: Row
    form: str
    reference: float
    ours: float
    values: tuple[float, ...] = ()
    """Those of all forms, where they count together."""

    @property
    def value(self) -> float:
        return self.row.limit.of(self.ours, self.reference)

    @property
    def met(self) -> bool:
        return self.value <= self.row.limit.value

    @property
    def explained(self) -> bool:
        return self.row.reason is not None and self.value <= self.row.reason.most


def of_each_form(row: Row, results: Results) -> list[Outcome]:
    found = []
    for form in row.forms:
        sides = results.of(row.program, form)
        found.append(Outcome(row, form, sides[row.theirs], sides[row.ours]))
    return found


def furthest(row: Row, results: Results) -> Outcome:
    """The form that is furthest from its expectation."""
    return max(of_each_form(row, results), key=lambda each: each.value)


def outcome(row: Row, results: Results) -> Outcome:
    if not row.together:
        return furthest(row, results)
    found = of_each_form(row, results)
    return Outcome(row, "", geometric_mean([each.reference for each in found]),
                   geometric_mean([each.ours for each in found]),
                   tuple(each.value for each in found))


def outcomes(results: Results) -> list[Outcome]:
    return [outcome(row, results) for row in ROWS]


def missed_without_reason(results: Results) -> list[str]:
    return [each.row.what for each in outcomes(results) if not (each.met or each.explained)]


def shown(seconds: float) -> str:
    """A time with its unit."""
    scale, unit = next((scale, unit) for scale, unit, least in
                       ((1, "s", 1), (1e3, "ms", 1e-3), (1e6, "µs", 1e-6), (1e9, "ns", 0))
                       if seconds >= least)
    return f"{seconds * scale:.3g} {unit}"


def table(results: Results) -> str:
    """The table, and the reasons for what is missed."""
    lines = ["| what | reference | at most | its time | ours | measured | |",
             "|---|---|---:|---:|---:|---:|---|"]
    reasons = []
    for each in outcomes(results):
        row = each.row
        form = f" ({each.form.split('/')[0]})" if len(row.forms) > 1 and each.form else ""
        measured = row.limit.shown(each.value)
        if row.together:
            measured += f" ({min(each.values):.3f} to {max(each.values):.3f})"
        lines.append(f"| {row.what}{form} | {row.reference or '–'} | {row.limit.text} | "
                     f"{shown(each.reference) if row.reference else '–'} | {shown(each.ours)} | "
                     f"{measured} | {'met' if each.met else '**missed**'} |")
        if not each.met:
            reasons.append(f"- **{row.what}**: " + (row.reason.text if each.explained
                                                    else "not explained yet"))
    if reasons:
        lines += ["", "Missed:", "", *reasons]
    return "\n".join(lines)
