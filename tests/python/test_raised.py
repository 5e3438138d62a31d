"""tests/python/test_raised.py: what is raised stands on the page of the operation that raises it.

Every operation is called with odd values for each of its arguments, those that read on variables
that no array can hold, and every one with what the guard refuses in any.
"""

import re
import struct
import typing
from pathlib import Path

import numpy
import pytest
import tessel
import tessel.sample
from tessel import catalogue, operations, reference
from tessel.operation import Operation
from tessel.operations import OPERATIONS
from test_methods import call_of

nc = tessel.load("netcdf")
each_operation = pytest.mark.parametrize("operation", OPERATIONS, ids=lambda each: each.short)


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


def on_page(operation: Operation) -> re.Pattern[str]:
    """What matches the identifiers on a page, with any word for a status."""
    page = reference.page_of(operation)
    ends = [(page.raised, ""), *((errors, end) for _, _, errors, end in page.others)]
    return re.compile("|".join(each.identifier + end.replace("<word>", r"\w+")
                               for errors, end in ends for each in errors))


def error_of(operation: Operation, *given: object) -> str:
    """The identifier of what the operation's method raises; "" if it succeeds."""
    try:
        result = getattr(nc, operation.short)(*given)
    except tessel.Error as error:
        return error.identifier
    if operation.opens:
        nc.abort(result[-1] if operation.several else result)
    return ""


deep: list = []
for _ in range(300):
    deep = [deep, "a"]

VALUES = [
    None, [], {}, "", "x", "a\0b", "\udc80", b"\xff", object(), True, -1, 0, 3.5, 2**70 + 1,
    2**64 - 1, float("nan"), float("inf"), 1e300, numpy.float32(1), numpy.float16(1),
    numpy.datetime64(0, "s"),
    numpy.array([]), numpy.array(["abc"]), numpy.array(["\U0001F600"]), numpy.array([1], "int32"),
    numpy.ma.array([1, 2]), numpy.zeros(3, object), [1, [2]], [object()], ["a", "b"],
    [2**53 + 1], [1, 2**40], [2**40, 2**40], deep, {1: 2},
    numpy.array([{"a": 1}, {"b": 1}]), {"\udc80": 1}, tessel.Unknown((-1,)), tessel.Function("f"),
]



def test_odd_values() -> None:
    """The members of a family for one class of numbers and for text stand for the others."""
    raised: set[str] = set()
    unknown = []
    for operation in OPERATIONS:
        if operation.short.endswith(("_float", "_int", "_short", "_schar", "_uchar")):
            continue
        expected = on_page(operation)
        for i, argument in enumerate(operation.arguments):
            ncid = tessel.sample.dataset(nc)
            given = call_of(operation, ncid)
            for value in VALUES:
                identifier = error_of(operation, *given[:i], value, *given[i + 1:])
                raised.add(identifier)
                if identifier and not expected.fullmatch(identifier):
                    unknown.append((operation.short, argument.name, identifier, repr(value)))
            nc.abort(ncid)
    assert not unknown
    # Otherwise the values above would not be odd enough.
    assert set(catalogue.GIVEN) - raised == set()
    assert {"TESSEL:host:outOfMemory", "TESSEL:host:dimensionsTooLarge"} <= raised


MUCH = 2**31 - 5
NO_ARRAYS: list[tuple[list[int], str, str]] = [
    ([1] * 40, "get_var_double", "TESSEL:python:tooManyDimensions"),
    ([1] * 40, "get_vara_double", "TESSEL:python:tooManyDimensions"),
    ([1] * 40, "get_vars_double", "TESSEL:python:tooManyDimensions"),
    ([MUCH, MUCH, 0], "get_var_double", "TESSEL:python:shapeTooLarge"),
    ([MUCH, MUCH, 0], "get_vara_double", "TESSEL:python:shapeTooLarge"),
    ([MUCH, MUCH, 0], "get_vars_double", "TESSEL:python:shapeTooLarge"),
    ([MUCH] * 3, "get_var_double", "TESSEL:host:dimensionsTooLarge"),
    ([MUCH] * 2, "get_var_schar", "TESSEL:host:outOfMemory"),
]


