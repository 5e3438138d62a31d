# tests/python/test_memory.py: whose memory a result and an input are, and that nothing is left.
"""No copies where none are needed, one where one is, and memory that stays flat.

TESSEL_OBSERVER is the library that notes what data the netCDF library is given.
TESSEL_MIXED_CALLS says how many calls are made to see that memory stays flat; 20000 without it.
"""

from __future__ import annotations

import contextlib
import ctypes
import gc
import math
import os
import shutil
import sys
import tracemalloc
from collections.abc import Callable, Iterator
from pathlib import Path

import numpy as np
import pytest

import tessel

MIB = 1 << 20
SHAPE = (64, 32, 1024)  # 16 MiB of double
NBYTES = 8 * 64 * 32 * 1024
HUGE_PAGE = 2 << 20


def status(field: str) -> int:
    """A field of the kernel's account of this process, in bytes."""
    for line in Path("/proc/self/status").read_text().splitlines():
        if line.startswith(field + ":"):
            return 1024 * int(line.split()[1])
    raise KeyError(field)


def resident() -> int:
    """What is in memory, without what the heap keeps for later."""
    gc.collect()
    ctypes.CDLL(None).malloc_trim(0)
    return status("VmRSS")


class Observed:
    """A module of its own that calls the library through the observer, and a variable of SHAPE."""

    def __init__(self, folder: Path) -> None:
        observer = ctypes.CDLL(os.environ["TESSEL_OBSERVER"], ctypes.RTLD_GLOBAL)
        self.observed_data = observer.observed_data
        self.observed_data.restype = ctypes.c_void_p
        # A file of its own, because a module that is loaded already keeps the functions it found.
        file = shutil.copy(tessel.load("netcdf").file, folder / "observed.tsx")
        self.call = tessel.load(Path(file))
        self.ncid = self.call("create", folder / "observed.nc", "CLOBBER")
        dimids = [self.call("def_dim", self.ncid, f"d{i}", length)[0, 0]
                  for i, length in enumerate(SHAPE)]
        double = self.call("parameter", "DOUBLE")
        self.varid = self.call("def_var", self.ncid, "v", double, dimids)
        self.call("enddef", self.ncid)

    def written_from(self, data: np.ndarray) -> int | None:
        """Where the library found the data of a write."""
        self.call("put_var_double", self.ncid, self.varid, data)
        return self.observed_data()

    def read(self) -> np.ndarray:
        return self.call("get_var_double", self.ncid, self.varid)


@pytest.fixture
def observed(tmp_path: Path) -> Iterator[Observed]:
    made = Observed(tmp_path)
    yield made
    made.call("close", made.ncid)


def address(array: np.ndarray) -> int:
    return array.__array_interface__["data"][0]


def numbered(order: str = "F") -> np.ndarray:
    return np.arange(float(np.prod(SHAPE))).reshape(SHAPE, order=order)


def test_the_library_fills_the_memory_of_the_result(observed: Observed) -> None:
    expected = numbered()
    observed.written_from(expected)
    result = observed.read()
    assert observed.observed_data() == address(result)
    np.testing.assert_array_equal(result, expected)
    assert result.flags.f_contiguous and result.flags.writeable and not result.flags.owndata


def test_results_do_not_share_memory(observed: Observed) -> None:
    observed.written_from(numbered())
    first, second = observed.read(), observed.read()
    first[...] = -1
    assert not np.shares_memory(first, second)
    np.testing.assert_array_equal(second, numbered())


def read_only(array: np.ndarray) -> np.ndarray:
    array.flags.writeable = False
    return array


