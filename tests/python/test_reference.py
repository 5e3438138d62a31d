# tests/python/test_reference.py: the reference says of every operation what there is to say.
"""Its errors are those that the code can raise, each is provoked by a test, its calls compile, and
it is the same on every kind of page."""

import functools
import os
import re
import subprocess
import sys
from pathlib import Path

import pytest
from tessel import catalogue, command, meanings, reference
from tessel.errors import CLASSES, WITHOUT_BUILT_IN, word_of
from tessel.operation import Operation
from tessel.operations import OPERATIONS, find

ROOT = Path(__file__).parents[2]
sys.path.insert(0, str(ROOT / "tools"))
import make_catalogue  # noqa: E402
import make_reference  # noqa: E402

each_operation = pytest.mark.parametrize("operation", OPERATIONS, ids=lambda each: each.short)
PAGES = {each.short: reference.page_of(each) for each in OPERATIONS}
# Programs that are run here are not built for the sanitizer, unlike what runs this.
PLAIN = {name: value for name, value in os.environ.items() if name != "LD_PRELOAD"}
MAN, RST = make_reference.man(), make_reference.rst_pages()

# Guards whose conditions cannot be met, not even by calling the function behind them.
UNPROVOKED = {"TESSEL:netcdf:packUpSizetScalar", "TESSEL:netcdf:defVar"}


@functools.cache
def files() -> tuple[str, ...]:
    """The texts of the conformance tests and of what they share."""
    return tuple(each.read_text() for folder in ("conformance", "support")
                 for each in (ROOT / "tests" / folder).glob("*.[ch]pp"))


@functools.cache
def is_expected(*literals: str) -> bool:
    """Whether one of the tests' files has all of these."""
    return any(all(each in text for each in literals) for text in files())


def identifiers(short: str) -> set[str]:
    """All identifiers on a page but for the statuses without a cause of their own."""
    page = PAGES[short]
    return {each.identifier for each in (*page.raised, *page.guards)}


def test_the_catalogue_is_the_modules() -> None:
    """What is committed is what the module's sources say now."""
    assert make_catalogue.made() == make_catalogue.TARGET.read_text()
    assert len(catalogue.ROWS) > 150 and len(catalogue.STATUSES) > 60


def test_every_text_of_the_catalogue_is_a_row() -> None:
    """Nothing in the module's table escapes the reading of it."""
    text = (ROOT / "module" / "call" / "catalogue.hpp").read_text()
    literals = re.findall(r'"(TESSEL:[^"]*)"', text)
    read = [identifier for identifier, _ in catalogue.ROWS.values()]
    assert len(literals) > 90 and set(literals) <= set(read)
    assert sum(not each.endswith(":") and "{" not in each for each in read) == len(literals)
    tags = re.findall(r'\{"(\w+(?::\w+)?)",\s+"[^"%]*"\}', text)
    assert {f"TESSEL:netcdf:{tag}:" for tag in tags} == {each for each in read
                                                         if each.endswith(":")}


def test_nothing_else_that_is_raised_escapes() -> None:
    """No identifier of the host, the guard or the package is one that the catalogue lacks, and none
    is put together but by the two functions whose callers give the word."""
    literals = {identifier for folder in ("runtime/src", "guard/src", "python/src", "python/tessel")
                for file in (ROOT / folder).rglob("*") if file.suffix in (".cpp", ".hpp", ".py")
                for identifier in re.findall(r'"(TESSEL:(?:host|guard|python):\w+)"',
                                             file.read_text())}
    known = {*catalogue.HOST, *catalogue.GUARD, *catalogue.PACKAGE}
    assert len(literals) > 50 and literals <= known
    assert {*catalogue.CALLED, *catalogue.GIVEN, *catalogue.RETURNED} < set(catalogue.PACKAGE)
    put_together = [(file.name, line.strip()) for file in (ROOT / "python").rglob("*")
                    if file.suffix in (".py", ".cpp") for line in file.read_text().splitlines()
                    if re.search(r'Error\(.*"TESSEL:python:(?!\w+")', line)]
    assert sorted(put_together) == [
        ("opening.py", 'error = tessel.Error(f"TESSEL:python:{word}", message, path=path)'),
        ("python_classes.cpp", 'throw Error(std::string("TESSEL:python:").append(word), message);'),
    ]


def test_every_row_is_on_a_page() -> None:
    on_pages = {row for each in OPERATIONS for row in reference.rows_of(each)}
    assert on_pages | set(reference.EVERY_CALL) == set(catalogue.ROWS)
    assert len(on_pages) == len(catalogue.ROWS) - len(reference.EVERY_CALL)
    assert set(catalogue.RAISES) == {each.short if each.short in catalogue.RAISES
                                     else each.short.rpartition("_")[0] for each in OPERATIONS}


