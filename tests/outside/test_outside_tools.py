"""tests/outside/test_outside_tools.py: other tools read the module's files, and it reads theirs.

Every external type, text included, as fixed and as record variable, as variable and as global
attribute, in both formats. The tools: ncdump and ncgen (text form of a dataset), NCO (whose ncks
copies a dataset value by value), and SciPy's own implementation of the format.
"""

import re
import subprocess
from pathlib import Path
from typing import NamedTuple

import numpy
import pytest
import tessel
from scipy.io import netcdf_file

netcdf = tessel.load("netcdf")

CLASSIC, OFFSET64 = 0, 512
FORMATS = {"classic": CLASSIC, "64-bit offset": OFFSET64}
COLUMNS, RECORDS = 8, 3


class External(NamedTuple):
    """An external type: its code, the member that carries it exactly, and COLUMNS values."""

    name: str
    code: int
    member: str
    dtype: numpy.dtype
    values: list

    @property
    def fixed(self) -> str:
        """The name of the fixed variable."""
        return "fixed_" + self.name

    @property
    def records(self) -> str:
        """The name of the record variable."""
        return "records_" + self.name


F32, F64 = numpy.finfo(numpy.float32), numpy.finfo(numpy.float64)
TYPES = [
    External("byte", 1, "schar", numpy.dtype("i1"), [-128, -1, 0, 1, 100, 127, -2, 2]),
    # Bytes beyond ASCII, none of which begin a character of UTF-8 here, and NUL within the text.
    External("char", 2, "text", numpy.dtype("S1"),
             [b"a", b"\xe9", b"\0", b'"', b"\\", b"~", b" ", b"\xff"]),
    External("short", 3, "short", numpy.dtype("i2"), [-32768, -1, 0, 1, 258, 32767, -2, 2]),
    External("int", 4, "int", numpy.dtype("i4"), [-(2**31), -1, 0, 1, 16909060, 2**31 - 1, -2, 2]),
    External("float", 5, "float", numpy.dtype("f4"),
             [F32.min, -0.0, F32.smallest_subnormal, 0.1, numpy.inf, F32.max, -numpy.inf, 1e-9]),
    External("double", 6, "double", numpy.dtype("f8"),
             [F64.min, -0.0, F64.smallest_subnormal, 0.1, numpy.inf, F64.max, -numpy.inf, 1e-9]),
]
each_type = pytest.mark.parametrize("external", TYPES, ids=lambda t: t.name)
each_format = pytest.mark.parametrize("mode", FORMATS.values(), ids=FORMATS.keys())


def fixed(external: External) -> numpy.ndarray:
    """The values of the fixed variable and of the attributes."""
    return numpy.array(external.values, external.dtype)


def records(external: External) -> numpy.ndarray:
    """The values of the record variable, (RECORDS, COLUMNS): each record is turned by one."""
    return numpy.array([numpy.roll(fixed(external), i) for i in range(RECORDS)], external.dtype)


def as_text(values: numpy.ndarray) -> str:
    """Bytes as the text that the module takes."""
    return values.tobytes().decode("latin-1")


def for_host(external: External, values: numpy.ndarray):
    """Values as an argument: the library's order of elements, of the member's class."""
    flat = values.ravel()
    return as_text(flat) if external.name == "char" else flat


def from_host(external: External, result) -> numpy.ndarray:
    """A result as values of the external type, in the library's order of dimensions."""
    if isinstance(result, str):  # of an attribute: what is no UTF-8 has the byte's code
        return numpy.frombuffer(result.encode("latin-1"), "S1")
    if external.name == "char":  # of a variable: each byte is widened with its sign
        codes = numpy.ascontiguousarray(result.T).view(numpy.uint32).astype(numpy.uint16)
        found = codes.astype(numpy.uint8)
        assert (codes == found.astype(numpy.int8).astype(numpy.uint16)).all()
        return found.view("S1")
    return result.T


def of_attribute(external: External) -> numpy.ndarray:
    """What the module reads of an attribute: text ends before a NUL."""
    values = fixed(external)
    return values[:external.values.index(b"\0")] if external.name == "char" else values


def number(value) -> int:
    """A 1-by-1 result as an int."""
    return int(value[0, 0])


