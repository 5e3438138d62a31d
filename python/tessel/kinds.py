# python/tessel/kinds.py: the kinds of arguments and results, and the arguments that many share.
"""What the operations' arguments may be and their results are."""

from __future__ import annotations

from tessel.operation import Argument, Kind, ResultKind

_NUMBER = "double or int32; the first element counts, without its fraction"
_NOT_NUMERIC = "is of no numeric class"


def other_class(*classes: str) -> str:
    """Why an argument is refused that may have these classes."""
    return f"is of another class than {' and '.join(', '.join(classes).rsplit(', ', 1))}"


IDENTIFIER = Kind(
    "SupportsIndex", "int", _NUMBER, "{name} if type({name}) is int else integer({name})",
    (("TESSEL:netcdf:emptySetID", "has no elements"),
     ("TESSEL:netcdf:badIDDatatype", other_class("double", "int32"))))
NAME = Kind(
    "str", "str", "char", "{name}",
    (("TESSEL:netcdf:argumentWasNotChar", other_class("char")),))
PATH_NAME = Kind(
    "paths.Path", "str, bytes or path object", NAME.host, "file_path({name})",
    (*NAME.errors, ("TESSEL:python:badPath", "has a NUL in it, or is not UTF-8")))
MODE = Kind(
    "str | SupportsIndex", "str or int",
    f"char, or {_NUMBER}", "{name} if type({name}) is str else integer({name})",
    (("TESSEL:netcdf:emptySetMode", "has no elements"),
     ("TESSEL:netcdf:badModeDatatype", other_class("char", "double", "int32")),
     ("TESSEL:netcdf:unrecognizedFileMode", "is no name of a mode")))
TYPE = Kind(
    "SupportsIndex", "int", "double; the first element counts", IDENTIFIER.conversion,
    (("TESSEL:netcdf:unpack_xtype:emptySetDatatype", "has no elements"),
     ("TESSEL:netcdf:unpack_xtype:badDatatype", other_class("double")),
     ("TESSEL:netcdf:invalidNetcdfDatatype", "is not from 0 to 6")))
SIZE = Kind(
    "SupportsIndex", "int", "any numeric class; the first element counts", IDENTIFIER.conversion,
    (("TESSEL:netcdf:emptySetSizeParameter", "has no elements"),
     ("TESSEL:netcdf:badSizeArgumentDatatype", _NOT_NUMERIC),
     ("TESSEL:netcdf:sizeArgumentIsInfOrNaN", "is infinite or no number"),
     ("TESSEL:netcdf:negativeSize", "is negative")))
ANYTHING = Kind(SIZE.annotation, SIZE.wording, "anything", SIZE.conversion, ())
CODE = Kind(
    "SupportsIndex", "int", "double; the first element counts, without its fraction",
    "{name} if type({name}) is int else code({name})",
    (("TESSEL:netcdf:unpackIntSingleton:argumentIsEmptySet", "has no elements"),
     ("TESSEL:netcdf:unpackIntSingleton:badNumericType", other_class("double", "int32"))))
DIMENSIONS = Kind(
    "Indices", "sequence of int", "double, an element a dimension; empty for none",
    "identifiers({name})",
    (("TESSEL:netcdf:unpackDimids:badDimidsType", "are of another class than double"),
     ("TESSEL:netcdf:ndimsLargerThanNetcdfLimits", "are more than 1024")))
POSITIONS = Kind(
    "Indices", "sequence of int", "any numeric class, an element a dimension",
    "{name} if type({name}) in PLAIN else vector({name})",
    (("TESSEL:netcdf:{label}ArgumentIsEmpty", "has no elements"),
     ("TESSEL:netcdf:{label}ArgumentHasBadDatatype", _NOT_NUMERIC),
     ("TESSEL:netcdf:indexArgumentHasInf", "has an infinite element"),
     ("TESSEL:netcdf:indexArgumentHasNaN", "has an element that is no number")))


def _text_kind(conversion: str, *errors: tuple[str, str]) -> Kind:
    """Text to write."""
    return Kind("str | bytes | NDArray[numpy.str_]", "str, bytes or array of characters", "char",
                f"{{name}} if type({{name}}) is bytes else {conversion}({{name}})", errors)


_NOT_ONE_BYTE = ("TESSEL:python:notOneByte",
                 "has a character that is neither one of ASCII nor above U+FF7F")
TEXT_OF_VARIABLE = _text_kind("text_of_bytes", _NOT_ONE_BYTE)
TEXT_OF_ATTRIBUTE = _text_kind(
    "attribute_text", ("TESSEL:python:notText", "is a str with half of a surrogate pair"),
    (_NOT_ONE_BYTE[0], f"is an array and {_NOT_ONE_BYTE[1]}"))


def data_kind(dtype: str, host_class: str) -> Kind:
    """Numbers to write: an array of the dtype, or Python's own that are exact in it."""
    return Kind(f"Numbers | NDArray[numpy.{dtype}]", f"array of {dtype}, or numbers exact in it",
                host_class, f"{{name}} if type({{name}}) is ndarray else "
                f"numbers({{name}}, dtypes['{dtype}'])",
                (("TESSEL:python:notExact",
                  f"has a Python number that {dtype} cannot hold exactly"),))


NUMBER = ResultKind("int", "int", "double, 1-by-1", "{value}", count=True)
TEXT = ResultKind("str", "str", "char, a row", "{value}")
CONSTANT = ResultKind("Any", "int or float", "double, 1-by-1",
                      "constant({value})")  # as a union, of use to nobody
NAMES = ResultKind("list[str]", "list of str", "cell of char rows, n-by-1",
                   "{value}.ravel().tolist()")
DIMENSION_LIST = ResultKind("tuple[int, ...]", "tuple of int", "double, a row; 0-by-0 for none",
                            "ids({value})", count=True)


def data_result(dtype: str, host_class: str, row: bool) -> ResultKind:
    """Data that were read; text without a dtype, which with `row` is a row for certain."""
    if dtype:
        return ResultKind(f"NDArray[numpy.{dtype}]", f"array of {dtype}", host_class, "{value}")
    if row:
        return TEXT
    return ResultKind("str | NDArray[numpy.str_]", "str or array of characters", "char",
                      "{value}")


NCID = Argument("ncid", IDENTIFIER, "The dataset.")
VARID = Argument("varid", IDENTIFIER, "The variable.")
OWNER = Argument("varid", IDENTIFIER, "The variable, or -1 for the dataset itself.")
DIMID = Argument("dimid", IDENTIFIER, "The dimension.")
ATTRIBUTE = Argument("name", NAME, "The attribute's name.", "attribute")
XTYPE = Argument("xtype", TYPE, """The external type: param("NC_BYTE"), "NC_CHAR", "NC_SHORT",
    "NC_INT", "NC_FLOAT" or "NC_DOUBLE".""", "datatype")
INDEX = Argument("index", POSITIONS, """The position in each dimension, from 0, first dimension
    fastest.""", "start")
START = Argument("start", POSITIONS, """Where the block begins in each dimension, from 0, first
    dimension fastest.""")
COUNT = Argument("count", POSITIONS, """How many elements in each dimension, first dimension
    fastest.""")
STRIDE = Argument("stride", POSITIONS, """The step in each dimension, first dimension fastest; 1
    takes every element.""")

WRONG_COUNT = "there are more or fewer arguments than the page lists"
NOT_OPEN = ("notNetcdfID", "ncid is no open dataset")
NO_VARIABLE = ("variableNotFound", "the dataset has no such variable")
BAD_NAME = ("nameContainsIllegalCharacters",
            "the name is empty, or has characters that names must not have")
