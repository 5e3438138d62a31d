"""tests/python/test_errors.py: what an error is, which of Python's own it also is, and its note."""

import copy
import errno
import gzip
import os
import pickle
import re
import subprocess
import sys
import threading
import traceback
import typing
from pathlib import Path

import numpy
import pytest
import tessel
import tessel.sample
import xarray
from made_files import generate
from tessel import beginning, errors, netcdf, notes, wording
from tessel.errors import BUILT_INS, CLASSES, SYSTEM_ERRORS, WITHOUT_BUILT_IN, Error

ROOT = Path(__file__).parents[2]
nc = tessel.load("netcdf")
WORDS = sorted({*CLASSES, *WITHOUT_BUILT_IN})


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


@pytest.fixture
def ncid() -> typing.Iterator[int]:
    """The sample, in a file."""
    made = tessel.sample.dataset(nc, "sample.nc")
    yield made
    try:
        nc.close(made)
    except Error:  # the test has closed it
        pass


def failure(method: typing.Callable[..., object], *given: object, **named: object) -> Error:
    """The error that a call raises."""
    with pytest.raises(Error) as caught:
        method(*given, **named)
    return caught.value


def note_of(error: Error) -> list[str]:
    """The lines of the one note."""
    assert len(error.__notes__) == 1
    return error.__notes__[0].splitlines()


# The table.

def words_in(files: typing.Iterable[Path], pattern: str) -> set[str]:
    """All that the pattern finds."""
    return {found for file in files for found in re.findall(pattern, file.read_text())}


def test_every_word_is_in_the_table() -> None:
    """Those of the module's catalogue and statuses, of the guard, the host and this package."""
    module = ROOT / "module"
    full = words_in(module.rglob("*.?pp"), r'"TESSEL:[\w:]*?(\w+)"')
    rests = words_in([module / "call" / "catalogue.hpp"], r'\{":?(\w+)",\s+"[^"]*%s')
    for label in ("start", "count", "stride"):
        full |= {label + rest for rest in rests if rest.startswith("Argument")}
    full |= {rest for rest in rests if not rest.startswith("Argument")}
    statuses = words_in([module / "call" / "status.cpp"], r'"(\w+)"')
    host = words_in((ROOT / "runtime").rglob("*.?pp"), r'"TESSEL:host:(\w+)"')
    guard = words_in((ROOT / "guard" / "src").glob("*.?pp"), r'"TESSEL:guard:(\w+)"')
    own = words_in((ROOT / "python" / "src").glob("*.cpp"), r'refuse\(\s*"(\w+)"')
    own |= words_in((ROOT / "python" / "tessel").rglob("*.py"), r'"TESSEL:python:(\w+)"')
    assert len(full) > 50 and len(statuses) > 60 and len(host) > 10 and len(own) > 15
    assert guard == {"alignment", "closed", "counts", "header", "lengths", "mapping", "mode",
                     "name", "position", "records", "redefinition", "remote"}
    assert (full | statuses | guard | host | own) - set(WORDS) == set()


def test_no_word_is_there_twice() -> None:
    listed = [word for words in BUILT_INS.values() for word in words.split()]
    listed += [*SYSTEM_ERRORS, *WITHOUT_BUILT_IN]
    assert len(listed) == len(set(listed)) == len(WORDS)


@pytest.mark.parametrize("built_in, word", [(built_in, word) for built_in, words in
                                            BUILT_INS.items() for word in words.split()])
def test_built_in(built_in: type[Exception], word: str) -> None:
    error = Error(f"TESSEL:some:{word}", "the message")
    assert isinstance(error, built_in) and type(error) is CLASSES[word]
    assert type(error).__name__ == built_in.__name__ and type(error).__module__ == "tessel.errors"
    assert getattr(errors, built_in.__name__) is type(error), "it is not made once"
    assert errors.built_in_of(word) is built_in
    with pytest.raises(built_in):
        raise error


@pytest.mark.parametrize("word, number", SYSTEM_ERRORS.items())
def test_system_error(word: str, number: int) -> None:
    """As Python itself would raise it."""
    error = Error(f"TESSEL:netcdf:open:{word}", "the message")
    assert isinstance(error, type(OSError(number, "")))
    assert (error.errno, error.strerror, error.filename) == (number, os.strerror(number), None)
    assert str(error) == "the message"


