# tests/python/test_transfer.py: reading and copying in blocks, and what is left when that fails.
"""tessel.read and tessel.copy: right values, bounded memory, exact progress, no half a file."""

from __future__ import annotations

import errno
import io
import itertools
import math
import os
import signal
import subprocess
import sys
import tempfile
import textwrap
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

import numpy as np
import pytest
import tessel
from made_files import (EVERYTHING, MIB, NOFILL, OFFSET64, generate, netcdf, open_descriptors,
                        run_tool, sparse)
from tessel.dataset import Dataset
from tessel.terminal import ProgressBar
from tessel.transfer import blocks

BLOCK_SIZES = [1, 7, 40, 100, 1000, 16 * MIB]
FORMATS = {"classic": "classic", "64bit-offset": "64-bit offset"}


@pytest.fixture(name="everything", params=["classic", "64-bit offset"])
def everything_fixture(request, tmp_path) -> str:
    return generate(tmp_path / "everything.nc", EVERYTHING, request.param)


def same(one: object, other: object) -> bool:
    """Whether two results of the module are equal in everything, NaN and zeros' signs included."""
    if isinstance(one, str) or isinstance(other, str):
        return one == other
    return (one.dtype, one.shape, one.tobytes("F")) == (other.dtype, other.shape,
                                                        other.tobytes("F"))


def dump(path: str | Path) -> str:
    """All of a file as text."""
    return run_tool("ncdump", "-n", "name", "-p", "9,17", path)


def names_in(path: str) -> list[str]:
    with Dataset(path) as dataset:
        return list(dataset.variables)


def identifier_of(call) -> str:
    with pytest.raises(tessel.Error) as raised:
        call()
    return raised.value.identifier


# Blocks

@pytest.mark.parametrize("shape", [(), (1,), (7,), (2, 3), (3, 1, 4), (1, 1, 5), (4, 3, 2, 2), (0,),
                                   (3, 0, 2)])
@pytest.mark.parametrize("most", [1, 2, 3, 5, 6, 12, 100])
def test_blocks_cover_everything_once_and_in_order(shape, most):
    places = np.arange(math.prod(shape)).reshape(shape)
    seen = []
    for start, count in blocks(shape, most):
        assert 0 < math.prod(count) <= most
        seen += places[tuple(slice(a, a + n) for a, n in zip(start, count))].ravel().tolist()
    assert seen == list(range(math.prod(shape)))


def test_a_block_is_never_smaller_than_a_value():
    assert list(blocks((2,), 0)) == [([0], [1]), ([1], [1])]


# Reading

@pytest.mark.parametrize("block_bytes", BLOCK_SIZES)
def test_read_is_what_the_module_reads(everything, block_bytes):
    ncid = netcdf("open", everything, "NOWRITE")
    for name in names_in(everything):
        varid = netcdf("inq_varid", ncid, name)
        member = {1: "schar", 2: "text", 3: "short", 4: "int", 5: "float", 6: "double"}[
            int(netcdf("inq_var", ncid, varid)[1][0, 0])]
        expected = netcdf(f"get_var_{member}", ncid, varid)
        assert same(tessel.read(everything, name, block_bytes=block_bytes), expected), name
    netcdf("close", ncid)


@pytest.mark.parametrize("block_bytes", [1, 30, 16 * MIB])
def test_selections(everything, block_bytes):
    whole = tessel.read(everything, "r3")
    text = tessel.read(everything, "rtext")
    assert whole.shape == (5, 3, 3)
    for start in itertools.product(range(5), range(3), range(3)):
        rest = whole[tuple(slice(each, None) for each in start)]
        assert same(tessel.read(everything, "r3", start, block_bytes=block_bytes), rest)
    for start, count in [((1, 0, 2), (3, 2, 1)), ((0, 1, 0), (5, 1, 3)), ((4, 2, 2), (1, 1, 1)),
                         ((5, 3, 3), (0, 0, 0)), ((0, 0, 0), (5, 0, 3))]:
        where = tuple(slice(a, a + n) for a, n in zip(start, count))
        for name, values in (("r3", whole), ("rtext", text)):
            assert same(tessel.read(everything, name, start, count, block_bytes=block_bytes),
                        values[where])


def test_selections_of_text_that_are_one_row(everything):
    expected = "".join(tessel.read(everything, "text")[1, :])
    for block_bytes in BLOCK_SIZES:
        assert tessel.read(everything, "text", (1, 0), (1, 3), block_bytes=block_bytes) == expected


