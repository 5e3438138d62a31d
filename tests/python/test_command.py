# tests/python/test_command.py: the command line.
"""tessel info, plot, copy, check and ops: what they print, where, and how they fail."""

from __future__ import annotations

import json
import os
import pty
import re
import subprocess
import sys
from pathlib import Path

import numpy as np
import pytest
import tessel
from made_files import EVERYTHING, MIB, generate, sparse
from matplotlib import image
from tessel import command, picture
from tessel.dataset import Dataset

FIELD = """
dimensions: time = UNLIMITED ; z = 3 ; y = 4 ; x = 5 ;
variables:
    double time(time) ; time:units = "days since 2001-01-01" ;
    float z(z) ; z:units = "m" ; z:positive = "down" ;
    float y(y) ; y:units = "degrees_north" ;
    float x(x) ; x:units = "degrees_east" ;
    float t(time, z, y, x) ; t:units = "degC" ; t:long_name = "temperature" ;
        t:_FillValue = -1.f ;
    float tz(time, z) ; float zy(z, y) ; float yz(y, z) ; float lonlat(x, y) ; float s(time) ;
    float profile(z) ; char word(x) ; float nothing(x) ;
data:
    time = 0, 31 ; z = 0, 10, 50 ; y = -30, -10, 10, 30 ; x = 0, 10, 20, 30, 40 ;
"""


def ramp(name: str, count: int) -> str:
    return f"{name} = {', '.join(map(str, range(count)))} ;\n"


@pytest.fixture(name="field")
def field_fixture(tmp_path) -> str:
    values = ", ".join("-1" if i % 7 == 0 else str(i) for i in range(120))
    return generate(tmp_path / "field.nc", FIELD + f"t = {values} ;\n" + ramp("tz", 6)
                    + ramp("zy", 12) + ramp("yz", 12) + ramp("lonlat", 20) + ramp("s", 2)
                    + ramp("profile", 3) + 'word = "abc" ;')


def run(capsys, *arguments: object) -> tuple[int, str, str]:
    """Exit status, output and errors of a command."""
    try:
        status = command.main(list(map(str, arguments)))
    except SystemExit as left:
        status = left.code
    output = capsys.readouterr()
    return status, output.out, output.err


def one_line(result: tuple[int, str, str]) -> str:
    """The line that a command failed with, without its name."""
    status, output, errors = result
    assert (status, output) == (1, "")
    assert errors.startswith("tessel: ") and errors.endswith("\n")
    assert errors.count("\n") == 1
    return errors[len("tessel: "):-1]


# info

def test_info(capsys, field):
    status, output, errors = run(capsys, "info", field)
    assert (status, errors) == (0, "")
    for expected in (field, "float t(time, z, y, x)", "t: temperature",
                     "120 (time 2 × z 3 × y 4 × x 5)", "range    1 to 118 degC",
                     "time  2  unlimited  1 January 2001 to 1 February 2001"):
        assert re.sub(" +", " ", expected) in re.sub(" +", " ", output)
    assert "profile\n" in run(capsys, "info", field, "profile")[1]
    assert '"abc"' in run(capsys, "info", field, "word")[1]
    assert "  none" in run(capsys, "info", generate(Path(field).with_name("no.nc"), ""))[1]


# plot

