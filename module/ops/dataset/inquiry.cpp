// module/ops/dataset/inquiry.cpp: what is in a dataset, and which library this is.
#include "call/catalogue.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/dataset/handlers.hpp"

#include <netcdf.h>

namespace tessel::netcdf {

void inqHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                const OperationEntry *entry) {
    checkCount(catalogue::inq, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");

    int ndims = 0;
    int nvars = 0;
    int ngatts = 0;
    int unlimdimid = 0;
    check(nc_inq(ncid, &ndims, &nvars, &ngatts, &unlimdimid), catalogue::inq.failure);
    plhs[0] = packIntVector(&ndims, 1);
    plhs[1] = packIntVector(&nvars, 1);
    plhs[2] = packIntVector(&ngatts, 1);
    plhs[3] = packIntScalar(unlimdimid);
}

void inqLibversHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray * /*prhs*/[],
                       const OperationEntry *entry) {
    checkCount(catalogue::inqLibvers, nrhs, entry);
    plhs[0] = tsCreateString(nc_inq_libvers());
}

void strerrorHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::strerror, nrhs, entry);
    plhs[0] = tsCreateString(nc_strerror(unpackIntSingleton(prhs[1], "status")));
}

} // namespace tessel::netcdf
