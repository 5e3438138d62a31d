# python/tessel/operations.py: the table of the operations: everything about each that is not code.
"""All operations of the module "netcdf", in the order of its own table.

The methods of `tessel.netcdf.Netcdf`, their docstrings and the type stubs all come from here.
"""

from __future__ import annotations

import difflib

from tessel.families import family
from tessel.kinds import (ANYTHING, ATTRIBUTE, BAD_NAME, CODE, CONSTANT, DIMENSION_LIST, DIMENSIONS,
                          DIMID, IDENTIFIER, MODE, NAME, NAMES, NCID, NO_VARIABLE, NOT_OPEN, NUMBER,
                          OWNER, PATH_NAME, SIZE, TEXT, VARID, WRONG_COUNT, XTYPE)
from tessel.operation import Argument, Errors, Operation, Result

EXAMPLE_BEGINNING = """\
>>> import tessel.sample
>>> nc = tessel.load("netcdf")
>>> ncid = tessel.sample.dataset(nc)
"""
"""What the example of every operation begins with."""

_MOST_NEAR = 8

_NEW_NCID = Result("ncid", NUMBER, "The dataset, until it is closed.")
_HINT = Argument("chunksizehint", SIZE, "A hint for the size of the library's buffer; 0: its own.")
_PATH = Argument("path", PATH_NAME, "The file.", "file")
_OPEN_MODE = Argument("mode", MODE, """One of "NOWRITE" and "WRITE", or a number made of constants,
    such as param("WRITE") | param("SHARE").""")
_CREATE_MODE = Argument("cmode", MODE, """One of "CLOBBER" and "NOCLOBBER", or a number made of
    constants, such as param("NOCLOBBER") | param("64BIT_OFFSET").""", "mode")
_DIMENSION = Argument("name", NAME, "The dimension's name.", "dimension")
_WHOSE = "Its variable, or -1 for the dataset itself."
_VARIABLE = Argument("name", NAME, "The variable's name.", "variable")

_DEFINING = ("operationNotAllowedInDefineMode", "the dataset is in define mode")
_NOT_DEFINING = ("operationNotAllowedInDataMode", "the dataset is not in define mode (redef)")
_LONGER = ("operationNotAllowedInDataMode", "a longer name needs define mode (redef)")
_IN_USE = ("nameIsAlreadyInUse", "the name is taken")
_READ_ONLY = ("writeToReadOnly", "the dataset is open for reading only")
_NO_DIMENSION = ("invalidDimensionIdOrName", "the dataset has no such dimension")
_NO_ATTRIBUTE = ("attributeNotFound", "there is no such attribute")
_NO_FILE = ("noSuchFileOrDirectory", "there is no such file or folder")
_DENIED = ("permissionDenied", "the system does not permit it")
_NO_NETCDF = ("notANetcdfFile", "the file is none of the formats that the library reads")
_EXISTS = ("netcdfFileExistsAndNoClobber", 'there is such a file, and the mode says "NOCLOBBER"')
_BAD_MODE = ("invalidArgument", "the mode's bits make no sense together")


def _errors(tag: str, *failures: tuple[str, str], count: str = "badInputParameterCount",
            count_tag: str | None = None) -> Errors:
    """The error for a wrong number of arguments, then the library's failures."""
    return ((f"TESSEL:netcdf:{count_tag or tag}:{count}", WRONG_COUNT),
            *((f"TESSEL:netcdf:{tag}:{word}", cause) for word, cause in failures))


def _code(name: str, meaning: str, label: str) -> Argument:
    """A code, with what is easily done wrong in the host."""
    return Argument(name, CODE, f"""{meaning} In the host, and in a call by name, give a double: an
        int32 is no error, but its bytes are read as a double's, so that a single one counts as
        0.""",
                    label)


def _enddef(short: str) -> Operation:
    """The one operation that has four names."""
    return Operation(
        short, f"nc_{short}", "Leave define mode.",
        arguments=(NCID,), results=(),
        errors=_errors("endDef", NOT_OPEN, _NOT_DEFINING, count="badInputArgumentCount",
                       count_tag="enddef"),
        example=f">>> nc.redef(ncid)\n>>> nc.{short}(ncid)")