@pytest.mark.parametrize("word", [*WITHOUT_BUILT_IN, "somethingNew", ""])
def test_without_built_in(word: str) -> None:
    assert type(Error(f"TESSEL:netcdf:open:{word}", "m")) is Error
    assert errors.built_in_of(word) is None


def test_the_systems_words_are_its_numbers() -> None:
    """The numbers stand as they do in the module's own table."""
    text = (ROOT / "module" / "call" / "status.cpp").read_text()
    for word, number in SYSTEM_ERRORS.items():
        if word in ("netcdfFileExistsAndNoClobber", "writeToReadOnly", "tooManyNetcdfFilesOpen"):
            continue  # the library's own
        rows = re.findall(rf'"{word}",\s*// (-?\d+)', text)
        assert rows == [str(number)], word


# The class.

PROTOCOLS = range(pickle.HIGHEST_PROTOCOL + 1)


@pytest.mark.parametrize("word", WORDS)
def test_copies_and_pickles(word: str) -> None:
    error = Error(f"TESSEL:netcdf:op:{word}", "the message", "op", path="/folder/file.nc")
    error.add_note("a note")
    if isinstance(error, OSError):
        error.filename = "file.nc"
    for made in (copy.copy(error), copy.deepcopy(error),
                 *(pickle.loads(pickle.dumps(error, protocol)) for protocol in PROTOCOLS)):
        assert made is not error and type(made) is type(error)
        assert str(made) == made.message == "the message" and made.identifier == error.identifier
        assert (made.operation, made.word, made.args) == ("op", word, error.args)
        assert made.path == "/folder/file.nc"
        assert made.__notes__ == ["a note"]
        if isinstance(error, OSError):
            assert (made.errno, made.strerror, made.filename) == (error.errno, error.strerror,
                                                                  "file.nc")


def test_pickle_crosses_processes() -> None:
    error = failure(nc.open, "missing.nc", "NOWRITE")
    code = ("import pickle, sys; error = pickle.loads(sys.stdin.buffer.read());"
            "print(type(error).__mro__[2].__name__, error.filename, error.__notes__[0])")
    shown = subprocess.run([sys.executable, "-c", code], input=pickle.dumps(error), check=True,
                           capture_output=True).stdout.decode()
    assert shown == f"FileNotFoundError missing.nc {error.__notes__[0]}\n"


def test_attributes_of_a_raised_one() -> None:
    error = failure(nc.nc_open, "missing.nc", "NOWRITE")
    assert error.identifier == "TESSEL:netcdf:open:noSuchFileOrDirectory"
    assert error.message == ('Unable to open netCDF file, library error message "No such file or '
                             'directory"')
    assert (error.operation, error.word) == ("open", "noSuchFileOrDirectory")
    assert str(error) == error.message
    assert error.args == (error.identifier, error.message)
    assert (error.errno, error.filename) == (errno.ENOENT, "missing.nc")


def test_both_forms_raise_the_same() -> None:
    method, call = failure(nc.nc_inq, 99), failure(nc, "NC_INQ", 99)
    assert type(method) is type(call)
    for name in ("identifier", "message", "operation", "word", "args", "__notes__"):
        assert getattr(method, name) == getattr(call, name)


def test_an_own_subclass_stays_one() -> None:
    class Mine(Error):
        """Somebody's own."""

    error = Mine("TESSEL:netcdf:open:noSuchFileOrDirectory", "m")
    assert type(error) is Mine and not isinstance(error, FileNotFoundError)
    assert error.word == "noSuchFileOrDirectory" and error.operation is None


def test_errors_without_an_operation() -> None:
    for error in (failure(nc), failure(nc, 5), failure(tessel.load, "nothing"),
                  failure(tessel.load, "./nothing.tsx")):
        assert error.operation is None and not hasattr(error, "__notes__")
    assert isinstance(error, ModuleNotFoundError)


# Calls that raise each of the built-ins.

def closed() -> int:
    """An id that is open no more."""
    made = tessel.sample.dataset(nc)
    nc.close(made)
    return made


def read_only() -> int:
    return nc.open("sample.nc", "NOWRITE")


