// module/ops/dataset/handlers.hpp: the operations on whole datasets and on the library itself.
#pragma once

#include "call/operation.hpp"

namespace tessel::netcdf {

// open_create.cpp
OperationHandler openHandler;        ///< (file, mode) -> ncid
OperationHandler openTunedHandler;   ///< (file, mode, chunksizehint) -> chunksizehint, ncid
OperationHandler createHandler;      ///< (file, mode) -> ncid
OperationHandler createTunedHandler; ///< (file, mode, initialsize, unused) -> chunksize, ncid

// lifecycle.cpp
OperationHandler syncHandler;             ///< (ncid)
OperationHandler setDefaultFormatHandler; ///< (format) -> the format so far
OperationHandler setFillHandler;          ///< (ncid, mode) -> the fill mode so far
OperationHandler redefHandler;            ///< (ncid)
OperationHandler enddefHandler;           ///< (ncid)
OperationHandler enddefTunedHandler;      ///< (ncid, h_minfree, v_align, v_minfree, r_align)
OperationHandler closeHandler;            ///< (ncid)
OperationHandler abortHandler;            ///< (ncid)

// inquiry.cpp
OperationHandler inqHandler;        ///< (ncid) -> ndims, nvars, ngatts, unlimdimid
OperationHandler inqLibversHandler; ///< () -> the library's version text
OperationHandler strerrorHandler;   ///< (status) -> the library's text for it

} // namespace tessel::netcdf
