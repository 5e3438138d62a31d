// module/ops/attribute/handlers.hpp: the operations on attribute values.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// read.cpp
OperationHandler readAttHandler; ///< (ncid, varid, attribute) -> values

} // namespace tessel::netcdf
