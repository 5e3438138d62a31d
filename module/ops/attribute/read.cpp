// module/ops/attribute/read.cpp: reading attribute values.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/read_buffer.hpp"
#include "convert/scalar.hpp"
#include "ops/attribute/handlers.hpp"

#include <netcdf.h>

#include <array>
#include <string>

namespace tessel::netcdf {

void readAttHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                    const OperationEntry *entry) {
    checkCount(catalogue::getAtt, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");

    nc_type stored = NC_NAT; // the library converts from it, whatever it is
    std::size_t length = 0;
    check(nc_inq_att(ncid, varid, name.c_str(), &stored, &length), catalogue::getAttInquiry);

    const std::array<std::size_t, 2> dims = {length == 0 ? 0U : 1U, length};
    const int status = withMember(getAtt, entry, [&]<class T>(GetAtt<T> *get) {
        return readRow<T>(plhs[0], dims, length, entry,
                          [&](T *values) { return get(ncid, varid, name.c_str(), values); });
    });
    check(status, catalogue::getAtt.failure);
}

} // namespace tessel::netcdf