@pytest.mark.parametrize(("arguments", "kind", "horizontal", "vertical", "downwards"), [
    (["t"], "map", "x (degrees_east)", "y (degrees_north)", False),
    (["t", "--index", "x=2"], "section", "y (degrees_north)", "z (m)", True),
    (["t", "--index", "y=1"], "section", "x (degrees_east)", "z (m)", True),
    (["t", "--index", "x=2", "--index", "y=1"], "section", "time", "z (m)", True),
    (["t", "--index", "y=1", "--index", "z=0"], "section", "x (degrees_east)", "time", False),
    (["t", "--index", "x=1", "--index", "z=0"], "section", "time", "y (degrees_north)", False),
    (["t", "--index", "x=2", "--index", "y=1", "--index", "time=1"], "line", "degC", "z (m)", True),
    (["tz"], "section", "time", "z (m)", True),
    (["zy"], "section", "y (degrees_north)", "z (m)", True),
    (["yz"], "section", "y (degrees_north)", "z (m)", True),
    (["lonlat"], "map", "x (degrees_east)", "y (degrees_north)", False),
    (["s"], "line", "time", "s", False),
    (["profile"], "line", "profile", "z (m)", True),
])
def test_plot(capsys, monkeypatch, field, tmp_path, arguments, kind, horizontal, vertical,
              downwards):
    drawn = []

    class Figure(picture.Figure):
        """Remembers what was drawn."""

        def savefig(self, *where, **how):
            drawn.append(self)
            return super().savefig(*where, **how)

    monkeypatch.setattr(picture, "Figure", Figure)
    target = tmp_path / "picture.png"
    status, output, errors = run(capsys, "plot", field, *arguments, "-o", target)
    assert (status, output, errors) == (0, f"The {kind} is in {target}\n", "")
    axes = drawn[0].axes[0]
    assert (axes.get_xlabel(), axes.get_ylabel()) == (horizontal, vertical)
    assert axes.yaxis_inverted() == downwards
    pixels = image.imread(target)
    assert pixels.shape[0] > 200 and len(np.unique(pixels.reshape(-1, 4), axis=0)) > 10


def test_plot_draws_the_chosen_values_and_masks_missing_ones(monkeypatch, field, tmp_path):
    drawn = {}
    monkeypatch.setattr(picture, "_area", lambda figure, axes, variable, part:
                        drawn.setdefault("part", part) and "section")
    with Dataset(field) as dataset:
        variable = dataset.find("t")
        values = dataset.values(variable)
        chosen = {"z": 2, "time": 1}
        picture.draw(dataset, variable, dataset.values(variable, chosen), str(tmp_path / "a.png"),
                     chosen)
    np.testing.assert_array_equal(drawn["part"].values, values[1, 2])
    assert drawn["part"].values.mask.sum() == values[1, 2].mask.sum() > 0
    assert drawn["part"].at == ["1 February 2001", "z 50 m"]


@pytest.mark.parametrize(("arguments", "most"), [
    ([], 120), (["--index", "x=2"], 24), (["--index", "z=0", "--index", "time=1"], 20),
    (["--index", "z=0", "--index", "time=1", "--index", "x=0"], 5)])
def test_plot_reads_only_what_was_chosen(capsys, monkeypatch, field, tmp_path, arguments, most):
    sizes = []

    def call(dataset, operation, *given):
        result = Dataset.untouched(dataset, operation, *given)
        if operation.startswith("get_var"):
            sizes.append(result.size)
        return result

    monkeypatch.setattr(Dataset, "untouched", Dataset.call, raising=False)
    monkeypatch.setattr(Dataset, "call", call)
    assert run(capsys, "plot", field, "t", *arguments, "-o", tmp_path / "a.png")[0] == 0
    assert max(sizes) == most


@pytest.mark.parametrize("ending", ["pdf", "svg", "PNG"])
def test_other_formats_of_pictures(capsys, field, tmp_path, ending):
    target = tmp_path / f"picture.{ending}"
    assert run(capsys, "plot", field, "t", "-o", target)[0] == 0
    start = {"pdf": b"%PDF", "svg": b"<?xml", "PNG": b"\x89PNG"}[ending]
    assert target.read_bytes().startswith(start)
    assert sorted(os.listdir(tmp_path)) == ["field.nc", target.name]


@pytest.mark.parametrize(("arguments", "line"), [
    (["word"], "No picture of word: its values are text."),
    (["nothing"], "No picture of nothing: all its values are missing."),
    (["t", "--index", "w=1"], "t has no dimension w."),
    (["t", "--index", "x=5"], "x has 5 positions, and none is 5; the first is 0."),
    (["s", "--index", "time=0"], "No picture of s: it is a single value."),
])
def test_nothing_to_plot(capsys, field, tmp_path, arguments, line):
    assert one_line(run(capsys, "plot", field, *arguments, "-o", tmp_path / "a.png")) == (
        f"{line.rstrip('.')}: {field}")
    assert os.listdir(tmp_path) == ["field.nc"]


def test_pictures_that_cannot_be_written(capsys, field, tmp_path):
    for target in ("a", "a.nc", "missing/a.png"):
        assert target in one_line(run(capsys, "plot", field, "t", "-o", tmp_path / target))
    assert os.listdir(tmp_path) == ["field.nc"]


