# tests/python/test_threads.py: any number of Python threads over any files.
"""Threads that open, read, write and close, beside threads that only compute.

Every value is a function of where it stands, so each thread can check all that it reads without
knowing what the others do. TESSEL_THREAD_SECONDS says how long they work; 2 without it.
"""

from __future__ import annotations

import os
import random
import subprocess
import sys
import threading
import time
from collections import Counter
from collections.abc import Callable, Iterator
from pathlib import Path

import netCDF4
import numpy as np
import pytest

import tessel

WORKERS = 8
COMPUTERS = 2
COLUMNS, ROWS = 64, 48

netcdf = tessel.load("netcdf")


def open_descriptors() -> int:
    return len(os.listdir("/proc/self/fd"))


def identifier_of(call: Callable[[], object]) -> str:
    """The identifier of the error that the call must raise."""
    with pytest.raises(tessel.Error) as raised:
        call()
    return raised.value.identifier


def values_of(columns: range, rows: range, writer: int) -> np.ndarray:
    """What stands in a block, as written by the given writer."""
    return (np.array(columns, float)[:, None] + 1000.0 * np.array(rows, float)[None, :]
            + 1e6 * writer)


class Scene:
    """The files that all threads use, and every dataset id that was ever handed out."""

    def __init__(self, folder: Path) -> None:
        self.folder = folder
        self.ids: set[float] = set()
        self.common_file = folder / "common.nc"
        made = self.create(self.common_file, ROWS)
        netcdf("put_var_double", made, 0, values_of(range(COLUMNS), range(ROWS), 0))
        netcdf("close", made)
        self.read_id = self.open(self.common_file)
        self.write_id = self.create(folder / "written.nc", WORKERS)
        netcdf("put_var_double", self.write_id, 0, values_of(range(COLUMNS), range(WORKERS), 0))

    def note(self, ncid: np.ndarray) -> float:
        number = float(ncid[0, 0])
        self.ids.add(number)
        return number

    def create(self, path: Path, height: int) -> float:
        """A file with one variable of double, id 0; open, out of define mode."""
        ncid = self.note(netcdf("create", path, "CLOBBER"))
        x = netcdf("def_dim", ncid, "x", COLUMNS)[0, 0]
        y = netcdf("def_dim", ncid, "y", height)[0, 0]
        netcdf("def_var", ncid, "v", netcdf("parameter", "DOUBLE"), [x, y])
        netcdf("enddef", ncid)
        return ncid

    def open(self, path: Path) -> float:
        return self.note(netcdf("open", path, "NOWRITE"))

    def close(self) -> None:
        netcdf("close", self.read_id)
        netcdf("close", self.write_id)


