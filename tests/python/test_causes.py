"""tests/python/test_causes.py: what the pages say about why a call is refused is so."""

import re
import typing
from pathlib import Path

import numpy
import pytest
import tessel
import tessel.sample
from tessel import kinds, meanings, reference
from tessel.errors import word_of
from tessel.operation import Kind
from tessel.operations import OPERATIONS, find

nc = tessel.load("netcdf")


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


# A value of each class of the host.
CLASSES: dict[str, typing.Any] = {
    "double": 1.5, "single": numpy.float32(1.5), "char": "text", "logical": True, "cell": ["a"],
    "struct": {"a": 1}, **{name: numpy.array([1], name) for name in
                           ("int8", "int16", "int32", "int64", "uint8", "uint16", "uint32",
                            "uint64")}}
NUMERIC = set(CLASSES) - {"char", "logical", "cell", "struct"}

# The position of an argument of each kind, in a call that is refused for nothing before it.
CALLS: dict[str, tuple[Kind, str, tuple[typing.Any, ...]]] = {
    "badIDDatatype": (kinds.IDENTIFIER, "inq", (None,)),
    "argumentWasNotChar": (kinds.NAME, "param", (None,)),
    "badModeDatatype": (kinds.MODE, "open", ("missing.nc", None)),
    "badDatatype": (kinds.TYPE, "def_var", (1, "v", None, [])),
    "badSizeArgumentDatatype": (kinds.SIZE, "_open", ("missing.nc", 0, None)),
    "badNumericType": (kinds.CODE, "strerror", (None,)),
    "badDimidsType": (kinds.DIMENSIONS, "def_var", (1, "v", 5, None)),
    "countArgumentHasBadDatatype": (kinds.POSITIONS, "get_vara_int", (1, 0, [0], None)),
}


def named_classes(cause: str) -> set[str]:
    """The classes that a cause says are taken."""
    if cause == "is of no numeric class":
        return NUMERIC
    found = re.fullmatch(r"(?:is|are) of another class than (.*)", cause)
    assert found, cause
    return set(re.split(", | and ", found[1]))


@pytest.mark.parametrize("word", CALLS)
def test_refused_for_its_class(word: str) -> None:
    """By the call form, which gives the module what it is given: exactly the classes that the cause
    does not name."""
    kind, operation, given = CALLS[word]
    [cause] = [cause for identifier, cause in kind.errors
               if word_of(identifier.format(label="count")) == word]
    refused = set()
    for name, value in CLASSES.items():
        try:
            nc(operation, *(value if each is None else each for each in given))
        except tessel.Error as error:
            if error.word == word:
                refused.add(name)
    assert refused == set(CLASSES) - named_classes(cause)


def test_every_cause_that_is_about_a_class_is_tried() -> None:
    about = {identifier for operation in OPERATIONS for argument in operation.arguments
             for identifier, _ in argument.kind.errors
             if re.search("(?i)bad.*type|NotChar", word_of(identifier))}
    assert {word_of(each.format(label="count")) for each in about} == set(CALLS)


# Codes.

def test_what_is_said_of_codes() -> None:
    """The module reads the bytes of an int32 as a double's. The page and the docstring of each
    operation that takes a code say so, and what to do; the words of the module's error do, too."""
    assert nc("strerror", -33.0) != nc("strerror", numpy.int32(-33)) == nc("strerror", 0.0)
    takers = [each for each in OPERATIONS
              if any(argument.kind is kinds.CODE for argument in each.arguments)]
    assert {each.short for each in takers} == {"set_fill", "set_default_format", "strerror"}
    for each in takers:
        [code] = [argument for argument in each.arguments if argument.kind is kinds.CODE]
        for text in (reference.text_of(each), getattr(nc, each.short).__doc__):
            said = " ".join(text.split())
            assert ("give a double: an int32 is no error, but its bytes are read as a double's, so "
                    "that a single one counts as 0.") in said
        assert code.kind.host.startswith("double;")
    assert meanings.MEANINGS["badNumericType"][1].startswith("Give it as a double:")
    assert "int32 array is no\n  error there" in (tessel.__doc__ or "")


@pytest.mark.parametrize("dtype", ["int16", "int32", "int64", "uint16", "float64"])
@pytest.mark.parametrize("make", [lambda dtype: numpy.array([256], dtype),
                                  lambda dtype: numpy.array(256, dtype),
                                  lambda dtype: numpy.dtype(dtype).type(256)])