# copy

def test_copy(capsys, tmp_path):
    source = generate(tmp_path / "source.nc", EVERYTHING)
    target = tmp_path / "target.nc"
    assert run(capsys, "copy", source, target, "--format", "64bit-offset") == (0, "", "")
    assert target.read_bytes()[:4] == b"CDF\2"
    assert one_line(run(capsys, "copy", source, target)) == f"The target exists already: {target}"
    assert run(capsys, "copy", source, target, "--overwrite", "--format", "classic") == (0, "", "")
    assert target.read_bytes()[:4] == b"CDF\1"


def on_a_terminal(*arguments: object) -> tuple[int, str]:
    """Exit status and standard error of the command line with a terminal there."""
    ours, theirs = pty.openpty()
    with subprocess.Popen([sys.executable, "-m", "tessel", *map(str, arguments)],
                          stdout=subprocess.DEVNULL, stderr=theirs) as process:
        os.close(theirs)
        seen = b""
        while True:
            try:
                part = os.read(ours, 4096)
            except OSError:  # the other end is closed
                break
            if not part:
                break
            seen += part
    os.close(ours)
    return process.returncode, seen.decode()


def test_progress_bar(tmp_path):
    source = sparse(tmp_path / "source.nc", 40 * MIB)
    status, seen = on_a_terminal("copy", source, tmp_path / "target.nc")
    assert status == 0
    steps = seen.split("\r")
    assert len(steps) > 2
    assert steps[0] == ""
    assert steps[-2] == f"source.nc [{'#' * 40}] 100 % of 40 MiB"
    assert steps[-1] == "\n"
    shares = [int(re.fullmatch(r"source\.nc \[(#*) *\] +(\d+) % of 40 MiB", each)[2])
              for each in steps[1:-1]]
    assert shares == sorted(shares)
    status, seen = on_a_terminal("copy", source, "/proc/target.nc")
    assert status == 1
    assert "%" not in seen


def test_an_error_begins_a_line_of_its_own(tmp_path, monkeypatch, capsys):
    source = sparse(tmp_path / "source.nc", MIB)
    monkeypatch.setattr(sys.stderr, "isatty", lambda: True)
    stop = iter([False, True])

    def placed(*_):
        if next(stop):
            raise OSError(28, "No space left on device", "target.nc")

    monkeypatch.setattr("tessel.transfer._read_block", placed)
    assert command.main(["copy", source, str(tmp_path / "target.nc")]) == 1
    assert capsys.readouterr().err.startswith("\rsource.nc [")


# check

def test_check(capsys, tmp_path):
    path = generate(tmp_path / "f.nc", EVERYTHING)
    size = os.path.getsize(path)
    status, output, errors = run(capsys, "check", path)
    assert (status, errors) == (0, "")
    assert re.fullmatch(rf"{path}: complete; it needs \d+ bytes and has {size}\n", output)
    os.truncate(path, size - 10)
    for arguments in (["check"], ["info"], ["plot", "-o", tmp_path / "a.png"], ["copy"]):
        more = {"plot": ["r3"], "copy": [tmp_path / "copy.nc"]}.get(arguments[0], [])
        assert one_line(run(capsys, arguments[0], path, *more, *arguments[1:])) == (
            f"The file is cut off: it has {size - 10} bytes, and what is in it needs "
            f"{re.search('needs ([0-9]+)', output)[1]}: {path}"), arguments
        if arguments[0] != "check":
            status, _, errors = run(capsys, arguments[0], path, *more, *arguments[1:], "--no-check")
            assert (status, errors) == (
                0, f"tessel: zeros stand for 10 bytes that were cut off: {path}\n"), arguments
    whole = generate(tmp_path / "whole.nc", EVERYTHING)
    assert run(capsys, "copy", whole, tmp_path / "a.nc", "--no-check") == (0, "", "")
    other = generate(tmp_path / "g.nc", EVERYTHING, "netCDF-4")
    assert run(capsys, "check", other)[1].startswith(f"{other}: nothing to check; ")


