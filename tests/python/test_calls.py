"""tests/python/test_calls.py: names of operations are kept by the object that they are, and calls
find the operation that they name, whatever else has had that name's place in memory."""

import gc
import sys
import weakref
from pathlib import Path

import numpy
import pytest
import tessel
from tessel import _runtime, netcdf

nc = tessel.load("netcdf")


@pytest.fixture(autouse=True)
def folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Files that are made here are gone afterwards."""
    monkeypatch.chdir(tmp_path)


def test_names_made_on_the_way() -> None:
    """Each is an object of its own, and the next one often has the address of the one before."""
    expected = {"inq_libvers": nc.inq_libvers(), "strerror": nc.strerror(-33)}
    for i in range(1000):
        name, given = [("inq_libvers", ()), ("strerror", (-33,))][i % 2]
        made = "".join([name[:3], name[3:]])
        assert made is not name
        assert nc(made, *given) == expected[name]
        del made


class Text(str):
    """A str of somebody's own."""


@pytest.mark.parametrize("name", ["inq_libvers", "NC_Inq_LibVers", Text("nc_inq_libvers"),
                                  b"inq_libvers"])
def test_names_of_any_kind(name: object) -> None:
    for _ in range(3):
        assert nc(name) == nc.inq_libvers()


def kept(names: list[str]) -> int:
    """How many of these names a new module keeps when it is called with them."""
    module = tessel.Module(nc)
    before = list(map(sys.getrefcount, names))
    for each in names:
        with pytest.raises(LookupError):
            module(each)
    del each
    # An error refers to its arguments for as long as it lives; pytest has let go of all of them.
    held = [now - then for now, then in zip(map(sys.getrefcount, names), before)]
    assert set(held) <= {0, 1}
    del module
    assert list(map(sys.getrefcount, names)) == before
    return sum(held)


def test_names_are_kept_but_not_without_end() -> None:
    assert kept([sys.intern(f"no_operation_{i}") for i in range(100)]) == 100
    assert kept([sys.intern(f"no_operation_{i}") for i in range(1000)]) == 512
    assert kept(["".join(["no_operation_", str(i)]) for i in range(100)]) == 0


def spellings(name: str) -> list[object]:
    """What the module takes for a name, none of them kept but the first two."""
    made = "".join([name[:3], name[3:]])
    return [name, name.upper(), made, Text(name), numpy.str_(name), made.encode(),
            numpy.array(list(name)), f"{made}\0 and more"]


@pytest.mark.parametrize("opening", [*spellings("create"), "Nc_Create"], ids=repr)
@pytest.mark.parametrize("closing", [*spellings("close"), "abort"], ids=repr)
def test_datasets_are_remembered_by_any_spelling(opening: object, closing: object) -> None:
    ncid = int(nc(opening, "any.nc", "CLOBBER").item())
    assert netcdf.path_of(ncid) == str(Path("any.nc").absolute())
    nc(closing, ncid)
    assert netcdf.path_of(ncid) is None


@pytest.mark.parametrize("arguments", [
    ("close", 1j), ("close", numpy.array([2 + 1j], "F")), ("close", "abc"), ("close", b""),
    ("close", numpy.array([object()])), ("inq_var", 1j, 2j), ("inq_dim", 1, 1j),
    ("def_var", 1, "v", 5, numpy.array([1j]))])
@pytest.mark.filterwarnings("error")
def test_what_is_no_id(arguments: tuple[object, ...]) -> None:
    """Nothing but the module's error, neither of a call nor of a method."""
    name, *given = arguments
    for call in (lambda: nc(*arguments), lambda: getattr(nc, str(name))(*given)):
        with pytest.raises(tessel.Error):
            call()


def test_instead() -> None:
    """What takes the calls of a name gets the module and all arguments, and its result is theirs."""
    seen = []

    def instead(*given: object) -> str:
        seen.append(given)
        return "instead"

    module = tessel.Module(nc, {"inq_libvers": instead})
    for name in (*spellings("inq_libvers"), "INQ_LibVers"):
        assert module(name, 1, None) == "instead"
        given = seen.pop()
        assert (given[0], *given[2:]) == (module, 1, None) and given[1] is name and not seen
        assert _runtime.call(module, name) == nc.inq_libvers()  # the module itself
    assert module("nc_inq_libvers") == nc.inq_libvers()  # another name
    assert tessel.Module(nc, {None: instead})("inq_libvers") == nc.inq_libvers()
    for wrong in ((), (3,), ("İnq_libvers",), (object(),)):  # nobody's
        assert pytest.raises(tessel.Error, module, *wrong)
    assert tessel.Module(module)("inq_libvers") == nc.inq_libvers()  # the same module alone


