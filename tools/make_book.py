#!/usr/bin/env python3
"""tools/make_book.py: makes the book: sources put together, Doxygen, Sphinx, and its links checked.

usage: PYTHONPATH=build/release/python /usr/bin/python3 tools/make_book.py VERSION FOLDER

The pages are those of docs/book, the documents of docs, and the reference, which is generated. They
end up in FOLDER/html. Any warning fails, and so does a link that leads nowhere within the book, or
from a document into the tree.
"""

from __future__ import annotations

import json
import os
import re
import shutil
import subprocess
import sys
from html.parser import HTMLParser
from pathlib import Path
from urllib.parse import unquote, urlsplit

import make_reference

ROOT = Path(__file__).resolve().parents[1]
DOCS = ROOT / "docs"

# Where the documents of docs/ stand in the book; others are in "inside".
CHAPTERS = {"order.md": "concepts", "formats.md": "concepts", "threads.md": "howto",
            "xarray.md": "howto", "xarray-writing.md": "howto"}


def chapter(name: str) -> str:
    """Where a document stands in the book."""
    return CHAPTERS.get(name, "inside")


LINK = r"\[([^\]\n]*)\]\(([^)\s]+)\)"


def places_in(document: Path) -> set[str]:
    """What links may name in a document: its headings as those who show it name them, and places
    with names of their own."""
    text = re.sub(r"^```.*?^```", "", document.read_text(), flags=re.M | re.S)
    headings = re.findall(r"^#+ +(.+?) *$", text, re.M)
    return {*(re.sub(r"[^\w -]", "", re.sub(LINK, r"\1", each)).lower().replace(" ", "-")
              for each in headings), *re.findall(r'<a name="(\w+)"></a>', text)}


def missing_targets(document: Path) -> list[str]:
    """The links of a document to files that are not in the tree, and to places not in a file."""
    found = []
    text = re.sub(r"^```.*?^```|`[^`\n]*`", "", document.read_text(), flags=re.M | re.S)
    for _, link in re.findall(LINK, text):
        parts = urlsplit(link)
        target = document.parent / unquote(parts.path) if parts.path else document
        if not parts.scheme and not (target.exists() and (
                not parts.fragment or parts.fragment in places_in(target))):
            found.append(f"{document.name}: {link}")
    return found


def documents(root: Path) -> list[Path]:
    """Those whose links are paths in the tree; of the book's own pages, Sphinx looks at them."""
    return sorted((*root.glob("*.md"), *root.glob("docs/*.md")))


def linked(text: str, home: str) -> str:
    """A document with its links as they are in the book: to its other pages, or only their text.
    One that shows a file's name shows the page's title there. Places that HTML names in it are
    named as Sphinx wants it."""
    places = set(re.findall(r'^<a name="(\w+)"></a>', text, re.M))
    text = re.sub(r'^<a name="(\w+)"></a>', r"(\1)=\n", text, flags=re.M)

    def replaced(found: re.Match[str]) -> str:
        shown, target = found[1], found[2]
        name = target.partition("#")[0]
        if target[1:] in places and target[0] == "#":
            return f"[{shown}]({target[1:]})"
        if target.startswith(("http", "#")) or (DOCS / name).suffix in (".svg", ".png"):
            return found[0]
        if (DOCS / name).is_file():
            folder = f"../{chapter(name)}/" if chapter(name) != home else ""
            return f"[{'' if shown == name else shown}]({folder}{target})"
        return shown

    return re.sub(rf"(?<!!){LINK}", replaced, text)


def put_together(source: Path) -> None:
    """The sources of all pages in one folder."""
    shutil.rmtree(source, ignore_errors=True)
    shutil.copytree(DOCS / "book", source)
    for page in (source / "interfaces").glob("*.md"):
        page.touch()  # it shows what the headers say, which Sphinx does not look at for changes
    for document in DOCS.glob("*.md"):
        home = chapter(document.name)
        (source / home).mkdir(exist_ok=True)
        (source / home / document.name).write_text(linked(document.read_text(), home))
    for picture in (*DOCS.glob("*.svg"), *DOCS.glob("*.png")):
        for folder in (source, source / "concepts", source / "howto", source / "inside"):
            shutil.copy(picture, folder)
    shutil.copytree(ROOT / "examples", source / "code")
    make_reference.write(make_reference.encoded(make_reference.rst_pages()), source / "reference")


def run(*command: str | Path, **more: object) -> str:
    """Runs a program; what it prints, and an end to everything if it fails."""
    done = subprocess.run([str(each) for each in command],  # type: ignore[call-overload]
                          text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          check=False, **more)
    if done.returncode != 0:
        sys.exit(f"{done.stdout}\nFailed: {command[0]}")
    return str(done.stdout)


