"""tests/python/test_methods.py: the method of every operation, beside its call form."""

import copy
import doctest
import inspect
import itertools
import os
import re
import subprocess
import sys
import typing
from pathlib import Path

import numpy
import pytest
import tessel
import tessel.sample
from tessel import arguments, netcdf, operations
from tessel.families import MEMBERS
from tessel.operations import OPERATIONS

nc = tessel.load("netcdf")
LISTING = Path(__file__).parents[1] / "structure" / "operations.txt"
NAMES = [(each, name) for each in OPERATIONS for name in each.names]
each_operation = pytest.mark.parametrize("operation", OPERATIONS, ids=lambda each: each.short)
each_name = pytest.mark.parametrize("operation, name", NAMES, ids=[name for _, name in NAMES])


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


@pytest.fixture
def ncid() -> typing.Iterator[int]:
    """The sample, in memory."""
    made = tessel.sample.dataset(nc)
    yield made
    try:
        nc.close(made)
    except tessel.Error:  # the test has closed it
        pass


def test_table_is_the_modules() -> None:
    """The same operations in the same order under the same names as in the module's own table."""
    listed = [tuple(line.split()[1:]) for line in LISTING.read_text().splitlines()]
    assert [(each.long, each.short) for each in OPERATIONS] == listed


@each_name
def test_is_a_function_with_the_tables_signature(operation: operations.Operation,
                                                 name: str) -> None:
    method = getattr(tessel.Netcdf, name)
    assert inspect.isfunction(method)
    assert method.__name__ == name
    assert method.__qualname__ == method.__code__.co_qualname == f"Netcdf.{name}"
    assert method.__module__ == "tessel.netcdf"
    signature = inspect.signature(method)
    assert list(signature.parameters) == ["self", *(each.name for each in operation.arguments)]
    for argument in operation.arguments:
        assert signature.parameters[argument.name].annotation == argument.kind.annotation
        assert signature.parameters[argument.name].default is inspect.Parameter.empty
    assert signature.return_annotation == operation.returns
    typing.get_type_hints(method)  # every name in the annotations is known
    assert name in dir(nc)


@each_operation
def test_docstring_tells_all(operation: operations.Operation) -> None:
    text = getattr(nc, operation.short).__doc__
    assert text.startswith(operation.purpose) and operation.purpose.endswith(".")
    assert text == getattr(nc, operation.long).__doc__
    for argument in operation.arguments:
        assert f"\n{argument.name} : {argument.kind.wording}\n" in text
        assert argument.meaning.endswith(".") and argument.meaning[0].isupper()
    for result in operation.results:
        assert f"\n{result.name} : {result.kind.wording}\n" in text
        assert result.meaning.endswith(".") and result.meaning[0].isupper()
    for identifier, cause in operation.all_errors:
        assert identifier in text and " ".join(cause.split()) in " ".join(text.split())
        assert re.fullmatch(r"TESSEL(:\w+)+", identifier)
    assert max(map(len, text.splitlines())) <= 92


@each_name
def test_example(operation: operations.Operation, name: str) -> None:
    """The example of every docstring runs and gives what it says."""
    found = doctest.DocTestFinder(recurse=False).find(getattr(tessel.Netcdf, name), name, globs={})
    assert len(found) == 1 and len(found[0].examples) > 3
    text: list[str] = []
    results = doctest.DocTestRunner(optionflags=doctest.FAIL_FAST).run(found[0], out=text.append)
    assert results.failed == 0, "".join(text)
    assert any(re.search(rf"nc\.{re.escape(operation.short)}\(", example.source)
               for example in found[0].examples)


def prototypes() -> dict[str, list[tuple[str, str]]]:
    """The parameters (type, name) of the library's functions, from its header."""
    header = Path("/usr/include/netcdf.h").read_text()
    header = re.sub(r"/\*.*?\*/", "", header, flags=re.DOTALL)
    found = {}
    for name, inside in re.findall(r"\b(nc_\w+)\s*\(([^()]*)\)\s*;", header):
        pairs = (re.fullmatch(r"(.*?)(\w+)", each.strip(), re.DOTALL)
                 for each in inside.split(",") if each.strip() not in ("", "void", "..."))
        found[name] = [(pair[1].strip(), pair[2]) for pair in pairs if pair]
    return found


