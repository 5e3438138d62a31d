# python/tessel/xarray/blocks.py: the values of all variables on their way into a file.
"""Writes values block by block: arrays in memory in blocks of a size, Dask arrays as they are
computed, by whatever scheduler Dask is to use.

All Dask arrays of a dataset are one graph, so that what several blocks need is computed once. In
this process, threads put each block into the file that is open here. Where others compute, in
processes of this machine or in workers of a cluster, the computed values do not come back: whoever
has computed a block opens the file, puts the block, and closes it, one after the other.
"""

from __future__ import annotations

import contextlib
import fcntl
import math
import threading
import uuid
from collections.abc import Callable, Iterator, Sequence
from typing import Any, Protocol

import numpy as np
from numpy.typing import NDArray

import tessel
from tessel.new_dataset import NewDataset
from tessel.transfer import Progress, blocks
from tessel.xarray.fitting import EXTERNAL

Dask = Any
"""Dask has no types, and is not imported unless there is an array of it."""


class Slot:
    """A defined variable: where values go."""

    def __init__(self, varid: int, dtype: np.dtype[Any], shape: tuple[int, ...]) -> None:
        self.varid = varid
        self.member = EXTERNAL[dtype.name][0]
        self.itemsize = dtype.itemsize
        self.nbytes = dtype.itemsize * math.prod(shape)


def _put(netcdf: tessel.Netcdf, ncid: Any, slot: tuple[int, str], start: Sequence[int],
         values: NDArray[Any]) -> None:
    if not values.size:
        return  # of which the module has no notion
    varid, member = slot
    # Values in the library's order, seen from the other side, are in the host's order.
    data = values.tobytes() if member == "text" else np.ascontiguousarray(values).T
    if values.ndim:
        getattr(netcdf, f"put_vara_{member}")(ncid, varid, list(start)[::-1],
                                              values.shape[::-1], data)
    else:
        getattr(netcdf, f"put_var_{member}")(ncid, varid, data)


class Sink(Protocol):
    """What puts a block into the file."""

    def __call__(self, slot: tuple[int, str], start: Sequence[int],
                 values: NDArray[Any]) -> None: ...


class _Open:
    """The file as it is open in this process. When writing has failed, the threads that are still
    at it must not put anything into whatever file has the id by then."""

    def __init__(self, made: NewDataset) -> None:
        self._made = made
        self._netcdf = tessel.load("netcdf")
        self._lock = threading.Lock()
        self._over = False

    def __call__(self, slot: tuple[int, str], start: Sequence[int], values: NDArray[Any]) -> None:
        with self._lock:
            if not self._over:
                _put(self._netcdf, self._made.ncid, slot, start, values)

    def end(self) -> None:
        """Nothing is put any more."""
        with self._lock:
            self._over = True


class _Reopened:
    """The file by its name, for other processes: opened for each block, under a lock."""

    def __init__(self, path: str, lock: contextlib.AbstractContextManager[Any]) -> None:
        self._path = path
        self._lock = lock

    def __call__(self, slot: tuple[int, str], start: Sequence[int], values: NDArray[Any]) -> None:
        netcdf = tessel.load("netcdf")
        with self._lock:
            ncid = netcdf.open(self._path, "WRITE")
            try:
                netcdf.set_fill(ncid, int(netcdf.param("NOFILL")))  # every value is put
                _put(netcdf, ncid, slot, start, values)
            finally:
                netcdf.close(ncid)


class _FileLock:
    """A lock among the processes of one machine: the file's own."""

    def __init__(self, path: str) -> None:
        self._path = path
        self._held = threading.local()

    def __enter__(self) -> None:
        self._held.file = open(self._path, "rb")  # pylint: disable=consider-using-with
        fcntl.flock(self._held.file, fcntl.LOCK_EX)

    def __exit__(self, *_error: object) -> None:
        self._held.file.close()

    def __reduce__(self) -> tuple[Any, ...]:
        return type(self), (self._path,)


def _write_block(sink: Sink, slot: tuple[int, str], start: Sequence[int], values: Any) -> None:
    sink(slot, start, np.asarray(values))


