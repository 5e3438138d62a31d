// module/ops/data/read_strided.cpp: reading strided blocks.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/index_vector.hpp"
#include "convert/read_buffer.hpp"
#include "convert/scalar.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/read_variable.hpp"

namespace tessel::netcdf {

void readVarsHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::getVars, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector start;
    unpackIndexVector(prhs[3], "start", start);
    IndexVector count;
    unpackIndexVector(prhs[4], "count", count);
    StrideVector stride;
    unpackStrideVector(prhs[5], "stride", stride);
    const std::size_t ndims = numberOfDimensions(ncid, varid, catalogue::getVarsNumDims);
    checkLength(start, ndims, catalogue::getVarsStartLength);
    checkLength(count, ndims, catalogue::getVarsCountLength);
    checkLength(stride, ndims, catalogue::getVarsStrideLength);
    // The ids are of no use here; the inquiry is, as one more thing that can fail with its own
    // name.
    dimensionIDs(ncid, varid, ndims, catalogue::getVarsDimids);

    const IndexVector dims = resultShape(count);
    const int status = withMember(getVars, entry, [&]<class T>(GetVars<T> *get) {
        return readBlock<T>(plhs[0], {dims.data(), dims.size()}, blockText, entry, [&](T *data) {
            return get(ncid, varid, start.data(), count.data(), stride.data(), data);
        });
    });
    check(status, catalogue::getVars.failure);
}

} // namespace tessel::netcdf
