// module/ops/data/read_var.cpp: reading whole variables.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/read_buffer.hpp"
#include "convert/scalar.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/read_variable.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cstdint>

namespace tessel::netcdf {
namespace {

/// This family counts the characters it hands over in 32 bits, and none when that is negative.
std::size_t countedIn32Bits(std::size_t n) {
    return static_cast<std::size_t>(std::max(static_cast<std::int32_t>(n), 0));
}

constexpr TextBlock text = {1, countedIn32Bits};

/// The lengths of a variable's dimensions now, in library order.
IndexVector currentLengths(int ncid, int varid) {
    const std::size_t ndims = numberOfDimensions(ncid, varid, catalogue::getVarNumDims);
    const DimensionVector<int> dimids = dimensionIDs(ncid, varid, ndims, catalogue::getVarDimids);
    IndexVector lengths(ndims, unfilled);
    for (std::size_t i = 0; i < ndims; ++i) {
        check(nc_inq_dimlen(ncid, dimids[i], &lengths[i]), catalogue::getVarDimLen);
    }
    return lengths;
}

} // namespace

void readVarHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                    const OperationEntry *entry) {
    checkCount(catalogue::getVar, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const IndexVector dims = resultShape(currentLengths(ncid, varid));

    const int status = withMember(getVar, entry, [&]<class T>(GetVar<T> *get) {
        return readBlock<T>(plhs[0], {dims.data(), dims.size()}, text, entry,
                            [&](T *data) { return get(ncid, varid, data); });
    });
    check(status, catalogue::getVar.failure);
}

} // namespace tessel::netcdf
