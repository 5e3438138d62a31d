# python/tessel/families.py: the typed families: a row for each family and each of its members.
"""The operations that exist once for each type of the library's, described once for all of them."""

from __future__ import annotations

import re
from collections.abc import Callable
from dataclasses import dataclass

from tessel.kinds import (ATTRIBUTE, BAD_NAME, COUNT, INDEX, NCID, NO_VARIABLE, NOT_OPEN, OWNER,
                          START, STRIDE, TEXT_OF_ATTRIBUTE, TEXT_OF_VARIABLE, VARID, WRONG_COUNT,
                          XTYPE, data_kind, data_result)
from tessel.operation import Argument, Errors, Operation, Result


@dataclass(frozen=True)
class Member:
    """A type of the families."""

    suffix: str
    host_class: str
    dtype: str
    external: str
    """The variable of the sample that it reads and writes, named as its external type."""

    @property
    def is_text(self) -> bool:
        """Whether its data are characters."""
        return self.suffix == "text"

    def value(self, number: str) -> str:
        """A value of the sample as Python writes it."""
        return {"double": f"{number}.0", "float": f"{number}.0",
                "text": f"'{'abcdef'[int(number)]}'"}.get(self.suffix, number)

    def data(self, numbers: str) -> str:
        """Some values of the sample as data to write."""
        if self.is_text:
            return "'" + "".join("abcdef"[int(each)] for each in numbers) + "'"
        return "[" + ", ".join(self.value(each) for each in numbers) + "]"

    def filled(self, template: str) -> str:
        """A template with this member's words: {type}, {class}, {external}, {v3}, {d012}."""
        text = re.sub(r"\{v(\d)\}", lambda found: self.value(found[1]), template)
        text = re.sub(r"\{d(\d+)\}", lambda found: self.data(found[1]), text)
        return (text.replace("{type}", self.suffix).replace("{class}", self.host_class)
                .replace("{external}", self.external))


MEMBERS = (
    Member("double", "double", "float64", "double"),
    Member("float", "single", "float32", "float"),
    Member("int", "int32", "int32", "int"),
    Member("short", "int16", "int16", "short"),
    Member("schar", "int8", "int8", "byte"),
    Member("uchar", "uint8", "uint8", "byte"),
    Member("text", "char", "", "char"),
)
"""The members of every family, in the order of the module's table."""

_CONVERTED = ("mathResultNotRepresentable",
              "a value does not fit the other type; the other values are read or written")
_NUMBER_AND_TEXT = ("attemptToConvertBetweenTextAndNumbers",
                    "text is asked of numbers, or numbers of text")
_BEYOND = ("indexExceedsDimensionBound", "a position is beyond its dimension")
_EDGE = ("startPlusCountExceedsDimensionBound", "the block ends beyond a dimension")
_STRIDE = ("illegalStride", "a stride is not positive")
_DEFINING = ("operationNotAllowedInDefineMode", "the dataset is in define mode")
_READ_ONLY = ("writeToReadOnly", "the dataset is open for reading only")
_LENGTH = "{} has not one element for each dimension of the variable"


def _errors(tag: str, *words: tuple[str, str]) -> Errors:
    return tuple((f"TESSEL:netcdf:{tag}:{word}", cause) for word, cause in words)


def _conversion(tag: str, of: Member) -> Errors:
    """What the library refuses to convert."""
    return _errors(tag, _NUMBER_AND_TEXT, *(() if of.is_text else (_CONVERTED,)))


def _read(name: str, tag: str, *arguments: Argument, purpose: str, notes: str, shape: str,
          errors: Errors, example: str, text_example: str | None = None, text_shape: str,
          text_row: bool = False) -> Callable[[Member], Operation]:
    """A family that reads."""

    def member(of: Member) -> Operation:
        lines = text_example if text_example is not None and of.is_text else example
        return Operation(
            short=f"{name}_{of.suffix}", long=f"nc_{name}_{of.suffix}",
            purpose=of.filled(purpose), notes=notes,
            arguments=(NCID, OWNER if name == "get_att" else VARID, *arguments),
            results=(Result("data", data_result(of.dtype, of.host_class, text_row),
                            text_shape if of.is_text else shape),),
            errors=((f"TESSEL:netcdf:{tag}:badInputParameterCount", WRONG_COUNT),
                    *errors, *_conversion(tag, of)),
            example=of.filled(lines))

    return member


