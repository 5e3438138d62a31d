# tests/python/test_book.py: the examples in the book run, and what makes it finds broken links.
"""Every piece of Python in the pages of docs/book is run, page by page."""

import doctest
import json
import re
import sys
from pathlib import Path

import pytest

ROOT = Path(__file__).parents[2]
BOOK = ROOT / "docs" / "book"
sys.path.insert(0, str(ROOT / "tools"))
import make_book  # noqa: E402

PAGES = sorted(BOOK.rglob("*.md"))


@pytest.fixture(autouse=True)
def empty_folder(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """Every test has an empty current folder."""
    monkeypatch.chdir(tmp_path)


def examples(page: Path) -> str:
    """The pieces of Python of a page, one after the other."""
    return "\n".join(re.findall(r"^```pycon\n(.*?)^```", page.read_text(), re.M | re.S))


WITH_EXAMPLES = [each for each in PAGES if examples(each)]


@pytest.mark.parametrize("page", WITH_EXAMPLES, ids=lambda each: each.stem)
def test_examples(page: Path) -> None:
    test = doctest.DocTestParser().get_doctest(examples(page), {}, page.name, None, None)
    assert len(test.examples) == len(re.findall(r"^>>> ", examples(page), re.M))
    shown: list[str] = []
    results = doctest.DocTestRunner().run(test, out=shown.append)
    assert results.failed == 0, "".join(shown)


def test_there_are_examples() -> None:
    assert {"start", "modes", "records", "text", "large", "tuned", "labelled"} == {
        each.stem for each in WITH_EXAMPLES}


def test_a_broken_link_is_found(tmp_path: Path) -> None:
    (tmp_path / "a.html").write_text('<a href="b.html">1</a><a href="b.html#here">2</a>'
                                     '<a href="b.html#there">3</a><a href="c.html">4</a>'
                                     '<a href="https://example.org/c.html">5</a>')
    (tmp_path / "b.html").write_text('<p id="here"><a href="#gone">6</a><img src="d.png"></p>')
    assert make_book.broken_links(tmp_path) == (
        ["a.html: b.html#there", "a.html: c.html", "b.html: #gone", "b.html: d.png"], 6)


def test_links_of_documents_lead_somewhere() -> None:
    names = {each.name for each in make_book.documents(ROOT)}
    assert {"README.md", "CONTRIBUTING.md", "SECURITY.md", "CHANGELOG.md", "order.md"} < names
    assert [found for each in make_book.documents(ROOT)
            for found in make_book.missing_targets(each)] == []


@pytest.mark.parametrize("link, missing", [
    ("b.md", False),
    ("c.md", True),
    ("folder", False),
    ("../here/b.md", False),
    ("b.md#a-head-of-c", False),
    ("b.md#here", False),
    ("b.md#comment", True),
    ("b.md#there", True),
    ("#head", False),
    ("#gone", True),
    ("https://example.org/gone.md", False),
])
def test_a_missing_target_is_found(tmp_path: Path, link: str, missing: bool) -> None:
    here = tmp_path / "here"
    (here / "folder").mkdir(parents=True)
    (here / "b.md").write_text('## A head: of `c`\n```sh\n# comment\n```\n<a name="here"></a>x')
    (here / "a.md").write_text(f"# Head\n[shown]({link}) and ![shown]({link}), `[not](one.md)`")
    assert make_book.missing_targets(here / "a.md") == [f"a.md: {link}"] * 2 * missing


@pytest.mark.parametrize("indexed, found", [
    ({"alltitles": {"enddef": [[0, "enddef"]]}}, {"alltitles": {"enddef": [[0, None]]}}),
    ({"alltitles": {"Errors": [[0, "errors"], [1, "errors"]]}},
     {"alltitles": {"Errors": [[0, "errors"], [1, None]]}}),
    ({"indexentries": {"nc_enddef": [[0, "index-0"]]}},
     {"indexentries": {"nc_enddef": [[0, None]]}}),
    ({"indexentries": {"tscell": [[1, "c.tsCELL"]]}},
     {"indexentries": {"tscell": [[1, "c.tsCELL"]]}}),
])
def test_a_page_is_in_the_search_once(tmp_path: Path, indexed: dict[str, object],
                                      found: dict[str, object]) -> None:
    """Without an anchor wherever the page itself is meant, as its text is, whatever it is found
    by."""
    rest = {"titles": ["enddef", "Errors"], "alltitles": {}, "indexentries": {}}
    file = tmp_path / "searchindex.js"
    file.write_text(f"Search.setIndex({json.dumps(rest | indexed)})")
    make_book.finish_search(tmp_path)
    assert file.read_text() == f"Search.setIndex({json.dumps(rest | found)})"


def test_links_of_documents_are_those_of_the_book() -> None:
    text = "[a](order.md) [b](threads.md#x) [c](../host/) ![d](map.png) [e](https://example.org)"
    assert make_book.linked(text, "concepts") == (
        "[a](order.md) [b](../howto/threads.md#x) c ![d](map.png) [e](https://example.org)")
    text = "[order.md](order.md), [threads.md](threads.md#x), [a.md](order.md)"
    assert make_book.linked(text, "concepts") == (
        "[](order.md), [](../howto/threads.md#x), [a.md](order.md)")
    assert make_book.linked('[a](#here) [b](#head)\n<a name="here"></a>x', "inside") == (
        "[a](here) [b](#head)\n(here)=\nx")