@pytest.mark.parametrize("lengths, short, identifier", NO_ARRAYS)
def test_variables_that_no_array_holds(lengths: list[int], short: str, identifier: str) -> None:
    plain = tessel.load("netcdf", "off")  # one of them lies where no file reaches
    ncid = plain.create("odd.nc", nc.param("64BIT_OFFSET"))
    dimids = [plain.def_dim(ncid, f"d{i}", length) for i, length in enumerate(lengths)]
    varid = plain.def_var(ncid, "odd", nc.param("BYTE"), dimids)
    plain.set_fill(ncid, nc.param("NOFILL"))
    plain.enddef(ncid)
    operation = operations.find(short)
    assert operation is not None and on_page(operation).fullmatch(identifier)
    block = {"start": [0] * len(lengths), "count": lengths, "stride": [1] * len(lengths)}
    given = [block[each.name] for each in operation.arguments[2:]]
    assert error_of(operation, ncid, varid, *given) == identifier
    plain.abort(ncid)


# What the guard refuses.


def header(external_type: int) -> bytes:
    """A file with one variable, which is of that type."""
    return (b"CDF\1" + struct.pack(">4I", 0, 10, 1, 1) + b"x\0\0\0"
            + struct.pack(">6I", 4, 0, 0, 11, 1, 1) + b"v\0\0\0"
            + struct.pack(">7I", 1, 0, 0, 0, external_type, 4, 100) + bytes(16))


def overwritten() -> int:
    """A dataset that is open for reading, whose header would now be refused."""
    Path("overwritten.nc").write_bytes(header(4))
    ncid = nc.open("overwritten.nc", "NOWRITE")
    Path("overwritten.nc").write_bytes(header(12))
    return ncid


def lost() -> int:
    """A dataset whose end failed within the library, because the guard did not know it."""
    plain = tessel.load("netcdf", "off")
    ncid = plain.create("lost.nc", "CLOBBER")
    plain.def_var(ncid, "v", plain.param("INT"), [plain.def_dim(ncid, "x", 3)])
    plain.put_att_double(ncid, 0, "_FillValue", plain.param("INT"), [1, 2])
    with pytest.raises(ValueError, match="Not a valid data type"):
        nc.close(ncid)
    return ncid


def defining() -> int:
    """The sample, in define mode."""
    ncid = tessel.sample.dataset(nc)
    nc.redef(ncid)
    return ncid


def enormous() -> int:
    """A dataset of 64-bit data with a dimension that the library takes for a negative number."""
    ncid = nc.create("enormous.nc", 32)
    nc.def_dim(ncid, "x", 2.0**63)
    return ncid


def claiming(records: int) -> int:
    """A dataset that is open for writing, of so many records of eight bytes that are not there."""
    Path("claiming.nc").write_bytes(
        b"CDF\1" + struct.pack(">4I", records, 10, 1, 1) + b"t\0\0\0"
        + struct.pack(">6I", 0, 0, 0, 11, 1, 1) + b"v\0\0\0"
        + struct.pack(">7I", 1, 0, 0, 0, nc.param("DOUBLE"), 8, 80))
    return nc.open("claiming.nc", "WRITE")


def lacking() -> int:
    """One of which much is to be written when it is redefined."""
    return claiming(2**30)


def lacking_more() -> int:
    """One of which much is to be written, now that its records become longer."""
    ncid = claiming(1000)
    nc.redef(ncid)
    nc.def_var(ncid, "w", nc.param("DOUBLE"), [nc.def_dim(ncid, "x", 2**20), 0])
    return ncid


MAPPED = 16
"""The library's mode flag for files in mapped memory."""


def distant(flags: int = 0) -> int:
    """A dataset of 64-bit data with records of which no file holds as many as may be asked for."""
    ncid = nc.create("distant.nc", 32 + flags)
    t = nc.def_dim(ncid, "t", 0)
    nc.def_var(ncid, "v", nc.param("BYTE"), [nc.def_dim(ncid, "x", 2.0**31), t])
    nc.def_var(ncid, "text", nc.param("CHAR"), [1, t])
    nc.set_fill(ncid, nc.param("NOFILL"))
    nc.enddef(ncid)
    return ncid


def endless(flags: int = 0, length: float = 2.0**31) -> int:
    """A dataset whose variables, which are being defined, end where no file reaches."""
    ncid = nc.create("endless.nc", 32 + flags)
    dimids = [nc.def_dim(ncid, f"d{i}", length) for i in range(2)]
    for name in ("v", "w"):
        nc.def_var(ncid, name, nc.param("BYTE"), dimids)
    return ncid


def plain() -> int:
    """One that nothing is wrong with."""
    ncid = nc.create("plain.nc", "CLOBBER")
    nc.enddef(ncid)
    return ncid


def distant_in_memory() -> int:
    """One whose records no memory holds."""
    return distant(MAPPED)