@pytest.mark.parametrize(("start", "count", "word"), [
    ((0, 0), None, "badStartLength"),
    ((0, 0, 0), (1, 1), "badCountLength"),
    (None, (1,), "badCountLength"),
    ((0, 0, 1), (5, 3, 3), "indexExceedsDimensionBound"),
    ((6, 0, 0), None, "indexExceedsDimensionBound"),
    ((-1, 0, 0), (1, 1, 1), "indexExceedsDimensionBound"),
    ((0, 0, 0), (1, -1, 1), "indexExceedsDimensionBound"),
    (None, (10**12, 10**12, 10**12), "indexExceedsDimensionBound"),
])
def test_bad_selections(everything, start, count, word):
    assert identifier_of(lambda: tessel.read(everything, "r3", start, count)) == \
        f"TESSEL:python:{word}"


WRONG_TYPES = {
    # how it is called: what is wrong with it, and the message
    "start of fractions": (lambda f, g: tessel.read(f, "r3", (0.5, 0, 0)),
                           "each element of start is a whole number, not of the type float."),
    "count of texts": (lambda f, g: tessel.read(f, "r3", None, ("1", 1, 1)),
                       "each element of count is a whole number, not of the type str."),
    "start is one number": (lambda f, g: tessel.read(f, "r2", 1),
                            "start is a sequence of whole numbers, not of the type int."),
    "size of blocks in words": (lambda f, g: tessel.read(f, "r3", block_bytes="1 MiB"),
                                "block_bytes is a whole number, not of the type str."),
    "size of blocks in fractions": (lambda f, g: tessel.copy(f, g, block_bytes=1e6),
                                    "block_bytes is a whole number, not of the type float."),
    "out is a list": (lambda f, g: tessel.read(f, "r3", out=[]),
                      "out is an array of NumPy's, not of the type list."),
    "progress is a number": (lambda f, g: tessel.copy(f, g, progress=5),
                             "progress is a function of two numbers, not of the type int."),
    "source is a number": (lambda f, g: tessel.copy(5, g),
                           "A path is a str, bytes or a path object, not of the type int."),
    "target is nothing": (lambda f, g: tessel.copy(f, None),
                          "A path is a str, bytes or a path object, not of the type NoneType."),
}


@pytest.mark.parametrize(("call", "message"), WRONG_TYPES.values(), ids=WRONG_TYPES.keys())
def test_wrong_types(everything, tmp_path, call, message):
    with pytest.raises(TypeError) as raised:
        call(everything, tmp_path / "copy.nc")
    assert raised.value.identifier == "TESSEL:python:unsupportedType"
    assert raised.value.message == message
    assert raised.value.operation in ("read", "copy")
    assert os.listdir(tmp_path) == ["everything.nc"]


@pytest.mark.parametrize("maker", [tessel.progress_bar, ProgressBar])
def test_what_makes_a_progress_bar_stands_for_one(everything, tmp_path, monkeypatch, maker):
    shown = io.StringIO()
    monkeypatch.setattr(shown, "isatty", lambda: True)
    monkeypatch.setattr(sys, "stderr", shown)
    tessel.copy(everything, tmp_path / "copy.nc", progress=maker)
    assert shown.getvalue().count("100 %") == 1
    assert same(tessel.read(tmp_path / "copy.nc", "r3", progress=maker),
                tessel.read(everything, "r3"))
    assert shown.getvalue().count("100 %") == 2


def test_numbers_may_be_of_any_class(everything):
    expected = tessel.read(everything, "r3", (1, 0, 0), (2, 1, 3))
    assert same(tessel.read(everything, "r3", np.array([1, 0, 0]), iter([2, 1, np.int8(3)]),
                            block_bytes=np.int16(40)), expected)


@pytest.mark.parametrize("form", [bytes, Path, str])
def test_paths_of_every_kind(everything, tmp_path, monkeypatch, form):
    """A name beyond ASCII is the same file in each, and one that begins with a blank too."""
    monkeypatch.chdir(tmp_path)
    for name in ("größe.nc", " blank.nc"):
        given = os.fsencode(name) if form is bytes else form(name)
        tessel.copy(everything, given)
        assert sorted(os.listdir(tmp_path)) == sorted(["everything.nc", name])
        assert same(tessel.read(given, "r3"), tessel.read(everything, "r3"))
        assert tessel.check(given) == tessel.check(tmp_path / name)
        tessel.copy(given, os.fsencode(tmp_path / "back.nc") if form is bytes else "back.nc")
        assert dump("back.nc") == dump(everything)
        os.unlink("back.nc")
        os.unlink(name)