class BlockWriter:
    """Collects sources and slots while a dataset is being defined, which is what xarray does with
    a writer, and then writes."""

    def __init__(self) -> None:
        self._arrays: list[tuple[NDArray[Any], Slot]] = []
        self._graphs: list[tuple[Dask, Slot]] = []

    def add(self, source: Any, target: Slot) -> None:
        """Remembers the values of a variable."""
        if hasattr(source, "dask"):
            self._graphs.append((source, target))
        else:
            self._arrays.append((np.asarray(source), target))

    def write(self, made: NewDataset, progress: Progress, block_bytes: int) -> None:
        """Writes everything into a file whose definitions are complete. `progress` is told the
        bytes done and all bytes, before the first block and after each."""
        total = sum(slot.nbytes for _, slot in [*self._arrays, *self._graphs])
        done = 0

        def told(nbytes: int) -> None:
            nonlocal done
            done += nbytes
            progress(done, total)

        told(0)
        made.end_definitions()
        sink = _Open(made)
        try:
            for values, slot in self._arrays:
                for start, count in blocks(values.shape, max(block_bytes // slot.itemsize, 1)):
                    part = values[tuple(slice(a, a + n) for a, n in zip(start, count))]
                    sink((slot.varid, slot.member), start, part)
                    told(part.nbytes)
            if self._graphs:
                self._compute(made, sink, told)
        finally:
            sink.end()

    def _compute(self, made: NewDataset, sink: Sink, told: Callable[[int], None]) -> None:
        import dask
        from dask.array.core import Array

        schedule = (dask.base.get_scheduler(collections=[source for source, _ in self._graphs])
                    or Array.__dask_scheduler__)
        client = _client_of(schedule)
        if client is not None:
            made.close()
            with client.as_current(), _lock_of_cluster() as lock:
                _in_cluster(client, *self._tasks(_Reopened(made.path, lock)), told)
            return
        if schedule not in (dask.threaded.get, dask.local.get_sync):
            made.close()
            sink = _Reopened(made.path, _FileLock(made.path))
        graph, sizes = self._tasks(sink)

        class Told(dask.callbacks.Callback):
            """Is told about every task that is done."""

            def _posttask(self, key: Any, *_of_task: Any) -> None:
                if key in sizes:
                    told(sizes[key])

        with Told():
            schedule(graph, list(sizes))

    def _tasks(self, sink: Sink) -> tuple[Dask, dict[Any, int]]:
        """The graph of all blocks, and the bytes of each by the key of the task that writes it."""
        from dask.array.core import Array
        from dask.highlevelgraph import HighLevelGraph

        name = f"write-{uuid.uuid4().hex}"
        tasks: dict[Any, Any] = {}
        sizes: dict[Any, int] = {}
        for number, (source, slot) in enumerate(self._graphs):
            for place in np.ndindex(*source.numblocks):
                key = (name, number, *place)
                start = [sum(each[:i]) for each, i in zip(source.chunks, place)]
                lengths = [each[i] for each, i in zip(source.chunks, place)]
                tasks[key] = (_write_block, sink, (slot.varid, slot.member), start,
                              (source.name, *place))
                sizes[key] = slot.itemsize * math.prod(lengths)
        sources = [source for source, _ in self._graphs]
        graph = HighLevelGraph.from_collections(name, tasks, dependencies=sources)
        return Array.__dask_optimize__(graph, list(sizes)), sizes


def _client_of(schedule: Any) -> Any:
    """The client of a cluster that a scheduler belongs to; None for the others."""
    client = getattr(schedule, "__self__", None)
    return client if hasattr(client, "scheduler_info") else None


@contextlib.contextmanager
def _lock_of_cluster() -> Iterator[Any]:
    """A lock among workers. It is a semaphore because that is taken back from a worker that has
    died."""
    import distributed

    semaphore = distributed.Semaphore(1, name=f"tessel-{uuid.uuid4().hex}")
    try:
        yield semaphore
    finally:
        semaphore.close()


def _in_cluster(client: Any, graph: Dask, sizes: dict[Any, int],
                told: Callable[[int], None]) -> None:
    import distributed

    keys = list(sizes)
    futures = client.get(graph, keys, sync=False)
    size_of = {future.key: sizes[key] for future, key in zip(futures, keys)}
    try:
        for future in distributed.as_completed(futures):
            future.result()
            told(size_of[future.key])
    finally:
        client.cancel(futures)