def test_parameters_have_the_librarys_names() -> None:
    """Those that go in, without the p of a pointer; op is called data, and lengths that an array
    knows itself are left out."""
    known = prototypes()
    compared = 0
    for operation in OPERATIONS:
        long = "nc_enddef" if operation.short == "end_def" else operation.long
        if long not in known:
            assert operation.short in ("param", "get_constant_names")
            continue
        put_att = operation.short.startswith("put_att")
        given = []
        for kind, name in known[long]:
            is_pointer = kind.endswith("*")
            goes_in = not is_pointer or "const" in kind or name == "chunksizehintp"
            if not goes_in or (put_att and name == "len") or name == "ndims":
                continue
            name = "data" if name == "op" else name
            given.append(name[:-1] if is_pointer and name.endswith("p") else name)
        assert [each.name for each in operation.arguments] == given, operation.short
        compared += 1
    assert compared == len(OPERATIONS) - 2


# The arguments of a call of each operation on the sample, for the families by their beginning.
CALLS: dict[str, typing.Callable[..., tuple]] = {
    "abort": lambda ncid: (ncid,),
    "close": lambda ncid: (ncid,),
    "copy_att": lambda ncid: (ncid, -1, "title", ncid, 6),
    "_create": lambda ncid: ("new.nc", "CLOBBER", 1024, 0),
    "create": lambda ncid: ("new.nc", "CLOBBER"),
    "def_dim": lambda ncid: (ncid, "depth", 4),
    "def_var": lambda ncid: (ncid, "depth", 5, [1.0, 2.0]),
    "del_att": lambda ncid: (ncid, -1, "title"),
    "_enddef": lambda ncid: (ncid, 0, 4, 0, 4),
    "end_def": lambda ncid: (ncid,),
    "enddef": lambda ncid: (ncid,),
    "get_constant_names": lambda ncid: (),
    "inq": lambda ncid: (ncid,),
    "inq_att": lambda ncid: (ncid, -1, "title"),
    "inq_attid": lambda ncid: (ncid, 5, "range"),
    "inq_attname": lambda ncid: (ncid, 5, 0),
    "inq_dim": lambda ncid: (ncid, 2),
    "inq_dimid": lambda ncid: (ncid, "time"),
    "inq_libvers": lambda ncid: (),
    "inq_varid": lambda ncid: (ncid, "series"),
    "inq_var": lambda ncid: (ncid, 3),
    "param": lambda ncid: ("nc_fill_short",),
    "_open": lambda ncid: ("file.nc", "WRITE", 4096),
    "open": lambda ncid: ("file.nc", 0),
    "redef": lambda ncid: (ncid,),
    "rename_att": lambda ncid: (ncid, -1, "title", "t"),
    "rename_dim": lambda ncid: (ncid, 0, "e"),
    "rename_var": lambda ncid: (ncid, 0, "b"),
    "set_default_format": lambda ncid: (1,),
    "set_fill": lambda ncid: (ncid, 256),
    "strerror": lambda ncid: (-33,),
    "sync": lambda ncid: (ncid,),
    "get_att": lambda ncid, varid, data: (ncid, varid, "range"),
    "get_var": lambda ncid, varid, data: (ncid, varid),
    "get_var1": lambda ncid, varid, data: (ncid, varid, [1, 1]),
    "get_vara": lambda ncid, varid, data: (ncid, varid, [0, 1], [2, 1]),
    "get_vars": lambda ncid, varid, data: (ncid, varid, [0, 0], [2, 2], [2, 1]),
    "put_att": lambda ncid, varid, data: (ncid, varid, "range", 1 + varid, data),
    "put_var": lambda ncid, varid, data: (ncid, varid, data),
    "put_vara": lambda ncid, varid, data: (ncid, varid, [0, 1], [3, 1], data[:3]),
    "put_vars": lambda ncid, varid, data: (ncid, varid, [0, 0], [2, 1], [2, 1], data[:2]),
    "put_var1": lambda ncid, varid, data: (ncid, varid, [2, 1], data[:1]),
}
DEFINING = {"copy_att", "def_dim", "def_var", "del_att", "_enddef", "end_def", "enddef"}