OPERATIONS: tuple[Operation, ...] = (
    Operation(
        "abort", "nc_abort", "Close a dataset and undo what was defined since redef.",
        notes="A dataset that was just created, and never left define mode, is deleted.",
        arguments=(NCID,), results=(), ends=True,
        errors=_errors("abort", NOT_OPEN, count="badInputArgumentCount"),
        example=">>> nc.abort(ncid)"),
    Operation(
        "close", "nc_close", "Write what is left to write, and close a dataset.",
        arguments=(NCID,), results=(), ends=True,
        errors=_errors("close", NOT_OPEN, ("noSpaceLeftOnDevice", "the disk is full")),
        example=">>> nc.close(ncid)"),
    Operation(
        "copy_att", "nc_copy_att", "Copy an attribute to another variable or dataset.",
        notes="A new attribute, and one that grows, needs the target to be in define mode.",
        arguments=(Argument("ncid_in", IDENTIFIER, "The dataset to copy from.", "ncid"),
                   Argument("varid_in", IDENTIFIER, _WHOSE, "varid"),
                   ATTRIBUTE,
                   Argument("ncid_out", IDENTIFIER, "The dataset to copy to.", "ncid"),
                   Argument("varid_out", IDENTIFIER, _WHOSE, "varid")),
        results=(),
        errors=_errors("copyAtt", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE, _NOT_DEFINING, _READ_ONLY),
        example='>>> nc.redef(ncid)\n'
                '>>> nc.copy_att(ncid, -1, "title", ncid, nc.inq_varid(ncid, "series"))'),
    Operation(
        "_create", "nc__create", "Create a dataset with a hint for the library's buffer.",
        notes="The one size given is the initial size and the hint.",
        arguments=(_PATH, _CREATE_MODE,
                   Argument("initialsz", SIZE, "The size that the file begins with; 0: none.",
                            "initialsize"),
                   Argument("chunksizehint", ANYTHING, "Not looked at.")),
        results=(Result("chunksizehint", NUMBER, "What the library chose."), _NEW_NCID),
        several="CreateTuned", opens=True,
        errors=_errors("pCreate", _NO_FILE, _DENIED, _EXISTS, _BAD_MODE),
        example='>>> new = nc._create("new.nc", "NOCLOBBER", 4096, 0)\n'
                '>>> new.chunksizehint\n4096\n>>> nc.close(new.ncid)'),
    Operation(
        "create", "nc_create", "Create a dataset, which then is in define mode.",
        arguments=(_PATH, _CREATE_MODE), results=(_NEW_NCID,), opens=True,
        errors=_errors("create", _NO_FILE, _DENIED, _EXISTS, _BAD_MODE, count="badParameterCount"),
        example='>>> new = nc.create("new.nc", "NOCLOBBER")\n>>> nc.close(new)'),
    Operation(
        "def_dim", "nc_def_dim", "Define a dimension.",
        arguments=(NCID, _DIMENSION,
                   Argument("len", SIZE, "Its length; 0 makes it unlimited.", "dim_length")),
        results=(Result("dimid", NUMBER, "The dimension."),),
        errors=_errors("defDim", NOT_OPEN, _NOT_DEFINING, _IN_USE, BAD_NAME,
                       ("invalidDimensionSize", "the length is more than the format holds"),
                       ("onlyOneUnlimitedDimensionAllowed", "there is an unlimited one already")),
        example='>>> nc.redef(ncid)\n>>> nc.def_dim(ncid, "depth", 20)\n3'),
    Operation(
        "def_var", "nc_def_var", "Define a variable.",
        arguments=(NCID, _VARIABLE, XTYPE,
                   Argument("dimids", DIMENSIONS, """Its dimensions, the fastest first and the
                       unlimited one last; none for a single value.""", "Dimids")),
        results=(Result("varid", NUMBER, "The variable."),),
        errors=_errors("defVar", NOT_OPEN, _NOT_DEFINING, _IN_USE, BAD_NAME,
                       ("invalidDataType", "the external type is 0, or no whole number"), _NO_DIMENSION,
                       ("unlimitedDimensionInTheWrongIndex", "the unlimited one is not the last")),
        example=">>> nc.redef(ncid)\n"
                '>>> nc.def_var(ncid, "depth", nc.param("NC_FLOAT"), [0, 1])\n7'),
    Operation(
        "del_att", "nc_del_att", "Delete an attribute.",
        arguments=(NCID, OWNER, ATTRIBUTE), results=(),
        errors=_errors("delAtt", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE, _NOT_DEFINING, _READ_ONLY),
        example='>>> nc.redef(ncid)\n>>> nc.del_att(ncid, nc.param("GLOBAL"), "title")'),
    Operation(
        "_enddef", "nc__enddef", "Leave define mode, and leave room in the file.",
        arguments=(NCID,
                   Argument("h_minfree", SIZE, "Bytes kept free after the header."),
                   Argument("v_align", SIZE, "What the data of fixed size are aligned to."),
                   Argument("v_minfree", SIZE, "Bytes kept free after the data of fixed size."),
                   Argument("r_align", SIZE, "What the records are aligned to.")),
        results=(),
        errors=_errors("pEndDef", NOT_OPEN, _NOT_DEFINING, count="badParameterCount"),
        example=">>> nc.redef(ncid)\n>>> nc._enddef(ncid, 512, 4, 0, 4)"),
    _enddef("end_def"),
    _enddef("enddef"),
    *family("get_att"),
    Operation(
        "get_constant_names", "get_constant_names", "The names of the library's constants.",
        arguments=(), results=(Result("names", NAMES, "Each with its NC_."),),
        errors=(),
        example=">>> nc.get_constant_names()[:3]\n['NC_BYTE', 'NC_CHAR', 'NC_DOUBLE']"),
    *family("get_var"),
    *family("get_var1"),
    *family("get_vara"),
    *family("get_vars"),
    Operation(
        "inq", "nc_inq", "What a dataset consists of.",
        arguments=(NCID,),
        results=(Result("ndims", NUMBER, "The number of dimensions."),
                 Result("nvars", NUMBER, "The number of variables."),
                 Result("natts", NUMBER, "The number of global attributes."),
                 Result("unlimdimid", NUMBER, "The unlimited dimension; -1 without one.")),
        several="Inq",
        errors=_errors("inq", NOT_OPEN),
        example=">>> nc.inq(ncid)\nInq(ndims=3, nvars=7, natts=1, unlimdimid=2)"),
    Operation(
        "inq_att", "nc_inq_att", "The type and length of an attribute.",
        arguments=(NCID, OWNER, ATTRIBUTE),
        results=(Result("xtype", NUMBER, "The external type: 1 byte, 2 char, 3 short, 4 int, 5 "
                                         "float, 6 double."),
                 Result("len", NUMBER, "The number of values or characters.")),
        several="InqAtt",
        errors=_errors("inqAtt", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE),
        example='>>> nc.inq_att(ncid, nc.param("GLOBAL"), "title")\nInqAtt(xtype=2, len=8)'),
    Operation(
        "inq_attid", "nc_inq_attid", "The number of an attribute.",
        arguments=(NCID, OWNER, ATTRIBUTE),
        results=(Result("attnum", NUMBER, "Its number, from 0."),),
        errors=_errors("inqAttID", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE),
        example='>>> nc.inq_attid(ncid, nc.param("GLOBAL"), "title")\n0'),
    Operation(
        "inq_attname", "nc_inq_attname", "The name of an attribute.",
        arguments=(NCID, OWNER, Argument("attnum", IDENTIFIER, "Its number, from 0.", "attid")),
        results=(Result("name", TEXT, "Its name."),),
        errors=_errors("inqAttName", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE),
        example=">>> nc.inq_attname(ncid, nc.param(\"GLOBAL\"), 0)\n'title'"),
    Operation(
        "inq_dim", "nc_inq_dim", "The name and length of a dimension.",
        arguments=(NCID, DIMID),
        results=(Result("name", TEXT, "Its name."),
                 Result("len", NUMBER, "Its length; of the unlimited one, the number of records.")),
        several="InqDim",
        errors=_errors("inqDim", NOT_OPEN, _NO_DIMENSION),
        example=">>> nc.inq_dim(ncid, 0)\nInqDim(name='x', len=3)"),
    Operation(
        "inq_dimid", "nc_inq_dimid", "The dimension of a name.",
        arguments=(NCID, _DIMENSION), results=(Result("dimid", NUMBER, "The dimension."),),
        errors=_errors("inqDimID", NOT_OPEN, _NO_DIMENSION),
        example='>>> nc.inq_dimid(ncid, "time")\n2'),
    Operation(
        "inq_libvers", "nc_inq_libvers", "The version of the library.",
        arguments=(), results=(Result("version", TEXT, "Its number, and when it was built."),),
        errors=_errors("inqLibVers"),
        example=">>> nc.inq_libvers().split()[0].count('.')\n2"),
    Operation(
        "inq_varid", "nc_inq_varid", "The variable of a name.",
        arguments=(NCID, _VARIABLE), results=(Result("varid", NUMBER, "The variable."),),
        errors=_errors("inqVarID", NOT_OPEN, NO_VARIABLE),
        example='>>> nc.inq_varid(ncid, "series")\n6'),
    Operation(
        "inq_var", "nc_inq_var", "What a variable is.",
        arguments=(NCID, VARID),
        results=(Result("name", TEXT, "Its name."),
                 Result("xtype", NUMBER, "The external type: 1 byte, 2 char, 3 short, 4 int, 5 "
                                         "float, 6 double."),
                 Result("dimids", DIMENSION_LIST, "Its dimensions, the fastest first."),
                 Result("natts", NUMBER, "The number of its attributes.")),
        several="InqVar",
        errors=_errors("inqVar", NOT_OPEN, NO_VARIABLE),
        example=">>> nc.inq_var(ncid, nc.inq_varid(ncid, \"int\"))\n"
                "InqVar(name='int', xtype=4, dimids=(0, 1), natts=1)"),
    Operation(
        "param", "parameter", "The value of one of the library's constants.",
        arguments=(Argument("name", NAME, """The constant, with or without its NC_, in any case:
            "NC_DOUBLE", "global", "Fill_Int".""", "parameter"),),
        results=(Result("value", CONSTANT, "The fill values of float and double are floats."),),
        errors=(("TESSEL:netcdf_tq:tqParameter:badInputParameterCount", WRONG_COUNT),
                ("TESSEL:netcdf:unrecognizedCharParameter", "there is no such constant")),
        example='>>> nc.param("NC_DOUBLE"), nc.param("global")\n(6, -1)'),
    Operation(
        "_open", "nc__open", "Open a dataset with a hint for the library's buffer.",
        arguments=(_PATH, _OPEN_MODE, _HINT),
        results=(Result("chunksizehint", NUMBER, "What the library chose."), _NEW_NCID),
        several="OpenTuned", opens=True,
        errors=_errors("pOpen", _NO_FILE, _DENIED, _NO_NETCDF),
        example='>>> nc.close(tessel.sample.dataset(nc, "sample.nc"))\n'
                '>>> opened = nc._open("sample.nc", "NOWRITE", 4096)\n'
                '>>> opened.chunksizehint\n4096\n>>> nc.close(opened.ncid)'),
    Operation(
        "open", "nc_open", "Open a dataset.",
        arguments=(_PATH, _OPEN_MODE), results=(_NEW_NCID,), opens=True,
        errors=_errors("open", _NO_FILE, _DENIED, _NO_NETCDF),
        example='>>> nc.close(tessel.sample.dataset(nc, "sample.nc"))\n'
                '>>> opened = nc.open("sample.nc", "NOWRITE")\n>>> nc.close(opened)'),
    *family("put_att"),
    *family("put_var"),
    *family("put_vara"),
    *family("put_vars"),
    *family("put_var1"),
    Operation(
        "redef", "nc_redef", "Go back to define mode.",
        arguments=(NCID,), results=(),
        errors=_errors("redef", NOT_OPEN, _DEFINING, _READ_ONLY),
        example=">>> nc.redef(ncid)"),
    Operation(
        "rename_att", "nc_rename_att", "Rename an attribute.",
        arguments=(NCID, OWNER, ATTRIBUTE, Argument("newname", NAME, "Its new name.", "attribute")),
        results=(),
        errors=_errors("renameAtt", NOT_OPEN, NO_VARIABLE, _NO_ATTRIBUTE, _IN_USE, BAD_NAME,
                       _LONGER, _READ_ONLY),
        example='>>> nc.rename_att(ncid, nc.param("GLOBAL"), "title", "name")'),
    Operation(
        "rename_dim", "nc_rename_dim", "Rename a dimension.",
        arguments=(NCID, DIMID, Argument("name", NAME, "Its new name.", "dimension")), results=(),
        errors=_errors("renameDim", NOT_OPEN, _NO_DIMENSION, _IN_USE, BAD_NAME, _LONGER,
                       _READ_ONLY),
        example='>>> nc.rename_dim(ncid, 2, "t")'),
    Operation(
        "rename_var", "nc_rename_var", "Rename a variable.",
        arguments=(NCID, VARID, Argument("name", NAME, "Its new name.", "variable")), results=(),
        errors=_errors("renameVar", NOT_OPEN, NO_VARIABLE, _IN_USE, BAD_NAME, _LONGER, _READ_ONLY),
        example='>>> nc.rename_var(ncid, nc.inq_varid(ncid, "series"), "line")'),
    Operation(
        "set_default_format", "nc_set_default_format",
        "Set the format of the datasets to be created from now on.",
        notes="It holds for everything in this process that uses the library.",
        arguments=(_code("format", 'Either param("FORMAT_CLASSIC") or param("FORMAT_64BIT").',
                         "new_default_format"),),
        results=(Result("old_format", NUMBER, "The format until now."),),
        errors=_errors("setDefaultFormat", ("invalidArgument", "there is no such format")),
        example=">>> old = nc.set_default_format(nc.param(\"FORMAT_64BIT\"))\n"
                ">>> nc.set_default_format(old)\n2"),
    Operation(
        "set_fill", "nc_set_fill", "Set whether data that nobody writes are filled.",
        arguments=(NCID, _code("fillmode", 'Either param("FILL") or param("NOFILL").',
                               "new_fill_mode")),
        results=(Result("old_mode", NUMBER, "The fill mode until now."),),
        errors=_errors("setFill", NOT_OPEN, ("invalidArgument", "there is no such fill mode"),
                       _READ_ONLY),
        example=">>> nc.set_fill(ncid, nc.param(\"NOFILL\"))\n0"),
    Operation(
        "strerror", "nc_strerror", "What a status of the library means.",
        arguments=(_code("ncerr", "The status.", "status"),),
        results=(Result("text", TEXT, "The library's or the system's text."),),
        errors=_errors("strerror", count="badInputArgumentCount"),
        example=">>> nc.strerror(nc.param(\"NC_EBADID\"))\n'NetCDF: Not a valid ID'"),
    Operation(
        "sync", "nc_sync", "Write what is left to write, and see what others have written.",
        arguments=(NCID,), results=(),
        errors=_errors("sync", NOT_OPEN, _DEFINING, count="badInputArgumentCount"),
        example=">>> nc.sync(ncid)"),
)
"""The table."""

BY_NAME: dict[str, Operation] = {name: each for each in OPERATIONS for name in each.names}
"""The operations by each of their names."""


def near(name: str) -> str:
    """The names that may have been meant, to be read after a sentence: those of a family, those
    that begin so, or similar ones; nothing if there are none."""
    meant = name.lower().removeprefix("nc_")
    names = [each.short for each in OPERATIONS]
    found = (meant and ([each for each in names if each.startswith(f"{meant}_")]
                        or [each for each in names if each.startswith(meant)])
             or difflib.get_close_matches(meant, names, _MOST_NEAR))
    if not found:
        return ""
    more = f" and {len(found) - _MOST_NEAR} more" if len(found) > _MOST_NEAR else ""
    return f"there are {', '.join(found[:_MOST_NEAR])}{more}" if len(found) > 1 \
        else f"there is {found[0]}"


def find(name: str) -> Operation | None:
    """The operation of a name, in any case, as the module finds it."""
    return BY_NAME.get(name.lower())