@pytest.mark.parametrize("path", [b"\xff.nc", "a\0.nc", b"\xff/a.nc"])
def test_paths_that_the_module_would_take_for_others(everything, tmp_path, path, monkeypatch):
    monkeypatch.chdir(tmp_path)
    os.mkdir(b"\xff")
    for call in (lambda: tessel.copy(everything, path), lambda: tessel.copy(path, "copy.nc"),
                 lambda: tessel.read(path, "r3"), lambda: tessel.check(path)):
        assert identifier_of(call) == "TESSEL:python:badPath"
    assert identifier_of(lambda: tessel.copy(everything, "")) == "TESSEL:python:badPath"
    monkeypatch.chdir(b"\xff")
    assert identifier_of(lambda: tessel.copy(everything, "copy.nc")) == "TESSEL:python:badPath"
    assert len(os.listdir(tmp_path)) == 2


def test_read_errors_are_the_modules(everything, tmp_path):
    assert identifier_of(lambda: tessel.read(everything, "missing")) == \
        "TESSEL:netcdf:inqVarID:variableNotFound"
    assert identifier_of(lambda: tessel.read(tmp_path / "missing.nc", "a")) == \
        "TESSEL:netcdf:open:noSuchFileOrDirectory"
    assert identifier_of(lambda: tessel.read(everything, "r3", block_bytes=0)) == \
        "TESSEL:python:badBlockSize"


@pytest.mark.parametrize("block_bytes", [50, 16 * MIB])
def test_read_into_an_array(everything, tmp_path, block_bytes):
    expected = tessel.read(everything, "r3")
    out = np.memmap(tmp_path / "out", float, "w+", shape=expected.shape, order="F")
    assert tessel.read(everything, "r3", out=out, block_bytes=block_bytes) is out
    assert same(np.asarray(out), expected)
    library_order = np.zeros(expected.shape[::-1])
    tessel.read(everything, "r3", out=library_order.T, block_bytes=block_bytes)
    assert same(library_order.T, expected)
    text = np.zeros((5, 1), "U1")
    tessel.read(everything, "word", out=text)
    assert text.tobytes().decode("utf-32-le") == "a b\0\0"
    out.flags.writeable = False
    assert identifier_of(lambda: tessel.read(everything, "r3", out=out)) == \
        "TESSEL:python:readOnlyArray"
    assert identifier_of(lambda: tessel.read(everything, "r3", out=np.empty((5, 3)))) == \
        "TESSEL:python:badShape"
    assert identifier_of(lambda: tessel.read(everything, "r3", out=np.empty((5, 3, 3), "f4"))) == \
        "TESSEL:python:unsupportedDtype"


def test_types_beyond_the_classic_ones(tmp_path):
    path = generate(tmp_path / "new.nc", """dimensions: x = 3 ;
        variables: int64 a(x) ; uint64 b(x) ; uint c(x) ; ushort d(x) ; ubyte e(x) ; string f(x) ;
        data: a = -9007199254740991, 0, 9007199254740991 ; b = 1, 2, 9007199254740993 ;
            c = 1, 2, 4294967295 ; d = 1, 2, 65535 ; e = 1, 2, 255 ; f = "a", "b", "c" ;""",
                    "netCDF-4")
    for block_bytes in (8, 16 * MIB):
        read = {name: tessel.read(path, name, block_bytes=block_bytes) for name in "acde"}
        assert {name: (str(each.dtype), each.ravel().tolist()) for name, each in read.items()} == {
            "a": ("float64", [-(2**53 - 1), 0, 2**53 - 1]), "c": ("float64", [1, 2, 2**32 - 1]),
            "d": ("int32", [1, 2, 65535]), "e": ("uint8", [1, 2, 255])}
        assert identifier_of(lambda: tessel.read(path, "b", block_bytes=block_bytes)) == \
            "TESSEL:python:notExact"
        assert identifier_of(lambda: tessel.read(path, "f", block_bytes=block_bytes)) == \
            "TESSEL:netcdf:getVara:attemptToConvertBetweenTextAndNumbers"


@pytest.mark.parametrize(("block_bytes", "calls"), [
    (16 * MIB, [0, 360]), (360, [0, 360]), (359, [0, 240, 360]), (120, [0, 120, 240, 360]),
    (80, [0, 80, 120, 200, 240, 320, 360]), (8, list(range(0, 361, 8)))])
def test_progress_of_reading(everything, block_bytes, calls):
    told = []
    tessel.read(everything, "r3", block_bytes=block_bytes,
                progress=lambda done, total: told.append((done, total)))
    assert told == [(done, 360) for done in calls]


# Copying

