// module/ops/attribute/write.cpp: writing attribute values.
#include "call/catalogue.hpp"
#include "convert/families.hpp"
#include "convert/number.hpp"
#include "convert/scalar.hpp"
#include "convert/write_data.hpp"
#include "ops/attribute/handlers.hpp"

#include <netcdf.h>

#include <string>

namespace tessel::netcdf {

void writeAttHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                     const OperationEntry *entry) {
    checkCount(catalogue::putAtt, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");
    const nc_type type = unpack_xtype(prhs[4]);
    const tsArray *const values = prhs[5];
    validate_write_op_datatype(values, entry);

    const int status = withMember(putAtt, entry, [&]<class T>(PutAtt<T> *put) {
        return put(ncid, varid, name.c_str(), type, tsGetNumberOfElements(values),
                   elements<T>(values));
    });
    check(status, catalogue::putAtt.failure);
}

void writeAttTextHandler(int /*nlhs*/, tsArray * /*plhs*/[], int nrhs, const tsArray *prhs[],
                         const OperationEntry *entry) {
    checkCount(catalogue::putAttText, nrhs, entry);
    const int ncid = unpackID(prhs[1], "ncid");
    const int varid = unpackID(prhs[2], "varid");
    const std::string name = unpackName(prhs[3], "attribute");
    const tsArray *const text = prhs[4];
    validate_write_op_datatype(text, entry);

    char *const bytes = make_text_write_buffer(text, entry);
    check(nc_put_att_text(ncid, varid, name.c_str(), tsGetNumberOfElements(text), bytes),
          catalogue::putAttText.failure);
    tsFree(bytes);
}

} // namespace tessel::netcdf