def call_of(operation: operations.Operation, ncid: int) -> tuple:
    """Arguments with which the operation succeeds."""
    if operation.short in CALLS:
        return CALLS[operation.short](ncid)
    family, _, suffix = operation.short.rpartition("_")
    member = next(each for each in MEMBERS if each.suffix == suffix)
    varid = list(tessel.sample.VARIABLES).index(member.external)
    data = "zyxwvu" if member.is_text else numpy.arange(6, 0, -1, member.dtype)
    given = CALLS[family](ncid, varid, data)
    if member.is_text and family == "get_att":
        return ncid, -1, "title"
    if member.is_text and family == "put_att":
        return ncid, varid, "units", data
    return given


def state(ncid: int) -> object:
    """What the sample holds, by the call form; what it raises, where it is closed."""
    try:
        counts = [int(each.item()) for each in nc("inq", ncid)]
        dims = [[str(each) for each in nc("inq_dim", ncid, i)] for i in range(counts[0])]
        made = []
        for varid in range(-1, counts[1]):
            natts = counts[2] if varid < 0 else int(nc("inq_var", ncid, varid)[3].item())
            names = [nc("inq_attname", ncid, varid, i) for i in range(natts)]
            values = [nc("get_att_text", ncid, varid, each)
                      if nc("inq_att", ncid, varid, each)[0].item() == 2
                      else nc("get_att_double", ncid, varid, each).tolist() for each in names]
            made.append((varid, names, values))
            if varid >= 0:
                variable = [str(each) for each in nc("inq_var", ncid, varid)]
                text = nc("inq_var", ncid, varid)[1].item() == 2
                try:
                    data = nc("get_var_text" if text else "get_var_double", ncid, varid)
                    variable.append(str(data.tolist()))
                except tessel.Error as error:
                    variable.append(error.word)
                made.append(variable)
        return counts, dims, made
    except tessel.Error as error:
        return error.word


def plain(value: object, is_new_ncid: bool) -> object:
    """A result of the method form as the call form gives it."""
    if is_new_ncid:
        nc.close(value)
        return "a new dataset"
    if isinstance(value, (int, float)):
        return [[float(value)]]
    if isinstance(value, list):
        return [[each] for each in value]
    if isinstance(value, tuple):
        return [[float(each) for each in value]]
    return value.tolist() if isinstance(value, numpy.ndarray) else value


def outcome(operation: operations.Operation, name: str, as_method: bool) -> tuple:
    """What a call gives, and what the sample holds afterwards."""
    made = tessel.sample.dataset(nc)
    if operation.short in DEFINING or operation.short.startswith(("put_att", "rename")):
        nc.redef(made)
    given = call_of(operation, made)
    results = getattr(nc, name)(*given) if as_method else nc(name, *given)
    several = len(operation.results) > 1
    listed = () if results is None else tuple(results) if several else (results,)
    assert len(listed) == len(operation.results)
    flat = []
    for row, value in zip(operation.results, listed):
        if not as_method and isinstance(value, numpy.ndarray):
            flat.append("a new dataset" if row.name == "ncid" and nc.close(value.item()) is None
                        else value.tolist())
        else:
            flat.append(plain(value, row.name == "ncid"))
    left = state(made)
    if left != "notNetcdfID":
        nc.abort(made)
    return flat, left


