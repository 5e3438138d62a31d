// module/ops/attribute/handlers.hpp: the operations on attribute values.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// read.cpp
OperationHandler readAttHandler; ///< (ncid, varid, attribute) -> values

// write.cpp
OperationHandler writeAttHandler;     ///< (ncid, varid, attribute, type, values)
OperationHandler writeAttTextHandler; ///< (ncid, varid, attribute, text)

} // namespace tessel::netcdf
