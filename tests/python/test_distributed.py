# tests/python/test_distributed.py: climatologies computed by other processes and on other hosts.
"""Dask's schedulers, from one thread to a cluster, give the same values and write the same files.

Scheduler and workers are processes of their own, started as a user of a cluster does, with Dask's
own programs. For separate hosts there is a network of its own: a switch and three hosts, each a
network namespace of the kernel, which have nothing in common but a folder.
"""

from __future__ import annotations

import contextlib
import json
import os
import shutil
import subprocess
import sys
import textwrap
from collections.abc import Iterator, Sequence
from pathlib import Path
from typing import Any

import dask
import dask.array
import distributed
import numpy as np
import pandas as pd
import pytest
import xarray as xr
from tessel.xarray import to_netcdf

# Servers and workers would load the sanitizers' libraries as well, and take very long.
pytestmark = pytest.mark.without_sanitizers

SECONDS = 90
"""After which all that a test has started ends by itself, whatever has become of the test."""

FILES, LATS, LONS = 5, 8, 12


@pytest.fixture(name="files", scope="module")
def files_fixture(tmp_path_factory: pytest.TempPathFactory) -> list[Path]:
    """A file for each of some years: packed values, of which some are missing."""
    folder = tmp_path_factory.mktemp("years")
    random = np.random.default_rng(5)
    made = []
    for year in range(2001, 2001 + FILES):
        values = random.standard_normal((12, LATS, LONS)) * 10
        values[random.random(values.shape) < 0.1] = np.nan
        time = pd.date_range(f"{year}-01-15", periods=12, freq=pd.DateOffset(months=1))
        made.append(folder / f"{year}.nc")
        to_netcdf(xr.Dataset({"t": (("time", "lat", "lon"), values)}, {"time": time}), made[-1],
                  unlimited_dims="time",
                  encoding={"t": {"dtype": "i2", "scale_factor": 0.01, "_FillValue": -32768}})
    return made


def expected(files: Sequence[Path]) -> np.ndarray:
    """The climatology by NumPy, of what another engine reads."""
    values = []
    for each in files:
        with xr.open_dataset(each, engine="scipy", mask_and_scale=False) as raw:
            values.append(np.where(raw.t == -32768, np.nan, raw.t.values * 0.01))
    return np.nanmean(values, axis=0)


def climatology(files: Sequence[Path], target: Path) -> np.ndarray:
    """The climatology by the scheduler that is in use: computed, and written."""
    with xr.open_mfdataset(list(files), engine="tessel", chunks={"lat": 4}) as many:
        made = many.groupby("time.month").mean("time")
        to_netcdf(made, target, encoding={"t": {"dtype": "f4"}})
        return made.t.compute().values


@contextlib.contextmanager
def running(*command: object, log: Path) -> Iterator[subprocess.Popen[bytes]]:
    """A process that ends with the `with` block, or when its time is over."""
    with open(log, "wb") as output, subprocess.Popen(
            list(map(str, command)), stdout=output, stderr=output) as process:
        try:
            yield process
        finally:
            process.terminate()
            try:
                process.wait(10)
            except subprocess.TimeoutExpired:
                process.kill()


@contextlib.contextmanager
def cluster(folder: Path, hosts: Sequence[tuple[Sequence[str], str]]) -> Iterator[Path]:
    """A scheduler and a worker for each further host; gives the file that says where the
    scheduler is. A host is what runs a command there, and its address."""
    where = folder / "scheduler.json"
    common = ["--no-dashboard", "--scheduler-file", where]

    def program(name: str, inside: Sequence[str], address: str, *options: object) -> Any:
        return running(*inside, "timeout", SECONDS, sys.executable, "-m", f"distributed.cli.{name}",
                       "--host", address, *common, *options,
                       log=folder / f"{name}-{address}-{len(list(folder.iterdir()))}.log")

    with contextlib.ExitStack() as stack:
        inside, address = hosts[0]
        stack.enter_context(program("dask_scheduler", inside, address, "--port", 0))
        for number, (inside, address) in enumerate(hosts[1:]):
            stack.enter_context(program(
                "dask_worker", inside, address, "--nthreads", 1, "--no-nanny", "--name",
                f"worker-{number}", "--local-directory", folder / f"worker-{number}",
                "--death-timeout", SECONDS))
        yield where


