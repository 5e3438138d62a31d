# python/tessel/xarray/fitting.py: values and attributes as the classic formats can hold them.
"""What becomes of values before they are written: the same numbers in a type that the files have,
or an error. NumPy's own conversions wrap around in silence, so every one is checked here."""

from __future__ import annotations

from collections.abc import Hashable
from functools import partial
from typing import Any

import numpy as np
from numpy.typing import NDArray
from xarray import Variable, conventions
from xarray.backends.netcdf3 import STRING_ENCODING
from xarray.coding import strings, times, variables

import tessel
from tessel.xarray import elsewhere

EXTERNAL = {"int8": ("schar", "BYTE"), "bytes8": ("text", "CHAR"), "int16": ("short", "SHORT"),
            "int32": ("int", "INT"), "float32": ("float", "FLOAT"), "float64": ("double", "DOUBLE")}
"""The types of the files by the name of the dtype: the member of the typed families that writes
them, and the constant."""

_COERCED = {"int64": "int32", "uint64": "int32", "uint32": "int32", "uint16": "int16",
            "uint8": "int8", "bool": "int8"}
"""What is written for the types that the files have not, as by xarray's other engines."""


def _misfit(values: NDArray[Any], wrong: NDArray[np.bool_], dtype: np.dtype[Any],
            what: str) -> tessel.Error:
    first = values[wrong].ravel()[0]
    return tessel.Error("TESSEL:python:valueDoesNotFit",
                        f"{what}: could not safely cast from {values.dtype} to {dtype}: it has the "
                        f"value {first}.")


def _beyond(values: NDArray[Any], dtype: np.dtype[Any]) -> NDArray[np.bool_]:
    """Which rounded values an integer type cannot hold; NaN is one of them."""
    limits = np.iinfo(dtype)
    if values.dtype.kind != "f":
        own = np.iinfo(values.dtype)
        return ((values < max(limits.min, own.min)) | (values > min(limits.max, own.max)))
    # The first numbers beyond are powers of two, which every floating type has; the largest ones
    # within are none of theirs.
    return ~((values >= float(limits.min)) & (values < float(limits.max + 1)))


def fitted(values: NDArray[Any], dtype: np.dtype[Any], what: str) -> NDArray[Any]:
    """The same values in another type, rounded where it has fewer digits; an error for a value
    that is beyond the type."""
    if values.dtype == dtype:
        return values
    if values.dtype.kind not in "biuf" or dtype.kind not in "biuf":
        raise unsupported(values.dtype, what)
    if values.dtype.kind == "b":
        return values.astype(dtype)
    if dtype.kind in "iu":
        rounded = np.asarray(np.around(values)) if values.dtype.kind == "f" else values
        wrong = _beyond(rounded, dtype)
        if wrong.any():
            raise _misfit(values, wrong, dtype, what)
        return rounded.astype(dtype)
    with np.errstate(over="ignore"):
        made = values.astype(dtype)
    if values.dtype.kind == "f" and values.dtype.itemsize > dtype.itemsize:
        wrong = np.isinf(made) & ~np.isinf(values)
        if wrong.any():
            raise _misfit(values, wrong, dtype, what)
    return made


def _fitted_unsigned(values: NDArray[Any], dtype: np.dtype[Any], what: str) -> NDArray[Any]:
    """The bits of unsigned values in a signed type."""
    return fitted(values, np.dtype(f"u{dtype.itemsize}"), what).view(dtype)


def unsupported(dtype: np.dtype[Any], what: str) -> tessel.Error:
    """The error for values of a type that nothing is written for."""
    return tessel.Error("TESSEL:python:unsupportedDtype",
                        f"{what}: the files of the classic formats have no type for {dtype}.")


def _converted(data: Any, dtype: np.dtype[Any], what: str, *, unsigned: bool = False) -> Any:
    """The same as `fitted`; for a Dask array when it is computed."""
    if data.dtype == dtype and not unsigned:
        return data
    convert = partial(_fitted_unsigned if unsigned else fitted, dtype=dtype, what=what)
    if hasattr(data, "map_blocks"):
        return data.map_blocks(convert, dtype=dtype, meta=np.empty((0,) * data.ndim, dtype))
    return convert(np.asarray(data))


def _whole(values: NDArray[Any], dtype: np.dtype[Any], what: str) -> NDArray[Any]:
    """The same as `fitted`, and an error for what an integer type would have to round. Values that
    are measured may be rounded; one that stands for missing ones would be another one."""
    if dtype.kind in "iu" and values.dtype.kind == "f":
        fractional = np.isfinite(values) & (values != np.around(values))
        if fractional.any():
            raise _misfit(values, fractional, dtype, what)
    return fitted(values, dtype, what)


def _marker(value: Any, dtype: np.dtype[Any], what: str, unsigned: bool) -> Any:
    """A value that stands for missing ones, as the data have it before the bits become signed."""
    given = np.asarray(value)
    if given.dtype.kind not in "biuf" or given.ndim:
        return value
    if unsigned:
        if given >= 0:
            return _whole(given, np.dtype(f"u{dtype.itemsize}"), what)[()]
        return _whole(given, dtype, what).view(f"u{dtype.itemsize}")[()]
    return _whole(given, dtype, what)[()]


