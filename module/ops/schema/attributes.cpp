// module/ops/schema/attributes.cpp: attributes as named entries, without their values.
//
// The variable id -1 (NC_GLOBAL) means the dataset's own attributes; it is an id like any other.
#include "call/catalogue.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/schema/handlers.hpp"

#include <netcdf.h>

#include <array>
#include <string>

namespace tessel::netcdf {

void inqAttHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::inqAtt, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");

    nc_type type = NC_NAT;
    std::size_t length = 0;
    check(nc_inq_att(ncid, varid, name.c_str(), &type, &length), catalogue::inqAtt.failure);
    plhs[0] = packIntScalar(type);
    plhs[1] = packUpSizetScalar(length);
}

void inqAttidHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::inqAttid, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");

    int attid = 0;
    check(nc_inq_attid(ncid, varid, name.c_str(), &attid), catalogue::inqAttid.failure);
    plhs[0] = packIntScalar(attid);
}

void inqAttnameHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                       const OperationEntry *entry) {
    checkCount(catalogue::inqAttname, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const int attid = unpackID(prhs[3], "attid");

    std::array<char, NC_MAX_NAME + 1> name; // filled by the inquiry
    check(nc_inq_attname(ncid, varid, attid, name.data()), catalogue::inqAttname.failure);
    plhs[0] = tsCreateString(name.data());
}

void renameAttHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::renameAtt, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");
    const std::string newName = unpackName(prhs[4], "attribute");

    check(nc_rename_att(ncid, varid, name.c_str(), newName.c_str()), catalogue::renameAtt.failure);
}

void delAttHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::delAtt, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");

    check(nc_del_att(ncid, varid, name.c_str()), catalogue::delAtt.failure);
}

void copyAttHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                    const OperationEntry *entry) {
    checkCount(catalogue::copyAtt, nrhs, entry);
    const int sourceNcid = unpackID(prhs[1], "ncid");
    const int sourceVarid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");
    const int targetNcid = unpackID(prhs[4], "ncid");
    const int targetVarid = unpackID(prhs[5], "varid");

    check(nc_copy_att(sourceNcid, sourceVarid, name.c_str(), targetNcid, targetVarid),
          catalogue::copyAtt.failure);
}

} // namespace tessel::netcdf