def write_with_module(path: Path, mode: int) -> None:
    """Both variables and both attributes of every type."""
    ncid = netcdf("create", str(path), float(mode))
    t = netcdf("def_dim", ncid, "t", 0.0)
    x = netcdf("def_dim", ncid, "x", float(COLUMNS))
    for external in TYPES:
        values = for_host(external, fixed(external))
        varid = netcdf("def_var", ncid, external.fixed, float(external.code), [number(x)])
        netcdf("def_var", ncid, external.records, float(external.code), [number(x), number(t)])
        for owner in (number(varid), -1):
            type_argument = [] if external.name == "char" else [float(external.code)]
            netcdf(f"put_att_{external.member}", ncid, owner, "a_" + external.name, *type_argument,
                   values)
    netcdf("enddef", ncid)
    for external in TYPES:
        varid = netcdf("inq_varid", ncid, external.fixed)
        netcdf(f"put_var_{external.member}", ncid, varid, for_host(external, fixed(external)))
        varid = netcdf("inq_varid", ncid, external.records)
        netcdf(f"put_vara_{external.member}", ncid, varid, [0, 0], [COLUMNS, RECORDS],
               for_host(external, records(external)))
    netcdf("close", ncid)


def same(found: numpy.ndarray, expected: numpy.ndarray) -> bool:
    """Equal bit for bit, whatever the byte order."""
    native = found.astype(found.dtype.newbyteorder("="))
    return native.shape == expected.shape and native.tobytes() == expected.tobytes()


def check_with_module(path: Path, external: External) -> None:
    """The module finds both variables and both attributes of the type as they should be."""
    ncid = netcdf("open", str(path), "NOWRITE")
    try:
        for name, expected in ((external.fixed, fixed(external)),
                               (external.records, records(external))):
            varid = netcdf("inq_varid", ncid, name)
            assert number(netcdf("inq_var", ncid, varid)[1]) == external.code
            found = from_host(external, netcdf(f"get_var_{external.member}", ncid, varid))
            assert same(found.reshape(expected.shape), expected), name
        for owner in (netcdf("inq_varid", ncid, external.fixed), -1):
            attribute = "a_" + external.name
            kind, length = netcdf("inq_att", ncid, owner, attribute)
            assert (number(kind), number(length)) == (external.code, COLUMNS)
            values = netcdf(f"get_att_{external.member}", ncid, owner, attribute)
            found = from_host(external, values)
            assert same(found.ravel(), of_attribute(external)), attribute
    finally:
        netcdf("close", ncid)


def run(*command: object) -> str:
    """What a tool prints; a tool that fails, fails the test."""
    return subprocess.run([str(c) for c in command], check=True, capture_output=True,
                          encoding="latin-1").stdout


def cdl_values(external: External, text: str) -> numpy.ndarray:
    """The values of a list in ncdump's notation, without the type suffixes of attributes."""
    if external.name == "char":
        strings = re.findall(r'"((?:\\.|[^"\\])*)"', text)
        text = re.sub(r"\\([0-7]{3}|.)", lambda m: chr(int(m[1], 8)) if m[1].isdigit() else m[1],
                      "".join(strings))
        return numpy.frombuffer(text.encode("latin-1"), "S1")
    items = [item.strip().rstrip("bsf" if external.code != 5 else "f") for item in text.split(",")]
    items = [re.sub("^(-?)In.*", r"\1inf", item) for item in items]
    return numpy.array([external.dtype.type(item) for item in items], external.dtype)


@each_format
@each_type
def test_ncdump_reads_ours(tmp_path: Path, external: External, mode: int) -> None:
    path = tmp_path / "ours.nc"
    write_with_module(path, mode)
    assert run("ncdump", "-k", path).strip() == ("classic" if mode == CLASSIC else "64-bit offset")
    cdl = run("ncdump", "-p", "9,17", path)
    declared = re.search(rf"^\s*(\w+) {external.fixed}\(x\) ;", cdl, re.MULTILINE)
    assert declared and declared[1] == external.name
    data = cdl[cdl.index("\ndata:"):]
    for name, expected in ((external.fixed, fixed(external)),
                           (external.records, records(external))):
        listed = re.search(rf"^ {name} =\s(.*?)\s;\n", data, re.MULTILINE | re.DOTALL)
        assert listed, name
        assert same(cdl_values(external, listed[1]), expected.ravel()), name
    for owner in (external.fixed, ""):
        listed = re.search(rf"^\s+{owner}:a_{external.name} = (.*) ;$", cdl, re.MULTILINE)
        assert listed, owner
        assert same(cdl_values(external, listed[1]), fixed(external)), owner