@each_operation
def test_page_has_what_the_code_can_raise(operation: Operation) -> None:
    """The handler's rows, expanded by names and labels, and the causes that the table has for
    statuses of its library calls: no more and no less."""
    page = PAGES[operation.short]
    tags = {each.identifier for each in page.statuses}
    words = set(catalogue.STATUSES.values())
    expected = set()
    for row in reference.rows_of(operation):
        template = catalogue.ROWS[row][0]
        if template.endswith(":"):
            assert template in tags
        elif "{label}" in template:
            expected |= {template.format(label=each.label or each.name)
                         for each in operation.arguments
                         if each.name in ("index", "start", "count", "stride")}
        else:
            expected.add(template.format(short=operation.short))
    own = {each for each in identifiers(operation.short)
           if not each.startswith("TESSEL:python:")}
    caused = {each for each in own - expected
              if each[:-len(word_of(each))] in tags and word_of(each) in words}
    assert own == expected | caused
    for each in (*page.raised, *page.statuses, *page.around, *page.guards, *page.refused):
        assert each.cause and each.message and not re.search(r"%[sduf]|[{}]", each.message)


def test_each_conversion_is_filled() -> None:
    """As many texts as conversions; the operation's name only where a name can stand."""
    assert set(reference._FILLINGS) <= set(catalogue.ROWS)
    for row, (_, message) in catalogue.ROWS.items():
        conversions = re.findall("%.", message)
        if row in reference._FILLINGS:
            assert len(conversions) == len(reference._FILLINGS[row]), row
        else:
            assert conversions in ([], ["%s"]), row


@each_operation
def test_page_is_provoked(operation: Operation) -> None:
    """Each identifier is one that a test of the module expects; statuses are forced into every
    library call, tag by tag."""
    for identifier in identifiers(operation.short) - UNPROVOKED:
        if identifier.startswith("TESSEL:python:"):
            assert identifier in (ROOT / "tests" / "python" / "test_methods.py").read_text()
            continue
        rest = identifier.removeprefix("TESSEL:netcdf:")
        word = word_of(identifier)
        tag = rest[:-len(word)]
        ways = [(f'"{rest}',), (f"netcdf:{rest}",), (f'netcdf:{tag}"', f'"{word}"'),
                (re.sub(r"^(start|count|stride)", '"', rest),)]
        if word in catalogue.STATUSES.values():
            ways.append((f'"{tag}"',))
        if tag == f"{operation.short}:":
            ways.append((f'":{word}"',))
        assert any(is_expected(*each) for each in ways), identifier
    for each in PAGES[operation.short].statuses:
        assert is_expected(f'"{each.identifier.removeprefix("TESSEL:netcdf:")}"')


def test_every_status_is_forced() -> None:
    text = (ROOT / "tests" / "conformance" / "library_failures.cpp").read_text()
    for status, word in catalogue.STATUSES.items():
        assert f'{{{status}, "{word}"}}' in text


def test_every_word_is_explained() -> None:
    """Those that errors.py knows, and the guard's; each once."""
    guard = set(re.findall(r'"TESSEL:guard:(\w+)"',
                           (ROOT / "guard" / "src" / "refusals.hpp").read_text()))
    assert len(guard) >= 7
    assert set(meanings.MEANINGS) == {*CLASSES, *WITHOUT_BUILT_IN, *guard}
    assert sum(map(len, meanings.GROUPS.values())) == len(meanings.MEANINGS)
    for meaning, remedy in meanings.MEANINGS.values():
        assert meaning.endswith(".") and remedy.endswith(".") and meaning != remedy


@each_operation
def test_the_same_everywhere(operation: Operation) -> None:
    """The text, the manual page and the page of the book have all errors, arguments and results."""
    page = PAGES[operation.short]
    text = reference.text_of(operation)
    man = MAN[f"man3/tessel-{operation.short}.3"].replace("\\-", "-").replace("\\e", "\\")
    rst = RST[f"{operation.short}.rst"]
    for form in (text, man, rst):
        for each in (*page.raised, *page.statuses, *page.around, *page.guards, *page.refused):
            assert each.identifier in form
        for each in (*operation.arguments, *operation.results):
            assert each.name in form and each.kind.host in form
        for line in operation.example.splitlines():
            assert line.replace("'", "\\(aq") in form or line in form
    assert operation.purpose in text
    for form, heading in ((text, "\nErrors\n------\n"), (man, "\n.SH ERRORS\n"),
                          (rst, "\nErrors\n------\n")):
        before, _, errors = form.partition(heading)
        for each in (*page.raised, *page.statuses, *page.around, *page.guards, *page.refused):
            assert each.identifier in errors and each.identifier not in before


