"""tests/structure/arrows.py: the arrows between the folders point one way.

usage: arrows.py ROOT

Each folder may include what the table gives it, and itself; nothing else of the project. System and
library headers are nobody's business here.
"""

import re
import sys
from pathlib import Path

# folder -> the folders whose headers it may include
MAY_INCLUDE = {
    "host": set(),
    "module/call": {"host"},
    "module/convert": {"host", "module/call"},
    "module/constants": {"host", "module/call", "module/convert"},
    "module/ops/dataset": {"host", "module/call", "module/convert"},
    "module/ops/schema": {"host", "module/call", "module/convert"},
    "module/ops/attribute": {"host", "module/call", "module/convert"},
    "module/ops/data": {"host", "module/call", "module/convert"},
    "module/gateway": {
        "host",
        "module/call",
        "module/constants",
        "module/ops/dataset",
        "module/ops/schema",
        "module/ops/attribute",
        "module/ops/data",
    },
    "runtime/include": {"host"},
    "runtime/src": {"host", "runtime/include"},
    "guard/include": {"host", "runtime/include"},
    "guard/src": {"host", "runtime/include", "guard/include"},
    "python/src": {"host", "runtime/include", "guard/include"},
}

# where an include is looked for, and the folder of the table that a header belongs to
SEARCH = ["host", "module", "runtime/include", "runtime/src", "guard/include",
          "guard/src", "python/src"]


def folder_of(path: Path) -> str | None:
    """The longest folder of the table that the path is in."""
    inside = [f for f in MAY_INCLUDE if path.as_posix().startswith(f + "/")]
    return max(inside, key=len, default=None)


def included(root: Path, source: Path, name: str) -> Path | None:
    """The project's header that the source means, or None for a header of somebody else's."""
    for folder in [source.parent, *(Path(s) for s in SEARCH)]:
        if (root / folder / name).is_file():
            return folder / name
    return None


def faults(root: Path) -> tuple[list[str], int]:
    """What breaks the table, and how many includes of the project's own headers were looked at."""
    found, looked_at = [], 0
    for path in sorted(root.glob("*/**/*")):
        source = path.relative_to(root)
        folder = folder_of(source)
        if folder is None or path.suffix not in {".h", ".hpp", ".cpp"}:
            continue
        for name in re.findall(r'^#include "(.+?)"', path.read_text(), re.MULTILINE):
            header = included(root, source, name)
            if header is None:
                found.append(f"{source}: \"{name}\" is nowhere")
                continue
            looked_at += 1
            target = folder_of(header)
            if target != folder and target not in MAY_INCLUDE[folder]:
                found.append(f"{source}: {folder} must not know {target} ({name})")
    return found, looked_at


def main() -> int:
    """Prints each fault; fails if there is one, or if there was nothing to look at."""
    found, looked_at = faults(Path(sys.argv[1]))
    print("\n".join(found) or f"{looked_at} includes follow the arrows")
    return 1 if found or looked_at < 100 else 0


if __name__ == "__main__":
    sys.exit(main())
