// module/ops/dataset/open_create.cpp: opening and creating datasets.
#include "call/catalogue.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "ops/dataset/handlers.hpp"

#include <netcdf.h>

#include <string>

namespace tessel::netcdf {

void openHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                 const OperationEntry *entry) {
    checkCount(catalogue::open, nrhs, entry);
    const std::string path = unpackName(prhs[1], "file");
    const int mode = unpackMode(prhs[2]);

    int ncid = 0;
    check(nc_open(path.c_str(), mode, &ncid), catalogue::open.failure);
    plhs[0] = packIntScalar(ncid);
}

void openTunedHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                      const OperationEntry *entry) {
    checkCount(catalogue::openTuned, nrhs, entry);
    const std::string path = unpackName(prhs[1], "file");
    const int mode = unpackMode(prhs[2]);
    std::size_t chunkSize = unpackGenericSizeParameter(prhs[3], "chunksizehint");

    int ncid = 0;
    check(nc__open(path.c_str(), mode, &chunkSize, &ncid), catalogue::openTuned.failure);
    plhs[0] = packUpSizetScalar(chunkSize);
    plhs[1] = packIntScalar(ncid);
}

void createHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                   const OperationEntry *entry) {
    checkCount(catalogue::create, nrhs, entry);
    const std::string path = unpackName(prhs[1], "file");
    const int mode = unpackMode(prhs[2]);

    int ncid = 0;
    check(nc_create(path.c_str(), mode, &ncid), catalogue::create.failure);
    plhs[0] = packIntScalar(ncid);
}

void createTunedHandler(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[],
                        const OperationEntry *entry) {
    checkCount(catalogue::createTuned, nrhs, entry);
    const std::string path = unpackName(prhs[1], "file");
    const int mode = unpackMode(prhs[2]);
    // One argument gives both sizes: the hint that goes in is the initial size, and only the one
    // that comes back means anything. The last argument is counted but never read.
    const std::size_t initialSize = unpackGenericSizeParameter(prhs[3], "initialsize");
    std::size_t chunkSize = unpackGenericSizeParameter(prhs[3], "chunksize");

    int ncid = 0;
    check(nc__create(path.c_str(), mode, initialSize, &chunkSize, &ncid),
          catalogue::createTuned.failure);
    plhs[0] = packUpSizetScalar(chunkSize);
    plhs[1] = packIntScalar(ncid);
}

} // namespace tessel::netcdf