def endless_in_memory() -> int:
    """One whose variables no memory holds, though a file would."""
    return endless(MAPPED, 2.0**26)


def many() -> int:
    """A dataset of more records than the library moves."""
    ncid = nc.create("many.nc", 0)
    nc.def_var(ncid, "v", nc.param("BYTE"), nc.def_dim(ncid, "t", 0))
    nc.set_fill(ncid, nc.param("NOFILL"))
    nc.enddef(ncid)
    nc.put_var1_schar(ncid, 0, 2**31, numpy.int8(1))
    return ncid


# What the guard refuses, as what arguments are instead, by their names.
REFUSED: list[tuple[str, dict[str, typing.Any]]] = [
    ("remote", {"path": "https://127.0.0.1:1/a.nc"}),
    ("mode", {"mode": 32768, "path": "none.nc"}),
    ("mode", {"cmode": 64}),
    ("mapping", {"path": "plain.nc", "mode": MAPPED + 1, "cmode": MAPPED + 0x4000, "ncid": plain}),
    ("mapping", {"ncid": endless_in_memory}),
    ("mapping", {"ncid": distant_in_memory, "varid": 0, "index": [0, 2.0**20],
                 "start": [0, 2.0**20], "count": [1, 1], "stride": [1, 1]}),
    ("header", {"path": "overwritten.nc", "mode": "NOWRITE", "ncid": overwritten}),
    ("header", {"ncid": lacking}),
    ("header", {"ncid": lacking_more}),
    ("position", {"ncid": endless}),
    ("position", {"ncid": distant, "varid": 0, "index": [0, 2.0**33], "start": [0, 2.0**33],
                  "count": [1, 1], "stride": [1, 1]}),
    ("redefinition", {"ncid": many}),
    ("alignment", {"ncid": defining, "v_align": 0, "r_align": 0}),
    ("name", {"ncid": defining, "ncid_out": defining,
              "name": "\u0344" * 128, "newname": "\u0344" * 128}),
    ("lengths", {"ncid": enormous, "dimids": 0}),
    ("counts", {"start": [1, 0], "count": [-1, -1], "stride": [2, 1], "index": [1, 0]}),
    ("records", {"varid": 6, "index": [2**40],
                 "start": [2**40], "count": [1], "stride": [1]}),
    ("closed", {"ncid": lost, "ncid_in": lost, "ncid_out": lost}),
]


WRITTEN = ("counts", "mapping", "position", "records")
"""The words of writes, which are of one element."""


def test_every_refusal_is_tried() -> None:
    assert {f"TESSEL:guard:{word}" for word, _ in REFUSED} == set(catalogue.GUARD)


@pytest.mark.parametrize("word", dict(REFUSED))
def test_refused_are_those_whose_page_says_so(word: str) -> None:
    """Behind the guard, every operation is called with what is refused in any of them."""
    identifier = f"TESSEL:guard:{word}"
    say = {each.short for each in OPERATIONS
           if identifier in {refused.identifier for refused in reference.page_of(each).refused}}
    refused = set()
    for instead in (instead for of, instead in REFUSED if of == word):
        once = lost() if instead.get("ncid") is lost else None
        for operation in OPERATIONS:
            made = [tessel.sample.dataset(nc)]
            given = list(call_of(operation, made[0]))
            for i, argument in enumerate(operation.arguments):
                if argument.name in instead:
                    value = instead[argument.name]
                    if callable(value):
                        value = once or value()
                        made += [] if once else [value]
                    given[i] = value
                elif argument.name == "data" and word in WRITTEN:
                    given[i] = given[i][:1]
            if error_of(operation, *given) == identifier:
                refused.add(operation.short)
            for ncid in made:
                error_of(operations.BY_NAME["abort"], ncid)
    assert refused == say and say


@each_operation
def test_docstring_has_what_the_page_has(operation: Operation) -> None:
    """The same identifiers; the page has the messages besides."""
    def identifiers(text: str, begin: str) -> list[str]:
        section = text.partition(f"\n{begin}\n")[2].partition("\nExample")[0]
        return re.findall(r"^    (TESSEL:[\w:]+?(?:<word>)?)(?= \(|: |$)|^(TESSEL:\S+)", section,
                          re.M)
    page = ["".join(each) for each in identifiers(reference.text_of(operation), "Errors")]
    said = ["".join(each) for each in identifiers(getattr(nc, operation.short).__doc__, "Raises")]
    assert len(said) > 0 and said == page