@each_name
def test_does_what_the_call_form_does(operation: operations.Operation, name: str) -> None:
    nc.close(tessel.sample.dataset(nc, "file.nc"))
    before = nc.set_default_format(1)
    assert outcome(operation, name, True) == outcome(operation, name, False)
    nc.set_default_format(before)


@each_operation
def test_results_have_the_promised_types(operation: operations.Operation, ncid: int) -> None:
    nc.close(tessel.sample.dataset(nc, "file.nc"))
    if operation.short in DEFINING or operation.short.startswith(("put_att", "rename")):
        nc.redef(ncid)
    method = getattr(nc, operation.short)
    value = method(*call_of(operation, ncid))
    if not operation.results:
        assert value is None
        return
    if operation.several:
        kind = getattr(netcdf, operation.several)
        assert type(value) is kind and issubclass(kind, tuple)
        assert kind._fields == tuple(each.name for each in operation.results)
    values = value if operation.several else (value,)
    for row, each in zip(operation.results, values):
        wanted = {"int": int, "int or float": int, "str": str, "list of str": list,
                  "tuple of int": tuple}.get(row.kind.wording)
        if wanted is not None:
            assert type(each) is wanted
            if wanted is tuple:
                assert all(type(one) is int for one in each)
        elif operation.short.endswith("_text"):
            assert isinstance(each, str) or each.dtype == "<U1"
        else:
            dtype = next(member.dtype for member in MEMBERS
                         if operation.short.endswith("_" + member.suffix))
            assert type(each) is numpy.ndarray and each.dtype == dtype
            assert each.flags.f_contiguous and not each.flags.owndata, "a copy of the host's array"
    if operation.opens:
        nc.close(value.ncid if operation.several else value)


def test_fill_values_are_floats() -> None:
    assert isinstance(nc.param("FILL_DOUBLE"), float) and nc.param("FILL_DOUBLE") > 9e36
    assert isinstance(nc.param("FILL_FLOAT"), float)
    assert nc.param("NC_FILL_INT") == -2147483647 and type(nc.param("NC_FILL_INT")) is int


def test_keywords(ncid: int) -> None:
    assert nc.get_vara_int(ncid=ncid, varid=3, count=[1, 1], start=[2, 1]).tolist() == [[5]]
    with pytest.raises(TypeError, match="stride"):
        nc.get_vara_int(ncid, 3, [0, 0], [1, 1], stride=[1, 1])
    with pytest.raises(TypeError, match="missing"):
        nc.get_vara_int(ncid, 3)


@pytest.mark.parametrize("kind", [int, numpy.int8, numpy.int32, numpy.int64, numpy.uint64,
                                  numpy.array])
def test_whole_numbers_of_any_kind(ncid: int, kind: type) -> None:
    """Also where the module itself takes doubles only, or reads others wrongly."""
    assert nc.inq_var(ncid, kind(3)).name == "int"
    assert nc.strerror(kind(-33) if kind is not numpy.uint64 else kind(0)) == nc.strerror(
        0 if kind is numpy.uint64 else -33)
    nc.redef(ncid)
    assert nc.def_dim(ncid, "depth", kind(4)) == 3
    varid = nc.def_var(ncid, "depth", kind(5), [kind(0), kind(3)])
    assert nc.inq_var(ncid, varid)[1:3] == (5, (0, 3))


@pytest.mark.parametrize("make", [
    lambda number: numpy.array([number], "i4"), lambda number: numpy.array(number, "i4"),
    lambda number: numpy.array([[number]], "i4"), lambda number: numpy.array([number, 7], "i4"),
    lambda number: numpy.array([number], "i8"), lambda number: numpy.array([number], ">i2"),
    lambda number: numpy.array([number], float)],
    ids=["i4", "0-d i4", "2-d i4", "two i4", "i8", ">i2", "double"])