RAISING: dict[str, tuple[type[Exception], typing.Callable[[int], object]]] = {
    "missing": (FileNotFoundError, lambda n: nc.open("missing.nc", "NOWRITE")),
    "missing folder": (FileNotFoundError, lambda n: nc.create("missing/new.nc", "CLOBBER")),
    "exists": (FileExistsError, lambda n: nc.create("sample.nc", "NOCLOBBER")),
    "below a file": (NotADirectoryError, lambda n: nc.open("sample.nc/x", "NOWRITE")),
    "read only": (PermissionError, lambda n: nc.redef(read_only())),
    "no dataset": (OSError, lambda n: nc.open(__file__, "NOWRITE")),
    "position": (IndexError, lambda n: nc.get_var1_double(n, 5, [3, 0])),
    "block": (IndexError, lambda n: nc.get_vara_double(n, 5, [0, 0], [4, 1])),
    "variable": (KeyError, lambda n: nc.inq_varid(n, "nothing")),
    "variable id": (LookupError, lambda n: nc.inq_var(n, 99)),
    "attribute": (KeyError, lambda n: nc.inq_att(n, -1, "nothing")),
    "dimension": (KeyError, lambda n: nc.inq_dimid(n, "nothing")),
    "constant": (LookupError, lambda n: nc.param("nothing")),
    "operation": (LookupError, lambda n: nc("nothing")),
    "class": (TypeError, lambda n: nc.put_var_int(n, 3, numpy.arange(6.0))),
    "text": (TypeError, lambda n: nc.get_var_text(n, 3)),
    "count": (TypeError, lambda n: nc("inq")),
    "no name": (TypeError, lambda n: nc.open(5, "NOWRITE")),
    "no value": (TypeError, lambda n: nc.inq(None)),
    "mode": (ValueError, lambda n: nc.open("sample.nc", "READ")),
    "closed": (ValueError, lambda n: nc.inq(closed())),
    "size": (ValueError, lambda n: nc.put_var_int(n, 3, [1])),
    "length": (ValueError, lambda n: nc.get_vara_int(n, 3, [1], [1, 1])),
    "negative": (ValueError, lambda n: nc.def_dim(n, "depth", -1)),
    "in use": (ValueError, lambda n: (nc.redef(n), nc.def_dim(n, "x", 1))),
    "range": (OverflowError, lambda n: nc.put_var1_double(n, 3, [0, 0], 1e10)),
    "state": (RuntimeError, lambda n: nc.def_dim(n, "depth", 1)),
    "overflow": (ValueError, lambda n: nc("get_vara_double", n, 5, [0, 0], [2.0**40, 2.0**40])),
    "host class": (TypeError, lambda n: nc("inq", numpy.float16(3))),
}


# The address sanitizer ends a process that asks for so much.
MEMORY = pytest.param(MemoryError, lambda n: nc.get_vara_double(n, 5, [0, 0], [2**30, 2**29]),
                      id="memory", marks=pytest.mark.without_sanitizers)


@pytest.mark.parametrize("built_in, call", [MEMORY, *(pytest.param(*row, id=name)
                                                      for name, row in RAISING.items())])
def test_is_raised_as(ncid: int, built_in: type[Exception],
                      call: typing.Callable[[int], object]) -> None:
    with pytest.raises(built_in) as caught:
        call(ncid)
    assert isinstance(caught.value, Error)
    assert caught.value.word in WORDS
    note_of(caught.value)