@pytest.mark.parametrize("target_format", FORMATS)
@pytest.mark.parametrize("block_bytes", BLOCK_SIZES)
def test_copy_is_equal(everything, tmp_path, target_format, block_bytes):
    target = tmp_path / "copy.nc"
    tessel.copy(everything, target, target_format, block_bytes=block_bytes)
    assert dump(target) == dump(everything)
    for name in names_in(everything):
        assert same(tessel.read(target, name), tessel.read(everything, name)), name
    assert run_tool("ncdump", "-k", target).strip() == FORMATS[target_format]
    assert tessel.check(target) <= target.stat().st_size <= tessel.check(target) + 3


def test_copy_keeps_the_format_unless_told_otherwise(everything, tmp_path):
    target = tmp_path / "copy.nc"
    tessel.copy(everything, target)
    assert target.read_bytes()[:4] == Path(everything).read_bytes()[:4]
    back, again = tmp_path / "back.nc", tmp_path / "again.nc"
    tessel.copy(target, back, "64bit-offset")
    tessel.copy(back, again, "classic")
    tessel.copy(everything, target, "classic", overwrite=True)
    assert again.read_bytes() == target.read_bytes()


@pytest.mark.parametrize("cdl", [
    "", "dimensions: x = 3 ;", "dimensions: r = UNLIMITED ; variables: int a(r) ;",
    'variables: double s ; :note = "none" ; data: s = 5 ;',
    "dimensions: r = UNLIMITED ; variables: byte a(r) ; data: a = 1, 2, 3, 4, 5 ;",
    "dimensions: x = 3 ; r = UNLIMITED ; variables: short a(r, x) ; data: a = 1, 2, 3, 4, 5, 6 ;",
    "dimensions: größe = 2 ; variables: int überall(größe) ; überall:maß = 1 ; "
    "data: überall = 1, 2 ;"])
@pytest.mark.parametrize("target_format", FORMATS)
def test_copy_of_small_schemas(tmp_path, cdl, target_format):
    source = generate(tmp_path / "small.nc", cdl.encode().decode("latin-1"))
    target = tmp_path / "copy.nc"
    tessel.copy(source, target, target_format)
    assert dump(target) == dump(source)


def test_copy_of_real_files(tmp_path):
    folder = Path(subprocess.run(["dpkg", "-L", "ferret-datasets"], capture_output=True, check=True,
                                 text=True).stdout.split("/coads_climatology.cdf")[0].split()[-1])
    for name in ("coads_climatology.cdf", "ocean_atlas_subset.nc"):
        there, back = tmp_path / "there.nc", tmp_path / "back.nc"
        tessel.copy(folder / name, there, "64bit-offset", block_bytes=MIB)
        tessel.copy(there, back, "classic", block_bytes=100000)
        assert back.read_bytes() == (folder / name).read_bytes()
        there.unlink()
        back.unlink()


def test_progress_of_copying(everything, tmp_path):
    total = sum({"float": 4, "byte": 1, "char": 1, "double": 8, "short": 2, "int": 4}[kind] * many
                for kind, many in [("float", 15), ("byte", 15), ("char", 15), ("double", 1),
                                   ("short", 3), ("char", 5), ("char", 1), ("char", 45),
                                   ("int", 5), ("double", 45)])
    for number, block_bytes in enumerate(BLOCK_SIZES):
        told = []
        tessel.copy(everything, tmp_path / f"{number}.nc", block_bytes=block_bytes,
                    progress=lambda done, all: told.append((done, all)))
        assert {each[1] for each in told} == {total}
        done = [each[0] for each in told]
        assert (done[0], done[-1]) == (0, total)
        assert done == sorted(set(done))


@pytest.mark.parametrize("default", [1, 2, 3, 4])
@pytest.mark.parametrize(("form", "mark"), [("classic", b"CDF\1"), ("64bit-offset", b"CDF\2")])
def test_the_default_format_is_neither_used_nor_touched(everything, tmp_path, form, mark, default):
    before = netcdf("set_default_format", default)
    try:
        tessel.copy(everything, tmp_path / "copy.nc", form)
        assert (tmp_path / "copy.nc").read_bytes()[:4] == mark
        assert netcdf("set_default_format", default)[0, 0] == default
    finally:
        netcdf("set_default_format", before)