def test_info_of_more_positions_than_memory_holds(capsys, tmp_path):
    """Without coordinates, none of them is made."""
    path = tmp_path / "f.nc"
    nc = tessel.load("netcdf")
    ncid = nc.create(path, 32)  # 64-bit data
    nc.def_dim(ncid, "x", 10**11)
    nc.close(ncid)
    status, output, errors = run(capsys, "info", path)
    assert (status, errors) == (0, "")
    assert "Dimensions\n  x  100000000000\n" in output


# ops

def test_ops(capsys):
    status, output, errors = run(capsys, "ops")
    assert (status, errors) == (0, "")
    lines = output.splitlines()
    assert len(lines) == 102
    assert re.fullmatch(r"get_vara_double +\S.*", [x for x in lines if "get_vara_double" in x][0])
    listed = {line.split()[0] for line in lines}
    assert {"open", "param", "get_constant_names", "put_vars_text"} <= listed

    output = run(capsys, "ops", "get_vara_double")[1]
    assert output.startswith("get_vara_double(ncid, varid, start, count)\n\n")
    assert "TESSEL:netcdf:getVara:" in output
    for spelling in ("nc_get_vara_double", "NC_GET_VARA_DOUBLE"):
        assert run(capsys, "ops", spelling)[1] == output
    assert one_line(run(capsys, "ops", "frob")) == \
        "There is no operation frob; tessel ops lists all."


@pytest.mark.parametrize("name, near", [
    ("get_var", "there are get_var_double, get_var_float, get_var_int, get_var_short, "
                "get_var_schar, get_var_uchar, get_var_text"),
    ("nc_get_var_dbl", "there are get_var_double, "), ("NC_INQ_VARI", "there is inq_varid"),
    ("get", "there are get_att_double, "), ("get", ", get_constant_names and 28 more")])
def test_operations_of_a_similar_name(capsys, name, near):
    line = one_line(run(capsys, "ops", name))
    assert line.startswith(f"There is no operation {name}; there ")
    assert near in line and line.endswith("; tessel ops lists all.")
    nc = tessel.load("netcdf")
    with pytest.raises(tessel.Error) as raised:
        nc(name, 1)
    assert raised.value.__notes__ == [f"in {name}(1)\n{line.split('; ')[1]}"]


# In general

@pytest.mark.parametrize("arguments", [["--help"], *([each, "--help"] for each in
                                                     ("info", "plot", "copy", "check", "ops"))])
def test_help(capsys, arguments):
    status, output, errors = run(capsys, *arguments)
    assert (status, errors) == (0, "")
    assert output.startswith(f"usage: {' '.join(['tessel', *arguments[:-1]])} ")


@pytest.mark.parametrize("arguments", [
    [], ["frob"], ["info"], ["info", "a", "b", "c"], ["plot", "a", "b"], ["copy", "a"], ["check"],
    ["copy", "a", "b", "--format", "netCDF-4"], ["plot", "a", "b", "-o", "c", "--index", "x"],
    ["plot", "a", "b", "-o", "c", "--index", "x=-1"], ["ops", "a", "b"],
    ["info", "a", "b", "\033[31m\n"]])
def test_wrong_usage(capsys, arguments):
    line = one_line(run(capsys, *arguments))
    assert re.search(r"; try tessel( info| plot| copy| check| ops)? --help$", line)
    assert "\033" not in line


WRONG = {
    "empty": (b"", "it is empty"),
    "cut off": (b"CDF", "it was cut off after 3 bytes"),
    "gzip": (b"\x1f\x8b\x08" + bytes(9), "it is compressed by gzip: decompress it first (gunzip) "
                                         "(12 bytes)"),
    "HTML": (b"<!doctype html>", "it is a web page, perhaps what a server said instead of the "
                                 "file"),
    "HDF5": (b"\x89HDF\r\n\x1a\n" + b"\xff" * 99,
             "it begins like an HDF5 file (as netCDF-4 files do), and is damaged or no dataset "
             "(107 bytes)"),
    "text": ("a\033[31m\n".encode(), "it begins with the bytes 61 1b 5b 33 31 6d 0a, which is no "
                                      "format known here"),
}