def test_an_error_instead() -> None:
    def instead(*given: object) -> None:
        raise ZeroDivisionError

    with pytest.raises(ZeroDivisionError):
        tessel.Module(nc, {"inq_libvers": instead})("inq_libvers")


class Uncomparable:
    """A key that is found where "inq_libvers" would be, and does not say whether it is that."""

    def __hash__(self) -> int:
        return hash("inq_libvers")

    def __eq__(self, _other: object) -> bool:
        raise ZeroDivisionError


def test_an_error_in_search_of_what_is_instead() -> None:
    module = tessel.Module(nc, {Uncomparable(): print})  # type: ignore[dict-item]
    for name in spellings("inq_libvers"):
        with pytest.raises(ZeroDivisionError):
            module(name)


@pytest.mark.parametrize("name", ["inq_libvers", "close"])
def test_named_arguments(name: str) -> None:
    with pytest.raises(tessel.Error) as caught:
        nc(name, ncid=3, **{"größe": 4})
    assert caught.value.identifier == "TESSEL:python:namedArgument"
    assert caught.value.message.endswith("by position, not as ncid=, größe=.")


def test_no_arguments() -> None:
    assert pytest.raises(tessel.Error, nc).value.identifier.startswith("TESSEL:netcdf:")
    for call in (_runtime.call, _runtime.call_ints):
        assert pytest.raises(tessel.Error, call, nc).value.identifier.startswith("TESSEL:netcdf:")
        for wrong in ((), (3,), ("inq_libvers",)):
            with pytest.raises(TypeError):
                call(*wrong)


@pytest.mark.parametrize("wrong", [(), (3,), (nc, 3), (nc, {}, 3)])
def test_making_a_module(wrong: tuple[object, ...]) -> None:
    with pytest.raises(TypeError):
        tessel.Module(*wrong)  # type: ignore[call-arg, arg-type]


def test_instances_end() -> None:
    module = tessel.Module(nc)
    gone = weakref.ref(module)
    assert gone() is module and "netcdf.tsx" in repr(module)
    del module
    assert gone() is None


class Derived(tessel.Module):
    """One with attributes."""


@pytest.mark.parametrize("lead_back", [
    lambda module, functions: functions.update(x=lambda *_: module),
    lambda module, functions: (functions.update(x=lambda *_: module), module("x"),
                               functions.clear()),  # what the kept name has is left
    lambda module, functions: setattr(module, "itself", module),
])
def test_instances_that_lead_to_themselves_end(lead_back: object) -> None:
    functions: dict[str, object] = {}
    module = Derived(nc, functions)  # type: ignore[arg-type]
    lead_back(module, functions)  # type: ignore[operator]
    gone = weakref.ref(module)
    gc.collect()
    assert gone() is module
    del module, functions
    assert gone() is not None, "nothing led back"
    gc.collect()
    assert gone() is None


def test_ints() -> None:
    """Whole doubles by themselves and nothing else."""
    ncid = nc.create("ints.nc", "CLOBBER")
    x = nc.def_dim(ncid, "x", 2)
    varid = nc.def_var(ncid, "v", nc.param("NC_DOUBLE"), [x, x])
    for name in "ac":
        nc.put_att_double(ncid, varid, name, nc.param("NC_DOUBLE"), 1.0)
    nc.put_att_int(ncid, varid, "b", nc.param("NC_INT"), 2)

    def ints(*arguments: object) -> object:
        return _runtime.call_ints(nc, *arguments)

    name, xtype, dimids, natts = ints("inq_var", ncid, varid)  # type: ignore[misc]
    assert (name, xtype, natts) == ("v", 6, 3) and {type(xtype), type(natts)} == {int}
    assert dimids.tolist() == [[x, x]] and dimids.dtype == float
    for whole in (-3.0, -2.0**63, 2.0**62):
        nc.put_att_double(ncid, varid, "a", nc.param("NC_DOUBLE"), whole)
        found = ints("get_att_double", ncid, varid, "a")
        assert type(found) is int and found == whole
    assert ints("get_att_int", ncid, varid, "b").tolist() == [[2]]  # type: ignore[attr-defined]
    assert ints("enddef", ncid) is None
    for other in (2.5, 2.0**63, numpy.inf):
        nc.put_att_double(ncid, varid, "c", nc.param("NC_DOUBLE"), other)
        kept = ints("get_att_double", ncid, varid, "c")
        assert isinstance(kept, numpy.ndarray) and kept.tolist() == [[other]]
    nc.close(ncid)