def doxygen(folder: Path) -> None:
    """What the headers say, as XML; a warning is an error."""
    inputs = " ".join(str(ROOT / each) for each in ("host", "runtime/include", "guard/include"))
    told = run("doxygen", "-", cwd=folder, input=(
        f"@INCLUDE = {DOCS / 'book' / 'Doxyfile'}\nINPUT = {inputs}\n"
        f"STRIP_FROM_PATH = {ROOT / 'host'} {ROOT / 'runtime/include'} {ROOT / 'guard/include'}\n"
        f"OUTPUT_DIRECTORY = {folder}\n"))
    if told.strip():
        sys.exit(told)


class Page(HTMLParser):
    """The links and the anchors of a page."""

    def __init__(self, text: str) -> None:
        super().__init__()
        self.links: set[str] = set()
        self.anchors: set[str] = {""}
        self.feed(text)

    def handle_starttag(self, tag: str, attrs: list[tuple[str, str | None]]) -> None:
        for name, value in attrs:
            if name == "id" or (name == "name" and tag == "a"):
                self.anchors.add(value or "")
            elif name in ("href", "src") and value:
                self.links.add(value)


def broken_links(html: Path) -> tuple[list[str], int]:
    """The links within the book that lead nowhere, and how many were followed."""
    pages = {file: Page(file.read_text()) for file in html.rglob("*.html")}
    found, followed = [], 0
    for file, page in pages.items():
        for link in page.links:
            parts = urlsplit(link)
            if parts.scheme or parts.netloc:
                continue
            followed += 1
            target = (file.parent / unquote(parts.path)).resolve() if parts.path else file
            anchors = pages[target].anchors if target in pages else {"", unquote(parts.fragment)}
            if not target.is_file() or unquote(parts.fragment) not in anchors:
                found.append(f"{file.relative_to(html)}: {link}")
    return sorted(found), followed


def finish_search(html: Path) -> None:
    """Has the search find a page once. It takes results for the same where page, title and anchor
    are, and a page is in its index without an anchor for its text, with one for its title, and with
    one for the words that the page is under in the index."""
    file = html / "searchindex.js"
    start, end = "Search.setIndex(", ")"
    text = file.read_text()
    assert text.startswith(start) and text.endswith(end)
    index = json.loads(text.removeprefix(start).removesuffix(end))
    for title, places in index["alltitles"].items():
        for place in places:
            if index["titles"][place[0]] == title:
                place[1] = None
    for places in index["indexentries"].values():
        for place in places:
            if place[1].startswith("index-"):
                place[1] = None
    file.write_text(start + json.dumps(index) + end)


def finish_theme(static: Path) -> None:
    """Makes the packaged theme work from any folder and in any browser. Its style sheet names
    another by an address of the web server's and has no rule for those who prefer dark, and its
    script is none that browsers run: it imports what was meant to be bundled."""
    style = static / "styles" / "furo.css"
    text = style.read_text()
    [wanted] = re.findall(r"^@import url\(/javascript/(.+?)\);$", text, re.M)
    text = re.sub(r"^@import .+;$", lambda _: Path("/usr/share/javascript", wanted).read_text(),
                  text, flags=re.M)
    [dark] = re.findall(r'^  body\[data-theme="dark"\] (\{[^}]*\})', text, re.M)
    style.write_text(f"{text}\n@media (prefers-color-scheme: dark) {{\n"
                     f'  body[data-theme="auto"] {dark} }}\n')
    script = static / "scripts" / "furo.js"
    library = static / "scripts" / "gumshoe-patched.js"
    bundled, found = re.subn(r'^import Gumshoe from ".*";$', lambda _: library.read_text(),
                             script.read_text(), flags=re.M)
    assert found == 1
    script.write_text(bundled)


def main(version: str, folder: Path) -> None:
    """The book, or the reason why there is none."""
    if missing := [each for document in documents(ROOT) for each in missing_targets(document)]:
        sys.exit("\n".join([*missing, "links to what is not in the tree"]))
    folder = folder.resolve()
    folder.mkdir(parents=True, exist_ok=True)
    source, html = folder / "source", folder / "html"
    put_together(source)
    doxygen(folder)
    shutil.rmtree(html, ignore_errors=True)
    run(sys.executable, "-m", "sphinx", "-q", "-W", "--keep-going", "-j", "2", "-b", "html",
        "-d", folder / "doctrees", source, html,
        env={**os.environ, "TESSEL_VERSION": version, "TESSEL_DOXYGEN": str(folder / "xml")})
    finish_theme(html / "_static")
    finish_search(html)
    found, followed = broken_links(html)
    if found or followed < 1000:
        sys.exit("\n".join([*found, f"{len(found)} of {followed} links lead nowhere"]))
    print(f"{html / 'index.html'}: {len(list(html.rglob('*.html')))} pages, {followed} links")


if __name__ == "__main__":
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    main(sys.argv[1], Path(sys.argv[2]))
