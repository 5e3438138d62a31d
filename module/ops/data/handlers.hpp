// module/ops/data/handlers.hpp: the operations on variable data.
//
// Index vectors and shapes are in host order: first dimension fastest.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// read_var.cpp
OperationHandler readVarHandler; ///< (ncid, varid) -> the whole variable

// read_block.cpp
OperationHandler readVar1Handler; ///< (ncid, varid, index) -> one element
OperationHandler readVaraHandler; ///< (ncid, varid, start, count) -> a block

// read_strided.cpp
OperationHandler readVarsHandler; ///< (ncid, varid, start, count, stride) -> a strided block

// write_var.cpp
OperationHandler writeVarHandler; ///< (ncid, varid, data)

// write_block.cpp
OperationHandler writeVar1Handler; ///< (ncid, varid, index, one element)
OperationHandler writeVaraHandler; ///< (ncid, varid, start, count, data)

// write_strided.cpp
OperationHandler writeVarsHandler; ///< (ncid, varid, start, count, stride, data)

} // namespace tessel::netcdf
