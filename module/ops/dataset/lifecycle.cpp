// module/ops/dataset/lifecycle.cpp: define mode and data mode, fill, flushing, and the end.
#include "call/catalogue.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/dataset/handlers.hpp"

#include <netcdf.h>

namespace tessel::netcdf {
namespace {

/// The operations that take a dataset id and give nothing back.
void callWithDataset(const Operation &operation, int (*function)(int ncid), int nrhs,
                     const tsArray *prhs[], const OperationEntry *entry) {
    checkCount(operation, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    check(function(ncid), operation.failure);
}

} // namespace

void syncHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                 const OperationEntry *entry) {
    callWithDataset(catalogue::sync, nc_sync, nrhs, prhs, entry);
}

void redefHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                  const OperationEntry *entry) {
    callWithDataset(catalogue::redef, nc_redef, nrhs, prhs, entry);
}

void enddefHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    callWithDataset(catalogue::enddef, nc_enddef, nrhs, prhs, entry);
}

void closeHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                  const OperationEntry *entry) {
    callWithDataset(catalogue::close, nc_close, nrhs, prhs, entry);
}

void abortHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                  const OperationEntry *entry) {
    callWithDataset(catalogue::abort, nc_abort, nrhs, prhs, entry);
}

void enddefTunedHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                        const OperationEntry *entry) {
    checkCount(catalogue::enddefTuned, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const std::size_t headerMinFree = unpackGenericSizeParameter(prhs[2], "h_minfree");
    const std::size_t variableAlign = unpackGenericSizeParameter(prhs[3], "v_align");
    const std::size_t variableMinFree = unpackGenericSizeParameter(prhs[4], "v_minfree");
    const std::size_t recordAlign = unpackGenericSizeParameter(prhs[5], "r_align");

    check(nc__enddef(ncid, headerMinFree, variableAlign, variableMinFree, recordAlign),
          catalogue::enddefTuned.failure);
}

void setFillHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                    const OperationEntry *entry) {
    checkCount(catalogue::setFill, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int mode = unpackIntSingleton(prhs[2], "new_fill_mode");

    int oldMode = 0;
    check(nc_set_fill(ncid, mode, &oldMode), catalogue::setFill.failure);
    plhs[0] = packIntVector(&oldMode, 1);
}

void setDefaultFormatHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                             const OperationEntry *entry) {
    checkCount(catalogue::setDefaultFormat, nrhs, entry);
    const int format = unpackIntSingleton(prhs[1], "new_default_format");

    int oldFormat = 0;
    check(nc_set_default_format(format, &oldFormat), catalogue::setDefaultFormat.failure);
    plhs[0] = packIntVector(&oldFormat, 1);
}

} // namespace tessel::netcdf
