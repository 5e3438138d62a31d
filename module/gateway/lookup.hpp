// module/gateway/lookup.hpp: from the name of an operation to its row.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

/// Lower-cases the name in place and gives back the first row of the operation table whose long or
/// short name it is. Raises "TESSEL:netcdf:InvalidOperation" for any other name.
const OperationEntry *findOperation(char *name);

} // namespace tessel::netcdf