def logs(folder: Path) -> str:
    return "\n".join(f"== {each.name}\n{each.read_text(errors='replace')}"
                     for each in sorted(folder.glob("*.log")))


@pytest.fixture(name="client", scope="module")
def client_fixture(tmp_path_factory: pytest.TempPathFactory) -> Iterator[distributed.Client]:
    """The client of a scheduler with two worker processes."""
    folder = tmp_path_factory.mktemp("cluster")
    with cluster(folder, [((), "127.0.0.1")] * 3) as where:
        try:
            with distributed.Client(scheduler_file=str(where), timeout=SECONDS,
                                    set_as_default=False) as client:
                client.wait_for_workers(2, timeout=SECONDS)
                yield client
        except Exception as error:
            error.add_note(logs(folder))
            raise


@contextlib.contextmanager
def using(client: distributed.Client) -> Iterator[None]:
    """Has Dask compute in a cluster."""
    with client.as_current(), dask.config.set(scheduler="dask.distributed"):
        yield


# Processes of this host

def test_every_scheduler_gives_the_same(files: list[Path], client: distributed.Client,
                                        tmp_path: Path) -> None:
    results, written = {}, {}
    for name in ("synchronous", "threads", "processes"):
        with dask.config.set(scheduler=name):
            results[name] = climatology(files, tmp_path / name)
        written[name] = (tmp_path / name).read_bytes()
    with using(client):
        results["distributed"] = climatology(files, tmp_path / "distributed")
    written["distributed"] = (tmp_path / "distributed").read_bytes()

    np.testing.assert_allclose(results["threads"], expected(files), rtol=0, atol=1e-5)
    for name in results:
        assert results[name].tobytes() == results["threads"].tobytes(), name
        assert written[name] == written["threads"], name


def test_both_workers_compute(files: list[Path], client: distributed.Client) -> None:
    with using(client), xr.open_mfdataset(files, engine="tessel") as many:
        future = client.persist(many.t.groupby("time.month").mean("time"))
        distributed.wait(future, SECONDS)
        assert len([keys for keys in client.has_what().values() if keys]) == 2
        processes = {*client.run(os.getpid).values(), client.run_on_scheduler(os.getpid)}
        assert len(processes - {os.getpid()}) == 3
        np.testing.assert_allclose(future.compute(), expected(files), rtol=0, atol=1e-5)


def test_the_workers_write(client: distributed.Client, tmp_path: Path) -> None:
    """Each block says which process has computed it; every block is there."""
    blocks = dask.array.zeros((40, 3), chunks=(1, 3)).map_blocks(
        lambda block: block + os.getpid(), dtype=float)
    calls: list[tuple[int, int]] = []
    with using(client):
        to_netcdf(xr.Dataset({"pid": (("block", "x"), blocks)}), tmp_path / "x.nc",
                  unlimited_dims="block", progress=lambda *each: calls.append(each))
    assert calls == [(done, 40 * 3 * 8) for done in range(0, 961, 24)]
    with xr.open_dataset(tmp_path / "x.nc", engine="netcdf4") as written:
        assert set(written.pid.values.ravel()) == set(client.run(os.getpid).values())


def test_a_value_that_does_not_fit_on_a_worker(client: distributed.Client, tmp_path: Path) -> None:
    blocks = dask.array.arange(40, chunks=1).map_blocks(lambda block: block << block)
    with using(client), pytest.raises(ValueError, match="variable 'x': could not safely cast"):
        to_netcdf(xr.Dataset({"x": ("t", blocks)}), tmp_path / "x.nc")
    assert not list(tmp_path.iterdir())