@pytest.mark.parametrize(("content", "what"), WRONG.values(), ids=WRONG.keys())
def test_a_file_that_is_no_dataset(capsys, tmp_path, content, what):
    path = tmp_path / "wrong.nc"
    path.write_bytes(content)
    for arguments in (["info", path], ["check", path], ["copy", path, tmp_path / "a.nc"],
                      ["plot", path, "v", "-o", tmp_path / "a.png"]):
        line = one_line(run(capsys, *arguments))
        assert line.startswith("Unable to open netCDF file, library error message ")
        assert line.endswith(f": {path}: {what}")
    assert os.listdir(tmp_path) == ["wrong.nc"]


def test_the_file_that_an_error_is_about(capsys, field, tmp_path):
    """Of several, the right one."""
    missing = tmp_path / "missing" / "a.nc"
    assert one_line(run(capsys, "copy", field, missing)).endswith(
        f'"No such file or directory": {missing}: there is no folder {tmp_path}/missing')
    assert one_line(run(capsys, "copy", missing, field)).endswith(
        f'"No such file or directory": {missing}: there is no folder {tmp_path}/missing')
    assert one_line(run(capsys, "copy", field, field)) == (
        f"The target is the same file as the source: {field}")
    for arguments in (["info", field, "none"],
                      ["plot", field, "none", "-o", tmp_path / "a.png"]):
        assert one_line(run(capsys, *arguments)).endswith(
            f"Variable not found\": {field}: variables: time, z, y, x, t, tz, zy, yz, lonlat, s, "
            "profile, word and 1 more")
    empty = generate(tmp_path / "empty.nc", "")
    assert one_line(run(capsys, "info", empty, "none")).endswith(
        f"{empty}: there are no variables")
    wide = generate(tmp_path / "wide.nc", "dimensions: x = 2 ; variables: ubyte a(x) ;", "cdf5")
    line = one_line(run(capsys, "copy", wide, tmp_path / "new.nc", "--format", "classic"))
    assert line.endswith(f": {tmp_path}/new.nc") and ".part" not in line
    assert one_line(run(capsys, "copy", wide, tmp_path / "new.nc")) == (
        "The file has the format 64bit-data, which copies do not have: give one of classic, "
        f"64bit-offset: {wide}")
    new = generate(tmp_path / "new-format.nc", "dimensions: x = 2 ;", "netCDF-4")
    assert one_line(run(capsys, "copy", new, tmp_path / "new.nc")) == (
        "Only files of the classic formats, 64-bit offset and 64-bit data are copied; this one has "
        f"another format, such as that of HDF5: {new}")


def test_errors_that_are_about_no_file(capsys, field, monkeypatch):
    """The file is not to blame, and is not named; an address is."""
    monkeypatch.setenv("TESSEL_GUARD", "none")
    for arguments in (["info", field], ["check", field], ["copy", field, "new.nc"]):
        assert one_line(run(capsys, *arguments)) == \
            "A guard is one of on, remote, off, and not 'none'."
    monkeypatch.delenv("TESSEL_GUARD")

    def lost(name):
        raise tessel.Error("TESSEL:host:moduleNotFound", f"There is no module {name}.")

    monkeypatch.setattr(tessel, "load", lost)
    for arguments in (["info", field], ["check", field]):
        assert one_line(run(capsys, *arguments)) == "There is no module netcdf."
    monkeypatch.undo()
    for arguments in (["info", ""], ["check", ""], ["copy", "", "new.nc"],
                      ["plot", "", "v", "-o", "a.png"]):
        assert one_line(run(capsys, *arguments)) == "The file has no name."
    for arguments in ([], ["--guard", "off"]):
        assert one_line(run(capsys, "info", *arguments, "http://[")).endswith(": http://[")


@pytest.mark.parametrize("before", [None, "on", "remote"])
def test_the_guard_of_a_command_is_its_own(capsys, field, monkeypatch, before):
    if before is None:
        monkeypatch.delenv("TESSEL_GUARD", raising=False)
    else:
        monkeypatch.setenv("TESSEL_GUARD", before)
    for guard, address in (("off", "http://["), ("on", "http://["), ("off", field)):
        run(capsys, "info", "--guard", guard, address)
        assert os.environ.get("TESSEL_GUARD") == before


WITHOUT = ("import sys; sys.modules[{0!r}] = None; "
           "from {1} import main; sys.exit(main(sys.argv[1:]))")