def test_what_the_format_cannot_hold(tmp_path):
    source = tmp_path / "large.nc"
    ncid = netcdf("create", source, OFFSET64)
    netcdf("set_fill", ncid, NOFILL)
    dimid = netcdf("def_dim", ncid, "x", 3 * 2**28)
    for name in ("a", "b"):
        netcdf("def_var", ncid, name, 4, dimid)
    netcdf("enddef", ncid)
    netcdf("put_var1_int", ncid, 1, 3.0 * 2**28 - 1, np.array([1], np.int32))
    netcdf("close", ncid)
    assert source.stat().st_size > 6 * 2**30 > source.stat().st_blocks * 512
    before = open_descriptors()
    assert identifier_of(lambda: tessel.copy(source, tmp_path / "classic.nc", "classic")) == \
        "TESSEL:netcdf:endDef:formatSizeConstraintsViolated"
    assert os.listdir(tmp_path) == ["large.nc"]
    assert open_descriptors() == before


def test_types_that_the_format_lacks(tmp_path):
    source = generate(tmp_path / "wide.nc", """dimensions: x = 2 ; variables: ubyte a(x) ;
        data: a = 1, 2 ;""", "cdf5")
    assert identifier_of(lambda: tessel.copy(source, tmp_path / "copy.nc", "classic")) == \
        "TESSEL:netcdf:invalidNetcdfDatatype"
    assert identifier_of(lambda: tessel.copy(source, tmp_path / "copy.nc")) == \
        "TESSEL:python:badFormat"
    assert os.listdir(tmp_path) == ["wide.nc"]


def test_other_sources_and_formats_are_refused(everything, tmp_path):
    source = generate(tmp_path / "new.nc", EVERYTHING, "netCDF-4")
    assert identifier_of(lambda: tessel.copy(source, tmp_path / "copy.nc")) == \
        "TESSEL:python:notAClassicFile"
    assert identifier_of(lambda: tessel.copy(everything, tmp_path / "copy.nc", "netCDF-4")) == \
        "TESSEL:python:badFormat"
    assert identifier_of(lambda: tessel.copy(tmp_path / "no.nc", tmp_path / "copy.nc")) == \
        "TESSEL:netcdf:open:noSuchFileOrDirectory"
    assert sorted(os.listdir(tmp_path)) == ["everything.nc", "new.nc"]


def test_records_that_no_variable_has(tmp_path):
    """The library counts them as the header does, and a copy could not."""
    source = Path(generate(tmp_path / "r.nc", "dimensions: r = UNLIMITED ; x = 2 ; "
                           "variables: int a(x) ; data: a = 1, 2 ;"))
    tessel.copy(source, tmp_path / "none.nc")
    data = bytearray(source.read_bytes())
    data[4:8] = (5).to_bytes(4, "big")
    source.write_bytes(data)
    with Dataset(source) as dataset:
        assert dataset.dimensions[0].length == 5
    with pytest.raises(ValueError) as raised:
        tessel.copy(source, tmp_path / "copy.nc")
    assert raised.value.identifier == "TESSEL:python:recordsWithoutVariables"
    assert "counts 5 records along r" in raised.value.message
    assert sorted(os.listdir(tmp_path)) == ["none.nc", "r.nc"]


# Notes

OWN = {
    # how it is called: the word, the function, and what a note says beside the call and the file
    "badStartLength": (lambda f, g: tessel.read(f, "r3", (0, 0)), "read",
                       "double r3(wide=5, high=3, record=3 unlimited)"),
    "badCountLength": (lambda f, g: tessel.read(f, "scalar", None, (1,)), "read",
                       "double scalar, a single value"),
    "indexExceedsDimensionBound": (lambda f, g: tessel.read(f, "r3", (9, 9, 9)), "read",
                                   "double r3(wide=5, high=3, record=3 unlimited)"),
    "badShape": (lambda f, g: tessel.read(f, "r2", out=np.empty(9)), "read",
                 "short r2(record=3 unlimited)"),
    "unsupportedDtype": (lambda f, g: tessel.read(f, "r2", out=np.empty((3, 1))), "read",
                         "short r2(record=3 unlimited)"),
    "badBlockSize": (lambda f, g: tessel.read(f, "r3", block_bytes=0), "read", None),
    "fileExists": (lambda f, g: tessel.copy(f, g.parent / "there.nc"), "copy", None),
    "sameFile": (lambda f, g: tessel.copy(f, f), "copy", None),
    "badFormat": (lambda f, g: tessel.copy(f, g, "netCDF-4"), "copy", None),
    "notARegularFile": (lambda f, g: tessel.copy(f, g.parent, overwrite=True), "copy", None),
}


@pytest.mark.parametrize(("word", "call", "function", "more"),
                         [(word, *row) for word, row in OWN.items()], ids=OWN.keys())