def checked(variable: Variable, name: Hashable) -> Variable:
    """The variable packed as its encoding says, which is the part of xarray's encoding that would
    wrap around what does not fit. xarray's own does the rest, and finds nothing left of this."""
    conventions.ensure_not_multiindex(variable, name=name)
    for coder in (times.CFDatetimeCoder(), times.CFTimedeltaCoder(),
                  variables.CFScaleOffsetCoder()):
        variable = coder.encode(variable, name=name)
    variable = variable.copy(deep=False)
    attrs, encoding = dict(variable.attrs), dict(variable.encoding)
    if "dtype" in encoding and encoding["dtype"] not in ("S1", str):
        variable = elsewhere.ensure_dtype_not_object(variable, name=name)
    if encoding.get("dtype") in ("S1", str) or variable.dtype.kind in "OSU":
        return variable

    what = f"variable {name!r}"
    unsigned = encoding.get("_Unsigned") == "true"
    dtype = np.dtype(encoding.pop("dtype", variable.dtype)).newbyteorder("=")
    if unsigned:
        variables.pop_to(encoding, attrs, "_Unsigned", name=name)
        dtype = np.dtype(f"i{dtype.itemsize}")
    for key in ("_FillValue", "missing_value"):
        if encoding.get(key) is not None:
            encoding[key] = _marker(encoding[key], dtype, f"{key} of {what}", unsigned)
    # The data stay what they are while the missing ones are filled; the marker has its type
    # already.
    between = np.dtype(f"u{dtype.itemsize}") if unsigned else dtype
    filled = variables.CFMaskCoder().encode(
        Variable(variable.dims, variable.data, attrs, {**encoding, "dtype": between},
                 fastpath=True), name=name)
    attrs, encoding = dict(filled.attrs), dict(filled.encoding)
    del encoding["dtype"]
    if unsigned:
        for key in ("_FillValue", "missing_value"):
            if np.asarray(attrs.get(key, "")).dtype == between:
                attrs[key] = np.asarray(attrs[key]).view(dtype)[()]
    data = _converted(filled.data, dtype, what, unsigned=unsigned)
    return Variable(filled.dims, data, attrs, encoding, fastpath=True)


def external(variable: Variable, name: Hashable) -> Variable:
    """A variable that xarray has encoded, in one of the types that the files have, with its texts
    as characters."""
    # Which newer versions of xarray do not count as encoding.
    variable = elsewhere.ensure_dtype_not_object(variable, name=name)
    encoding = dict(variable.encoding)
    asked = {"dtype": encoding.pop("dtype")} if encoding.get("dtype") is str else {}
    variable = Variable(variable.dims, variable.data, variable.attrs, encoding, fastpath=True)
    for coder in (strings.EncodedStringCoder(allows_unicode=False), strings.CharacterArrayCoder()):
        variable = coder.encode(variable, name=name)
    what = f"variable {name!r}"
    dtype = variable.dtype.newbyteorder("=")
    dtype = np.dtype(_COERCED.get(dtype.name, dtype))
    if dtype.name not in EXTERNAL:
        raise unsupported(variable.dtype, what)
    attrs = {key: attribute(value, f"attribute {key!r} of {what}")
             for key, value in variable.attrs.items()}
    if "_FillValue" in attrs:
        attrs["_FillValue"] = _fill_value(attrs["_FillValue"], dtype, what)
    data = variable.data if dtype.kind == "S" else _converted(variable.data, dtype, what)
    # Texts of variable length are left to whoever judges what the encoding asked for in vain.
    return Variable(variable.dims, data, attrs, {**variable.encoding, **asked}, fastpath=True)


def _fill_value(value: bytes | NDArray[Any], dtype: np.dtype[Any],
                what: str) -> bytes | NDArray[Any]:
    """The attribute in the variable's own type, as the library wants this one."""
    what = f"_FillValue of {what}"
    if isinstance(value, bytes) != (dtype.kind == "S"):
        raise tessel.Error("TESSEL:python:unsupportedDtype", f"{what}: it is not of {dtype}.")
    if isinstance(value, bytes):
        value = value or b"\0"  # with which NumPy fills a text that is shorter than others
    if len(value) != 1:
        raise tessel.Error("TESSEL:python:badShape", f"{what}: it is one value, not {len(value)}.")
    return value if isinstance(value, bytes) else _whole(value, dtype, what)


def attribute(value: Any, what: str) -> bytes | NDArray[Any]:
    """The value of an attribute: the bytes of a text, or numbers in one of the types."""
    if isinstance(value, str):
        return value.encode(STRING_ENCODING)
    if isinstance(value, bytes):
        return bytes(value)
    values = np.atleast_1d(value)
    if values.ndim > 1:
        raise tessel.Error("TESSEL:python:badShape", f"{what}: attributes must be 1-dimensional.")
    if values.dtype.kind in "SU" and values.size == 1:
        return attribute(values[0], what)
    dtype = values.dtype.newbyteorder("=")
    dtype = np.dtype(_COERCED.get(dtype.name, dtype))
    if dtype.kind == "S" or dtype.name not in EXTERNAL:
        raise unsupported(values.dtype, what)
    return fitted(values, dtype, what)
