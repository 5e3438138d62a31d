# tests/python/test_xarray_own.py: xarray's own tests of its backends, with the engine "tessel".
"""The classes for netCDF-3 files from the packaged xarray, in both formats, plain and with Dask,
and its round trips with a distributed scheduler.

xarray's tests write with xarray's `to_netcdf`, and open without naming an engine in places. Here
the first is `tessel.xarray.to_netcdf`, and for a file that "tessel" can open, that engine is the one
chosen, so that nothing of another engine takes part.
"""

from __future__ import annotations

import contextlib
import functools
import importlib.util
import itertools
import os
from collections import Counter
from collections.abc import Callable, Iterator
from pathlib import Path
from typing import Any

import numpy as np
import pytest
import tessel.xarray
import xarray as xr
from tessel.new_dataset import NewDataset
from tessel.xarray.blocks import BlockWriter
from tessel.xarray.writing import WritingStore
from xarray.backends import api, plugins
from xarray.tests import test_backends, test_distributed
# The fixtures of the distributed tests; pytest finds them by these names.
from xarray.tests.test_distributed import (cleanup, loop, loop_in_thread,  # noqa: F401
                                           tmp_netcdf_filename)

UNSUPPORTED = "xarray's save_mfdataset writes by xarray's own engines only"
NOT_PASSED = {
    "test_save_mfdataset_roundtrip": UNSUPPORTED,
    "test_save_mfdataset_pathlib_roundtrip": UNSUPPORTED,
    "test_save_mfdataset_pass_kwargs": UNSUPPORTED,
}
"""The tests that do not pass, and why. They must fail: one that passes fails the run."""

LEFT_OUT = {
    "test_coordinate_variables_after_iris_roundtrip": "the package that it is about, iris",
    "test_open_mfdataset_no_files": "the package that it opens an address with, aiobotocore",
}
"""The tests that xarray would skip, and what they need that is not there."""

EXAMPLES = Path(test_backends.__file__).parent / "data"

OTHERS = {"group": None, "compute": True, "invalid_netcdf": False}
"""What `Dataset.to_netcdf` can be told that is not for netCDF-3 files, and the default."""

calls: Counter[str] = Counter()


@pytest.fixture(autouse=True)
def everything_through_the_engine(monkeypatch: pytest.MonkeyPatch,
                                  request: pytest.FixtureRequest, tmp_path: Path) -> None:
    """Has xarray write and open everything through the module."""
    opened = tessel.xarray.TesselBackendEntrypoint.open_dataset
    guessed = plugins.guess_engine

    def save(dataset: xr.Dataset, path: Any, engine: str | None = None, multifile: bool = False,
             **options: Any) -> None:
        if multifile:
            raise NotImplementedError(UNSUPPORTED)
        assert engine in (None, "tessel")
        assert all(options.pop(name, default) == default for name, default in OTHERS.items())
        calls["to_netcdf"] += 1
        tessel.xarray.to_netcdf(dataset, path, **options)

    @functools.wraps(opened)  # whose parameters xarray asks for
    def count(entrypoint: Any, path: Any, **options: Any) -> xr.Dataset:
        calls["open_dataset"] += 1
        return opened(entrypoint, path, **options)

    def guess(path: Any) -> Any:
        if tessel.xarray.TesselBackendEntrypoint().guess_can_open(path):
            return "tessel"
        # Of other formats are only the files that xarray brings along, and names that are wrong.
        assert not os.path.exists(path) or EXAMPLES in Path(path).parents
        return guessed(path)

    monkeypatch.chdir(tmp_path)  # some tests name files without a folder
    monkeypatch.setattr(api, "to_netcdf", save)
    monkeypatch.setattr(tessel.xarray.TesselBackendEntrypoint, "open_dataset", count)
    monkeypatch.setattr(plugins, "guess_engine", guess)
    monkeypatch.setattr(test_distributed, "ENGINES", ["tessel"])
    name = getattr(request.function, "__name__", "")
    if name in NOT_PASSED:
        request.applymarker(pytest.mark.xfail(strict=True, reason=NOT_PASSED[name]))


