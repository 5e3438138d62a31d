// module/ops/data/read_block.cpp: reading single elements and contiguous blocks.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/index_vector.hpp"
#include "convert/read_buffer.hpp"
#include "convert/scalar.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/read_variable.hpp"

#include <array>

namespace tessel::netcdf {

void readVar1Handler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::getVar1, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector index;
    unpackIndexVector(prhs[3], "start", index);
    checkLength(index, numberOfDimensions(ncid, varid, catalogue::getVar1NumDims),
                catalogue::getVar1IndexLength);

    constexpr std::array<std::size_t, 1> one = {1};
    const int status = withMember(getVar1, entry, [&]<class T>(GetVar1<T> *get) {
        return readRow<T>(plhs[0], one, 1, entry,
                          [&](T *value) { return get(ncid, varid, index.data(), value); });
    });
    check(status, catalogue::getVar1.failure);
}

void readVaraHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::getVara, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector start;
    unpackIndexVector(prhs[3], "start", start);
    IndexVector count;
    unpackIndexVector(prhs[4], "count", count);
    const std::size_t ndims = numberOfDimensions(ncid, varid, catalogue::getVaraNumDims);
    checkLength(start, ndims, catalogue::getVaraStartLength);
    checkLength(count, ndims, catalogue::getVaraCountLength);

    const IndexVector dims = resultShape(count);
    const int status = withMember(getVara, entry, [&]<class T>(GetVara<T> *get) {
        return readBlock<T>(plhs[0], {dims.data(), dims.size()}, blockText, entry, [&](T *data) {
            return get(ncid, varid, start.data(), count.data(), data);
        });
    });
    check(status, catalogue::getVara.failure);
}

} // namespace tessel::netcdf
