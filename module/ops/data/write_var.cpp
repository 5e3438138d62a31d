// module/ops/data/write_var.cpp: writing whole variables.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/scalar.hpp"
#include "convert/write_data.hpp"
#include "ops/data/handlers.hpp"

#include <netcdf.h>

#include <array>

namespace tessel::netcdf {
namespace {

/// The number of elements that the variable has now, with as many records as there are.
std::size_t currentSize(int ncid, int varid) {
    int ndims = 0;
    std::array<int, NC_MAX_VAR_DIMS> dimids; // filled as far as it is read
    check(nc_inq_var(ncid, varid, nullptr, nullptr, &ndims, dimids.data(), nullptr),
          catalogue::putVarInquiry);
    std::size_t size = 1;
    for (int i = 0; i < ndims; ++i) {
        std::size_t length = 0;
        check(nc_inq_dimlen(ncid, dimids[static_cast<std::size_t>(i)], &length),
              catalogue::putVarDimLen);
        size *= length;
    }
    return size;
}

} // namespace

void writeVarHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::putVar, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const tsArray *const data = prhs[3];
    validate_write_op_datatype(data, entry);
    if (tsGetNumberOfElements(data) != currentSize(ncid, varid)) {
        raise(catalogue::putVarDataSize);
    }

    const int status = withMember(putVar, entry, [&]<class T>(PutVar<T> *put) {
        return writeBlock<T>(data, entry, [&](const T *from) { return put(ncid, varid, from); });
    });
    check(status, catalogue::putVar.failure);
}

} // namespace tessel::netcdf