@each_format
@each_type
def test_ours_through_ncgen(tmp_path: Path, external: External, mode: int) -> None:
    """Text form and back again: what ncgen builds, the module reads."""
    write_with_module(tmp_path / "ours.nc", mode)
    text = tmp_path / "text.cdl"
    # ncdump writes the number -0.0 without a point, and ncgen reads that as the integer 0.
    cdl = run("ncdump", "-p", "9,17", tmp_path / "ours.nc")
    text.write_text(re.sub(r"-0(?=[,\s])", "-0.", cdl), encoding="latin-1")
    run("ncgen", "-k", "classic" if mode == CLASSIC else "64-bit offset", "-o",
        tmp_path / "theirs.nc", text)
    check_with_module(tmp_path / "theirs.nc", external)


@each_format
@each_type
def test_ours_through_nco(tmp_path: Path, external: External, mode: int) -> None:
    """ncks reads every value of ours and writes it into a dataset of the other format."""
    write_with_module(tmp_path / "ours.nc", mode)
    run("ncks", "-6" if mode == CLASSIC else "-3", tmp_path / "ours.nc", tmp_path / "theirs.nc")
    magic = (tmp_path / "theirs.nc").read_bytes()[:4]
    assert magic == (b"CDF\x02" if mode == CLASSIC else b"CDF\x01")
    check_with_module(tmp_path / "theirs.nc", external)


@each_type
def test_nco_appends_our_records(tmp_path: Path, external: External) -> None:
    """ncrcat reads the records of two of ours; the module sees twice as many."""
    write_with_module(tmp_path / "ours.nc", CLASSIC)
    run("ncrcat", tmp_path / "ours.nc", tmp_path / "ours.nc", tmp_path / "theirs.nc")
    ncid = netcdf("open", str(tmp_path / "theirs.nc"), "NOWRITE")
    varid = netcdf("inq_varid", ncid, external.records)
    found = from_host(external, netcdf(f"get_var_{external.member}", ncid, varid))
    netcdf("close", ncid)
    assert same(found, numpy.concatenate([records(external), records(external)]))


@each_format
@each_type
def test_scipy_reads_ours(tmp_path: Path, external: External, mode: int) -> None:
    write_with_module(tmp_path / "ours.nc", mode)
    with netcdf_file(tmp_path / "ours.nc", mmap=False) as dataset:
        assert dataset.version_byte == (1 if mode == CLASSIC else 2)
        for name, expected in ((external.fixed, fixed(external)),
                               (external.records, records(external))):
            assert same(dataset.variables[name][:].copy(), expected), name
        for owner in (dataset.variables[external.fixed], dataset):
            found = getattr(owner, "a_" + external.name)
            if external.name == "char":
                found = numpy.frombuffer(found, "S1")
            assert same(numpy.asarray(found), fixed(external))


@each_format
@each_type
def test_we_read_scipy(tmp_path: Path, external: External, mode: int) -> None:
    with netcdf_file(tmp_path / "theirs.nc", "w", version=1 if mode == CLASSIC else 2) as dataset:
        dataset.createDimension("t", None)
        dataset.createDimension("x", COLUMNS)
        values = fixed(external)
        as_attribute = values.tobytes() if external.name == "char" else values
        kind = "c" if external.name == "char" else external.dtype
        variable = dataset.createVariable(external.fixed, kind, ("x",))
        variable[:] = values
        setattr(variable, "a_" + external.name, as_attribute)
        setattr(dataset, "a_" + external.name, as_attribute)
        dataset.createVariable(external.records, kind, ("t", "x"))[:] = records(external)
    check_with_module(tmp_path / "theirs.nc", external)


@each_format
def test_text_of_attributes_is_written_as_bytes_and_read_as_utf8(tmp_path: Path, mode: int) -> None:
    """Others see the low byte of each character of ours; theirs is UTF-8 where it can be."""
    ncid = netcdf("create", str(tmp_path / "ours.nc"), float(mode))
    netcdf("put_att_text", ncid, -1, "title", "Gr\u00fc\u00df \u6c34")
    netcdf("close", ncid)
    with netcdf_file(tmp_path / "ours.nc", mmap=False) as dataset:
        assert dataset.title == b"Gr\xfc\xdf \x34"
    assert ':title = "Gr\xfc\xdf 4" ;' in run("ncdump", tmp_path / "ours.nc")

    with netcdf_file(tmp_path / "theirs.nc", "w", version=1 if mode == CLASSIC else 2) as dataset:
        dataset.title = "Gr\u00fc\u00df \u6c34 ".encode() + b"\xfc"
    run("ncks", tmp_path / "theirs.nc", tmp_path / "copied.nc")
    for name in ("theirs.nc", "copied.nc"):
        ncid = netcdf("open", str(tmp_path / name), "NOWRITE")
        assert netcdf("get_att_text", ncid, -1, "title") == "Gr\u00fc\u00df \u6c34 \u00fc"
        netcdf("close", ncid)