# How the same values may lie in memory, and how many copies that costs.
LAYOUTS: dict[str, tuple[Callable[[], np.ndarray], int]] = {
    "column-major": (numbered, 0),
    "read-only": (lambda: read_only(numbered()), 0),
    "transposed row-major": (lambda: numbered().T.copy("C").T, 0),
    "one dimension": (lambda: numbered().ravel("F"), 0),
    "part of a longer one": (
        lambda: np.concatenate((np.zeros(5), numbered().ravel("F")))[5:], 0),
    "row-major": (lambda: numbered("F").copy("C"), 1),
    "every second": (lambda: np.repeat(numbered().ravel("F"), 2)[::2], 1),
    "backwards": (lambda: numbered().ravel("F")[::-1].copy()[::-1], 1),
    "other byte order": (lambda: numbered().astype(">f8"), 1),
    "misaligned": (
        lambda: np.frombuffer(b"x" + numbered().tobytes("F"), np.uint8)[1:].view(float), 1),
}


class Cost:
    """What a piece of work needed at its peak more than before and kept at its end, in arrays."""

    def __init__(self) -> None:
        self.numpy = self.kept = 0.0


@contextlib.contextmanager
def counted() -> Iterator[Cost]:
    """Counts the memory of NumPy arrays, which Python's tracer of allocations knows."""
    cost = Cost()
    tracemalloc.start()
    try:
        before, _ = tracemalloc.get_traced_memory()
        tracemalloc.reset_peak()
        yield cost
        after, peak = tracemalloc.get_traced_memory()
        cost.numpy = (peak - before) / NBYTES
        cost.kept = (after - before) / NBYTES
    finally:
        tracemalloc.stop()


@pytest.mark.parametrize("layout", LAYOUTS)
def test_copies_of_an_input(observed: Observed, layout: str) -> None:
    make, copies = LAYOUTS[layout]
    data = make()
    with counted() as cost:
        found = observed.written_from(data)
    assert (found == address(data)) == (copies == 0)
    assert cost.numpy == pytest.approx(copies, abs=0.01)
    assert cost.kept == pytest.approx(0, abs=0.01)
    np.testing.assert_array_equal(observed.read(), numbered())


def test_the_counter_of_copies_counts(observed: Observed) -> None:
    data = numbered()
    with counted() as cost:
        observed.written_from(data.copy("F"))
        kept = data.copy("F")
    assert np.array_equal(kept, data)
    assert cost.numpy == pytest.approx(1, abs=0.01)
    assert cost.kept == pytest.approx(1, abs=0.01)


@pytest.mark.without_sanitizers  # the sanitizer keeps memory that was freed
@pytest.mark.parametrize("layout", ["column-major", "row-major"])
def test_nothing_but_numpy_copies_an_input(observed: Observed, layout: str) -> None:
    """The whole process never needs more at once than the copies that NumPy is seen to make."""
    make, copies = LAYOUTS[layout]
    data = make()
    observed.written_from(data)  # what the library and NumPy need once is there
    before = resident()
    Path("/proc/self/clear_refs").write_text("5")  # forgets the peak
    observed.written_from(data)
    assert (status("VmHWM") - before) / NBYTES == pytest.approx(copies, abs=0.2)


def test_the_memory_of_a_result_goes_with_its_last_view(observed: Observed) -> None:
    observed.written_from(numbered())
    large = NBYTES * 16  # 256 MiB
    most = (NBYTES + HUGE_PAGE) * 16  # where the kernel backs each to its end with a huge page
    waiting = 2 * (NBYTES + HUGE_PAGE)  # what the host keeps for the next large blocks
    before = resident()
    results = [observed.read() for _ in range(16)]
    assert 0.9 * large < resident() - before < 1.1 * most
    views = [result[::2, 1:, 0].T for result in results]
    del results
    assert 0.9 * large < resident() - before < 1.1 * most
    del views[1:]
    assert 0 < resident() - before < NBYTES + waiting + 0.1 * large
    np.testing.assert_array_equal(views[0], numbered()[::2, 1:, 0].T)
    views.clear()
    assert resident() - before < waiting + 0.05 * large