def test_codes_in_arrays(make, tmp_path) -> None:
    """Of an int32, the module would read the bytes as those of a double, and answer something
    else."""
    assert nc.strerror(make(-33)) == nc.strerror(-33) != nc.strerror(0)
    before = nc.set_default_format(make(nc.param("FORMAT_64BIT")))
    try:
        assert nc.set_default_format(make(before)) == nc.param("FORMAT_64BIT")
    finally:
        nc.set_default_format(before)
    dataset = nc.create(tmp_path / "filled.nc", "CLOBBER")
    assert nc.set_fill(dataset, make(nc.param("NOFILL"))) == nc.param("FILL")
    assert nc.set_fill(dataset, make(nc.param("FILL"))) == nc.param("NOFILL")
    nc.close(dataset)


def test_codes_that_are_none() -> None:
    for wrong in (numpy.array([], "i4"), numpy.array(["a"]), numpy.array([True])):
        with pytest.raises(tessel.Error) as raised:
            nc.strerror(wrong)
        assert raised.value.identifier.startswith("TESSEL:netcdf:unpackIntSingleton:")


@pytest.mark.parametrize("vector", [
    [1, 0], (1, 0), numpy.array([1, 0]), numpy.array([1.0, 0.0]), numpy.array([1, 0], numpy.uint8),
    numpy.array([[1, 0]]), range(1, -1, -1), {1: "x", 0: "y"}.keys(), numpy.array([1, 0]).data],
    ids=lambda each: type(each).__name__)
def test_vectors_of_any_kind(ncid: int, vector: object) -> None:
    assert nc.get_var1_double(ncid, 5, vector).item() == 1.0
    assert nc.get_vars_double(ncid, 5, vector, [1, 1], [1, 1]).item() == 1.0
    nc.redef(ncid)
    assert nc.inq_var(ncid, nc.def_var(ncid, "v", 6, vector)).dimids == (1, 0)


@pytest.mark.parametrize("none", [[], (), numpy.array([], int), range(0)])
def test_variable_without_dimensions(ncid: int, none: object) -> None:
    nc.redef(ncid)
    varid = nc.def_var(ncid, "single", nc.param("DOUBLE"), none)
    assert nc.inq_var(ncid, varid).dimids == ()
    nc.enddef(ncid)
    nc.put_var_double(ncid, varid, 2.5)
    assert nc.get_var_double(ncid, varid).tolist() == [[2.5]]


def test_what_is_no_number_goes_to_the_module(ncid: int) -> None:
    for bad in (True, "1", None, [1, 2j]):
        with pytest.raises(tessel.Error):
            nc.inq_var(ncid, bad)
    with pytest.raises(tessel.Error) as caught:
        nc.get_var1_double(ncid, 5, "ab")
    assert caught.value.word == "startArgumentHasBadDatatype"


INTEGERS = ["int", "short", "schar", "uchar"]


@pytest.mark.parametrize("member", [each for each in MEMBERS if not each.is_text],
                         ids=lambda each: each.suffix)
def test_numbers_that_are_exact(ncid: int, member: object) -> None:
    varid = list(tessel.sample.VARIABLES).index(member.external)
    put, get = (getattr(nc, f"{way}_var_{member.suffix}") for way in ("put", "get"))
    for data in ([1, 2, 3, 4, 5, 6], (1.0, 2, 3, 4, 5, numpy.int64(6)), [[1, 2, 3], [4, 5, 6]],
                 [[1, 4], [2, 5], [3, 6]]):
        put(ncid, varid, data)
        wanted = numpy.array(data, float).ravel("F")
        assert get(ncid, varid).ravel("F").tolist() == wanted.tolist()
    put1 = getattr(nc, f"put_var1_{member.suffix}")
    put1(ncid, varid, [0, 0], 7)
    put1(ncid, varid, [1, 0], 8.0)
    assert get(ncid, varid)[:2, 0].tolist() == [7, 8]


