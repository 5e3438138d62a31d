// module/constants/handlers.hpp: the operations that expose the named constants.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

/// "parameter": the value of a constant, found by its long or short name in any case.
OperationHandler parameterHandler;

/// "get_constant_names": the long names as a cell column. Further inputs are ignored.
OperationHandler constantNamesHandler;

} // namespace tessel::netcdf
