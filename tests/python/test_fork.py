# tests/python/test_fork.py: children forked while other threads are within calls.
"""A forked child can make calls, whatever the threads of its parent were doing."""

from __future__ import annotations

import os
import signal
import sys
import threading
import traceback
from collections.abc import Callable
from pathlib import Path

import numpy as np
import pytest

import tessel

FORKS = 20
CALLERS = 3
PATIENCE = 30  # seconds, then the alarm ends the child

# The sanitizer's own allocator may be locked at the moment of a fork, and stays so in the child.
pytestmark = [pytest.mark.filterwarnings("ignore:.*multi-threaded.*:DeprecationWarning"),
              pytest.mark.without_sanitizers]

netcdf = tessel.load("netcdf")


def write_and_read(path: Path, value: float) -> bool:
    """Makes a file and reads it back; False if it is not what was written."""
    written = np.full(1000, value, float)
    ncid = netcdf("create", path, "CLOBBER")
    x = netcdf("def_dim", ncid, "x", written.size)
    netcdf("def_var", ncid, "v", netcdf("parameter", "DOUBLE"), x)
    netcdf("enddef", ncid)
    netcdf("put_var_double", ncid, 0, written)
    netcdf("close", ncid)
    ncid = netcdf("open", path, "NOWRITE")
    read = netcdf("get_var_double", ncid, 0)
    netcdf("close", ncid)
    return np.array_equal(read.ravel(), written)


def exit_status_of_child(run: Callable[[], bool]) -> int:
    """0 if a forked child comes to its end and says True; minus the signal that ended it."""
    child = os.fork()
    if child == 0:
        signal.signal(signal.SIGALRM, signal.SIG_DFL)
        signal.alarm(PATIENCE)
        status = 1
        try:
            status = 0 if run() else 1
        except BaseException:  # whatever it is, the child must not go on as a second test run
            traceback.print_exc(file=sys.stderr)
        finally:
            os._exit(status)
    return os.waitstatus_to_exitcode(os.waitpid(child, 0)[1])


def test_a_child_forked_while_other_threads_call_can_call(tmp_path: Path) -> None:
    done = threading.Event()
    faults: list[str] = []

    def work(number: int) -> None:
        while not done.is_set():
            if not write_and_read(tmp_path / f"{number}.nc", 1):
                faults.append(f"thread {number} read other values")

    threads = [threading.Thread(target=work, args=(number,)) for number in range(CALLERS)]
    for thread in threads:
        thread.start()
    try:
        child_file = tmp_path / "child.nc"
        statuses = [exit_status_of_child(lambda: write_and_read(child_file, 2))
                    for _ in range(FORKS)]
    finally:
        done.set()
        for thread in threads:
            thread.join()
    assert statuses == [0] * FORKS
    assert faults == []
