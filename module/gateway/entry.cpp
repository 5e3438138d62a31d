// module/gateway/entry.cpp: the module's one entry point.
#include "call/catalogue.hpp"
#include "gateway/lookup.hpp"
#include "tessel/extension.h"
#include "tessel/memory.h"

using namespace tessel::netcdf;

/// Finds the operation that the first input names and hands the whole call to its handler.
void tsxFunction(int nlhs, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    if (nrhs < 1) {
        raise(catalogue::tooFewArguments);
    }
    if (tsGetClassID(prhs[0]) != tsCHAR) {
        raise(catalogue::firstArgNotChar);
    }
    char *const name = tsArrayToString(prhs[0]);
    const OperationEntry *const entry = findOperation(name);
    tsFree(name);
    entry->handler(nlhs, plhs, nrhs, prhs, entry);
}