def mixed_calls(folder: Path) -> list[tuple[Callable[[], object], str | None]]:
    """Calls of all kinds, and the identifiers of the errors of those that fail: every third."""
    netcdf = tessel.load("netcdf")
    path = str(folder / "mixed.nc")
    ncid = netcdf("create", path, "CLOBBER")
    dimid = netcdf("def_dim", ncid, "x", 100)
    varid = netcdf("def_var", ncid, "v", netcdf("parameter", "DOUBLE"), dimid)
    netcdf("put_att_text", ncid, varid, "units", "metres")
    netcdf("enddef", ncid)
    row = np.arange(100.0)
    netcdf("put_var_double", ncid, varid, row)
    read_id = netcdf("open", path, "NOWRITE")

    def reopen() -> None:
        netcdf("close", netcdf("open", path, "NOWRITE"))

    calls: list[tuple[Callable[[], object], str | None]] = [
        (lambda: netcdf("get_var_double", ncid, varid), None),
        (lambda: netcdf("put_var_double", ncid, varid, row[::-1]), None),
        (lambda: netcdf("open", path + "x", "NOWRITE"),
         "TESSEL:netcdf:open:noSuchFileOrDirectory"),
        (lambda: netcdf("get_vara_int", ncid, varid, [3], [50]), None),
        (lambda: netcdf("inq_var", ncid, varid), None),
        (lambda: netcdf("put_var_double", ncid, varid, row[:5]),
         "TESSEL:netcdf:putVar:dataSizeMismatch"),
        (lambda: netcdf("get_att_text", ncid, varid, "units"), None),
        (reopen, None),
        (lambda: netcdf("get_var_double", ncid, 99),
         "TESSEL:netcdf:getVar:numDimsInquiry:variableNotFound"),
        (lambda: netcdf("inq", read_id), None),
        (lambda: netcdf("put_var1_double", ncid, varid, [7], 1.5), None),
        (lambda: netcdf("inq_dimid", ncid, [1, {"a": (2, "b")}]),
         "TESSEL:netcdf:argumentWasNotChar"),
        (lambda: netcdf("get_var1_text", ncid, varid, [7]),
         "TESSEL:netcdf:getVar1:attemptToConvertBetweenTextAndNumbers"),
        (lambda: netcdf("get_constant_names"), None),
        (lambda: netcdf("strerror", -33), None),
        (lambda: netcdf.inq_var(ncid, varid), None),
        (lambda: netcdf.inq_dimid(read_id, "none"),
         "TESSEL:netcdf:inqDimID:invalidDimensionIdOrName"),
        (lambda: netcdf.get_vara_short(ncid, varid, [2], [9]), None),
    ]
    return calls


@pytest.mark.without_sanitizers  # the sanitizer keeps memory that was freed
def test_mixed_calls_leave_nothing_behind(tmp_path: Path) -> None:
    calls = mixed_calls(tmp_path)
    assert 3 * sum(identifier is not None for _, identifier in calls) == len(calls)
    errors = 0

    def rounds(count: int) -> None:
        nonlocal errors
        for _ in range(count):
            for call, identifier in calls:
                raised = None
                try:
                    call()
                except tessel.Error as error:
                    raised = error.identifier
                    errors += 1
                if raised != identifier:
                    pytest.fail(f"raised {raised} instead of {identifier}")

    def state() -> tuple[int, int, int]:
        return len(os.listdir("/proc/self/fd")), resident(), sys.getallocatedblocks()

    total = math.ceil(int(os.environ.get("TESSEL_MIXED_CALLS", "20000")) / len(calls))
    rounds(500)  # what is made once is there
    descriptors, memory, blocks = state()
    errors = 0
    rounds(total)
    descriptors_after, memory_after, blocks_after = state()
    print(f"{total * len(calls)} calls, {errors} errors: "
          f"{memory_after - memory} bytes, {blocks_after - blocks} blocks more")
    assert 3 * errors == total * len(calls)
    assert descriptors_after == descriptors
    assert memory_after - memory < MIB
    assert blocks_after - blocks < 1000