def test_notes_of_this_packages_errors(tmp_path, word, call, function, more):
    source = generate(tmp_path / "everything.nc", EVERYTHING)
    (tmp_path / "there.nc").touch()
    with pytest.raises(tessel.Error) as raised:
        call(source, tmp_path / "copy.nc")
    error = raised.value
    assert (error.identifier, error.operation) == (f"TESSEL:python:{word}", function)
    lines = "\n".join(error.__notes__).splitlines()
    assert [line for line in lines if line.startswith(f"in tessel.{function}(")]
    assert f"{'file' if function == 'read' else 'source'}: {source}" in lines
    if function == "copy":
        assert any(line.startswith(f"target: {tmp_path}") for line in lines)
    assert more is None or more in lines


def test_notes_of_the_modules_errors_say_what_they_were_for(everything):
    with pytest.raises(KeyError) as raised:
        tessel.read(everything, "nothing", [0])
    assert raised.value.operation == "inq_varid"
    first, last = raised.value.__notes__
    assert first.startswith("in inq_varid(ncid=")
    assert last.startswith("in tessel.read(path=") and "variable='nothing', start=[0])" in last


FAILING = {
    # how the copy fails, given its target: the arguments, and the folder that it is made in
    "no folder": ({}, "missing/copy.nc"),
    "a type that the format lacks": ({"format": "classic"}, "copy.nc"),
}


@pytest.mark.parametrize(("more", "name"), FAILING.values(), ids=FAILING.keys())
@pytest.mark.parametrize("relative", [False, True])
def test_notes_of_a_failed_copy_name_its_target(tmp_path, monkeypatch, more, name, relative):
    monkeypatch.chdir(tmp_path)
    source = generate(tmp_path / "wide.nc", "dimensions: x = 2 ; variables: ubyte a(x) ;", "cdf5")
    target = name if relative else str(tmp_path / name)
    with pytest.raises(tessel.Error) as raised:
        tessel.copy(source, target, **{"format": "64bit-offset", **more})
    error = raised.value
    notes = "\n".join(error.__notes__)
    assert ".part" not in notes + str(error.args) and f"{tmp_path}/{name}" in notes
    assert error.path == f"{tmp_path}/{name}"
    if isinstance(error, FileNotFoundError):
        assert error.filename == target
        assert f"there is no folder {tmp_path}/missing" in notes


def test_calls_in_notes_have_the_targets_name(everything):
    """In a folder whose name is short enough for the whole of the call to be shown."""
    with tempfile.TemporaryDirectory() as folder:
        target = f"{folder}/no/copy.nc"
        with pytest.raises(FileNotFoundError) as raised:
            tessel.copy(everything, target)
    assert raised.value.__notes__[0].startswith(f"in create(path={target!r}, cmode=")


def test_notes_of_a_failed_copy_after_a_change_of_folder(everything, tmp_path, monkeypatch):
    """A note is about the folder that the copy was asked for in."""
    monkeypatch.chdir(tmp_path)

    def leave(done, total):
        os.chdir("/")
        Path(tmp_path, "copy.nc").touch()

    with pytest.raises(tessel.Error) as raised:
        tessel.copy("everything.nc", "copy.nc", progress=leave)
    assert raised.value.path == f"{tmp_path}/copy.nc"
    assert f"\nsource: {tmp_path}/everything.nc\ntarget: {tmp_path}/copy.nc" in (
        raised.value.__notes__[-1])


# Targets

def test_a_target_is_kept_unless_told_otherwise(everything, tmp_path):
    target = tmp_path / "copy.nc"
    target.write_text("kept")
    assert identifier_of(lambda: tessel.copy(everything, target)) == "TESSEL:python:fileExists"
    assert target.read_text() == "kept"
    tessel.copy(everything, target, overwrite=True)
    assert dump(target) == dump(everything)
    assert sorted(os.listdir(tmp_path)) == ["copy.nc", "everything.nc"]


def test_a_target_that_appears_meanwhile_is_kept(everything, tmp_path):
    target = tmp_path / "copy.nc"
    assert identifier_of(lambda: tessel.copy(
        everything, target, progress=lambda *_: target.write_text("kept"))) == \
        "TESSEL:python:fileExists"
    assert target.read_text() == "kept"
    assert sorted(os.listdir(tmp_path)) == ["copy.nc", "everything.nc"]