@pytest.mark.parametrize(("library", "program", "arguments"), [
    ("cftime", "tessel.command", ["info", "field.nc"]),
    ("cftime", "tessel.command", ["plot", "field.nc", "s", "-o", "a.png"]),
    ("cftime", "tessel.show", ["field.nc"]),
    ("matplotlib", "tessel.command", ["plot", "field.nc", "t", "-o", "a.png"]),
    ("matplotlib", "tessel.show", ["field.nc", "profile"])])
def test_a_library_that_is_not_installed(field, library, program, arguments):
    folder = Path(field).parent
    done = subprocess.run([sys.executable, "-B", "-c", WITHOUT.format(library, program),
                           *arguments], cwd=folder, capture_output=True, text=True, check=False)
    name = "tessel: " if program == "tessel.command" else ""
    assert (done.returncode, done.stderr) == (
        1, f"{name}This needs {library}, which is not installed; Debian has it in the package "
           f"python3-{library}.\n")
    assert "a.png" not in os.listdir(folder)


def test_what_needs_no_other_library(tmp_path):
    """Neither Matplotlib nor, without times, cftime."""
    generate(tmp_path / "a.nc", "dimensions: x = 2 ; variables: int a(x) ; data: a = 1, 2 ;")
    code = "import sys; sys.modules['matplotlib'] = None; " + WITHOUT.format(
        "cftime", "tessel.command")
    for arguments in (["info", "a.nc"], ["check", "a.nc"], ["copy", "a.nc", "b.nc"], ["ops"]):
        subprocess.run([sys.executable, "-B", "-c", code, *arguments], cwd=tmp_path, check=True,
                       stdout=subprocess.DEVNULL)


def test_memory_that_is_not_there(capsys, field, monkeypatch):
    def exhausted(self):
        raise MemoryError

    monkeypatch.setattr(Dataset, "main_variable", exhausted)
    assert one_line(run(capsys, "info", field)) == "There is not enough memory."


def test_what_would_be_waited_for(capsys, tmp_path):
    """A pipe that nobody writes into."""
    pipe = tmp_path / "pipe"
    os.mkfifo(pipe)
    for path in (pipe, "/dev/tty"):
        for arguments in (["info", path], ["check", path], ["copy", path, tmp_path / "a.nc"],
                          ["plot", path, "v", "-o", tmp_path / "a.png"]):
            assert one_line(run(capsys, *arguments)) == (
                f"The file is no regular file, but a pipe, a socket or a device: {path}")


def test_version(capsys):
    status, output, errors = run(capsys, "--version")
    assert (status, errors) == (0, "")
    library = tessel.load("netcdf").inq_libvers().split()[0]
    assert re.fullmatch(rf"tessel {re.escape(tessel.__version__)}, netCDF library {re.escape(library)}, "
                        rf"NumPy {re.escape(np.__version__)}, Python \d+\.\d+\.\S+\n", output)


@pytest.mark.parametrize("arguments", [["info", "field.nc"], ["ops"], ["--version"]],
                         ids=lambda each: each[0])
def test_an_output_that_takes_nothing(field, arguments):
    with open("/dev/full", "wb") as full:
        done = subprocess.run([sys.executable, "-B", "-m", "tessel", *arguments], stdout=full,
                              stderr=subprocess.PIPE, text=True, check=False,
                              cwd=Path(field).parent)
    assert (done.returncode, done.stderr) == (1, "tessel: No space left on device\n")


@pytest.mark.parametrize("name", ["missing.nc", "\033[31mred\a.nc"])
def test_missing_files(capsys, tmp_path, name):
    for arguments in (["info", name], ["check", name], ["copy", name, tmp_path / "a.nc"],
                      ["plot", name, "v", "-o", "a.png"]):
        line = one_line(run(capsys, *arguments))
        assert "No such file or directory" in line
        assert "\033" not in line and "\a" not in line