class Store(WritingStore):
    """What is written can be read from the same object, as xarray's test of stores wants it."""

    def __init__(self, path: str, made: Any) -> None:
        super().__init__(made, 2**20)
        self._path = path
        self._target = made

    def store(self, variables: Any, attributes: Any, *_given: Any, **_named: Any) -> None:
        writer = BlockWriter()
        super().store(variables, attributes, writer=writer)
        writer.write(self._target, lambda done, total: None, 2**20)
        self._target.close()

    def load(self) -> Any:
        self._reading = tessel.xarray.TesselDataStore.open(self._path)
        return self._reading.load()

    def get_encoding(self) -> Any:
        return self._reading.get_encoding()

    def close(self) -> None:
        self._reading.close()


class Netcdf3(test_backends.NetCDFBase, test_backends.NetCDF3Only):
    """xarray's tests for netCDF-3 files."""

    engine = "tessel"  # type: ignore[assignment]
    test_coordinate_variables_after_iris_roundtrip = None

    @contextlib.contextmanager
    def create_store(self) -> Iterator[Store]:
        form = {"NETCDF3_CLASSIC": "classic", "NETCDF3_64BIT": "64bit-offset"}[self.file_format]
        with test_backends.create_tmp_file() as path, \
                NewDataset(path, form) as made:
            yield Store(path, made)

    test_array_attrs = test_backends.TestScipyFilePath.test_array_attrs
    test_encoding_unlimited_dims = \
        test_backends.TestGenericNetCDFData.test_encoding_unlimited_dims


    @pytest.mark.parametrize("decoded, encoded", [
        ("create_unsigned_masked_scaled_data", "create_encoded_unsigned_masked_scaled_data"),
        ("create_signed_masked_scaled_data", "create_encoded_signed_masked_scaled_data"),
        ("create_masked_and_scaled_data", "create_encoded_masked_and_scaled_data"),
        pytest.param(
            "create_bad_unsigned_masked_scaled_data",
            "create_bad_encoded_unsigned_masked_scaled_data", marks=pytest.mark.xfail(
                strict=True, reason="its attribute _Unsigned is no text; fails with every engine")),
    ])
    def test_roundtrip_mask_and_scale(self, decoded: str, encoded: str) -> None:
        super().test_roundtrip_mask_and_scale(getattr(test_backends, decoded),
                                              getattr(test_backends, encoded))

    def test_vectorized_indexing_negative_step(self) -> None:
        """Without xarray's allowance for failing, which is for another format."""
        super().test_vectorized_indexing_negative_step()


class TestClassic(Netcdf3):
    """Files of the classic format."""

    file_format = "NETCDF3_CLASSIC"


class TestOffset64(Netcdf3):
    """Files of the 64-bit offset format."""

    file_format = "NETCDF3_64BIT"