def _write(name: str, tag: str, *arguments: Argument, purpose: str, notes: str, size: str,
           errors: Errors, example: str, text_example: str | None = None,
           may_be_empty: bool = False) -> Callable[[Member], Operation]:
    """A family that writes."""

    def member(of: Member) -> Operation:
        lines = text_example if text_example is not None and of.is_text else example
        short = f"{name}_{of.suffix}"
        mine = tag
        given = arguments
        found = errors
        kind = TEXT_OF_VARIABLE if of.is_text else data_kind(of.dtype, of.host_class)
        if of.is_text and name == "put_att":  # the one member with a frame of its own
            kind, mine = TEXT_OF_ATTRIBUTE, "putAttText"
            given = tuple(each for each in arguments if each is not XTYPE)
            found = tuple((identifier.replace(":putAtt:", ":putAttText:"), cause)
                          for identifier, cause in errors)
        empty = () if may_be_empty else (("TESSEL:netcdf:emptyVariableData", "data is empty"),)
        about_text = (_WRITTEN_AS[kind],) if kind in _WRITTEN_AS else ()
        return Operation(
            short=short, long=f"nc_{short}", purpose=of.filled(purpose),
            notes=" ".join((notes, *about_text)), results=(),
            arguments=(NCID, OWNER if name == "put_att" else VARID, *given,
                       Argument("data", kind, size)),
            errors=((f"TESSEL:netcdf:{mine}:badInputParameterCount", WRONG_COUNT),
                    *empty,
                    (f"TESSEL:netcdf:{short}:badDatatype",
                     f"data is an array of another class than {of.host_class}"),
                    *found, *_conversion(mine, of)),
            example=of.filled(lines))

    return member


_BLOCK_ORDER = """Dimensions are in host order, the fastest first: the reverse of what ncdump
    prints. The values stay in the order that they have in the file."""
_WHOLE = """One dimension for each of the variable's, the fastest first; n-by-1 for a variable of
    one dimension, 1-by-1 for one of none."""
_BLOCK = "In the shape that `count` says; n-by-1 for one dimension."
_ROW = " A single row is a str; a byte above 127 is a character above U+FF7F."

_WRITTEN_AS = {
    TEXT_OF_ATTRIBUTE: """A str is written as UTF-8, which is what get_att_text decodes; bytes are
        written as they are. The call form, `nc("put_att_text", ...)`, writes the low byte of each
        character, and so do the host and C++.""",
    TEXT_OF_VARIABLE: """A character is one byte in a variable: text may have the characters of
        ASCII, and those above U+FF7F that reading gives for bytes above 127. Give other text as
        bytes, such as text.encode("latin-1"). The call form writes the low byte of each character,
        whatever it is, and so do the host and C++.""",
}
"""What becomes of text in Python, by its kind."""

_VARIABLE = '>>> varid = nc.inq_varid(ncid, "{external}")\n'

