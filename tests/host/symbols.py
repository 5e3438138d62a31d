"""tests/host/symbols.py: what the built files export and want, against what the headers declare.

usage: symbols.py HEADERS RUNTIME MODULE

The runtime library exports, with C linkage, exactly the functions that the host's headers declare,
save for the module's entry point. The module exports the entry point and nothing else, wants only
declared functions of the host, and does not depend on the runtime library.
"""

import re
import subprocess
import sys
from pathlib import Path

ENTRY_POINT = "tsxFunction"
COMMENT = re.compile(r"/\*.*?\*/", re.DOTALL)
FUNCTION = re.compile(r"\b(tsx?[A-Z]\w*)\(")
NEEDED = re.compile(r"\(NEEDED\).*\[(.*)\]")


def declared(folder: Path) -> set[str]:
    """The functions that the headers in the folder declare."""
    names: set[str] = set()
    for header in folder.glob("*.h"):
        names.update(FUNCTION.findall(COMMENT.sub("", header.read_text(encoding="utf-8"))))
    return names


def output(*command: str) -> str:
    """What a command prints."""
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def symbols(file: str, which: str) -> set[str]:
    """The names of the file's dynamic symbols, defined or undefined ones, without versions."""
    lines = output("nm", "-D", which, file).splitlines()
    return {line.split()[-1].split("@")[0] for line in lines}


def main(headers: str, runtime: str, module: str) -> list[str]:
    """The faults, one line each."""
    promised = declared(Path(headers))
    ours = promised - {ENTRY_POINT}
    exported = symbols(runtime, "--defined-only")
    exported = {name for name in exported if not name.startswith(("_Z", "__"))}  # C++, compiler
    wanted = {name for name in symbols(module, "--undefined-only") if re.match(r"tsx?[A-Z]", name)}
    libraries = NEEDED.findall(output("readelf", "--dynamic", module))
    checks = {
        "the headers declare the entry point": ENTRY_POINT in promised,
        f"the runtime lacks {sorted(ours - exported)}": exported >= ours,
        f"the runtime exports {sorted(exported - ours)} too": exported <= ours,
        f"the module exports {sorted(symbols(module, '--defined-only'))}": symbols(
            module, "--defined-only"
        )
        == {ENTRY_POINT},
        "the module wants functions of the host": bool(wanted),
        f"the module wants {sorted(wanted - ours)}": wanted <= ours,
        f"the module depends on {libraries}": bool(libraries)
        and Path(runtime).name not in libraries,
    }
    return [fault for fault, holds in checks.items() if not holds]


if __name__ == "__main__":
    if faults := main(*sys.argv[1:]):
        sys.exit("\n".join(faults))
