// module/ops/schema/dimensions.cpp: defining, finding, inquiring about and renaming dimensions.
#include "call/catalogue.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/schema/handlers.hpp"

#include <netcdf.h>

#include <array>
#include <string>

namespace tessel::netcdf {

void defDimHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::defDim, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const std::string name = unpackName(prhs[2], "dimension");
    const std::size_t length = unpackGenericSizeParameter(prhs[3], "dim_length");

    int dimid = 0;
    check(nc_def_dim(ncid, name.c_str(), length, &dimid), catalogue::defDim.failure);
    plhs[0] = packIntScalar(dimid);
}

void inqDimHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::inqDim, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int dimid = unpackID(prhs[2], "dimid");

    std::array<char, NC_MAX_NAME + 1> name; // filled by the inquiry
    std::size_t length = 0;
    check(nc_inq_dim(ncid, dimid, name.data(), &length), catalogue::inqDim.failure);
    plhs[0] = tsCreateString(name.data());
    plhs[1] = packUpSizetScalar(length);
}

void inqDimidHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::inqDimid, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const std::string name = unpackName(prhs[2], "dimension");

    int dimid = 0;
    check(nc_inq_dimid(ncid, name.c_str(), &dimid), catalogue::inqDimid.failure);
    plhs[0] = packIntScalar(dimid);
}

void renameDimHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::renameDim, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int dimid = unpackID(prhs[2], "dimid");
    const std::string newName = unpackName(prhs[3], "dimension");

    check(nc_rename_dim(ncid, dimid, newName.c_str()), catalogue::renameDim.failure);
}

} // namespace tessel::netcdf