FAMILIES: dict[str, Callable[[Member], Operation]] = {
    "get_att": _read(
        "get_att", "getAtt", ATTRIBUTE,
        purpose="Read the values of an attribute as {class}.",
        notes="The library converts from the attribute's own type.",
        shape="A row, 1-by-n for n values; 0-by-0 when there are none.",
        text_shape="""The text before the first NUL, decoded as UTF-8; a byte that is no part of valid
            UTF-8 is the character of the same code, as in Latin-1.""",
        text_row=True,
        errors=_errors("getAtt", NOT_OPEN, NO_VARIABLE,
                       ("attributeNotFound", "there is no attribute of that name")),
        example=_VARIABLE + '>>> nc.get_att_{type}(ncid, varid, "range").tolist()\n[[{v0}, {v5}]]',
        text_example='>>> nc.get_att_text(ncid, nc.param("GLOBAL"), "title")\n\'A sample\''),
    "get_var": _read(
        "get_var", "getVar",
        purpose="Read all values of a variable as {class}.",
        notes=_BLOCK_ORDER + " An unlimited dimension counts with the records that there are.",
        shape=_WHOLE, text_shape=_WHOLE + _ROW,
        errors=(*_errors("getVar:numDimsInquiry", NOT_OPEN, NO_VARIABLE),
                *_errors("getVar", _DEFINING)),
        example=_VARIABLE + ">>> nc.get_var_{type}(ncid, varid).tolist()\n"
                            "[[{v0}, {v3}], [{v1}, {v4}], [{v2}, {v5}]]"),
    "get_var1": _read(
        "get_var1", "getVar1", INDEX,
        purpose="Read one element of a variable as {class}.",
        notes=_BLOCK_ORDER,
        shape="The element, 1-by-1.", text_shape="One character; none for a NUL.",
        text_row=True,
        errors=(*_errors("getVar1", NOT_OPEN, NO_VARIABLE),
                *_errors("getVar1", ("indexVectorLengthMismatch", _LENGTH.format("index"))),
                *_errors("getVar1", _BEYOND, _DEFINING)),
        example=_VARIABLE + ">>> nc.get_var1_{type}(ncid, varid, [2, 1]).item()\n{v5}",
        text_example=_VARIABLE + ">>> nc.get_var1_text(ncid, varid, [2, 1])\n{v5}"),
    "get_vara": _read(
        "get_vara", "getVara", START, COUNT,
        purpose="Read a block of a variable as {class}.",
        notes=_BLOCK_ORDER,
        shape=_BLOCK, text_shape=_BLOCK + _ROW,
        errors=(*_errors("getVara:numDimsInquiry", NOT_OPEN, NO_VARIABLE),
                *_errors("getVara", ("startVectorLengthMismatch", _LENGTH.format("start")),
                      ("countVectorLengthMismatch", _LENGTH.format("count"))),
                *_errors("getVara", _BEYOND, _EDGE, _DEFINING)),
        example=_VARIABLE + ">>> nc.get_vara_{type}(ncid, varid, [1, 0], [2, 2]).tolist()\n"
                            "[[{v1}, {v4}], [{v2}, {v5}]]"),
    "get_vars": _read(
        "get_vars", "getVars", START, COUNT, STRIDE,
        purpose="Read every n-th element of a block of a variable as {class}.",
        notes=_BLOCK_ORDER,
        shape=_BLOCK, text_shape=_BLOCK + _ROW,
        errors=(*_errors("getVars", ("numVarsInquiryFailure",
                                  "ncid is no open dataset, or it has no variable of that id"),
                      ("startVectorLengthMismatch", _LENGTH.format("start")),
                      ("countVectorLengthMismatch", _LENGTH.format("count")),
                      ("strideVectorLengthMismatch", _LENGTH.format("stride"))),
                *_errors("getVars", _BEYOND, _EDGE, _STRIDE, _DEFINING)),
        example=_VARIABLE + ">>> nc.get_vars_{type}(ncid, varid, [0, 0], [2, 2], [2, 1]).tolist()\n"
                            "[[{v0}, {v3}], [{v2}, {v5}]]"),
    "put_att": _write(
        "put_att", "putAtt", ATTRIBUTE, XTYPE,
        purpose="Write the values of an attribute from {class}.",
        notes="""A new attribute, and one that grows, needs define mode. The library converts to the
            attribute's type.""",
        size="The values, in the order of the memory, whatever the shape; there may be none.",
        may_be_empty=True,
        errors=_errors("putAtt", NOT_OPEN, NO_VARIABLE,
                       ("operationNotAllowedInDataMode", "it needs define mode (redef)"),
                       BAD_NAME, _READ_ONLY),
        example=">>> nc.redef(ncid)\n" + _VARIABLE +
                '>>> nc.put_att_{type}(ncid, varid, "limits", nc.param("{external}"), {d15})\n'
                '>>> nc.get_att_{type}(ncid, varid, "limits").tolist()\n[[{v1}, {v5}]]',
        text_example=">>> nc.redef(ncid)\n" + _VARIABLE +
                     '>>> nc.put_att_text(ncid, varid, "units", "°C")\n'
                     '>>> nc.get_att_text(ncid, varid, "units")\n\'°C\''),
    "put_var": _write(
        "put_var", "putVar",
        purpose="Write all values of a variable from {class}.",
        notes=_BLOCK_ORDER + """ An unlimited dimension counts with the records that there are, so
            this never adds one.""",
        size="As many values as the variable has; the shape does not matter.",
        errors=(*_errors("putVar", NOT_OPEN, NO_VARIABLE),
                *_errors("putVar", ("dataSizeMismatch", "data has another size than the variable")),
                *_errors("putVar", _DEFINING, _READ_ONLY)),
        example=_VARIABLE + ">>> nc.put_var_{type}(ncid, varid, {d543210})\n"
                            ">>> nc.get_var_{type}(ncid, varid).tolist()\n"
                            "[[{v5}, {v2}], [{v4}, {v1}], [{v3}, {v0}]]"),
    "put_vara": _write(
        "put_vara", "putVara", START, COUNT,
        purpose="Write a block of a variable from {class}.",
        notes=_BLOCK_ORDER + " Positions beyond the last record add records.",
        size="As many values as `count` says; the shape does not matter.",
        errors=(*_errors("putVara", ("inqVarNDimsFailure",
                                  "ncid is no open dataset, or it has no variable of that id"),
                      ("badStartLength", _LENGTH.format("start")),
                      ("badCountLength", _LENGTH.format("count")),
                      ("dataSizeMismatch", "data has another size than `count` says")),
                *_errors("putVara", _BEYOND, _EDGE, _DEFINING, _READ_ONLY)),
        example=_VARIABLE + ">>> nc.put_vara_{type}(ncid, varid, [0, 0], [3, 1], {d543})\n"
                            ">>> nc.get_var_{type}(ncid, varid).tolist()\n"
                            "[[{v5}, {v3}], [{v4}, {v4}], [{v3}, {v5}]]"),
    "put_vars": _write(
        "put_vars", "putVars", START, COUNT, STRIDE,
        purpose="Write every n-th element of a block of a variable from {class}.",
        notes=_BLOCK_ORDER + " Positions beyond the last record add records.",
        size="As many values as `count` says; the shape does not matter.",
        errors=(*_errors("putVars", ("inqVarNDimsFailure",
                                  "ncid is no open dataset, or it has no variable of that id"),
                      ("badStartLength", _LENGTH.format("start")),
                      ("badCountLength", _LENGTH.format("count")),
                      ("badStrideLength", _LENGTH.format("stride")),
                      ("dataSizeMismatch", "data has another size than `count` says")),
                *_errors("putVars", _BEYOND, _EDGE, _STRIDE, _DEFINING, _READ_ONLY)),
        example=_VARIABLE + ">>> nc.put_vars_{type}(ncid, varid, [0, 0], [2, 1], [2, 1], {d54})\n"
                            ">>> nc.get_var_{type}(ncid, varid).tolist()\n"
                            "[[{v5}, {v3}], [{v1}, {v4}], [{v4}, {v5}]]"),
    "put_var1": _write(
        "put_var1", "putVar1", INDEX,
        purpose="Write one element of a variable from {class}.",
        notes=_BLOCK_ORDER + " A position beyond the last record adds records.",
        size="One value.",
        errors=(*_errors("putVar1", ("dataSizeMismatch", "data has more than one value"),
                      ("inqVarNDimsFailure",
                       "ncid is no open dataset, or it has no variable of that id"),
                      ("badStartLength", _LENGTH.format("index"))),
                *_errors("putVar1", _BEYOND, _DEFINING, _READ_ONLY)),
        example=_VARIABLE + ">>> nc.put_var1_{type}(ncid, varid, [2, 1], {v0})\n"
                            ">>> nc.get_var1_{type}(ncid, varid, [2, 1]).item()\n{v0}",
        text_example=_VARIABLE + ">>> nc.put_var1_text(ncid, varid, [2, 1], {v0})\n"
                                 ">>> nc.get_var1_text(ncid, varid, [2, 1])\n{v0}"),
}
"""The families by name; each makes the operation of a member."""


def family(name: str) -> tuple[Operation, ...]:
    """The operations of a family, in the order of the members."""
    return tuple(FAMILIES[name](member) for member in MEMBERS)
