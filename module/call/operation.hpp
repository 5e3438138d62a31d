// module/call/operation.hpp: an operation as the table lists it and as its handler is called.
#pragma once

#include "tessel/extension.h"

#include <cstdint>

namespace tessel::netcdf {

struct OperationEntry;

/// Serves one call: takes the host's four arguments unchanged (nrhs counts the operation name, so
/// the first argument of its own is prhs[1]) and the row that was found. Fills every output slot
/// that the operation defines, whatever nlhs is. A function type: `OperationHandler openHandler;`
/// declares a handler.
using OperationHandler = void(int nlhs, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                              const OperationEntry *entry);

/// One row of the operation table.
struct OperationEntry {
    std::int32_t id;       ///< tells a family's handler which member is meant
    const char *longName;  ///< the library's own name, in lower case ("nc_open")
    const char *shortName; ///< the same without "nc_" ("open")
    OperationHandler *handler;
};

} // namespace tessel::netcdf
