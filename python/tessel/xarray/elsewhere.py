# python/tessel/xarray/elsewhere.py: functions of xarray that its versions have in different places.
"""What xarray has in one module or another, by its version."""

from __future__ import annotations

import inspect
from importlib import import_module
from typing import Any

import xarray


def _found(name: str, *modules: str) -> Any:
    """What one of the modules has by that name."""
    for module in modules:
        try:
            return getattr(import_module(f"xarray.{module}"), name)
        except (ModuleNotFoundError, AttributeError):
            continue
    raise ImportError(f"This version of xarray ({xarray.__version__}) has no {name}.")


ensure_dtype_not_object = _found("ensure_dtype_not_object", "conventions", "backends.common")
_validate_dataset_names = _found("_validate_dataset_names", "backends.api", "backends.writers")
_validate_attrs = _found("_validate_attrs", "backends.api", "backends.writers")

DATAARRAY_NAME: str = _found("DATAARRAY_NAME", "backends.api", "backends.writers")
DATAARRAY_VARIABLE: str = _found("DATAARRAY_VARIABLE", "backends.api", "backends.writers")
"""The attribute with the name of a DataArray whose variable is not called so, and what that is
called instead."""


def validate(dataset: xarray.Dataset) -> None:
    """Looks at the names and the attributes as xarray does before it writes."""
    _validate_dataset_names(dataset)
    wants_engine = "engine" in inspect.signature(_validate_attrs).parameters
    _validate_attrs(dataset, **({"engine": "tessel"} if wants_engine else {}))
