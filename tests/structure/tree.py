"""tests/structure/tree.py: the version is stated in one place, and every source says what it is and is
compiled.

usage: tree.py ROOT VERSION COMPILE_COMMANDS
"""

from __future__ import annotations

import json
import re
import subprocess
import sys
from pathlib import Path

VERSION_IN = {"CMakeLists.txt", "CHANGELOG.md"}

# Compiled by the tests themselves, or by projects of their own.
BUILT_OTHERWISE = {"tests/host/contract.c", "tests/host/contract.cpp",
                   "examples/embedding/guarded.cpp", "examples/embedding/means.cpp"}


def main(root: Path, version: str, commands: Path) -> int:
    """Prints what is wrong, and says whether something is."""
    listed = subprocess.run(["git", "ls-files", "-z"], cwd=root, check=True, capture_output=True)
    files = {name: root / name for name in listed.stdout.decode().split("\0")
             if name and (root / name).is_file()}
    texts = {}
    for name, file in files.items():
        try:
            texts[name] = file.read_text("utf-8")
        except UnicodeDecodeError:
            continue
    found = []

    stated = re.compile(rf"(?<![\d.]){re.escape(version)}(?![\d.]*\d)")
    found += [f"{name}: the version is in CMakeLists.txt" for name, text in texts.items()
              if name not in VERSION_IN and stated.search(text)]
    newest = re.search(r"^## (\S+),", texts["CHANGELOG.md"], re.M)
    if not newest or newest[1] != version:
        found.append(f"CHANGELOG.md: the first heading is not of version {version}")
    if len(stated.findall(texts["CMakeLists.txt"])) != 1:
        found.append("CMakeLists.txt: the version is not there once")

    for name, text in texts.items():
        if re.search(r"\.(c|h|cpp|hpp)$", name):
            first = re.match(r"(?://|/\*) (\S+): ", text)
            path = first[1] if first else ""
            # Public headers say what they are included as.
            if path != name and not (path.startswith("tessel/") and name.endswith(f"/{path}")):
                found.append(f"{name}: does not begin with its path and what it is")

    compiled = {Path(each["file"]).resolve() for each in json.loads(commands.read_text())}
    found += [f"{name}: is not compiled" for name, file in files.items()
              if re.search(r"\.(c|cpp)$", name) and name not in BUILT_OTHERWISE
              and file.resolve() not in compiled]
    print("\n".join(found) or f"{len(files)} files, {len(compiled)} compiled")
    return len(found) > 0


if __name__ == "__main__":
    if len(sys.argv) != 4:
        sys.exit(__doc__)
    sys.exit(main(Path(sys.argv[1]), sys.argv[2], Path(sys.argv[3])))