@pytest.mark.parametrize("operation, value", [
    ("put_var1_int", 0.5), ("put_var1_int", 2**31), ("put_var1_int", -(2**31) - 1),
    ("put_var1_int", float("nan")), ("put_var1_int", float("inf")), ("put_var1_int", 1e300),
    ("put_var1_short", 32768), ("put_var1_schar", 128), ("put_var1_schar", -129),
    ("put_var1_uchar", 256), ("put_var1_uchar", -1), ("put_var1_float", 0.1),
    ("put_var1_float", 1e39), ("put_var1_float", 2**24 + 1), ("put_var1_double", 2**53 + 1),
    ("put_var1_double", 10**400), ("put_var1_int", 10**400), ("put_var1_int", [0.5]),
    pytest.param("put_var1_int", 10**5000, id="beyond what Python writes")])
def test_numbers_that_are_not(ncid: int, operation: str, value: object) -> None:
    with pytest.raises(ValueError, match="not exact") as caught:
        getattr(nc, operation)(ncid, 3, [0, 0], value)
    assert caught.value.identifier == "TESSEL:python:notExact"
    assert caught.value.operation == operation
    [note] = caught.value.__notes__
    assert note.startswith(f"in {operation}(ncid={ncid}, varid=3, index=[0, 0], data=")
    assert note.endswith("\nvarid 3: int int(x=3, y=2)")
    assert nc.get_var1_int(ncid, 3, [0, 0]).item() == 0


@pytest.mark.parametrize("value", [float("inf"), float("-inf"), 0.0, -0.0, 5e-324, 1.7e308])
def test_doubles_stay_what_they_are(ncid: int, value: float) -> None:
    nc.put_var1_double(ncid, 5, [0, 0], [value])
    found = nc.get_var1_double(ncid, 5, [0, 0]).item()
    assert found == value and numpy.signbit(found) == numpy.signbit(value)


def test_nan_is_exact(ncid: int) -> None:
    nc.put_var1_float(ncid, 4, [0, 0], float("nan"))
    assert numpy.isnan(nc.get_var1_float(ncid, 4, [0, 0]).item())


@pytest.mark.parametrize("data", [
    numpy.arange(6), numpy.arange(6.0), numpy.arange(6, dtype=numpy.int16), numpy.float64(1),
    [True] * 6, True, "abcdef", [[1, 2, 3], [4]], [1, "2"], None, [None]],
    ids=lambda each: f"{type(each).__name__}-{numpy.asarray(each, object).size}")
def test_arrays_of_other_classes_are_refused(ncid: int, data: object) -> None:
    """By the module, where its class has a counterpart; nothing is converted."""
    with pytest.raises(TypeError) as caught:
        nc.put_var_int(ncid, 3, data)
    assert caught.value.word in ("badDatatype", "unsupportedType")
    assert nc.get_var_int(ncid, 3).ravel("F").tolist() == [0, 1, 2, 3, 4, 5]


@pytest.mark.parametrize("text", ["°C", "日本", "µm", "Größe 𝄞", "a\uff80", "\x80\xff", "é" * 5000,
                                  "plain", ""])
def test_text_of_attributes_comes_back(ncid: int, text: str) -> None:
    """As UTF-8, which every other program takes it for; also as a str of NumPy's."""
    nc.redef(ncid)
    for given in (text, numpy.str_(text)):
        nc.put_att_text(ncid, -1, "text", given)
        assert nc.get_att_text(ncid, -1, "text") == nc("get_att_text", ncid, -1, "text") == text
        assert nc.inq_att(ncid, -1, "text").len == len(text.encode())
    nc.nc_put_att_text(ncid, -1, "text", text.encode())
    assert nc.get_att_text(ncid, -1, "text") == text


def test_bytes_of_attributes_are_what_they_are(ncid: int) -> None:
    nc.redef(ncid)
    for given in (b"\xb0C", numpy.array(["\uffb0", "C"])):
        nc.put_att_text(ncid, -1, "text", given)
        assert nc.inq_att(ncid, -1, "text").len == 2
        assert nc.get_att_text(ncid, -1, "text") == "°C"  # no UTF-8, and so Latin-1
    nc("put_att_text", ncid, -1, "text", "日本")  # the call form: the low bytes
    assert nc.get_att_text(ncid, -1, "text") == "å,"


