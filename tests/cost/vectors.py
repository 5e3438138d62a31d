"""tests/cost/vectors.py: the loops that widen and narrow text are made of vector instructions.

usage: vectors.py COMPILE_COMMANDS

Compiles the two files as they are compiled for the build, and has the compiler (g++) tell of which
loops it made vectors. With vectors switched off it must tell of none, or the test sees nothing.
"""

from __future__ import annotations

import json
import re
import shlex
import subprocess
import sys
from pathlib import Path
from typing import NamedTuple

# The narrowest vectors that are as wide as a register; what is left of a loop has narrower ones.
WIDTH = 16


class Loops(NamedTuple):
    """The loops of a file that are to be vectorised, by the file that the loop itself is in."""

    file: str
    loop_in: str
    count: int


WANTED = [
    # Widening and narrowing, each of what is before the first whole step and of what is behind the
    # last, or of everything: std::transform.
    Loops("module/convert/text.cpp", "stl_algo.h", 4),
    # From UTF-8 and into it, as long as it is ASCII.
    Loops("runtime/src/text.cpp", "text.cpp", 2),
]


def vectorised(commands: Path, loops: Loops, *flags: str) -> int:
    """How many such loops the compiler makes vectors of."""
    entry = next(each for each in json.loads(commands.read_text())
                 if each["file"].endswith("/" + loops.file))
    command = shlex.split(entry["command"])
    command[command.index("-o") + 1] = "/dev/null"
    # When files are compiled together, vectors are made when they are linked.
    told = subprocess.run([*command, "-fno-lto", "-fopt-info-vec-optimized", *flags],
                          cwd=entry["directory"], capture_output=True, text=True, check=True)
    widths = re.findall(rf"/{re.escape(loops.loop_in)}:\d+:\d+: optimized: +"
                        r"loop vectorized using (\d+) byte vectors", told.stderr)
    return sum(int(width) >= WIDTH for width in widths)


def main() -> int:
    commands = Path(sys.argv[1])
    good = True
    for loops in WANTED:
        found, without = vectorised(commands, loops), vectorised(commands, loops,
                                                                 "-fno-tree-vectorize")
        well = found >= loops.count and without == 0
        good = good and well
        print(f"{loops.file}: {found} of {loops.count} loops are made of vectors, "
              f"{without} with vectors switched off" + ("" if well else "  FAILED"))
    return 0 if good else 1


if __name__ == "__main__":
    sys.exit(main())