@pytest.mark.parametrize("way", ["same name", "other spelling", "symbolic link", "hard link"])
@pytest.mark.parametrize("overwrite", [False, True])
def test_the_source_is_no_target(everything, tmp_path, way, overwrite):
    other = tmp_path / "other.nc"
    if way == "symbolic link":
        other.symlink_to(everything)
    elif way == "hard link":
        other.hardlink_to(everything)
    target = {"same name": everything,
              "other spelling": f"{tmp_path}/../{tmp_path.name}/./everything.nc"}.get(way, other)
    content = Path(everything).read_bytes()
    assert identifier_of(lambda: tessel.copy(everything, target, overwrite=overwrite)) == \
        "TESSEL:python:sameFile"
    assert Path(everything).read_bytes() == content


def test_a_link_stays_one(everything, tmp_path):
    folder = tmp_path / "folder"
    folder.mkdir()
    real, link = folder / "real.nc", tmp_path / "link.nc"
    real.write_text("old")
    link.symlink_to(real)
    assert identifier_of(lambda: tessel.copy(everything, link)) == "TESSEL:python:fileExists"
    tessel.copy(everything, link, overwrite=True)
    assert link.is_symlink()
    assert dump(real) == dump(everything)
    real.unlink()
    assert identifier_of(lambda: tessel.copy(everything, link)) == "TESSEL:python:fileExists"
    assert os.listdir(folder) == []


def test_a_link_to_itself_is_kept(everything, tmp_path):
    loop = tmp_path / "loop"
    loop.symlink_to("loop")
    with pytest.raises(OSError) as caught:
        tessel.copy(everything, loop, overwrite=True)
    assert (caught.value.errno, caught.value.filename) == (errno.ELOOP, str(loop))
    assert os.readlink(loop) == "loop"


@pytest.mark.parametrize("target", ["http://127.0.0.1:1/x.nc", "[mode=x]s3://b/x.nc",
                                    "file:///x.nc"])
def test_a_target_that_is_an_address(everything, target):
    with pytest.raises(tessel.Error) as caught:
        tessel.copy(everything, target)
    assert caught.value.identifier == "TESSEL:python:badPath"
    assert target in str(caught.value) and ".tessel-" not in str(caught.value)


def test_a_target_in_a_folder_like_an_address(everything, tmp_path, monkeypatch):
    monkeypatch.chdir(tmp_path)
    (tmp_path / "http:").mkdir()
    tessel.copy(everything, "./http://x.nc")
    assert dump(tmp_path / "http:" / "x.nc") == dump(everything)


def test_a_target_that_is_no_file(everything, tmp_path):
    folder, pipe = tmp_path / "folder", tmp_path / "pipe"
    folder.mkdir()
    os.mkfifo(pipe)
    for target in (folder, pipe, "/dev/null"):
        assert identifier_of(lambda t=target: tessel.copy(everything, t, overwrite=True)) == \
            "TESSEL:python:notARegularFile"


def test_folders_that_take_no_file(everything, tmp_path):
    assert identifier_of(lambda: tessel.copy(everything, tmp_path / "missing" / "copy.nc")) == \
        "TESSEL:netcdf:create:noSuchFileOrDirectory"
    closed = tmp_path / "closed"
    closed.mkdir(0o555)
    if os.geteuid():  # nothing is closed to root
        assert identifier_of(lambda: tessel.copy(everything, closed / "copy.nc")) == \
            "TESSEL:netcdf:create:permissionDenied"
    assert os.listdir(closed) == []
    with pytest.raises(tessel.Error):
        tessel.copy(everything, "/proc/copy.nc")


def test_permissions_are_those_of_any_new_file(everything, tmp_path):
    before = os.umask(0o027)
    try:
        tessel.copy(everything, tmp_path / "copy.nc")
    finally:
        os.umask(before)
    assert (tmp_path / "copy.nc").stat().st_mode & 0o777 == 0o640


@pytest.mark.parametrize("error", [KeyboardInterrupt, ZeroDivisionError])
@pytest.mark.parametrize("at", [0, 1, 5, -1])
def test_nothing_is_left_when_progress_raises(everything, tmp_path, error, at):
    told = []
    tessel.copy(everything, tmp_path / "whole.nc", block_bytes=100,
                progress=lambda done, _: told.append(done))
    stop = told[at]
    before = open_descriptors()

    def interrupt(done, _):
        if done == stop:
            raise error

    with pytest.raises(error):
        tessel.copy(everything, tmp_path / "copy.nc", block_bytes=100, progress=interrupt)
    stop = 0
    with pytest.raises(error):
        tessel.read(everything, "r3", block_bytes=100, progress=interrupt)
    assert open_descriptors() == before
    assert sorted(os.listdir(tmp_path)) == ["everything.nc", "whole.nc"]


# In processes of their own