def test_the_index_has_all() -> None:
    index = RST["errors.rst"]
    for word in meanings.MEANINGS:
        assert f"\n   {word}\n" in index
    explained = {*catalogue.HOST, *catalogue.GUARD, *catalogue.PACKAGE}
    assert len(explained) > 60
    for identifier in explained:
        assert f"\n``{identifier}``\n   {make_reference.advice(identifier)}\n" in index
    module = {identifier for short in PAGES for identifier in identifiers(short)} - explained
    module |= {each.identifier for each in reference.every_call()} - explained
    assert len(module) > 250
    for identifier in module:
        word = word_of(identifier)
        meaning = make_reference.rst(meanings.MEANINGS[word][0])
        assert f"\n``{identifier}``\n   {meaning} :term:`{word}` says what to do.\n" in index
    places = re.findall(r"^\.\. _(.*):\n\n``(.*)``\n   ", index, re.M)
    assert [each for _, each in places] == re.findall(r"^``(TESSEL:.*)``$", index, re.M)
    assert len({place.lower() for place, _ in places}) == len(places) > 400
    assert ("error-TESSEL-netcdf-inqVarID-variableNotFound",
            "TESSEL:netcdf:inqVarID:variableNotFound") in places
    assert "\nAll identifiers\n" in index
    assert ("``TESSEL:host:outOfMemory``\n   There is no memory left. What to do: Read or write by "
            "smaller blocks.\n\n   Every operation.\n") in index
    assert {f"{each.short}.rst" for each in OPERATIONS} < set(RST)
    assert sum(map(len, make_reference.by_subject().values())) == 102
    assert all(make_reference.by_subject().values())


def test_manual_pages_are_clean(tmp_path: Path) -> None:
    """The formatter has nothing to complain of in any of them."""
    make_reference.write(make_reference.encoded(MAN), tmp_path)
    assert len(MAN) == 104
    run = subprocess.run(["groff", "-man", "-ww", "-Tutf8", "-z", *(str(tmp_path / each)
                                                                  for each in MAN)],
                         capture_output=True, text=True, env=PLAIN, check=True)
    assert run.stdout + run.stderr == ""
    for page, text in MAN.items():
        assert not re.search(r"\.:$", text, re.M), page
    whole = MAN["man1/tessel.1"]
    for name in ("info", "plot", "copy", "check", "ops"):
        assert f".SS {name}\n" in whole
    assert command.parser().prog == "tessel"


@pytest.mark.parametrize("arguments, what", [
    (["ops", "open"], "all is well"),
    (["info", "missing.nc"], "something failed"),
    (["ops", "nothing"], "something failed"),
    ([], "the command was used wrongly"),
    (["nothing"], "the command was used wrongly"),
    (["info"], "the command was used wrongly"),
    (["copy", "a.nc", "b.nc", "--format", "nothing"], "the command was used wrongly"),
    (["info", "a.nc", "--guard", "nothing"], "the command was used wrongly"),
])
def test_the_status_is_what_the_page_says(arguments: list[str], what: str) -> None:
    [text] = re.findall(r"^\.SH EXIT STATUS\n(.*?);", MAN["man1/tessel.1"], re.M)
    said = {each: int(number) for number, causes in re.findall(r"(\d+) if ([^,\d]*)", text)
            for each in causes.split(" or ")}
    assert set(said) == {"all is well", "something failed", "the command was used wrongly"}
    run = subprocess.run([sys.executable, "-B", "-m", "tessel", *arguments], check=False,
                         capture_output=True, text=True)
    assert (run.returncode, len(run.stderr.splitlines())) == (said[what], said[what])


def test_calls_in_cpp_compile(tmp_path: Path) -> None:
    """Every call as the pages have it, with a declaration for each argument."""
    types = {"char": "std::string", "double": "tessel::Array"}
    functions = []
    for operation in OPERATIONS:
        parameters = "".join(
            f", const {types.get(each.kind.host, 'tessel::Array')} &{each.name}"
            for each in operation.arguments)
        used = "".join(f"\n(void){name};" for name in
                       re.findall(r"const auto (\w+)", reference.cpp_call(operation)))
        functions.append(f"void call_{operation.short}(const tessel::Module &netcdf{parameters}) "
                         f"{{\n{reference.cpp_call(operation)}{used}\n}}")
    source = tmp_path / "calls.cpp"
    source.write_text("#include \"tessel/runtime.hpp\"\n#include <cstdint>\n#include <string>\n"
                      "#include <vector>\n"
                      + "\n".join(functions))
    run = subprocess.run(["c++", "-std=c++20", "-fsyntax-only", "-Wall", "-Werror",
                          f"-I{ROOT / 'runtime' / 'include'}", f"-I{ROOT / 'host'}", str(source)],
                         capture_output=True, text=True, env=PLAIN, check=False)
    assert run.returncode == 0, run.stderr
    assert len(functions) == 102


def test_ops_prints_the_page(capsys: pytest.CaptureFixture[str]) -> None:
    assert command.main(["ops", "nc_OPEN"]) == 0
    operation = find("open")
    assert operation is not None
    assert capsys.readouterr().out == reference.text_of(operation)
