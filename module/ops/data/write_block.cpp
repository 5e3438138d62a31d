// module/ops/data/write_block.cpp: writing single elements and contiguous blocks.
#include "call/catalogue.hpp"
#include "convert/index_vector.hpp"
#include "convert/memory.hpp"
#include "convert/scalar.hpp"
#include "convert/write_data.hpp"
#include "ops/data/handlers.hpp"
#include "ops/data/write_variable.hpp"

#include <netcdf.h>

namespace tessel::netcdf {
namespace {

template <class T>
using PutVar1 = int(int ncid, int varid, const std::size_t *index, const T *value);

constexpr Family<PutVar1> putVar1 = {87,
                                     catalogue::putVar1Foreign,
                                     {nc_put_var1_double, nc_put_var1_float, nc_put_var1_int,
                                      nc_put_var1_short, nc_put_var1_schar, nc_put_var1_uchar,
                                      nc_put_var1_text}};

template <class T>
using PutVara = int(int ncid, int varid, const std::size_t *start, const std::size_t *count,
                    const T *data);

constexpr Family<PutVara> putVara = {73,
                                     catalogue::putVaraForeign,
                                     {nc_put_vara_double, nc_put_vara_float, nc_put_vara_int,
                                      nc_put_vara_short, nc_put_vara_schar, nc_put_vara_uchar,
                                      nc_put_vara_text}};

} // namespace

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