def test_a_method_takes_a_code_by_its_value(make: typing.Callable[[str], typing.Any],
                                            dtype: str) -> None:
    ncid = tessel.sample.dataset(nc)
    before = nc.set_fill(ncid, 0)
    nc.set_fill(ncid, make(dtype))
    assert nc.set_fill(ncid, before) == 256
    nc.close(ncid)


# What else is said of arguments.

@pytest.mark.parametrize("value", [0.0, 3.5, float("nan")])
def test_no_external_type(value: float) -> None:
    """What is within the range and none of the types: the cause names each of these."""
    ncid = nc.create("none.nc", "CLOBBER")
    with pytest.raises(tessel.Error) as caught:
        nc("def_var", ncid, "none", value, numpy.zeros((0, 0)))
    assert caught.value.identifier == "TESSEL:netcdf:defVar:invalidDataType"
    [cause] = [each.cause for each in reference.page_of(find("def_var")).raised
               if each.identifier == caught.value.identifier]
    assert cause == "the external type is 0, or no whole number"
    nc.close(ncid)


@pytest.mark.parametrize("name, fails", [("", True), ("a/b", True), ("a\x07", True), ("_a", False)])
def test_bad_names(name: str, fails: bool) -> None:
    ncid = nc.create("names.nc", "CLOBBER")
    if fails:
        with pytest.raises(tessel.Error) as caught:
            nc.def_dim(ncid, name, 2)
        assert (caught.value.word, "the name is empty, or has characters that names must not have"
                ) == kinds.BAD_NAME
    else:
        assert nc.def_dim(ncid, name, 2) == 0
    nc.close(ncid)


def test_one_of_the_arguments() -> None:
    """Where the call decides which argument a message names, the page says so in words; the message
    itself names that one."""
    [raised] = [each for each in reference.page_of(find("inq_var")).raised
                if each.identifier == "TESSEL:netcdf:emptySetID"]
    assert "<ncid or varid> argument cannot be []" in raised.message
    for at, name in enumerate(("ncid", "varid")):
        given = [1.0, 1.0]
        given[at] = numpy.zeros((0, 0))
        with pytest.raises(tessel.Error) as caught:
            nc("inq_var", *given)
        assert str(caught.value) == raised.message.replace("<ncid or varid>", name)
    [raised] = [each for each in reference.page_of(find("inq")).raised
                if each.identifier == "TESSEL:netcdf:emptySetID"]
    assert raised.message.startswith("ncid argument")


# Advice.

VECTORS = ["start", "count", "stride"]
PLACES = {"get_var1_int": 1, "get_vara_int": 2, "get_vars_int": 3,
          "put_var1_int": 1, "put_vara_int": 2, "put_vars_int": 3}


@pytest.mark.parametrize("operation, empty", [
    (operation, each) for operation, vectors in PLACES.items()
    for each in ("none", *VECTORS[:vectors])])
def test_a_variable_without_dimensions(operation: str, empty: str) -> None:
    """These families do not reach it, with one number or with none; the advice names those that
    do."""
    ncid = nc.create("single.nc", "CLOBBER")
    varid = nc.def_var(ncid, "single", nc.param("INT"), [])
    nc.enddef(ncid)
    data = [numpy.array([7], "int32")] if operation.startswith("put") else []
    with pytest.raises(tessel.Error) as caught:
        getattr(nc, operation)(ncid, varid, *([] if each == empty else [1]
                                              for each in VECTORS[:PLACES[operation]]), *data)
    assert (caught.value.word == f"{empty}ArgumentIsEmpty") == (empty in VECTORS)
    advice = meanings.MEANINGS[caught.value.word][1]
    assert advice.endswith("a variable without dimensions is read by get_var_* and written by "
                           "put_var_*, and by no other family.")
    nc.put_var_int(ncid, varid, 7)
    assert nc.get_var_int(ncid, varid).item() == 7
    nc.close(ncid)


@pytest.mark.parametrize("operation", OPERATIONS, ids=lambda each: each.short)
def test_who_takes_the_dataset_itself(operation: typing.Any) -> None:
    """What says of -1 that it is the dataset itself is an operation on attributes, which all do."""
    says = [each for each in operation.arguments if "-1" in each.meaning]
    assert [each.name for each in says] == [each.name for each in operation.arguments
                                            if "_att" in operation.short
                                            and each.name.startswith("varid")]
