// module/ops/data/write_strided.cpp: writing strided blocks.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/index_vector.hpp"
#include "convert/scalar.hpp"
#include "convert/write_data.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/write_variable.hpp"

namespace tessel::netcdf {

void writeVarsHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::putVars, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector start;
    unpackIndexVector(prhs[3], "start", start);
    IndexVector count;
    unpackIndexVector(prhs[4], "count", count);
    StrideVector stride;
    unpackStrideVector(prhs[5], "stride", stride);
    const tsArray *const data = prhs[6];
    validate_write_op_datatype(data, entry);
    const WrittenVariable variable = inquireWritten(ncid, varid, catalogue::putVarsInquiry);
    checkLength(start.size(), variable, catalogue::putVarsStartLength);
    checkLength(count.size(), variable, catalogue::putVarsCountLength);
    checkLength(stride.size(), variable, catalogue::putVarsStrideLength);
    checkSize(count, data, catalogue::putVarsDataSize);

    const int status = withMember(putVars, entry, [&]<class T>(PutVars<T> *put) {
        return writeBlock<T>(data, entry, [&](const T *from) {
            return put(ncid, varid, start.data(), count.data(), stride.data(), from);
        });
    });
    check(status, catalogue::putVars.failure);
}

} // namespace tessel::netcdf