# Calls that write six characters, or one, to the sample's variable "char", whose number is 1.
TEXTS = [
    lambda text: ("put_var_text", text), lambda text: ("put_vara_text", [0, 0], [3, 2], text),
    lambda text: ("put_vars_text", [0, 0], [3, 2], [1, 1], text),
    lambda text: ("put_var1_text", [0, 0], text[-1:] if isinstance(text, (str, bytes))
                  else text.ravel()[-1:])]


@pytest.mark.parametrize("texts", TEXTS)
@pytest.mark.parametrize("wrong", ["\x80", "é", "日", "\uff7f", "\ud800", "𝄞"])
def test_characters_that_are_no_byte(ncid: int, texts: typing.Callable, wrong: str) -> None:
    """The module would store the low byte of each: another character, without a word."""
    text = "abcde" + wrong
    array = numpy.array(list(text))
    for given in (text, numpy.str_(text), array, array.reshape(2, 3), array.astype(">U1")):
        short, *places, data = texts(given)
        with pytest.raises(ValueError, match="is not one byte; give the bytes") as caught:
            getattr(nc, short)(ncid, 1, *places, data)
        error = typing.cast(tessel.Error, caught.value)
        assert error.identifier == "TESSEL:python:notOneByte" and error.operation == short
        assert error.message.startswith(f"{wrong!r} (U+{ord(wrong):04X}) ")
        [note] = error.__notes__
        assert note.endswith("\nvarid 1: char char(x=3, y=2)")
    assert "".join(nc.get_var_text(ncid, 1).ravel("F")) == "abcdef"
    nc.redef(ncid)
    with pytest.raises(ValueError, match="is not one byte"):
        nc.put_att_text(ncid, -1, "text", array)


@pytest.mark.parametrize("texts", TEXTS)
def test_bytes_of_variables_come_back(ncid: int, texts: typing.Callable) -> None:
    """As bytes, and as the characters that reading gives for them, in a str and in an array."""
    for read in ("abcde\uff80", "abcde\uffff", "\0\x7f\x01\uffe4de"):
        written = bytes(ord(each) & 0xff for each in read)
        for given in (read, written, numpy.array(list(read)), numpy.array(list(read), ">U1")):
            nc.put_var_text(ncid, 1, "......")
            short, *places, data = texts(given)
            getattr(nc, short)(ncid, 1, *places, data)
            found = nc.get_var_text(ncid, 1).ravel("F").tolist()
            assert found == ([read[-1], *"....."] if short == "put_var1_text"
                             else numpy.array(list(read)).tolist())


def test_text_that_has_no_utf8(ncid: int) -> None:
    nc.redef(ncid)
    with pytest.raises(ValueError, match="half of a surrogate pair") as caught:
        nc.put_att_text(ncid, -1, "text", "a\udc80")
    assert caught.value.identifier == "TESSEL:python:notText"
    assert caught.value.operation == "put_att_text"


def test_the_array_itself_goes_to_the_library(ncid: int, monkeypatch: pytest.MonkeyPatch) -> None:
    """No copy: what the method hands on is the object that it was given."""
    seen = []
    monkeypatch.setitem(netcdf._SCOPE, "call", lambda *given: seen.append(given))
    data, start = numpy.arange(3.0), numpy.array([0, 0])
    nc.put_vara_double(ncid, 5, start, [3, 1], data)
    assert seen[0][4] is start and seen[0][6] is data


def test_other_modules_have_no_methods() -> None:
    """The rule is the name of the file."""
    module = tessel.load("netcdf")
    assert type(module) is tessel.Netcdf and isinstance(module, tessel.Module)
    assert type(tessel.load(module.file)) is tessel.Netcdf
    other = Path("other.tsx")
    other.symlink_to(module.file)
    assert type(tessel.load(other)) is tessel.Module
    assert not hasattr(tessel.load(other), "open")
    assert tessel.load(other)("inq_libvers") == module.inq_libvers()