def evil_commands(tmp_path: Path) -> list[list[str]]:
    """Commands on files with escapes in all names and texts, and on files that are none."""
    path = Path(generate(tmp_path / "evil.nc", """dimensions: dddd = 2 ;
        variables: float vvvv(dddd) ; vvvv:aaaa = "bbbb" ; vvvv:units = "uuuu" ;
            char tttt(dddd) ;
        data: vvvv = 1, 2 ; tttt = "xx" ;"""))
    data = path.read_bytes()
    for text in (b"dddd", b"vvvv", b"aaaa", b"uuuu", b"tttt"):
        data = data.replace(text, b"\033[" + text[:1] + b"\a")
    data = data.replace(b"bbbb", b"\xc2\x9bJ\r")  # the one character that begins a sequence alone
    evil = path.with_name("\033[2Jevil\r.nc")
    evil.write_bytes(data)
    target = tmp_path / "\033[31m.png"
    commands = [["info", evil], ["info", evil, "\033[t\a"], ["check", evil],
                ["plot", evil, "\033[v\a", "-o", target],
                ["plot", evil, "\033[t\a", "-o", target],
                ["plot", evil, "\033[v\a", "-o", target, "--index", "\033[d\a=7"],
                ["copy", evil, tmp_path / "copy.nc"], ["ops", "\033[x"]]
    for number, (content, _) in enumerate(WRONG.values()):
        wrong = tmp_path / f"\033[{number}m.nc"
        wrong.write_bytes(content)
        commands += [["info", wrong], ["check", wrong], ["copy", wrong, tmp_path / "a.nc"]]
    return [list(map(str, each)) for each in commands]


STEERING = re.compile(r"[\x00-\x09\x0b-\x1f\x7f-\x9f]")


def test_what_is_in_a_file_cannot_steer_a_terminal(capsys, tmp_path):
    for arguments in evil_commands(tmp_path):
        _, output, errors = run(capsys, *arguments)
        assert output or errors
        assert not STEERING.search(output + errors)


def test_what_the_libraries_print_cannot_either(tmp_path):
    """They have the process's own standard error, which only a process of its own shows."""
    commands = evil_commands(tmp_path)
    program = ("import json, sys; from tessel.command import main; "
               "print(*map(main, json.load(sys.stdin)))")
    done = subprocess.run([sys.executable, "-B", "-c", program], input=json.dumps(commands),
                          capture_output=True, check=True, text=True)
    assert not STEERING.search(done.stdout + done.stderr)
    failed = done.stdout.splitlines()[-1].split().count("1")
    assert failed >= 3 * len(WRONG)
    assert len(done.stderr.splitlines()) == failed  # and nothing else was printed there


def test_a_reader_that_has_seen_enough(field):
    with subprocess.Popen([sys.executable, "-m", "tessel", "ops", "open"],
                          stdout=subprocess.PIPE, stderr=subprocess.PIPE) as process:
        process.stdout.close()
        assert process.stderr.read() == b""
    assert process.returncode == 0


def test_the_program_looks_into_no_current_folder(field, tmp_path):
    program = Path(tessel.__file__).parents[2] / "bin" / "tessel"
    folder = tmp_path / "folder"
    folder.mkdir()
    for name in ("tessel.py", "numpy.py", "argparse.py"):
        (folder / name).write_text("raise SystemExit('taken from the current folder')\n")
    link = tmp_path / "linked"
    link.symlink_to(program)
    environment = {name: value for name, value in os.environ.items() if name != "PYTHONPATH"}
    for each in (program, link):
        done = subprocess.run([each, "info", field], cwd=folder, env=environment,
                              capture_output=True, text=True, check=False)
        assert (done.returncode, done.stderr) == (0, "")
        assert "float t(time, z, y, x)" in done.stdout


def test_an_attribute_that_cannot_be_asked_for(capsys, tmp_path) -> None:
    """Its name is not UTF-8 in the file: it is shown, with what the library says of it."""
    path = Path(generate(tmp_path / "odd.nc", """dimensions: x = 2 ;
        variables: float v(x) ; v:aaaa = "bbbb" ; v:units = "m" ;
        data: v = 1, 2 ;"""))
    path.write_bytes(path.read_bytes().replace(b"aaaa", b"a\x9baa"))
    status, out, _ = run(capsys, "info", str(path), "v")
    assert status == 0 and "units" in out and "(type unknown) Attribute inquiry failed" in out
    status, _, err = run(capsys, "copy", str(path), str(tmp_path / "copy.nc"))
    assert status != 0 and "Attribute not found" in err
    assert not (tmp_path / "copy.nc").exists()