class Worker:
    """One thread that works, and what it draws by lot."""

    def __init__(self, scene: Scene, number: int) -> None:
        self.scene = scene
        self.number = number
        self.lot = random.Random(number)

    def read_block(self, ncid: float, writer: int) -> None:
        """Reads a block by lot and checks each of its elements."""
        column, row = self.lot.randrange(COLUMNS), self.lot.randrange(ROWS)
        width, height = self.lot.randint(1, COLUMNS - column), self.lot.randint(1, ROWS - row)
        block = netcdf("get_vara_double", ncid, 0, [column, row], [width, height])
        np.testing.assert_array_equal(
            block, values_of(range(column, column + width), range(row, row + height), writer))

    def own_file(self) -> None:
        path = self.scene.folder / f"{self.number}.nc"
        writer = self.lot.randrange(1000)
        ncid = self.scene.create(path, ROWS)
        netcdf("put_var_double", ncid, 0, values_of(range(COLUMNS), range(ROWS), writer))
        self.read_block(ncid, writer)
        netcdf("close", ncid)
        ncid = self.scene.open(path)
        self.read_block(ncid, writer)
        netcdf("close", ncid)

    def common_dataset(self) -> None:
        self.read_block(self.scene.read_id, 0)

    def common_file(self) -> None:
        ncid = self.scene.open(self.scene.common_file)
        assert netcdf("inq_varid", ncid, "v") == 0
        self.read_block(ncid, 0)
        netcdf("close", ncid)

    def common_rows(self) -> None:
        """Writes the thread's own row of the common dataset and reads it and another one.

        A write is one call, so no row that is read is half of one write and half of another.
        """
        writer = self.lot.randrange(1000)
        columns = range(COLUMNS)
        own = values_of(columns, range(self.number, self.number + 1), writer)
        netcdf("put_vara_double", self.scene.write_id, 0, [0, self.number], [COLUMNS, 1], own)
        assert np.array_equal(self.read_row(self.number), own)
        other = self.lot.randrange(WORKERS)
        row = self.read_row(other)
        written_by = int(row[0, 0] // 1e6)
        assert np.array_equal(row, values_of(columns, range(other, other + 1), written_by))

    def read_row(self, row: int) -> np.ndarray:
        return netcdf("get_vara_double", self.scene.write_id, 0, [0, row], [COLUMNS, 1])

    def errors(self) -> None:
        read_id = self.scene.read_id
        missing = self.scene.folder / "none.nc"
        for identifier, arguments in (
            ("TESSEL:netcdf:open:noSuchFileOrDirectory", ("open", missing, "NOWRITE")),
            ("TESSEL:netcdf:inqVarID:variableNotFound", ("inq_varid", read_id, "none")),
            ("TESSEL:netcdf:getVara:indexExceedsDimensionBound",
             ("get_vara_double", read_id, 0, [COLUMNS + 1, 0], [1, 1])),
            ("TESSEL:netcdf:InvalidOperation", ("no_such_operation",)),
            ("TESSEL:python:unsupportedType", ("inq", object())),
        ):
            assert identifier_of(lambda: netcdf(*arguments)) == identifier

    def methods(self) -> None:
        ncid = netcdf.open(str(self.scene.common_file), "NOWRITE")
        self.scene.ids.add(ncid)
        assert netcdf.inq_var(ncid, 0).name == "v"
        assert identifier_of(lambda: netcdf.inq_varid(ncid, "none")) == (
            "TESSEL:netcdf:inqVarID:variableNotFound")
        self.read_block(ncid, 0)
        netcdf.close(ncid)

    ACTIONS = (own_file, common_dataset, common_file, common_rows, errors, methods)


class Threads:
    """Runs functions on threads until the time is over, and keeps what they count and raise."""

    def __init__(self) -> None:
        self.done = threading.Event()
        self.counts: Counter[str] = Counter()
        self.faults: list[BaseException] = []
        self.lock = threading.Lock()
        self.threads: list[threading.Thread] = []

    def add(self, steps: Iterator[str]) -> None:
        """A thread that takes the steps; each says what it did."""
        def run() -> None:
            mine: Counter[str] = Counter()
            try:
                while not self.done.is_set():
                    mine[next(steps)] += 1
            except BaseException as fault:
                self.faults.append(fault)
                self.done.set()
            with self.lock:
                self.counts += mine
        self.threads.append(threading.Thread(target=run))

    def work(self, seconds: float) -> Counter[str]:
        for thread in self.threads:
            thread.start()
        self.done.wait(seconds)
        self.done.set()
        for thread in self.threads:
            thread.join()
        for fault in self.faults:
            raise fault
        return self.counts


def work_of(worker: Worker) -> Iterator[str]:
    while True:
        action = worker.lot.choice(Worker.ACTIONS)
        action(worker)
        yield action.__name__


def computing() -> Iterator[str]:
    while True:
        assert sum(range(1000)) == 499500
        yield "compute"


@pytest.fixture
def switch_interval() -> Iterator[Callable[[float], None]]:
    """Sets the time after which a thread must let another one run; undone at the end."""
    before = sys.getswitchinterval()
    yield sys.setswitchinterval
    sys.setswitchinterval(before)


def test_threads_over_different_and_the_same_files(
        tmp_path: Path, switch_interval: Callable[[float], None]) -> None:
    switch_interval(1e-4)
    descriptors = open_descriptors()
    scene = Scene(tmp_path)
    threads = Threads()
    for number in range(WORKERS):
        threads.add(work_of(Worker(scene, number)))
    for _ in range(COMPUTERS):
        threads.add(computing())
    counts = threads.work(float(os.environ.get("TESSEL_THREAD_SECONDS", "2")))
    scene.close()

    print(dict(counts))
    for action in Worker.ACTIONS:
        assert counts[action.__name__] >= WORKERS, counts
    assert counts["compute"] > 0
    assert scene.ids
    for ncid in scene.ids:
        assert identifier_of(lambda: netcdf("inq", ncid)) == "TESSEL:netcdf:inq:notNetcdfID"
    assert open_descriptors() == descriptors


def test_other_threads_compute_while_the_library_works(
        tmp_path: Path, switch_interval: Callable[[float], None]) -> None:
    """A thread gets on only when the others let go of the interpreter's lock."""
    switch_interval(1000)
    ncid = netcdf("create", tmp_path / "large.nc", "CLOBBER")
    dimid = netcdf("def_dim", ncid, "x", 4 << 20)
    netcdf("def_var", ncid, "v", netcdf("parameter", "DOUBLE"), dimid)
    netcdf("enddef", ncid)
    data = np.arange(4.0 * (1 << 20))
    steps = 0
    done = False

    def compute() -> None:
        nonlocal steps
        while not done:
            steps += 1
            time.sleep(0)  # lets go of the lock, and takes it again when it is free

    def steps_during(work: Callable[[], object]) -> int:
        before = steps
        work()
        return steps - before

    thread = threading.Thread(target=compute)
    thread.start()
    try:
        kept = steps_during(lambda: sum(range(1_000_000)))
        written = steps_during(lambda: netcdf("put_var_double", ncid, 0, data))
        read = steps_during(lambda: netcdf("get_var_double", ncid, 0))
    finally:
        done = True
        thread.join()
    netcdf("close", ncid)
    assert kept == 0, "what this test measures is not the lock"
    assert written > 10
    assert read > 10


WITHIN_A_CALL = """
import os, sys, threading, time
import tessel
from tessel import _runtime

fifo, action = sys.argv[1:]
nc = tessel.load("netcdf", "off")
loaded = [_runtime.load_file(os.fsencode(nc.file))]
os.mkfifo(fifo)

def reading():
    try:
        nc("open", fifo, "NOWRITE")
    except tessel.Error:
        pass

def loading():
    _runtime.load_file(os.fsencode(nc.file))

def unloading():
    loaded.clear()

def started(work):
    thread = threading.Thread(target=work)
    thread.start()
    return thread

def waits(thread):
    thread.join(0.3)
    return thread.is_alive()

threads = [started(reading)]
while not waits(started(lambda: nc("inq_libvers"))):
    pass
threads.append(started(globals()[action]))
assert all(map(waits, threads))
writer = os.open(fifo, os.O_WRONLY)  # for which the call has waited
os.close(writer)
for each in threads:
    each.join()
"""


@pytest.mark.parametrize("action", ["loading", "unloading"])
def test_what_waits_for_a_call_lets_others_run(tmp_path: Path, action: str) -> None:
    """In the program, a call comes to its end only if the main thread gets on."""
    subprocess.run([sys.executable, "-c", WITHIN_A_CALL, tmp_path / "fifo", action], check=True,
                   timeout=60)


def test_another_binding_under_one_lock(tmp_path: Path) -> None:
    """netCDF4-python uses the same library, and does not take the runtime's lock."""
    library = threading.Lock()
    expected = np.arange(100.0)

    def theirs(path: Path) -> Iterator[str]:
        while True:
            with library, netCDF4.Dataset(path) as dataset:
                np.testing.assert_array_equal(dataset["v"][:], expected)
            yield "theirs"

    def ours(path: Path) -> Iterator[str]:
        while True:
            with library:
                ncid = netcdf("open", path, "NOWRITE")
                np.testing.assert_array_equal(netcdf("get_var_double", ncid, 0)[:, 0], expected)
                netcdf("close", ncid)
            yield "ours"

    threads = Threads()
    for number in range(WORKERS):
        path = tmp_path / f"{number // 2}.nc"
        with netCDF4.Dataset(path, "w", format="NETCDF3_CLASSIC") as dataset:
            dataset.createDimension("x", len(expected))
            dataset.createVariable("v", "f8", ("x",))[:] = expected
        threads.add((theirs, ours)[number % 2](path))
    counts = threads.work(1)
    assert counts["theirs"] > WORKERS
    assert counts["ours"] > WORKERS


FIRST_RESULTS = """
import builtins, gc, threading, time
import tessel
nc = tessel.load("netcdf")

def others_run(*_):
    time.sleep(0.002)

imported = builtins.__import__
builtins.__import__ = lambda *given, **named: (others_run(), imported(*given, **named))[1]
gc.callbacks.append(others_run)
gc.set_threshold(1)
barrier = threading.Barrier(4)

def work():
    barrier.wait()
    assert nc("parameter", "NC_DOUBLE").tolist() == [[6]]

threads = [threading.Thread(target=work) for _ in range(4)]
for each in threads:
    each.start()
for each in threads:
    each.join()
"""


def test_the_first_results_of_several_threads() -> None:
    """What results are made with is not made by the first of them, while other threads may run."""
    subprocess.run([sys.executable, "-c", FIRST_RESULTS], check=True, timeout=60)