def test_paths(ncid: int) -> None:
    nc.close(nc.create(Path("päth.nc"), "CLOBBER"))
    assert Path("päth.nc").exists()
    nc.close(nc.nc_open("päth.nc", "NOWRITE"))


OPENINGS = [
    lambda path: nc.create(path, "CLOBBER"), lambda path: nc._create(path, 0, 0, 0).ncid,
    lambda path: nc.open(path, "NOWRITE"), lambda path: nc._open(path, 0, 0).ncid]


@pytest.mark.parametrize("opening", OPENINGS)
@pytest.mark.parametrize("name", ["größe.nc", " blank.nc", "\n\t.nc"])
@pytest.mark.parametrize("form", [str, os.fsencode, Path, lambda name: Entry(os.fsencode(name))])
def test_a_path_is_that_very_file(form: typing.Callable[[str], typing.Any], name: str,
                                  opening: typing.Callable[[typing.Any], int]) -> None:
    """The library would skip the blanks at its beginning, and bytes are characters for the host."""
    nc.close(nc.create("other.nc", 0))
    os.rename("other.nc", name)
    opened = opening(form(name))
    assert netcdf.path_of(opened) == f"{Path.cwd()}/{name}"
    nc.close(opened)
    assert os.listdir() == [name]


class Entry:
    """A path object that gives bytes."""

    def __init__(self, name: bytes) -> None:
        self.name = name

    def __fspath__(self) -> bytes:
        return self.name


@pytest.mark.parametrize("opening", OPENINGS)
@pytest.mark.parametrize("path", [b"\xff.nc", "\udcff.nc", Path("\udcff.nc"), "a\0.nc", b"a\0"])
def test_a_path_that_would_be_another_file(path: typing.Any,
                                           opening: typing.Callable[[typing.Any], int]) -> None:
    with pytest.raises(ValueError) as caught:
        opening(path)
    error = typing.cast(tessel.Error, caught.value)
    assert error.identifier == "TESSEL:python:badPath"
    assert error.operation in ("create", "_create", "open", "_open")
    assert len(error.__notes__[0].splitlines()) == 1 and not os.listdir()


def test_completion() -> None:
    names = set(dir(nc))
    assert {name for _, name in NAMES} <= names
    public = {name for name in names if not name.startswith("__")}
    assert public - {name for _, name in NAMES} == {"file"}


def test_members_do_not_share_anything() -> None:
    """Each name has a function of its own: its name is in tracebacks and in help."""
    functions = [getattr(tessel.Netcdf, name) for _, name in NAMES]
    assert len({id(each) for each in functions}) == len({id(each.__code__) for each in functions})
    assert len(functions) == 203 and copy.copy(functions[0]) is functions[0]


def test_a_similar_name_is_suggested() -> None:
    """By Python itself, which finds the methods; one that is no method costs the others nothing."""
    run = subprocess.run([sys.executable, "-c", "import tessel\ntessel.load('netcdf').get_var_dbl"],
                         text=True, capture_output=True, check=False)
    assert run.stderr.endswith("AttributeError: 'Netcdf' object has no attribute 'get_var_dbl'. "
                               "Did you mean: 'get_var_double'?\n")


def test_help_runs() -> None:
    text = subprocess.run([sys.executable, "-c", "import tessel; help(tessel.Netcdf)"], text=True,
                          capture_output=True, check=True).stdout
    for name in itertools.islice((name for _, name in NAMES), 0, None, 10):
        assert f" {name}(self" in text


def test_rules_of_arguments() -> None:
    """The small functions, where no call reaches them."""
    assert arguments.vector("ab") == "ab" and arguments.vector(b"ab") == b"ab"
    assert arguments.vector(3) == 3 and arguments.vector(iter([1, 2])) == [1, 2]
    assert arguments.identifiers(3) == [3]
    assert arguments.integer(True) is True and type(arguments.integer(numpy.int8(3))) is int
