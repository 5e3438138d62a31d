// module/ops/schema/variables.cpp: defining, finding, inquiring about and renaming variables.
#include "call/catalogue.hpp"
#include "convert/number.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/schema/handlers.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <span>
#include <string>
#include <vector>

namespace tessel::netcdf {

void defVarHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::defVar, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const std::string name = unpackName(prhs[2], "variable");
    const nc_type type = unpack_xtype(prhs[3]);
    std::vector<int> dimids;
    unpackDimids(prhs[4], dimids);
    const auto ndims = checkedCast<int>(dimids.size());
    if (!ndims) {
        raise(catalogue::ndimsOutOfRange, name.c_str());
    }

    int varid = 0;
    check(nc_def_var(ncid, name.c_str(), type, *ndims, dimids.data(), &varid),
          catalogue::defVar.failure);
    plhs[0] = packIntScalar(varid);
}

void inqVarHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::inqVar, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");

    std::array<char, NC_MAX_NAME + 1> name; // filled by the inquiry
    nc_type type = NC_NAT;
    int ndims = 0;
    std::array<int, NC_MAX_VAR_DIMS> dimids; // filled as far as it is read
    int natts = 0;
    check(nc_inq_var(ncid, varid, name.data(), &type, &ndims, dimids.data(), &natts),
          catalogue::inqVar.failure);
    const std::span hostOrder(dimids.data(), static_cast<std::size_t>(ndims));
    std::reverse(hostOrder.begin(), hostOrder.end());
    plhs[0] = tsCreateString(name.data());
    plhs[1] = packIntScalar(type);
    plhs[2] = packDimidVector(hostOrder);
    plhs[3] = packIntScalar(natts);
}

void inqVaridHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::inqVarid, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const std::string name = unpackName(prhs[2], "variable");

    int varid = 0;
    check(nc_inq_varid(ncid, name.c_str(), &varid), catalogue::inqVarid.failure);
    plhs[0] = packIntScalar(varid);
}

void renameVarHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::renameVar, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string newName = unpackName(prhs[3], "variable");

    check(nc_rename_var(ncid, varid, newName.c_str()), catalogue::renameVar.failure);
}

} // namespace tessel::netcdf
