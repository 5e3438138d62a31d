# tests/python/test_exit.py: the end of a program whose threads are still within calls.
"""Python ends daemon threads when it ends itself: as soon as they want the interpreter. A program that
leaves such threads within calls must end as it would without them, whatever they are doing."""

from __future__ import annotations

import subprocess
import sys
from pathlib import Path

import pytest

TIMES = 10
"""Programs for each call. Where threads are not stopped, nearly all of them are aborted."""

BEGINNING = """
import os, sys, threading, time
from pathlib import Path
import tessel
from tessel import _runtime
nc = tessel.load("netcdf")
ncid = nc.create(sys.argv[1], "CLOBBER")
nc.def_var(ncid, "v", nc.param("NC_DOUBLE"), [nc.def_dim(ncid, "x", 100_000)])
nc.enddef(ncid)
missing = Path(sys.argv[1]).with_name("missing.nc")

def failing(*call):
    try:
        nc(*call)
    except tessel.Error:
        pass
"""

END = """
def work():
    while True:
        call()

for _ in range(4):
    threading.Thread(target=work, daemon=True).start()
time.sleep(float(sys.argv[2]))
"""


@pytest.mark.parametrize("call", [
    "nc.get_var_double(ncid, 0)",
    "nc.inq_libvers()",
    "failing('inq_varid', ncid, 'w')",  # Python makes the error
    "failing('open', missing, 'NOWRITE')",  # and the text of the path, and takes the call
    "_runtime.load_file(os.fsencode(nc.file))",
    "tessel.Module(_runtime.load_file(os.fsencode(nc.file)))",
])
def test_threads_within_calls_do_not_disturb_the_end(tmp_path: Path, call: str) -> None:
    program = f"{BEGINNING}\ndef call():\n    {call}\n{END}"
    for i in range(TIMES):
        ended = subprocess.run(
            [sys.executable, "-c", program, tmp_path / "some.nc", str(i * 0.003)],
            capture_output=True, text=True, timeout=60)
        assert (ended.returncode, ended.stderr) == (0, "")
