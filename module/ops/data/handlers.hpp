// module/ops/data/handlers.hpp: the operations on variable data.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// read_var.cpp
OperationHandler readVarHandler; ///< (ncid, varid) -> the whole variable

} // namespace tessel::netcdf