DAMAGED: dict[str, typing.Callable[[bytes], bytes]] = {
    "cut off": lambda whole: whole[:len(whole) // 2],
    "only the mark": lambda whole: whole[:20],
    "zeros behind the mark": lambda whole: whole[:48] + bytes(len(whole) - 48),
    "noise behind the mark": lambda whole: whole[:8] + b"\xff" * 100,
}


@pytest.mark.parametrize("damaged", DAMAGED.values(), ids=DAMAGED.keys())
def test_damaged_hdf5(damaged: typing.Callable[[bytes], bytes]) -> None:
    """The library has a status of its own for it, which the module does not know."""
    path = Path(generate(Path.cwd() / "h.nc", "dimensions: x = 3 ;", "netCDF-4"))
    path.write_bytes(damaged(path.read_bytes()))
    with pytest.raises(OSError) as caught:
        nc.open("h.nc", "NOWRITE")
    assert caught.value.identifier == "TESSEL:netcdf:open:unknownErrorStatus"
    assert (caught.value.errno, caught.value.filename) == (None, "h.nc")
    assert "HDF5" in note_of(caught.value)[2]


def test_permission(monkeypatch: pytest.MonkeyPatch) -> None:
    """As somebody who may not read the file; root may read everything."""
    Path("closed.nc").touch()
    Path("closed.nc").chmod(0)
    code = ("import os, tessel\nif not os.getuid(): os.setuid(65534)\n"
            "try: tessel.load('netcdf').open('closed.nc', 'NOWRITE')\n"
            "except PermissionError as error: print(error.errno, *error.__notes__, sep='|')")
    for folder in (Path.cwd(), *Path.cwd().parents):
        if folder.stat().st_uid == os.getuid() and folder != Path("/"):
            folder.chmod(folder.stat().st_mode | 0o055)
    shown = subprocess.run([sys.executable, "-B", "-c", code], text=True, capture_output=True)
    assert shown.stdout.startswith(f"{errno.EACCES}|in open("), shown.stderr
    assert "cannot be read (Permission denied)" in shown.stdout


# The notes.

def test_note_is_shown_below_the_message() -> None:
    error = failure(nc.open, "missing.nc", "NOWRITE")
    shown = "".join(traceback.format_exception_only(error))
    assert shown == (f"tessel.errors.FileNotFoundError: {error.message}\n"
                     "in open(path='missing.nc', mode='NOWRITE')\n"
                     f"file: {Path.cwd()}/missing.nc\n")


def test_note_of_a_block(ncid: int) -> None:
    assert note_of(failure(nc.get_vara_double, ncid, 5, [0, 0], [4, 1])) == [
        f"in get_vara_double(ncid={ncid}, varid=5, start=[0, 0], count=[4, 1])",
        f"ncid {ncid}: opened as '{Path.cwd()}/sample.nc'",
        "varid 5: double double(x=3, y=2)"]


def test_note_of_records(ncid: int) -> None:
    assert note_of(failure(nc.get_var1_double, ncid, 6, [2]))[2] == (
        "varid 6: double series(time=2 unlimited)")


def test_note_of_single_value(ncid: int) -> None:
    nc.redef(ncid)
    varid = nc.def_var(ncid, "single", 6, [])
    assert note_of(failure(nc.get_var1_double, ncid, varid, [0]))[2] == (
        "varid 7: double single, a single value")


def test_note_of_what_was_not_found(ncid: int) -> None:
    assert note_of(failure(nc.inq_varid, ncid, "Series"))[2:] == [
        "variables: byte, char, short, int, float, double, series"]
    assert note_of(failure(nc.inq_var, ncid, 99))[2:] == [
        "variables: byte, char, short, int, float, double, series"]
    assert note_of(failure(nc.inq_dimid, ncid, "X"))[2:] == [
        "dimensions: x=3, y=2, time=2 unlimited"]
    assert note_of(failure(nc.get_att_text, ncid, -1, "units"))[2:] == [
        "varid -1: the dataset itself", "attributes: title"]
    assert note_of(failure(nc.get_att_text, ncid, 6, "units"))[2:] == [
        "varid 6: double series(time=2 unlimited)", "there are no attributes"]


def test_note_of_many_names(ncid: int) -> None:
    nc.redef(ncid)
    for i in range(13):
        nc.def_dim(ncid, f"d{i}", 1)
    line = note_of(failure(nc.inq_dimid, ncid, "nothing"))[2]
    assert line.startswith("dimensions: x=3, y=2, time=2 unlimited, d0=1") and line.endswith(
        "d8=1 and 4 more")


def test_note_of_dimensions(ncid: int) -> None:
    assert note_of(failure(nc.rename_dim, ncid, 1, "x"))[2:] == ["dimid 1: y=2"]
    nc.redef(ncid)
    assert note_of(failure(nc.def_var, ncid, "series", 6, [0, 2]))[2:] == [
        "dimid 0: x=3", "dimid 2: time=2 unlimited"]
    assert note_of(failure(nc.def_var, ncid, "new", 6, [2, 0]))[2:] == [
        "dimid 2: time=2 unlimited", "dimid 0: x=3"]


def test_note_of_two_datasets(ncid: int) -> None:
    other = tessel.sample.dataset(nc, "other.nc")
    lines = note_of(failure(nc.copy_att, ncid, -1, "nothing", other, 6))
    assert lines[1:] == [
        f"ncid_in {ncid}: opened as '{Path.cwd()}/sample.nc'", "varid_in -1: the dataset itself",
        f"ncid_out {other}: opened as '{Path.cwd()}/other.nc'",
        "varid_out 6: double series(time=2 unlimited)"]
    nc.close(other)


def test_note_of_an_id_that_is_not_open(ncid: int) -> None:
    nc.close(ncid)
    for error in (failure(nc.inq, ncid), failure(nc.close, ncid), failure(nc, "abort", ncid)):
        assert note_of(error)[1:] == [
            f"ncid {ncid}: no dataset that was opened here is known by this id"]


@pytest.mark.parametrize("opening", [
    lambda: nc.open("sample.nc", "NOWRITE"), lambda: nc.nc__open("sample.nc", 0, 0).ncid,
    lambda: nc.create("sample.nc", "CLOBBER"), lambda: nc._create("sample.nc", 0, 0, 0).ncid,
    lambda: int(nc("open", "sample.nc", "NOWRITE").item()),
    lambda: int(nc("NC__Open", "sample.nc", "NOWRITE", 0)[1].item()),
    lambda: nc.open(Path("sample.nc"), "NOWRITE")])
@pytest.mark.parametrize("ending", [nc.close, nc.abort, lambda ncid: nc("Close", ncid),
                                    lambda ncid: nc.nc_close(numpy.array([[ncid]], float))])
def test_paths_are_remembered_while_open(ncid: int, opening: typing.Callable[[], int],
                                         ending: typing.Callable[[int], object]) -> None:
    nc.close(ncid)
    before = dict(netcdf._opened)
    made = opening()
    assert netcdf.path_of(made) == f"{Path.cwd()}/sample.nc"
    failure(nc.open, "missing.nc", "NOWRITE")
    ending(made)
    assert netcdf.path_of(made) is None and netcdf._opened == before


def test_nothing_is_remembered_of_what_failed(ncid: int) -> None:
    before = dict(netcdf._opened)
    failure(nc.open, "missing.nc", "NOWRITE")
    failure(nc.close, 99)
    failure(nc.close, [])
    failure(nc, "close")
    failure(nc, "open", "missing.nc")
    assert netcdf._opened == before and netcdf.path_of(ncid) == f"{Path.cwd()}/sample.nc"


def test_paths_stay_true_in_another_folder(ncid: int, tmp_path: Path,
                                           monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.chdir("/")
    error = failure(nc.inq_varid, ncid, "nothing")
    assert note_of(error)[1] == f"ncid {ncid}: opened as '{tmp_path}/sample.nc'"
    assert error.path == f"{tmp_path}/sample.nc"


@pytest.mark.parametrize("given, taken", [
    (" \t\x01sample.nc", "sample.nc"), ("sample.nc\0more", "sample.nc"),
    (b"  gr\xf6\xdfe.nc", "größe.nc"), (Path(" größe.nc"), "größe.nc")])
def test_the_call_form_tells_the_file_that_the_library_takes(
        ncid: int, given: typing.Any, taken: str) -> None:
    """It skips blanks and ends at a NUL, and a byte is a character."""
    error = failure(nc, "open", given, 64)
    nc.close(ncid)
    if taken != "sample.nc":
        os.rename("sample.nc", taken)
        assert failure(nc, "create", given, "NOCLOBBER").path == f"{Path.cwd()}/{taken}"
    opened = int(nc("open", given, "NOWRITE").item())
    assert netcdf.path_of(opened) == f"{Path.cwd()}/{taken}"
    nc.close(opened)
    assert error.path == f"{Path.cwd()}/{taken}"


@pytest.mark.parametrize("path", ["", " ", b""])
def test_no_path_is_no_file(path: typing.Any) -> None:
    """And least of all the current folder."""
    error = failure(nc, "open", path, "NOWRITE")
    assert error.path is None and len(note_of(error)) == 1
    assert failure(tessel.read, "", "v").path is None


def test_a_folder_that_is_gone(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """There is no path from the root on, and no other error because of that."""
    gone = tmp_path / "gone"
    gone.mkdir()
    monkeypatch.chdir(gone)
    gone.rmdir()
    assert netcdf._place("sample.nc") == "sample.nc"
    assert failure(nc.open, "sample.nc", "NOWRITE").word == "noSuchFileOrDirectory"


@pytest.mark.parametrize("call, path", [
    (lambda n, m: nc.open("missing.nc", "NOWRITE"), "missing.nc"),
    (lambda n, m: nc.create("missing/new.nc", 0), "missing/new.nc"),
    (lambda n, m: nc.inq_varid(n, "nothing"), "sample.nc"),
    (lambda n, m: nc.copy_att(n, -1, "nothing", m, -1), "other.nc"),
    (lambda n, m: nc.put_var1_int(n, 3, [0, 0], 0.5), "sample.nc"),
    (lambda n, m: nc.inq(99), None), (lambda n, m: nc.param("nothing"), None),
    (lambda n, m: nc.open("http://[", "NOWRITE"), None)])
def test_path_of_an_error(ncid: int, call: typing.Callable[[int, int], object],
                          path: str | None) -> None:
    other = tessel.sample.dataset(nc, "other.nc")
    error = failure(call, ncid, other)
    assert error.path == (path and f"{Path.cwd()}/{path}")
    nc.close(other)


def test_names_from_files_cannot_steer_a_terminal(ncid: int) -> None:
    path = Path("evil\033[2J.nc")
    nc.close(tessel.sample.dataset(nc, "other.nc"))
    path.write_bytes(Path("other.nc").read_bytes().replace(b"double", b"\033[31m\x07").replace(
        b"series", b"\xc2\x9b31m\r"))
    evil = nc.open(path, "NOWRITE")
    for error in (failure(nc.get_var1_double, evil, 5, [9, 9]), failure(nc.inq_varid, evil, "no"),
                  failure(nc.get_var1_double, evil, 6, [9]),
                  failure(nc.create, path, "NOCLOBBER")):
        shown = "".join(traceback.format_exception_only(error))
        assert "evil" in shown
        assert not re.search(r"[\x00-\x09\x0b-\x1f\x7f-\x9f]", shown)
    assert "evil\\x1b[2J.nc" in error.__notes__[0]
    nc.close(evil)


def test_a_file_is_named_once() -> None:
    """Also one whose name is shown with escapes."""
    for name in ("missing.nc", "evil\033[2J.nc"):
        told = "\n".join(failure(tessel.read, name, "v").__notes__)
        assert told.count("file: ") == 1


def test_an_id_used_again_keeps_its_new_path(monkeypatch: pytest.MonkeyPatch) -> None:
    """Another thread may open a file between the end of a call of close and its record."""
    monkeypatch.setitem(netcdf._opened, 7, ("/the-same.nc",))
    known = netcdf._known(7)
    again = netcdf._remember("/the-same.nc", 7)
    netcdf._forget(known, None)
    assert netcdf.path_of(again) == "/the-same.nc"
    netcdf._forget(netcdf._known(7.0), None)
    assert netcdf.path_of(7) is None


@pytest.mark.parametrize("value, shown", [
    (3, "3"), ("a'b", '"a\'b"'), (b"ab", "b'ab'"), (None, "None"), ([1, 2], "[1, 2]"),
    ("x" * 61, "'" + "x" * 60 + "'... (61 characters)"), (list(range(13)), "<list of 13>"),
    (tuple(range(13)), "<tuple of 13>"), (numpy.array([[2.0]]), "2.0"),
    (numpy.arange(3), "<int64 array of shape (3,): [0, 1, 2]>"),
    (numpy.zeros((20, 30), "f4"), "<float32 array of shape (20, 30)>"),
    (numpy.zeros((0, 3)), "<float64 array of shape (0, 3)>"),
    (["x" * 70], "['" + "x" * 22 + "..." + "x" * 23 + "']"),
    ([[1, 2], (3,)], "[[1, 2], (3,)]"), ([[[5]]], "[[[...]]]"), ({"a": [1]}, "{'a': [1]}"),
    (xarray.Dataset({"a": ("x", [1] * 9)}), "<Dataset (x: 9)>"),
    ([xarray.DataArray([[1], [2]])], "[<DataArray (dim_0: 2, dim_1: 1)>]"),
    (xarray.Dataset({f"v{i}": (f"x{i}", [1]) for i in range(9)}),
     "<Dataset (x0: 1, x1: 1, x2: 1, x3: 1, x4: 1, x5: 1, x6: 1, x..."),
    ([numpy.eye(2)], "[array([[1., 0.], [0., 1.]])]"),
    pytest.param(10**10000, "<int of 33220 bits>", id="no int that Python writes"),
    pytest.param([10**10000], "[<int of 33220 bits>]", id="a list of such"),
    (numpy.array([[1] * 99, None], object), "<object array of shape (2,): "
     "[[1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, ...], None]>")], ids=lambda each: None)
def test_arguments_are_shortened(value: object, shown: str) -> None:
    assert wording.abridged(value) == shown


class Counted(str):
    """A text that counts how often it was written."""

    written = 0

    def __repr__(self) -> str:
        Counted.written += 1
        return "x"


@pytest.mark.parametrize("large", [
    [[Counted()] * 10**6], ([Counted()] * 10**6,), {"a": [Counted()] * 10**6},
    {i: Counted() for i in range(10**5)}, [[[Counted()] * 10**3] * 10**3]], ids=lambda each: None)
def test_a_large_argument_is_never_written_whole(large: object) -> None:
    Counted.written = 0
    assert len(wording.abridged(large)) <= 63
    assert Counted.written < 200


def test_note_of_unknown_operation_and_surplus_arguments() -> None:
    assert note_of(failure(nc, "nothing", 1, "x")) == ["in nothing(1, 'x')"]
    assert note_of(failure(nc, "inq", 99, "x"))[0] == "in inq(ncid=99, 'x')"
    other = Path("other.tsx")
    other.symlink_to(nc.file)
    assert note_of(failure(tessel.load(other), "inq", 99)) == ["in inq(99)"]


def test_notes_never_replace_the_error(ncid: int, monkeypatch: pytest.MonkeyPatch) -> None:
    class Awkward:
        """A value that cannot even be shown."""

        def __repr__(self) -> str:
            raise RuntimeError("no")

    error = failure(nc.inq, Awkward())
    assert error.word == "unsupportedType"
    assert note_of(error)[0].startswith("in inq(ncid=<Awkward instance at ")
    monkeypatch.setattr(notes, "_lines", lambda *given: 1 / 0)
    assert failure(nc.inq_var, ncid, 99).word == "variableNotFound"


def test_notes_ask_without_end_neither_in_threads(ncid: int) -> None:
    """An inquiry for a note that fails makes no note of its own, in any thread."""
    asked: list[Error] = []

    def ask() -> None:
        for _ in range(50):
            asked.append(failure(nc.get_var1_double, ncid, 99, [0]))

    threads = [threading.Thread(target=ask) for _ in range(4)]
    for each in threads:
        each.start()
    for each in threads:
        each.join()
    assert len(asked) == 200 and len({tuple(note_of(each)) for each in asked}) == 1


def test_success_makes_no_notes(ncid: int, monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.setattr(notes, "explain", lambda *given: pytest.fail("a note for no error"))
    nc.get_var_double(ncid, 5)
    nc("inq", ncid)


# Files that are no datasets.

@pytest.mark.parametrize("mode", [None, "BAD", [], 0x8000])
def test_a_file_is_not_blamed_for_the_arguments(ncid: int, mode: typing.Any) -> None:
    assert note_of(failure(nc.open, "sample.nc", mode))[1:] == [f"file: {Path.cwd()}/sample.nc"]


def test_a_file_is_not_blamed_for_what_the_system_refuses(ncid: int) -> None:
    error = Error("TESSEL:netcdf:open:permissionDenied", "m")
    notes.explain(error, nc, ("open", "sample.nc", "WRITE"))
    assert note_of(error)[1:] == [f"file: {Path.cwd()}/sample.nc"]


def file_note(content: bytes) -> list[str]:
    """What the note says about such a file."""
    Path("some.nc").write_bytes(content)
    error = failure(nc.open, "some.nc", "NOWRITE")
    lines = note_of(error)
    assert lines[:2] == ["in open(path='some.nc', mode='NOWRITE')", f"file: {Path.cwd()}/some.nc"]
    assert lines == note_of(failure(nc._open, "some.nc", "NOWRITE", 0))[:0] + lines
    return lines[2:]


HDF5 = b"\x89HDF\r\n\x1a\n"
FILES: dict[str, tuple[bytes, str]] = {
    "empty": (b"", "it is empty"),
    "cut off mark": (b"CD", "it was cut off after 2 bytes"),
    "cut off HDF5 mark": (HDF5[:5], "it was cut off after 5 bytes"),
    "HDF5 cut off": (HDF5 + b"\0\0\0\0\0\x08\x08" + bytes(25) + (2000).to_bytes(8, "little"),
                     "it is an HDF5 file that was cut off: 48 of 2000 bytes are there"),
    "HDF5 damaged": (HDF5 + b"\xff" * 100, "it begins like an HDF5 file (as netCDF-4 files do), "
                                           "and is damaged or no dataset (108 bytes)"),
    "gzip": (gzip.compress(b"CDF\x01", mtime=0), "it is compressed by gzip: decompress it first "
                                                 "(gunzip) (24 bytes)"),
    "bzip2": (b"BZh9" + b"1" * 8, "it is compressed by bzip2: decompress it first (bunzip2) "
                                  "(12 bytes)"),
    "zip": (b"PK\x03\x04" + bytes(20), "it is a zip archive: unpack it first (24 bytes)"),
    "tar": (b"name" + bytes(253) + b"ustar" + bytes(100), "it is a tar archive: unpack it first "
                                                          "(362 bytes)"),
    "GRIB": (b"GRIB" + bytes(30), "it is a GRIB file (34 bytes)"),
    "HTML": (b"\n<!DOCTYPE html>\n<p>404", "it is a web page, perhaps what a server said instead "
                                            "of the file"),
    "HTML without a type": (b"<HTML><body>", "it is a web page, perhaps what a server said instead "
                                             "of the file"),
    "text form": (b"netcdf sample {\n}", "it is the text form of a dataset: make a file of it "
                                         "first (ncgen)"),
    "text": (b"lon,lat\n1,2\n", "it is text that begins with 'lon,lat'"),
    "long text": ("é".encode() * 400, "it is text that begins with '" + "é" * 40 + "...'"),
    "zeros": (bytes(100), "it begins with zeros only (100 bytes): perhaps nothing was ever written "
                          "to it"),
    "unknown": (b"\xde\xad\xbe\xef" * 10, "it begins with the bytes de ad be ef de ad be ef, which "
                                          "is no format known here"),
}


@pytest.mark.parametrize("content, what", FILES.values(), ids=FILES.keys())
def test_what_a_file_is_instead(content: bytes, what: str) -> None:
    assert file_note(content) == [what]


def test_a_dataset_that_was_cut_off(ncid: int) -> None:
    nc.close(ncid)
    assert file_note(Path("sample.nc").read_bytes()[:60]) == [
        "it begins like a netCDF file of the classic format, and what follows is damaged or cut "
        "off (60 bytes)"]


@pytest.mark.parametrize("offset, mark, what", beginning.FORMATS)
def test_every_mark(offset: int, mark: bytes, what: str) -> None:
    first = b"\xff" * offset + mark + b"\xff" * 9
    wrong = beginning.REFUSED.get(mark, "")
    assert beginning.recognised(first, len(first)) == f"{what}{wrong} ({len(first)} bytes)"
    assert beginning.recognised(first, len(first), False) == f"{what} ({len(first)} bytes)"
    assert bool(wrong) == ("netCDF" in what)


@pytest.mark.parametrize("mark, what", beginning.TEXTS)
def test_every_text(mark: bytes, what: str) -> None:
    assert beginning.recognised(b"\xef\xbb\xbf " + mark.upper(), 30) == what


@pytest.mark.parametrize("version, start", [(0, 40), (1, 44), (2, 28), (3, 28)])
def test_ends_of_hdf5(version: int, start: int) -> None:
    """The field is where the version of the superblock has it."""
    block = bytearray(HDF5 + bytes([version]) + bytes(60))
    block[9 if version > 1 else 13] = 8
    block[start:start + 8] = (10**6).to_bytes(8, "little")
    cut = beginning.recognised(bytes(block), 69)
    assert cut == "is an HDF5 file that was cut off: 69 of 1000000 bytes are there"
    assert "cut off: " not in beginning.recognised(bytes(block), 10**6)
    assert "cut off: " not in beginning.recognised(bytes(block[:start + 4]), 10)


def test_notes_of_paths_that_are_no_files() -> None:
    Path("link.nc").symlink_to("nowhere")
    assert note_of(failure(nc.open, "link.nc", "NOWRITE"))[2:] == [
        "it is a link to nowhere, which is not there"]
    assert note_of(failure(nc.open, "a/b/c.nc", "NOWRITE"))[2:] == [
        f"there is no folder {Path.cwd()}/a"]
    assert note_of(failure(nc.create, "a/c.nc", "CLOBBER"))[2:] == [
        f"there is no folder {Path.cwd()}/a"]
    assert note_of(failure(nc.open, ".", "WRITE"))[2:] == ["it is a folder"]
    assert note_of(failure(nc.open, "missing.nc", "NOWRITE"))[2:] == []
    assert note_of(failure(nc.open, 5, "NOWRITE"))[1:] == []


def test_a_pipe_is_not_read(monkeypatch: pytest.MonkeyPatch) -> None:
    """It would wait for a writer."""
    os.mkfifo("pipe.nc")
    error = Error("TESSEL:netcdf:open:notANetcdfFile", "m")
    notes.explain(error, nc, ("open", "pipe.nc", "NOWRITE"))
    assert note_of(error)[1:] == [f"file: {Path.cwd()}/pipe.nc"]
