#!/usr/bin/env python3
"""tools/make_book.py: makes the book: sources put together, Doxygen, Sphinx, and its links checked.

usage: PYTHONPATH=build/release/python /usr/bin/python3 tools/make_book.py VERSION FOLDER

The pages are those of docs/book, the documents of docs, and the reference, which is generated. They
end up in FOLDER/html. Any warning fails, and so does a link within the book that leads nowhere.
"""

from __future__ import annotations

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
CHAPTERS = {"order.md": "concepts", "threads.md": "howto", "xarray.md": "howto",
            "xarray-writing.md": "howto"}


def chapter(name: str) -> str:
    """Where a document stands in the book."""
    return CHAPTERS.get(name, "inside")


def linked(text: str, home: str) -> str:
    """A document with its links as they are in the book: to its other pages, or only their text.
    Places that HTML names in it are named as Sphinx wants it."""
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
            return f"[{shown}](../{chapter(name)}/{target})" if chapter(name) != home else found[0]
        return shown

    return re.sub(r"(?<!!)\[([^\]\n]*)\]\(([^)\s]+)\)", replaced, text)


def put_together(source: Path) -> None:
    """The sources of all pages in one folder."""
    shutil.rmtree(source, ignore_errors=True)
    shutil.copytree(DOCS / "book", source)
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
    found, followed = broken_links(html)
    if found or followed < 1000:
        sys.exit("\n".join([*found, f"{len(found)} of {followed} links lead nowhere"]))
    print(f"{html / 'index.html'}: {len(list(html.rglob('*.html')))} pages, {followed} links")


if __name__ == "__main__":
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    main(sys.argv[1], Path(sys.argv[2]))