def test_a_worker_dies_while_it_writes(tmp_path: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    """It has the lock and the file; both come free, and another worker does what it did."""
    for name, value in (("TIMEOUT", "2s"), ("VALIDATION_INTERVAL", "1s")):
        monkeypatch.setenv(f"DASK_DISTRIBUTED__SCHEDULER__LOCKS__LEASE_{name}", value)

    def die_at_writing() -> None:
        from tessel.xarray import blocks
        blocks._put = lambda *_arguments: os._exit(1)

    folder = tmp_path / "cluster"
    folder.mkdir()
    made = xr.Dataset({"x": ("t", dask.array.arange(20.0, chunks=1)), "y": ("t", np.arange(20))})
    with cluster(folder, [((), "127.0.0.1")] * 3) as where, \
            distributed.Client(scheduler_file=str(where), timeout=SECONDS,
                               set_as_default=False) as client:
        client.wait_for_workers(2, timeout=SECONDS)
        victim = list(client.scheduler_info()["workers"])[0]
        client.run(die_at_writing, workers=[victim])
        with using(client):
            to_netcdf(made, tmp_path / "x.nc")
        assert victim not in client.scheduler_info()["workers"]
    with xr.open_dataset(tmp_path / "x.nc", engine="netcdf4") as written:
        xr.testing.assert_identical(written.load(), made.compute())
    assert not list(tmp_path.glob(".tessel*"))


# Hosts of their own

def ip(*words: object) -> None:
    """Runs the program that configures the kernel's networks."""
    subprocess.run(["ip", *map(str, words)], check=True, capture_output=True, timeout=30)


@contextlib.contextmanager
def separate_hosts(count: int) -> Iterator[list[tuple[Sequence[str], str]]]:
    """Hosts at a switch: network namespaces of this process's own, as `cluster` wants them."""
    names = [f"tessel-{os.getpid()}-{each}" for each in ("switch", *range(count))]
    switch, *hosts = names
    made = []
    try:
        for name in names:
            ip("netns", "add", name)
            made.append(name)
            ip("-n", name, "link", "set", "lo", "up")
        ip("-n", switch, "link", "add", "bridge", "type", "bridge")
        ip("-n", switch, "link", "set", "bridge", "up")
        for number, name in enumerate(hosts, 1):
            ip("link", "add", "cable", "netns", name, "type", "veth",
               "peer", "name", f"port{number}", "netns", switch)
            ip("-n", switch, "link", "set", f"port{number}", "master", "bridge", "up")
            ip("-n", name, "address", "add", f"192.0.2.{number}/24", "dev", "cable")
            ip("-n", name, "link", "set", "cable", "up")
        yield [(("ip", "netns", "exec", name), f"192.0.2.{number}")
               for number, name in enumerate(hosts, 1)]
    finally:
        for name in made:
            ip("netns", "delete", name)


def why_no_hosts() -> str:
    """What keeps this system from having separate hosts; "" when nothing does."""
    if shutil.which("ip") is None:
        return "there is no program ip"
    try:
        with separate_hosts(1):
            return ""
    except subprocess.CalledProcessError as error:
        return f"no network namespaces: {error.stderr.decode(errors='replace').strip()}"


CLIENT = """
    import json, os, sys
    from pathlib import Path
    import distributed
    import test_distributed

    def network():
        return os.readlink("/proc/self/ns/net")

    where, target, *files = sys.argv[1:]
    with distributed.Client(scheduler_file=where, timeout=60) as client:
        client.wait_for_workers(2, timeout=60)
        values = test_distributed.climatology(list(map(Path, files)), Path(target))
        print(json.dumps({
            "values": values.tobytes().hex(),
            "networks": [network(), client.run_on_scheduler(network),
                         *client.run(network).values()],
            "addresses": sorted(client.run(lambda dask_worker: dask_worker.ip).values())}))
"""


@pytest.mark.separate_hosts
def test_scheduler_and_workers_on_separate_hosts(files: list[Path], tmp_path: Path) -> None:
    if reason := why_no_hosts():
        pytest.skip(reason)
    with dask.config.set(scheduler="threads"):
        values = climatology(files, tmp_path / "threads.nc")
    folder = tmp_path / "cluster"
    folder.mkdir()
    with separate_hosts(4) as (scheduler, *others):
        (inside, _), *workers = others
        with cluster(folder, [scheduler, *workers]) as where:
            program = [*inside, "timeout", str(SECONDS), sys.executable, "-B", "-c",
                       textwrap.dedent(CLIENT), where, tmp_path / "hosts.nc", *files]
            paths = [str(Path(__file__).parent), os.environ.get("PYTHONPATH", "")]
            done = subprocess.run(list(map(str, program)), capture_output=True, text=True,
                                  check=False, env={**os.environ, "PYTHONPATH": ":".join(paths)})
    assert done.returncode == 0, done.stderr + logs(folder)
    told = json.loads(done.stdout)
    assert bytes.fromhex(told["values"]) == values.tobytes()
    assert (tmp_path / "hosts.nc").read_bytes() == (tmp_path / "threads.nc").read_bytes()
    assert len({*told["networks"], os.readlink("/proc/self/ns/net")}) == 5
    assert told["addresses"] == ["192.0.2.3", "192.0.2.4"]
