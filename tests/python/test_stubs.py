"""tests/python/test_stubs.py: the type stubs are those of the tables and of the living package."""

import os
import runpy
import subprocess
import sys
from collections.abc import Iterator, Sequence
from pathlib import Path

import pytest
import tessel

ROOT = Path(__file__).parents[2]
PACKAGE = ROOT / "python" / "tessel"
EXAMPLE = Path(__file__).with_name("typed_example.py")
MODULES = ["tessel.netcdf", "tessel.errors", "tessel._runtime", "tessel._faults"]

# The types do not depend on how the extension was compiled, and mypy would take very long.
pytestmark = pytest.mark.without_sanitizers


def written() -> dict[str, str]:
    """What the tool would write."""
    return runpy.run_path(str(ROOT / "tools" / "make_stubs.py"))["made"]()


@pytest.fixture(scope="module", autouse=True)
def cache(tmp_path_factory: pytest.TempPathFactory) -> Iterator[None]:
    """A cache for mypy that these tests share with nobody."""
    with pytest.MonkeyPatch.context() as patch:
        patch.setenv("MYPY_CACHE_DIR", str(tmp_path_factory.mktemp("cache")))
        yield


def mypy(*arguments: object, folder: Path, paths: str) -> subprocess.CompletedProcess[str]:
    """Runs one of mypy's programs."""
    return subprocess.run([sys.executable, "-m", *map(str, arguments)], text=True, cwd=folder,
                          capture_output=True, env={**os.environ, "MYPYPATH": paths})


def strict(*files: Path, folder: Path, paths: str = str(ROOT / "python"),
           options: Sequence[str] = ()) -> str:
    """What mypy finds."""
    result = mypy("mypy", "--strict", "--follow-imports=silent", *options, *files, folder=folder,
                  paths=paths)
    return result.stdout + result.stderr


def stubtest(folder: Path, paths: str) -> subprocess.CompletedProcess[str]:
    """Compares stubs with the living modules, argument by argument."""
    return mypy("mypy.stubtest", *MODULES, folder=folder, paths=paths)


def test_the_committed_stubs_are_the_tables() -> None:
    made = written()
    assert sorted(made) == sorted(each.name for each in PACKAGE.glob("*.pyi"))
    for name, text in made.items():
        assert (PACKAGE / name).read_text() == text, f"{name}: run tools/make_stubs.py"
        assert max(map(len, text.splitlines())) <= 100


def test_the_package_has_them() -> None:
    """Beside the modules that run, with the mark that says so."""
    living = Path(tessel.__file__).parent
    for file in [PACKAGE / "py.typed", *PACKAGE.glob("*.pyi")]:
        assert (living / file.name).read_bytes() == file.read_bytes()


def test_stubs_are_the_living_modules(tmp_path: Path) -> None:
    result = stubtest(tmp_path, "")
    assert result.returncode == 0, result.stdout + result.stderr


@pytest.mark.parametrize("before, after", [
    ("    def nc_sync(self, ncid: SupportsIndex) -> None: ...\n", ""),
    ("def strerror(self, ncerr:", "def strerror(self, status:"),
    ("    unlimdimid: int\n", ""),
    ("    def sync(", "    def synchronise(self) -> None: ...\n    def sync("),
])
def test_another_stub_is_noticed(tmp_path: Path, before: str, after: str) -> None:
    """The comparison can fail: each of these changes shows."""
    copy = tmp_path / "paths" / "tessel"
    copy.mkdir(parents=True)
    for each in PACKAGE.glob("*.pyi"):
        (copy / each.name).write_bytes(each.read_bytes())
    (copy / "__init__.pyi").touch()
    text = (copy / "netcdf.pyi").read_text()
    assert text.count(before) == 1
    (copy / "netcdf.pyi").write_text(text.replace(before, after))
    result = stubtest(tmp_path, str(copy.parent))
    assert result.returncode == 1 and "error: tessel.netcdf." in result.stdout


def test_stubs_are_strict(tmp_path: Path) -> None:
    found = strict(*PACKAGE.glob("*.pyi"), folder=tmp_path)
    assert found.startswith("Success"), found


# What stubs stand for; and what draws and computes with masked arrays, which have no types.
NOT_STRICT = {"_runtime", "errors", "netcdf", "picture", "time_mean"}

# What calls libraries that have no types, of which xarray's classes are derived and made.
UNTYPED_LIBRARIES = ("--allow-untyped-calls", "--ignore-missing-imports", "--no-warn-return-any")


def test_the_package_is_strict(tmp_path: Path) -> None:
    """Its functions have types themselves: read, copy and check, and the tables too."""
    above = [each for each in sorted(PACKAGE.glob("*.py")) if each.stem not in NOT_STRICT]
    engine = [*PACKAGE.glob("xarray/*.py"), PACKAGE / "axis.py"]
    assert {each.relative_to(PACKAGE).with_suffix("").as_posix() for each in engine} >= {
        "axis", "xarray/planning", "xarray/opening", "xarray/writing"}
    assert {each.stem for each in above} >= {"__init__", "transfer", "integrity", "command"}
    for files, options in ((set(above) - set(engine), ()), (engine, UNTYPED_LIBRARIES)):
        found = strict(*sorted(files), folder=tmp_path, options=options)
        assert found.startswith("Success"), found


def test_untyped_functions_are_found(tmp_path: Path) -> None:
    """The check can fail."""
    wrong = tmp_path / "integrity.py"
    text = (PACKAGE / "integrity.py").read_text()
    wrong.write_text(text.replace("def _padded(length: int) -> int:", "def _padded(length):"))
    assert "Function is missing a type annotation" in strict(wrong, folder=tmp_path)


def test_typed_program(tmp_path: Path) -> None:
    found = strict(EXAMPLE, folder=tmp_path)
    assert found.startswith("Success"), found
    shown = subprocess.run([sys.executable, EXAMPLE], cwd=tmp_path, text=True, capture_output=True,
                           check=True).stdout
    assert shown == "2.5 noSuchFileOrDirectory netcdf.tsx\n"


MISTAKES = ["nc.inq_dim(1)", "nc.get_var_double(1, 2, 3)", "nc.open(5, 'NOWRITE')",
            "nc.inq_dim(1, 2).length", "x: str = nc.inq_varid(1, 'v')", "nc.nc_opened('f', 0)",
            "nc.put_var_int(1, 2, numpy.zeros(3))", "tessel.load(3)",
            "tessel.Error('TESSEL:x:y', 'm').worth", "tessel.read(5, 'v')",
            "tessel.copy('a', 'b', overwrite='yes')", "x: str = tessel.check('a')"]


def test_mistakes_are_found(tmp_path: Path) -> None:
    """Every line is wrong, and mypy says so of every line, once."""
    program = tmp_path / "wrong.py"
    beginning = ["import numpy", "import tessel", "nc = tessel.load('netcdf')"]
    program.write_text("\n".join([*beginning, *MISTAKES, ""]))
    lines = [line for line in strict(program, folder=tmp_path).splitlines() if ": error: " in line]
    assert [line.split(":")[1] for line in lines] == [
        str(number) for number in range(len(beginning) + 1, len(beginning + MISTAKES) + 1)]