def child(program: str, *arguments: object, **more: object) -> subprocess.Popen:
    return subprocess.Popen([sys.executable, "-c", textwrap.dedent(program),
                             *map(str, arguments)], stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                            text=True, **more)


@pytest.mark.parametrize(("command", "number"), [
    ("copy", signal.SIGINT), ("read", signal.SIGINT), ("command line", signal.SIGINT),
    ("command line", signal.SIGTERM)])
def test_interrupt(tmp_path, command, number):
    source = sparse(tmp_path / "large.nc", 2**31)
    target = tmp_path / "copy.nc"
    program = {
        "copy": """
            import sys, tessel
            tessel.copy(sys.argv[1], sys.argv[2], progress=lambda *each: print(*each, flush=True))
            """,
        "read": """
            import sys, numpy, tessel
            out = numpy.memmap(sys.argv[2] + ".part", "i4", "w+", shape=(1024, 2**19), order="F")
            tessel.read(sys.argv[1], "big", out=out,
                        progress=lambda *each: print(*each, flush=True))
            """,
        "command line": """
            import sys
            from tessel import command, terminal
            terminal.ProgressBar.__call__ = lambda self, *each: print(*each, flush=True)
            sys.exit(command.main(["copy", *sys.argv[1:]]))
            """}[command]
    with child(program, source, target) as process:
        for line in process.stdout:  # begun, and not yet done
            done, total = map(int, line.split())
            if done > 0:
                break
        assert 0 < done < total == 2**31
        process.send_signal(number)
        if number == signal.SIGTERM:
            process.send_signal(number)  # as `timeout` does, to the process and to its group
        output, errors = process.communicate(timeout=60)
        assert process.returncode == -number
        last = int((output.split("\n")[-2] if output else line).split()[0])
        assert last < total
    assert ("KeyboardInterrupt" in errors) == (command != "command line")
    assert [each for each in os.listdir(tmp_path) if "tessel" in each or each == "copy.nc"] == []


def test_disk_full(tmp_path):
    source = sparse(tmp_path / "source.nc", 4 * MIB)
    program = """
        import os, resource, sys, tessel
        limit = int(sys.argv[3])
        resource.setrlimit(resource.RLIMIT_FSIZE, (limit, limit))
        files = lambda: len(os.listdir("/proc/self/fd"))
        before = files()
        for _ in range(3):
            try:
                tessel.copy(sys.argv[1], sys.argv[2], block_bytes=100000)
            except tessel.Error as error:
                print(error.identifier, files() - before, sorted(os.listdir(sys.argv[4])))
        """
    for limit in (100, 300000, 4 * MIB - 10, 4 * MIB):
        with child(program, source, tmp_path / "copy.nc", limit, tmp_path) as process:
            output, errors = process.communicate(timeout=60)
        assert errors == ""
        assert process.returncode == 0
        for line in output.splitlines() or [""]:
            identifier, more, left = line.split(" ", 2)
            assert identifier.endswith(":fileTooLarge")
            assert (more, left) == ("0", "['source.nc']")
        assert len(output.splitlines()) == 3


def test_memory_is_bounded(tmp_path):
    size = 2**30
    source = sparse(tmp_path / "large.nc", size)
    program = """
        import pathlib, re, sys, tessel
        def most():  # the most memory that this process has ever had, in KiB
            status = pathlib.Path("/proc/self/status").read_text()
            return int(re.search(r"VmHWM:\\s*(\\d+)", status)[1])
        begun = most()
        tessel.copy(sys.argv[1], sys.argv[2], block_bytes=16 * 2**20)
        print(most() - begun)
        """
    target = tmp_path / "copy.nc"
    with child(program, source, target) as process:
        output, errors = process.communicate(timeout=300)
    assert (errors, process.returncode) == ("", 0)
    assert 16 * MIB <= int(output) * 1024 < 40 * MIB
    assert target.stat().st_size == Path(source).stat().st_size
    last = tessel.read(target, "big", (1022, size // 4096 - 1))
    assert last.ravel().tolist() == [0, 1]
    target.unlink()


def test_copies_in_many_threads_leave_the_default_format(everything, tmp_path):
    before = netcdf("set_default_format", 2)
    try:
        def copy_often(thread: int) -> None:
            for i in range(50):
                target = tmp_path / f"{thread}-{i}.nc"
                tessel.copy(everything, target, "classic")
                assert target.read_bytes()[:4] == b"CDF\x01"
        with ThreadPoolExecutor(4) as threads:
            list(threads.map(copy_often, range(4)))
        assert netcdf("set_default_format", before)[0, 0] == 2
    finally:
        netcdf("set_default_format", before)
