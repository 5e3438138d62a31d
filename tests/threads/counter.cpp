// tests/threads/counter.cpp: a module with a number that nothing but the host's lock protects.
#include "tessel/host.h"

extern "C" void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray * /*prhs*/[]) {
    static int calls = 0;
    ++calls;
    if (nrhs > 0) { // without an input, the host is not needed
        plhs[0] = tsCreateDoubleScalar(calls);
    }
}
