// module/ops/schema/handlers.hpp: the operations on dimensions, variables and attributes as such.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// dimensions.cpp
OperationHandler defDimHandler;    ///< (ncid, dimension, dim_length) -> dimid
OperationHandler inqDimHandler;    ///< (ncid, dimid) -> name, length
OperationHandler inqDimidHandler;  ///< (ncid, dimension) -> dimid
OperationHandler renameDimHandler; ///< (ncid, dimid, dimension)

// variables.cpp
OperationHandler defVarHandler;    ///< (ncid, variable, type, dimids) -> varid
OperationHandler inqVarHandler;    ///< (ncid, varid) -> name, type, dimids, natts
OperationHandler inqVaridHandler;  ///< (ncid, variable) -> varid
OperationHandler renameVarHandler; ///< (ncid, varid, variable)

// attributes.cpp
OperationHandler inqAttHandler;     ///< (ncid, varid, attribute) -> type, length
OperationHandler inqAttidHandler;   ///< (ncid, varid, attribute) -> attid
OperationHandler inqAttnameHandler; ///< (ncid, varid, attid) -> name
OperationHandler renameAttHandler;  ///< (ncid, varid, attribute, attribute)
OperationHandler delAttHandler;     ///< (ncid, varid, attribute)
OperationHandler copyAttHandler;    ///< (ncid, varid, attribute, ncid, varid)

} // namespace tessel::netcdf
