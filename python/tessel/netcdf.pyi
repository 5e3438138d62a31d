# python/tessel/netcdf.pyi: written by tools/make_stubs.py; change the tables instead.

from collections.abc import Sequence
from typing import Any, NamedTuple, SupportsIndex

import numpy
from numpy.typing import NDArray

from tessel import paths
from tessel._runtime import Module

Indices = SupportsIndex | Sequence[SupportsIndex] | NDArray[Any]
Numbers = float | Sequence[Any]

def path_of(ncid: int) -> str | None: ...

class CreateTuned(NamedTuple):
    chunksizehint: int
    ncid: int

class Inq(NamedTuple):
    ndims: int
    nvars: int
    natts: int
    unlimdimid: int

class InqAtt(NamedTuple):
    xtype: int
    len: int

class InqDim(NamedTuple):
    name: str
    len: int

class InqVar(NamedTuple):
    name: str
    xtype: int
    dimids: tuple[int, ...]
    natts: int

class OpenTuned(NamedTuple):
    chunksizehint: int
    ncid: int

class Netcdf(Module):
    def __new__(cls, module: Module) -> Netcdf: ...
    def abort(self, ncid: SupportsIndex) -> None: ...
    def nc_abort(self, ncid: SupportsIndex) -> None: ...
    def close(self, ncid: SupportsIndex) -> None: ...
    def nc_close(self, ncid: SupportsIndex) -> None: ...
    def copy_att(
        self,
        ncid_in: SupportsIndex,
        varid_in: SupportsIndex,
        name: str,
        ncid_out: SupportsIndex,
        varid_out: SupportsIndex,
    ) -> None: ...
    def nc_copy_att(
        self,
        ncid_in: SupportsIndex,
        varid_in: SupportsIndex,
        name: str,
        ncid_out: SupportsIndex,
        varid_out: SupportsIndex,
    ) -> None: ...
    def _create(
        self,
        path: paths.Path,
        cmode: str | SupportsIndex,
        initialsz: SupportsIndex,
        chunksizehint: SupportsIndex,
    ) -> CreateTuned: ...
    def nc__create(
        self,
        path: paths.Path,
        cmode: str | SupportsIndex,
        initialsz: SupportsIndex,
        chunksizehint: SupportsIndex,
    ) -> CreateTuned: ...
    def create(self, path: paths.Path, cmode: str | SupportsIndex) -> int: ...
    def nc_create(self, path: paths.Path, cmode: str | SupportsIndex) -> int: ...
    def def_dim(self, ncid: SupportsIndex, name: str, len: SupportsIndex) -> int: ...
    def nc_def_dim(self, ncid: SupportsIndex, name: str, len: SupportsIndex) -> int: ...
    def def_var(
        self,
        ncid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        dimids: Indices,
    ) -> int: ...
    def nc_def_var(
        self,
        ncid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        dimids: Indices,
    ) -> int: ...
    def del_att(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> None: ...
    def nc_del_att(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> None: ...
    def _enddef(
        self,
        ncid: SupportsIndex,
        h_minfree: SupportsIndex,
        v_align: SupportsIndex,
        v_minfree: SupportsIndex,
        r_align: SupportsIndex,
    ) -> None: ...
    def nc__enddef(
        self,
        ncid: SupportsIndex,
        h_minfree: SupportsIndex,
        v_align: SupportsIndex,
        v_minfree: SupportsIndex,
        r_align: SupportsIndex,
    ) -> None: ...
    def end_def(self, ncid: SupportsIndex) -> None: ...
    def nc_end_def(self, ncid: SupportsIndex) -> None: ...
    def enddef(self, ncid: SupportsIndex) -> None: ...
    def nc_enddef(self, ncid: SupportsIndex) -> None: ...
    def get_att_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.float64]: ...
    def nc_get_att_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.float64]: ...
    def get_att_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.float32]: ...
    def nc_get_att_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.float32]: ...
    def get_att_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int32]: ...
    def nc_get_att_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int32]: ...
    def get_att_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int16]: ...
    def nc_get_att_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int16]: ...
    def get_att_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int8]: ...
    def nc_get_att_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.int8]: ...
    def get_att_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.uint8]: ...
    def nc_get_att_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
    ) -> NDArray[numpy.uint8]: ...
    def get_att_text(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> str: ...
    def nc_get_att_text(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> str: ...
    def get_constant_names(self) -> list[str]: ...
    def get_var_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.float64]: ...
    def nc_get_var_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.float64]: ...
    def get_var_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.float32]: ...
    def nc_get_var_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.float32]: ...
    def get_var_int(self, ncid: SupportsIndex, varid: SupportsIndex) -> NDArray[numpy.int32]: ...
    def nc_get_var_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.int32]: ...
    def get_var_short(self, ncid: SupportsIndex, varid: SupportsIndex) -> NDArray[numpy.int16]: ...
    def nc_get_var_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.int16]: ...
    def get_var_schar(self, ncid: SupportsIndex, varid: SupportsIndex) -> NDArray[numpy.int8]: ...
    def nc_get_var_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.int8]: ...
    def get_var_uchar(self, ncid: SupportsIndex, varid: SupportsIndex) -> NDArray[numpy.uint8]: ...
    def nc_get_var_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> NDArray[numpy.uint8]: ...
    def get_var_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> str | NDArray[numpy.str_]: ...
    def nc_get_var_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
    ) -> str | NDArray[numpy.str_]: ...
    def get_var1_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.float64]: ...
    def nc_get_var1_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.float64]: ...
    def get_var1_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.float32]: ...
    def nc_get_var1_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.float32]: ...
    def get_var1_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int32]: ...
    def nc_get_var1_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int32]: ...
    def get_var1_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int16]: ...
    def nc_get_var1_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int16]: ...
    def get_var1_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int8]: ...
    def nc_get_var1_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.int8]: ...
    def get_var1_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def nc_get_var1_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def get_var1_text(self, ncid: SupportsIndex, varid: SupportsIndex, index: Indices) -> str: ...
    def nc_get_var1_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
    ) -> str: ...
    def get_vara_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.float64]: ...
    def nc_get_vara_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.float64]: ...
    def get_vara_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.float32]: ...
    def nc_get_vara_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.float32]: ...
    def get_vara_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int32]: ...
    def nc_get_vara_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int32]: ...
    def get_vara_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int16]: ...
    def nc_get_vara_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int16]: ...
    def get_vara_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int8]: ...
    def nc_get_vara_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.int8]: ...
    def get_vara_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def nc_get_vara_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def get_vara_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> str | NDArray[numpy.str_]: ...
    def nc_get_vara_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
    ) -> str | NDArray[numpy.str_]: ...
    def get_vars_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.float64]: ...
    def nc_get_vars_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.float64]: ...
    def get_vars_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.float32]: ...
    def nc_get_vars_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.float32]: ...
    def get_vars_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int32]: ...
    def nc_get_vars_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int32]: ...
    def get_vars_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int16]: ...
    def nc_get_vars_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int16]: ...
    def get_vars_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int8]: ...
    def nc_get_vars_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.int8]: ...
    def get_vars_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def nc_get_vars_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> NDArray[numpy.uint8]: ...
    def get_vars_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> str | NDArray[numpy.str_]: ...
    def nc_get_vars_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
    ) -> str | NDArray[numpy.str_]: ...
    def inq(self, ncid: SupportsIndex) -> Inq: ...
    def nc_inq(self, ncid: SupportsIndex) -> Inq: ...
    def inq_att(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> InqAtt: ...
    def nc_inq_att(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> InqAtt: ...
    def inq_attid(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> int: ...
    def nc_inq_attid(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> int: ...
    def inq_attname(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        attnum: SupportsIndex,
    ) -> str: ...
    def nc_inq_attname(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        attnum: SupportsIndex,
    ) -> str: ...
    def inq_dim(self, ncid: SupportsIndex, dimid: SupportsIndex) -> InqDim: ...
    def nc_inq_dim(self, ncid: SupportsIndex, dimid: SupportsIndex) -> InqDim: ...
    def inq_dimid(self, ncid: SupportsIndex, name: str) -> int: ...
    def nc_inq_dimid(self, ncid: SupportsIndex, name: str) -> int: ...
    def inq_libvers(self) -> str: ...
    def nc_inq_libvers(self) -> str: ...
    def inq_varid(self, ncid: SupportsIndex, name: str) -> int: ...
    def nc_inq_varid(self, ncid: SupportsIndex, name: str) -> int: ...
    def inq_var(self, ncid: SupportsIndex, varid: SupportsIndex) -> InqVar: ...
    def nc_inq_var(self, ncid: SupportsIndex, varid: SupportsIndex) -> InqVar: ...
    def param(self, name: str) -> Any: ...
    def parameter(self, name: str) -> Any: ...
    def _open(
        self,
        path: paths.Path,
        mode: str | SupportsIndex,
        chunksizehint: SupportsIndex,
    ) -> OpenTuned: ...
    def nc__open(
        self,
        path: paths.Path,
        mode: str | SupportsIndex,
        chunksizehint: SupportsIndex,
    ) -> OpenTuned: ...
    def open(self, path: paths.Path, mode: str | SupportsIndex) -> int: ...
    def nc_open(self, path: paths.Path, mode: str | SupportsIndex) -> int: ...
    def put_att_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def nc_put_att_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def put_att_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def nc_put_att_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def put_att_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def nc_put_att_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def put_att_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def nc_put_att_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def put_att_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def nc_put_att_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def put_att_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def nc_put_att_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        xtype: SupportsIndex,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def put_att_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def nc_put_att_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def put_var_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def nc_put_var_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def put_var_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def nc_put_var_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def put_var_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def nc_put_var_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def put_var_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def nc_put_var_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def put_var_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def nc_put_var_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def put_var_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def nc_put_var_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def put_var_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def nc_put_var_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def put_vara_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def nc_put_vara_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def put_vara_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def nc_put_vara_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def put_vara_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def nc_put_vara_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def put_vara_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def nc_put_vara_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def put_vara_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def nc_put_vara_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def put_vara_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def nc_put_vara_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def put_vara_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def nc_put_vara_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def put_vars_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def nc_put_vars_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def put_vars_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def nc_put_vars_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def put_vars_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def nc_put_vars_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def put_vars_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def nc_put_vars_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def put_vars_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def nc_put_vars_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def put_vars_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def nc_put_vars_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def put_vars_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def nc_put_vars_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        start: Indices,
        count: Indices,
        stride: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def put_var1_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def nc_put_var1_double(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.float64],
    ) -> None: ...
    def put_var1_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def nc_put_var1_float(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.float32],
    ) -> None: ...
    def put_var1_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def nc_put_var1_int(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int32],
    ) -> None: ...
    def put_var1_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def nc_put_var1_short(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int16],
    ) -> None: ...
    def put_var1_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def nc_put_var1_schar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.int8],
    ) -> None: ...
    def put_var1_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def nc_put_var1_uchar(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: Numbers | NDArray[numpy.uint8],
    ) -> None: ...
    def put_var1_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def nc_put_var1_text(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        index: Indices,
        data: str | bytes | NDArray[numpy.str_],
    ) -> None: ...
    def redef(self, ncid: SupportsIndex) -> None: ...
    def nc_redef(self, ncid: SupportsIndex) -> None: ...
    def rename_att(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        newname: str,
    ) -> None: ...
    def nc_rename_att(
        self,
        ncid: SupportsIndex,
        varid: SupportsIndex,
        name: str,
        newname: str,
    ) -> None: ...
    def rename_dim(self, ncid: SupportsIndex, dimid: SupportsIndex, name: str) -> None: ...
    def nc_rename_dim(self, ncid: SupportsIndex, dimid: SupportsIndex, name: str) -> None: ...
    def rename_var(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> None: ...
    def nc_rename_var(self, ncid: SupportsIndex, varid: SupportsIndex, name: str) -> None: ...
    def set_default_format(self, format: SupportsIndex) -> int: ...
    def nc_set_default_format(self, format: SupportsIndex) -> int: ...
    def set_fill(self, ncid: SupportsIndex, fillmode: SupportsIndex) -> int: ...
    def nc_set_fill(self, ncid: SupportsIndex, fillmode: SupportsIndex) -> int: ...
    def strerror(self, ncerr: SupportsIndex) -> str: ...
    def nc_strerror(self, ncerr: SupportsIndex) -> str: ...
    def sync(self, ncid: SupportsIndex) -> None: ...
    def nc_sync(self, ncid: SupportsIndex) -> None: ...
