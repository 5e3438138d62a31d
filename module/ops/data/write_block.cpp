// module/ops/data/write_block.cpp: writing single elements and contiguous blocks.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/index_vector.hpp"
#include "convert/scalar.hpp"
#include "convert/write_data.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/write_variable.hpp"

namespace tessel::netcdf {

void writeVar1Handler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::putVar1, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector index;
    unpackIndexVector(prhs[3], "start", index);
    const tsArray *const data = prhs[4];
    validate_write_op_datatype(data, entry);
    if (tsGetNumberOfElements(data) != 1) {
        raise(catalogue::putVar1DataSize);
    }
    const WrittenVariable variable = inquireWritten(ncid, varid, catalogue::putVar1Inquiry);
    checkLength(index.size(), variable, catalogue::putVar1StartLength);

    const int status = withMember(putVar1, entry, [&]<class T>(PutVar1<T> *put) {
        return writeBlock<T>(data, entry,
                             [&](const T *value) { return put(ncid, varid, index.data(), value); });
    });
    check(status, catalogue::putVar1.failure);
}

void writeVaraHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::putVara, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    IndexVector start;
    unpackIndexVector(prhs[3], "start", start);
    IndexVector count;
    unpackIndexVector(prhs[4], "count", count);
    const tsArray *const data = prhs[5];
    validate_write_op_datatype(data, entry);
    const WrittenVariable variable = inquireWritten(ncid, varid, catalogue::putVaraInquiry);
    checkLength(start.size(), variable, catalogue::putVaraStartLength);
    checkLength(count.size(), variable, catalogue::putVaraCountLength);
    checkSize(count, data, catalogue::putVaraDataSize);

    const int status = withMember(putVara, entry, [&]<class T>(PutVara<T> *put) {
        return writeBlock<T>(data, entry, [&](const T *from) {
            return put(ncid, varid, start.data(), count.data(), from);
        });
    });
    check(status, catalogue::putVara.failure);
}

} // namespace tessel::netcdf