class WithDask:
    """Writes from Dask arrays and reads into Dask arrays."""

    @contextlib.contextmanager
    def roundtrip(self, data: xr.Dataset, save_kwargs: Any = None, open_kwargs: Any = None,
                  allow_cleanup_failure: bool = False) -> Iterator[xr.Dataset]:
        open_kwargs = {"chunks": -1, **(open_kwargs or {})}
        with super().roundtrip(data, save_kwargs, open_kwargs,  # type: ignore[misc]
                               allow_cleanup_failure) as opened:
            yield opened

    def save(self, dataset: xr.Dataset, path: str, **options: Any) -> None:
        chunked = {dim: max(length // 2, 1) for dim, length in dataset.sizes.items()}
        super().save(dataset.chunk(chunked), path, **options)  # type: ignore[misc]

    def test_dataset_caching(self) -> None:
        """xarray's class for Dask and netCDF-4 leaves this out as well; here it is what xarray's
        class for Dask alone expects."""
        with self.roundtrip(xr.Dataset({"foo": ("x", [5, 6, 7])})) as actual:
            assert not actual.foo.variable._in_memory
            actual.foo.values  # pylint: disable=pointless-statement
            assert not actual.foo.variable._in_memory


class TestClassicWithDask(WithDask, Netcdf3):
    """Files of the classic format, with Dask."""

    file_format = "NETCDF3_CLASSIC"


class TestOffset64WithDask(WithDask, Netcdf3):
    """Files of the 64-bit offset format, with Dask."""

    file_format = "NETCDF3_64BIT"


class TestManyFilesWithDask(test_backends.TestDask):
    """xarray's tests of Dask: many files at once, written again, computed."""

    engine = "tessel"  # type: ignore[assignment]
    test_open_mfdataset_no_files = None

    def test_vectorized_indexing_negative_step(self) -> None:
        """Without xarray's allowance for failing, as above."""
        super().test_vectorized_indexing_negative_step()

    def test_encoding_mfdataset(self) -> None:
        """Without xarray's allowance for failing, which dates from a time when it did."""
        super().test_encoding_mfdataset()

    @pytest.mark.xfail(strict=True, reason=UNSUPPORTED)
    def test_save_mfdataset_compute_false_roundtrip(self) -> None:
        super().test_save_mfdataset_compute_false_roundtrip()


class TestKeywordsOfManyFiles(test_backends.TestOpenMFDatasetWithDataVarsAndCoordsKw):
    """xarray's tests of how many files are combined."""


@pytest.mark.parametrize("parallel, chunks, cached", itertools.product(
    [True, False], [None, 5], [None, 1]))
def test_more_files_than_are_kept_open(parallel: bool, chunks: int | None,
                                       cached: int | None) -> None:
    with xr.set_options(**({} if cached is None else {"file_cache_maxsize": cached})):
        test_backends.test_open_mfdataset_manyfiles("tessel", 20, parallel, chunks, cached)


@pytest.mark.parametrize("function", [
    test_backends.test_open_mfdataset_can_open_path_objects,
    test_backends.test_source_encoding_always_present,
    test_backends.test_source_encoding_always_present_with_pathlib,
    test_backends.TestDataArrayToNetCDF().test_open_dataarray_options,
    test_backends.TestValidateAttrs().test_validating_attrs,
], ids=lambda function: function.__name__)
def test_by_itself(function: Callable[[], None]) -> None:
    function()


# With a scheduler and two workers that are processes of their own

@pytest.mark.without_sanitizers
@pytest.mark.parametrize("test", [
    test_distributed.test_dask_distributed_netcdf_roundtrip,
    test_distributed.test_dask_distributed_read_netcdf_integration_test,
], ids=lambda test: test.__name__)
@pytest.mark.parametrize("file_format", ["NETCDF3_CLASSIC", "NETCDF3_64BIT"])
def test_distributed_roundtrip(test: Callable[..., None], file_format: str, loop: Any,  # noqa: F811
                               tmp_netcdf_filename: str) -> None:  # noqa: F811
    test(loop, tmp_netcdf_filename, "tessel", file_format)


@pytest.mark.without_sanitizers
def test_distributed_without_dimensions(loop: Any,  # noqa: F811
                                        tmp_netcdf_filename: str) -> None:  # noqa: F811
    test_distributed.test_dask_distributed_write_netcdf_with_dimensionless_variables(
        loop, tmp_netcdf_filename)


@pytest.mark.without_sanitizers
def test_distributed_files_with_another_calendar(tmp_path: Any) -> None:
    test_distributed.test_open_mfdataset_can_open_files_with_cftime_index(tmp_path)


def test_the_module_did_it(tmp_path: Any) -> None:
    """What the tests above use is what is counted here."""
    before = calls.copy()
    xr.Dataset({"x": ("t", np.arange(3.0))}).to_netcdf(tmp_path / "x.nc")
    with xr.open_dataset(tmp_path / "x.nc") as dataset:
        layer = dataset.x.variable._data
        while hasattr(layer, "array"):
            layer = layer.array
        assert type(layer).__module__ == "tessel.xarray.array"
    assert calls - before == Counter(to_netcdf=1, open_dataset=1)


@pytest.mark.parametrize("name", LEFT_OUT)
def test_what_is_left_out_needs_what_is_not_there(name: str) -> None:
    package = LEFT_OUT[name].rpartition(" ")[2]
    assert importlib.util.find_spec(package) is None
    assert hasattr(test_backends.TestDask, name) or hasattr(test_backends.CFEncodedBase, name)
    assert not hasattr(TestClassic, name) or getattr(TestClassic, name) is None
